#pragma once

#include <tamsel/TamselHostExport.h>

#include <QColor>
#include <QObject>
#include <QString>
#include <QStringList>
#include <memory>

namespace tamsel {

// What an application that has just recorded its screen hands the editor.
struct TAMSEL_HOST_EXPORT VideoEditorRequest {
    // The recording. The editor never modifies it; clips go to the user's
    // Videos. A relative path is taken from the current directory.
    QString moviePath;
    // The recorded application's display name and identifier
    // ("org.example.Racer"); both are required.
    QString appName;
    QString bundleIdentifier;
    // Optional: a file to attach when the user shares the recording.
    QString attachmentPath;
    // Optional: replaces the default text of a share (null: the default).
    QString shareMessage;
    // Optional: the tint of the editor's top bar (invalid: the default).
    QColor tintColor;
    // Optional: further arguments for the editor's process ("--device phone"
    // forces the compact layout; "--demo" plays the typical use by itself).
    QStringList editorArguments;
};

// Opens the video editor on a recording in a process of its own and tells
// the application which activities the user completed there (saving to the
// album, sharing by mail, publishing, ...).
//
// Lives on the thread that made it and needs that thread's Qt event loop;
// its signals come on that thread. One request at a time; a host may open
// another after `ended`. Destroying the host closes its editor.
class TAMSEL_HOST_EXPORT VideoEditorHost : public QObject {
    Q_OBJECT
  public:
    explicit VideoEditorHost(QObject* parent = nullptr);
    ~VideoEditorHost() override;

    // The editor's program: $TAMSEL_VIDEO_EDITOR when set, else the
    // tamsel-video-editor installed with this library, else the one on PATH.
    static QString defaultEditorProgram();
    QString editorProgram() const;
    void setEditorProgram(const QString& program);

    // Starts the editor on `request`. False, with `error` set, when the
    // request lacks a required value, a request is still open, or the
    // editor cannot be started.
    bool open(const VideoEditorRequest& request, QString* error = nullptr);
    // Closes the editor, as a host does that no longer wants it; `ended`
    // follows.
    void close();
    bool isOpen() const;

  signals:
    // The user left the editor with done or cancel: the activity types they
    // completed ("org.tamsel.activity.SaveToAlbum", "TXPublishToYouTube",
    // ...), empty when they did nothing or closed the window. The host
    // closes the editor right after. At most once per request.
    void finished(const QStringList& activityTypes);
    // The editor's process has ended. `abnormal` when it crashed or failed
    // (then `finished` may not have come), with a word on how
    // ("crash, 11", "exit status 1").
    void ended(bool abnormal, const QString& how);

  private:
    struct Private;
    std::unique_ptr<Private> d;
};

} // namespace tamsel
