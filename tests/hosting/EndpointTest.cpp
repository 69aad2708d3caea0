// The extension's end of the host connection, and the framing under it.

#include "platform/hosting/ExtensionEndpoint.h"
#include "platform/hosting/HostMessages.h"
#include "platform/hosting/MessageChannel.h"
#include "support/Wait.h"

#include <QCborArray>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

TEST(ExtensionEndpoint, NoCallbackReachesItOnceItIsGone) {
    auto [hostEnd, extensionEnd] = makeSocketPair();
    MessageChannel host(hostEnd);
    // The connection to the host keeps the channel while its last messages
    // leave, so the channel outlives the endpoint and the final drain still
    // reads from it.
    auto channel = std::make_shared<MessageChannel>(extensionEnd);
    int dismissals = 0, hangUps = 0;
    {
        ExtensionEndpoint endpoint(channel);
        endpoint.onDismiss = [&] { ++dismissals; };
        endpoint.onHostGone = [&] { ++hangUps; };
    }
    ASSERT_FALSE(host.send(QCborMap{{QStringLiteral("type"), HostMessages::Dismiss}}));
    host.close();
    ASSERT_TRUE(waitUntil([&] { return !channel->isOpen(); }));
    EXPECT_EQ(dismissals, 0);
    EXPECT_EQ(hangUps, 0);
}

TEST(MessageFrameReader, MessagesComeWholeHoweverTheBytesArePortioned) {
    QByteArray stream;
    for (int n = 0; n < 3; ++n)
        stream += MessageFrameReader::frame(QCborMap{{"n", n}, {"pad", QString(n * 300, 'x')}});
    for (const qsizetype piece : {qsizetype(1), qsizetype(5), stream.size()}) {
        MessageFrameReader reader;
        QList<qint64> seen;
        for (qsizetype at = 0; at < stream.size(); at += piece) {
            reader.append(stream.constData() + at, qMin(piece, stream.size() - at));
            QCborMap message;
            while (reader.next(&message) == MessageFrameReader::Result::Message)
                seen.append(message.value("n").toInteger());
        }
        EXPECT_EQ(seen, (QList<qint64>{0, 1, 2})) << "pieces of " << piece;
    }
}

TEST(HostMessages, AReportKeepsItsStringsAndNothingElseIsAReport) {
    const QCborMap report{{"type", HostMessages::Invoke},
                          {"selector", "extensionDidFinishWithActivityTypes:"},
                          {"arguments", QCborArray{QCborArray{"a", 7, "b", QCborMap{}}}}};
    EXPECT_EQ(HostMessages::activityTypesOfReport(report), (QStringList{"a", "b"}));
    QCborMap empty = report;
    empty.insert(QStringLiteral("arguments"), QCborArray{});
    EXPECT_EQ(HostMessages::activityTypesOfReport(empty), QStringList{});
    QCborMap other = report;
    other.insert(QStringLiteral("selector"), "somethingElse:");
    EXPECT_FALSE(HostMessages::activityTypesOfReport(other));
    EXPECT_FALSE(HostMessages::activityTypesOfReport(QCborMap{{"type", HostMessages::Working}}));
}
