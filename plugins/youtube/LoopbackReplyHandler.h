#pragma once

#include "platform/runtime/Error.h"

#include <QOAuthHttpServerReplyHandler>

namespace youtube_publishing {

// Receives the browser's redirect after sign-in on 127.0.0.1 at a port the
// system chooses, as Google asks of desktop applications, and answers the
// browser with a page that sends the user back to the editor.
//
// It also reports a token request that the service refused or that never
// got an answer: Qt Network Authorization 6.4 only warns about those, which
// would leave a sign-in waiting for ever.
//
// Main thread only.
class LoopbackReplyHandler : public QOAuthHttpServerReplyHandler {
    Q_OBJECT
  public:
    explicit LoopbackReplyHandler(QObject* parent = nullptr);

    // "http://127.0.0.1:PORT/": the loopback address by number, never a name
    // a resolver could send elsewhere.
    QString callback() const override;

  signals:
    void tokenRequestFailed(platform::ErrorPtr error);

  public slots:
    void networkReplyFinished(QNetworkReply* reply) override;
};

} // namespace youtube_publishing
