#pragma once

#include "platform/media/Asset.h"
#include "platform/media/MediaTime.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QList>
#include <QString>
#include <QUrl>

#include <functional>
#include <memory>
#include <optional>

namespace platform {

// Preset names.
inline const QString ExportPresetPassthrough = QStringLiteral("TamselExportPresetPassthrough");
inline const QString ExportPresetHighestQuality =
    QStringLiteral("TamselExportPresetHighestQuality");

// Output file types.
inline const QString FileTypeMPEG4 = QStringLiteral("public.mpeg-4");

enum class ExportSessionStatus {
    Unknown = 0,
    Waiting = 1,
    Exporting = 2,
    Completed = 3,
    Failed = 4,
    Cancelled = 5,
};

// How one audio track enters the mix: its volume (1 is unchanged).
struct AudioMixInputParameters {
    int trackID = 0;
    float volume = 1.0f;

    static AudioMixInputParameters audioMixInputParametersWithTrack(const AssetTrack& track) {
        return {track.trackID, 1.0f};
    }
};

// The per-track parameters of an export's audio. A track without parameters
// keeps its level.
struct AudioMix {
    QList<AudioMixInputParameters> inputParameters;
};

// Writes a time range of an asset to a new movie file.
//
// Configure on one thread (any), then call exportAsynchronouslyWithCompletionHandler
// once. The work runs on a worker thread and the handler is called there,
// once, after status() has taken its final value: Completed, Failed (error()
// says why, with an integer code) or Cancelled. The file is written under a
// temporary name beside the output and renamed to the output URL only when
// complete, replacing a file there; a failed or cancelled export leaves
// nothing under the output name. A range reaching past the end of the asset
// is clipped at the end; an invalid or empty range (after clipping) fails.
// The session keeps itself alive until the handler has run.
class ExportSession {
  public:
    virtual ~ExportSession() = default;

    // A session from implementation(): the real one on FFmpeg unless a test
    // replaced it. Both presets write MP4, copy the streams they may and
    // encode the rest (H.264 at CRF 18, AAC at 192 kbit/s), starting at the
    // frame shown at the requested time (copied video through an edit list).
    // The pass-through preset copies every stream that MP4 holds as it is;
    // the highest-quality preset, made for uploading, copies H.264, HEVC,
    // VP9, AV1, AAC and Opus. An audio mix naming several audio tracks mixes
    // them into one; a track at a volume other than 1 is encoded. Null for
    // an unknown preset.
    static std::shared_ptr<ExportSession>
    exportSessionWithAsset_presetName(std::shared_ptr<Asset> asset, const QString& presetName);
    using Maker = std::shared_ptr<ExportSession>(std::shared_ptr<Asset>, const QString&);
    static Implementation<Maker>& implementation();

    virtual std::shared_ptr<Asset> asset() const = 0;
    virtual QString presetName() const = 0;

    virtual QUrl outputURL() const = 0;
    virtual void setOutputURL(const QUrl& url) = 0;
    virtual QString outputFileType() const = 0;
    virtual void setOutputFileType(const QString& fileType) = 0;
    // Default: the whole asset.
    virtual MediaTimeRange timeRange() const = 0;
    virtual void setTimeRange(const MediaTimeRange& range) = 0;
    virtual std::optional<AudioMix> audioMix() const = 0;
    virtual void setAudioMix(const std::optional<AudioMix>& mix) = 0;

    // ExportSessionStatus as an integer; readable from any thread.
    virtual int status() const = 0;
    virtual ErrorPtr error() const = 0;
    // 0 to 1; readable from any thread.
    virtual float progress() const = 0;

    virtual void exportAsynchronouslyWithCompletionHandler(std::function<void()> handler) = 0;
    // Stops a running or waiting export; it then completes as Cancelled.
    // Callable from any thread; no effect once the export has finished.
    virtual void cancelExport() = 0;
};

} // namespace platform
