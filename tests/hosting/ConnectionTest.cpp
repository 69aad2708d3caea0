// Input items and their providers, and the proxy that carries the finish
// report to the host.

#include "platform/hosting/AuxiliaryConnection.h"
#include "platform/hosting/ExtensionItem.h"
#include "platform/hosting/MessageChannel.h"
#include "platform/runtime/GlobalQueue.h"
#include "support/Wait.h"

#include <QColor>
#include <QCoreApplication>
#include <QThread>
#include <atomic>
#include <gtest/gtest.h>
#include <mutex>

using namespace platform;
using testing_support::waitUntil;

namespace {

struct Loaded {
    std::mutex mutex;
    QVariant item;
    ErrorPtr error;
    std::atomic<bool> done{false};
    std::atomic<bool> onMain{true};

    ItemProvider::LoadHandler handler() {
        return [this](QVariant i, ErrorPtr e) {
            std::lock_guard lock(mutex);
            item = i;
            error = e;
            onMain = QThread::currentThread() == QCoreApplication::instance()->thread();
            done = true;
        };
    }
};

const InterfaceDescription kHost{"TXVideoEditorExtensionHostProtocol",
                                 {"extensionDidFinishWithActivityTypes:"}};

} // namespace

// Strings and colours load on a worker thread, through the wire form as the
// extension gets them; an unreadable or untyped item fails its own load.
TEST(ItemProvider, LoadsItsItemOnAWorkerThreadOrFailsItsLoadOnly) {
    const auto viaWire = [](const QVariant& value) {
        const auto items =
            decodeExtensionItems(encodeExtensionItems({{"KEY", {ItemProvider::withItem(value)}}}));
        EXPECT_EQ(items.value(0).attributedTitle, "KEY");
        return items.value(0).attachments.value(0);
    };
    const QStringList data = {ItemProvider::GenericDataTypeIdentifier};
    const struct {
        std::shared_ptr<ItemProvider> provider;
        QVariant item;
        int code;
    } cases[] = {
        {viaWire(QStringLiteral("/home/me/Videos/rec.mp4")), "/home/me/Videos/rec.mp4", 0},
        {viaWire(QColor(255, 128, 0, 255)), QColor(255, 128, 0, 255), 0},
        {std::make_shared<ItemProvider>(QCborMap{{"colour", QCborArray{2.0, 0, 0, 1}}}, data),
         {},
         ItemProvider::UnreadableItem},
        {std::make_shared<ItemProvider>(QCborMap{{"colour", "red"}}, data),
         {},
         ItemProvider::UnreadableItem},
        {std::make_shared<ItemProvider>(QCborValue(42), data), {}, ItemProvider::UnreadableItem},
        {std::make_shared<ItemProvider>(QCborValue("text"), QStringList{}),
         {},
         ItemProvider::UnavailableType},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.code);
        ASSERT_TRUE(c.provider);
        EXPECT_EQ(c.provider->hasItemConformingToTypeIdentifier(data[0]),
                  c.code != ItemProvider::UnavailableType);
        Loaded loaded;
        c.provider->loadItemForTypeIdentifier_options_completionHandler(data[0], {},
                                                                        loaded.handler());
        ASSERT_TRUE(waitUntil([&] { return loaded.done.load(); }));
        EXPECT_FALSE(loaded.onMain);
        EXPECT_EQ(loaded.error ? loaded.error->code() : 0, c.code);
        EXPECT_EQ(loaded.item, c.item);
    }
}

TEST(ExtensionItem, WireFieldsOfTheWrongTypeReadAsEmpty) {
    const auto items = decodeExtensionItems(QCborArray{
        QCborMap{{"title", 5}, {"attachments", "nope"}},
        QCborMap{{"title", "T"},
                 {"attachments", QCborArray{QCborMap{{"types", QCborArray{1, "a/b"}}}}}},
        QCborValue("not an item"),
    });
    ASSERT_EQ(items.size(), 3);
    EXPECT_TRUE(items[0].attributedTitle.isEmpty());
    EXPECT_TRUE(items[0].attachments.isEmpty());
    ASSERT_EQ(items[1].attachments.size(), 1);
    EXPECT_EQ(items[1].attachments[0]->registeredTypeIdentifiers(), QStringList{"a/b"});
    EXPECT_TRUE(decodeExtensionItems(QCborValue("junk")).isEmpty());
}

TEST(RemoteObjectProxy, EveryProxyOfAConnectionDeliversInOrderEvenAnEmptyList) {
    auto [a, b] = makeSocketPair();
    auto connection = std::make_shared<AuxiliaryConnection>(
        std::make_shared<MessageChannel>(a), InterfaceDescription{"Vendor", {}}, kHost);
    MessageChannel host(b);
    QList<QCborMap> received;
    host.onMessage = [&](const QCborMap& m) { received.append(m); };

    auto first = connection->remoteObjectProxyWithErrorHandler(nullptr);
    auto second = connection->remoteObjectProxyWithErrorHandler(nullptr);
    EXPECT_NE(first, second);
    first->extensionDidFinishWithActivityTypes({});
    second->extensionDidFinishWithActivityTypes({"SaveToAlbumActivityType", "TXPublishToYouTube"});

    ASSERT_TRUE(waitUntil([&] { return received.size() == 2; }));
    EXPECT_EQ(received[0].value("selector").toString(), "extensionDidFinishWithActivityTypes:");
    const QCborValue emptyList = received[0].value("arguments").toArray().at(0);
    EXPECT_TRUE(emptyList.isArray()) << "an empty list is sent, not left out";
    EXPECT_EQ(emptyList.toArray().size(), 0);
    EXPECT_EQ(received[1].value("arguments").toArray().at(0).toArray(),
              (QCborArray{"SaveToAlbumActivityType", "TXPublishToYouTube"}));
}

// The codes themselves reach the log (TXVideoEditorExtensionContext's test);
// here, the thread they come on, and a selector the host does not know.
TEST(RemoteObjectProxy, UndeliverableMessagesReachTheErrorHandlerOffTheMainThread) {
    auto [a, b] = makeSocketPair();
    ::close(b); // the host has gone
    auto gone = std::make_shared<AuxiliaryConnection>(std::make_shared<MessageChannel>(a),
                                                      InterfaceDescription{}, kHost);
    std::atomic<int> code{0};
    std::atomic<bool> onMain{true};
    const auto seen = [&](ErrorPtr e) {
        onMain = QThread::currentThread() == QCoreApplication::instance()->thread();
        code = e->code();
    };
    gone->remoteObjectProxyWithErrorHandler(seen)->extensionDidFinishWithActivityTypes({"x"});
    ASSERT_TRUE(waitUntil([&] { return code != 0; }));
    EXPECT_EQ(code, RemoteObjectProxy::ConnectionInterrupted);
    EXPECT_FALSE(onMain);

    code = 0;
    gone->remoteObjectProxyWithErrorHandler(seen)->invoke("somethingElse:", {});
    EXPECT_EQ(code, RemoteObjectProxy::UnknownSelector);
}
