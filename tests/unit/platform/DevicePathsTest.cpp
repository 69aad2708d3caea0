#include "platform/runtime/DevicePaths.h"
#include "support/TempDir.h"

#include <QFileInfo>
#include <QUrl>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::ScopedEnv;

TEST(DevicePaths, DevicePrefixesMapOntoTheirRootsAndBack) {
    ScopedEnv env("TAMSEL_MOBILE_ROOT", "/tmp/mobile-root/");
    env.set("TAMSEL_SYSTEM_ROOT", "/opt/tamsel/System");

    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library/Tamsel/"),
              "/tmp/mobile-root/Library/Tamsel/");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library/Tamsel//a.mp4"),
              "/tmp/mobile-root/Library/Tamsel//a.mp4");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile"), "/tmp/mobile-root");
    EXPECT_EQ(DevicePaths::toHost("/System/Library/Frameworks/Tamsel.framework"),
              "/opt/tamsel/System/Library/Frameworks/Tamsel.framework");

    // Host paths pass unchanged, including look-alikes.
    for (const char* path :
         {"/home/me/rec.mp4", "/private/var/mobileX/a", "/SystemX/a", "/Systems", "relative/a", ""})
        EXPECT_EQ(DevicePaths::toHost(path), QString(path)) << path;

    EXPECT_EQ(DevicePaths::toDevice("/tmp/mobile-root/Library/Tamsel/a.mp4"),
              "/private/var/mobile/Library/Tamsel/a.mp4");
    EXPECT_EQ(DevicePaths::toDevice("/opt/tamsel/System/Library"), "/System/Library");
    EXPECT_EQ(DevicePaths::toDevice("/home/me/rec.mp4"), "/home/me/rec.mp4");
    EXPECT_EQ(
        DevicePaths::hostPathOfUrl(QUrl::fromLocalFile("/private/var/mobile/Library/Tamsel/a.mp4")),
        "/tmp/mobile-root/Library/Tamsel/a.mp4");
    EXPECT_EQ(DevicePaths::hostPathOfUrl(QUrl("https://example.org/a.mp4")), QString());
}

TEST(DevicePaths, DefaultRootsComeFromXdgAndTheBuild) {
    ScopedEnv env;
    env.unset("TAMSEL_MOBILE_ROOT");
    env.unset("TAMSEL_SYSTEM_ROOT");
    env.set("XDG_DATA_HOME", "/tmp/xdg-data");
    EXPECT_EQ(DevicePaths::mobileRoot(), "/tmp/xdg-data/tamsel/mobile");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library"),
              "/tmp/xdg-data/tamsel/mobile/Library");
    // The resources beside the executable, as in an installed prefix.
    EXPECT_TRUE(DevicePaths::systemRoot().endsWith("share/tamsel/System"))
        << DevicePaths::systemRoot().toStdString();
    EXPECT_TRUE(
        QFileInfo(DevicePaths::toHost("/System/Library/Frameworks/Tamsel.framework")).isDir());
}

TEST(DevicePaths, PreparingTheDeviceMakesItsLibraryFolder) {
    testing_support::MobileRoot root;
    EXPECT_FALSE(QFileInfo(root.hostPath("Library")).isDir());
    DevicePaths::prepareDevice();
    DevicePaths::prepareDevice();
    EXPECT_TRUE(QFileInfo(root.hostPath("Library")).isDir());
}
