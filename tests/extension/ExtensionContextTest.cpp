#include "extension/TXVideoEditorExtensionContext.h"
#include "platform/hosting/MessageChannel.h"
#include "support/LogCapture.h"

#include <gtest/gtest.h>
#include <unistd.h>

// The report reaching the host is tested with the principal controller and
// end to end; here, what a host that cannot be reached leaves in the log.
TEST(TXVideoEditorExtensionContext, AnUnreachableHostIsLoggedWithTheErrorCode) {
    auto [extensionEnd, hostEnd] = platform::makeSocketPair();
    ::close(hostEnd);
    testing_support::LogCapture logs;
    for (int fd : {extensionEnd, -1}) {
        auto context = std::make_shared<TXVideoEditorExtensionContext>(
            QList<platform::ExtensionItem>{},
            std::make_shared<platform::AuxiliaryConnection>(
                fd < 0 ? nullptr : std::make_shared<platform::MessageChannel>(fd),
                TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol(),
                TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol()));
        context->extensionObjectProxy()->extensionDidFinishWithActivityTypes({"x"});
        context->_auxiliaryConnection()->flush();
    }
    EXPECT_EQ(logs.lines(), (QList<testing_support::LogLine>{
                                {platform::LogLevel::Error, "error calling extension - 4099"},
                                {platform::LogLevel::Error, "error calling extension - 4097"}}));
}
