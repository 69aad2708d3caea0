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

TEST(ItemProvider, LoadsStringsAndColoursOnAWorkerThread) {
    const QList<QVariant> values{QStringLiteral("/home/me/Videos/rec.mp4"),
                                 QColor(255, 128, 0, 255)};
    for (const QVariant& value : values) {
        // Through the wire form, as the extension gets it.
        const auto items =
            decodeExtensionItems(encodeExtensionItems({{"KEY", {ItemProvider::withItem(value)}}}));
        ASSERT_EQ(items.size(), 1);
        EXPECT_EQ(items[0].attributedTitle, "KEY");
        const auto& provider = items[0].attachments.at(0);
        ASSERT_TRUE(
            provider->hasItemConformingToTypeIdentifier(ItemProvider::GenericDataTypeIdentifier));
        Loaded loaded;
        provider->loadItemForTypeIdentifier_options_completionHandler(
            ItemProvider::GenericDataTypeIdentifier, {}, loaded.handler());
        ASSERT_TRUE(waitUntil([&] { return loaded.done.load(); }));
        EXPECT_FALSE(loaded.error);
        EXPECT_FALSE(loaded.onMain);
        EXPECT_EQ(loaded.item, value);
    }
}

TEST(ItemProvider, UnreadableOrUntypedItemsFailTheirLoadOnly) {
    struct Case {
        QCborValue wire;
        QStringList types;
        int code;
    };
    const Case cases[] = {
        {QCborMap{{"colour", QCborArray{2.0, 0, 0, 1}}},
         {ItemProvider::GenericDataTypeIdentifier},
         ItemProvider::UnreadableItem},
        {QCborMap{{"colour", "red"}},
         {ItemProvider::GenericDataTypeIdentifier},
         ItemProvider::UnreadableItem},
        {QCborValue(42), {ItemProvider::GenericDataTypeIdentifier}, ItemProvider::UnreadableItem},
        {QCborValue("text"), {}, ItemProvider::UnavailableType},
    };
    for (const Case& c : cases) {
        ItemProvider provider(c.wire, c.types);
        Loaded loaded;
        provider.loadItemForTypeIdentifier_options_completionHandler(
            ItemProvider::GenericDataTypeIdentifier, {}, loaded.handler());
        ASSERT_TRUE(waitUntil([&] { return loaded.done.load(); }));
        ASSERT_TRUE(loaded.error);
        EXPECT_EQ(loaded.error->code(), c.code);
        EXPECT_FALSE(loaded.item.isValid());
    }
    EXPECT_FALSE(ItemProvider(QCborValue("x"), {})
                     .hasItemConformingToTypeIdentifier(ItemProvider::GenericDataTypeIdentifier));
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

TEST(RemoteObjectProxy, UndeliverableMessagesReachTheErrorHandlerOffTheMainThread) {
    struct Seen {
        std::atomic<int> code{0};
        std::atomic<bool> onMain{true};
        RemoteObjectProxy::ErrorHandler handler() {
            return [this](ErrorPtr e) {
                onMain = QThread::currentThread() == QCoreApplication::instance()->thread();
                code = e->code();
            };
        }
    };

    auto [a, b] = makeSocketPair();
    ::close(b); // the host has gone
    auto gone = std::make_shared<AuxiliaryConnection>(std::make_shared<MessageChannel>(a),
                                                      InterfaceDescription{}, kHost);
    Seen interrupted;
    gone->remoteObjectProxyWithErrorHandler(interrupted.handler())
        ->extensionDidFinishWithActivityTypes({"x"});
    ASSERT_TRUE(waitUntil([&] { return interrupted.code != 0; }));
    EXPECT_EQ(interrupted.code, RemoteObjectProxy::ConnectionInterrupted);
    EXPECT_FALSE(interrupted.onMain);

    auto none = std::make_shared<AuxiliaryConnection>(nullptr, InterfaceDescription{}, kHost);
    Seen invalid;
    none->remoteObjectProxyWithErrorHandler(invalid.handler())
        ->extensionDidFinishWithActivityTypes({});
    ASSERT_TRUE(waitUntil([&] { return invalid.code != 0; }));
    EXPECT_EQ(invalid.code, RemoteObjectProxy::ConnectionInvalid);

    Seen unknown;
    none->remoteObjectProxyWithErrorHandler(unknown.handler())->invoke("somethingElse:", {});
    EXPECT_EQ(unknown.code, RemoteObjectProxy::UnknownSelector);
}
