#include "extension/TXVideoEditorExtensionContext.h"
#include "platform/hosting/MessageChannel.h"
#include "support/LogCapture.h"
#include "support/Wait.h"

#include <QCborArray>
#include <gtest/gtest.h>
#include <unistd.h>

using testing_support::waitUntil;

namespace {

std::shared_ptr<TXVideoEditorExtensionContext> contextOn(int fd) {
    auto connection = std::make_shared<platform::AuxiliaryConnection>(
        fd < 0 ? nullptr : std::make_shared<platform::MessageChannel>(fd),
        TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol(),
        TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol());
    return std::make_shared<TXVideoEditorExtensionContext>(QList<platform::ExtensionItem>{},
                                                           connection);
}

} // namespace

TEST(TXVideoEditorExtensionContext, EachProxyReachesTheHost) {
    auto [extensionEnd, hostEnd] = platform::makeSocketPair();
    auto context = contextOn(extensionEnd);
    platform::MessageChannel host(hostEnd);
    QList<QCborArray> reports;
    host.onMessage = [&](const QCborMap& m) {
        reports.append(m.value("arguments").toArray().at(0).toArray());
    };

    testing_support::LogCapture logs;
    context->extensionObjectProxy()->extensionDidFinishWithActivityTypes({});
    context->extensionObjectProxy()->extensionDidFinishWithActivityTypes(
        {"SaveToAlbumActivityType"});
    ASSERT_TRUE(waitUntil([&] { return reports.size() == 2; }));
    EXPECT_EQ(reports[0], QCborArray{});
    EXPECT_EQ(reports[1], QCborArray{"SaveToAlbumActivityType"});
    EXPECT_TRUE(logs.texts().isEmpty());
}

TEST(TXVideoEditorExtensionContext, AnUnreachableHostIsLoggedWithTheErrorCode) {
    auto [extensionEnd, hostEnd] = platform::makeSocketPair();
    ::close(hostEnd);
    testing_support::LogCapture logs;
    for (auto context : {contextOn(extensionEnd), contextOn(-1)}) {
        context->extensionObjectProxy()->extensionDidFinishWithActivityTypes({"x"});
        context->_auxiliaryConnection()->flush();
    }
    EXPECT_EQ(logs.lines(), (QList<testing_support::LogLine>{
                                {platform::LogLevel::Error, "error calling extension - 4099"},
                                {platform::LogLevel::Error, "error calling extension - 4097"}}));
}

TEST(TXVideoEditorExtensionContext, DescribesBothSidesOfTheConnection) {
    EXPECT_TRUE(
        TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol().selectors.isEmpty());
    EXPECT_EQ(TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol().selectors,
              QStringList{"extensionDidFinishWithActivityTypes:"});
    auto context = contextOn(-1);
    EXPECT_FALSE(context->videoEditorExtensionViewController());
    auto principal = std::make_shared<QObject>();
    context->setPrincipalObject(principal);
    EXPECT_EQ(context->videoEditorExtensionViewController(), principal);
}
