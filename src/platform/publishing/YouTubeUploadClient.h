#pragma once

#include "platform/publishing/YouTubeSignIn.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QList>
#include <QObject>
#include <QString>
#include <QUrl>

#include <functional>
#include <memory>

namespace platform {

// A category a video can be published in.
struct YouTubeVideoCategory {
    QString identifier; // "20"
    QString title;      // "Gaming", in the language asked for
    bool operator==(const YouTubeVideoCategory&) const = default;
};

// What to publish and how it is described.
struct YouTubeUpload {
    QString filePath; // host path of a complete file
    QString mimeType = QStringLiteral("video/mp4");
    QString title;         // at most 100 characters, no "<" or ">"
    QString description;   // at most 5,000 bytes in UTF-8, no "<" or ">"
    QString categoryId;    // "" leaves the choice to the service
    QString privacyStatus; // "private", "unlisted" or "public"
};

// The published video.
struct YouTubeUploadResult {
    QString videoId;
    QUrl watchURL; // the video's web address
};

// Talks to the YouTube Data API v3 for the user signed in with a
// YouTubeSignIn: lists the categories a video can be put in, and uploads a
// video with the resumable protocol, surviving dropped connections, server
// failures, an access token that expires on the way and a session the server
// has forgotten.
//
// The real implementation comes with the YouTube publishing plug-in, which
// registers its class under realClassName() when it is loaded: make() gives
// null before that, unless a test put another maker in its place.
//
// Main thread only. Handlers are called later on the main thread, never
// inside the call that was given them; an upload's handler exactly once
// (unless the client is destroyed first). Failures are PublishingError values.
class YouTubeUploadClient : public QObject {
    Q_OBJECT
  public:
    using CategoriesHandler =
        std::function<void(const QList<YouTubeVideoCategory>& categories, ErrorPtr error)>;
    // Bytes of the file the server holds or that are on their way to it. It
    // reaches totalBytes only once the server has answered with the video.
    using ProgressHandler = std::function<void(qint64 sentBytes, qint64 totalBytes)>;
    using UploadHandler = std::function<void(const YouTubeUploadResult& result, ErrorPtr error)>;

    ~YouTubeUploadClient() override = default;

    // Where the access tokens come from. Held strongly.
    virtual void setSignIn(std::shared_ptr<YouTubeSignIn> signIn) = 0;

    // The categories a video can be assigned to in the region (ISO 3166
    // code, "DE"), titled in `language` ("de"), in the service's order.
    virtual void fetchCategories(const QString& regionCode, const QString& language,
                                 CategoriesHandler handler) = 0;

    // Uploads one video; one upload at a time (a second is refused with
    // BadResponse). The file is read while it is sent and must not change.
    virtual void upload(const YouTubeUpload& upload, ProgressHandler progress,
                        UploadHandler handler) = 0;

    // Stops the upload in progress; its handler gets Cancelled.
    virtual void cancel() = 0;

    static QString realClassName(); // "YouTubeResumableUploadClient"

    // A client from implementation(): the plug-in's class, unless a test
    // replaced the maker; null when no plug-in has registered one.
    static std::shared_ptr<YouTubeUploadClient> make();
    using Maker = std::shared_ptr<YouTubeUploadClient>();
    static Implementation<Maker>& implementation();

  protected:
    YouTubeUploadClient() = default;
};

} // namespace platform
