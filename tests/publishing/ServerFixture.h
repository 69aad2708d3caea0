#pragma once

#include "FakeYouTubeServer.h"
#include "support/TempDir.h"

#include "platform/publishing/YouTubeSignIn.h"

#include <QTemporaryDir>
#include <gtest/gtest.h>

#include <memory>

namespace testing_support {

// A started fake of the service with the plug-in pointed at it, and no
// secret store: the session bus points nowhere, so nothing a test does
// reaches the keyring of the user running it, and the account lives in
// memory. Each test starts signed out.
class ServerFixture : public ::testing::Test {
  protected:
    ServerFixture() : server_(storage_.path()) {}
    void SetUp() override;
    void TearDown() override;

    // A sign-in of the plug-in (the real one).
    std::shared_ptr<platform::YouTubeSignIn> makeSignIn();
    // Signs in without the browser, with a refresh token the server knows.
    void signInQuietly();

    QTemporaryDir storage_;
    FakeYouTubeServer server_;
    ScopedEnv env_;
};

} // namespace testing_support
