#include "platform/hosting/MessageChannel.h"
#include "platform/runtime/GlobalQueue.h"
#include "support/Wait.h"

#include <atomic>

#include <QCborArray>
#include <QCoreApplication>
#include <QtEndian>
#include <gtest/gtest.h>
#include <unistd.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

struct Pair {
    Pair() {
        auto [a, b] = makeSocketPair();
        left = std::make_unique<MessageChannel>(a);
        right = std::make_unique<MessageChannel>(b);
        right->onMessage = [this](const QCborMap& m) { received.append(m); };
        right->onClosed = [this] { ++closings; };
    }
    std::unique_ptr<MessageChannel> left, right;
    QList<QCborMap> received;
    int closings = 0;
};

} // namespace

TEST(MessageChannel, DeliversWholeMessagesInOrderWhateverTheirSize) {
    Pair pair;
    const QByteArray big(3 * 1024 * 1024, 'z'); // more than the socket buffers hold
    // Sending blocks until the reader drains, and the reader is this thread.
    std::atomic<bool> sent{false};
    GlobalQueue::async(QueuePriority::Default, [&] {
        sent = !pair.left->send(QCborMap{{"n", 1}}) &&
               !pair.left->send(QCborMap{{"n", 2}, {"blob", big}}) &&
               !pair.left->send(QCborMap{{"n", 3}});
    });
    ASSERT_TRUE(waitUntil([&] { return pair.received.size() == 3; }));
    EXPECT_TRUE(sent);
    EXPECT_EQ(pair.received[0].value("n").toInteger(), 1);
    EXPECT_EQ(pair.received[1].value("blob").toByteArray(), big);
    EXPECT_EQ(pair.received[2].value("n").toInteger(), 3);
    EXPECT_EQ(pair.closings, 0);
}

TEST(MessageChannel, PeerGoneClosesOnceAndSendingFailsWithoutASignal) {
    Pair pair;
    pair.left.reset();
    ASSERT_TRUE(waitUntil([&] { return pair.closings == 1; }));
    EXPECT_FALSE(pair.right->isOpen());
    const ErrorPtr error = pair.right->send(QCborMap{{"late", true}});
    ASSERT_TRUE(error);
    QCoreApplication::processEvents();
    EXPECT_EQ(pair.closings, 1);
}

TEST(MessageChannel, GarbageFromThePeerClosesTheChannel) {
    const QList<QByteArray> garbage = {
        QByteArray("\x7f\xff\xff\xff", 4) + "x",                           // absurd length
        QByteArray("\x00\x00\x00\x03", 4) + QByteArray("\xff\xff\xff", 3), // not CBOR
        QByteArray("\x00\x00\x00\x01", 4) + QByteArray("\x05", 1),         // CBOR, but not a map
    };
    for (const QByteArray& bytes : garbage) {
        auto [a, b] = makeSocketPair();
        MessageChannel channel(b);
        int closings = 0, messages = 0;
        channel.onClosed = [&] { ++closings; };
        channel.onMessage = [&](const QCborMap&) { ++messages; };
        ASSERT_EQ(::write(a, bytes.constData(), size_t(bytes.size())), bytes.size());
        EXPECT_TRUE(waitUntil([&] { return closings == 1; })) << bytes.toHex().toStdString();
        EXPECT_EQ(messages, 0);
        ::close(a);
    }
}
