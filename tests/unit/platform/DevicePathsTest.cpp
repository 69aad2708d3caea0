#include "platform/runtime/DevicePaths.h"
#include "support/TempDir.h"

#include <QFileInfo>
#include <QSet>
#include <QUrl>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::ScopedEnv;

TEST(DevicePaths, DevicePrefixesMapOntoTheirRootsAndBack) {
    ScopedEnv env("TAMSEL_MOBILE_ROOT", "/tmp/mobile-root/");
    env.set("TAMSEL_SYSTEM_ROOT", "/opt/tamsel/System");

    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library/Tamsel/"),
              "/tmp/mobile-root/Library/Tamsel");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library/Tamsel//a.mp4"),
              "/tmp/mobile-root/Library/Tamsel/a.mp4");
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

TEST(DevicePaths, NoDevicePathLeadsOutOfItsRoot) {
    ScopedEnv env("TAMSEL_MOBILE_ROOT", "/m");
    env.set("TAMSEL_SYSTEM_ROOT", "/s");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/../../../etc/passwd"), "/m/etc/passwd");
    EXPECT_EQ(DevicePaths::toHost("/private/var/mobile/Library/../Library/./Caches/x"),
              "/m/Library/Caches/x");
    EXPECT_EQ(DevicePaths::toHost("/System/Library/../../../../etc/shadow"), "/s/etc/shadow");
    EXPECT_EQ(DevicePaths::toHost(QString("/private/var/mobile/Library/a") + QChar(0) + "b"),
              QString("/m/Library/a") + QChar(0x2400) + "b");
}

TEST(DevicePaths, WhateverFollowsTheTemporaryStoreIsOneEntryOfIt) {
    ScopedEnv env("TAMSEL_MOBILE_ROOT", "/m");
    const QString store = "/private/var/mobile/Library/Tamsel/";
    const QString slash(QChar(0x2215));
    const struct {
        QString name, host;
    } cases[] = {
        {"AC/DC_7.mp4", "AC" + slash + "DC_7.mp4"},
        {"../../../../tmp/x/evil_7.mp4", ".." + slash + ".." + slash + ".." + slash + ".." + slash +
                                             "tmp" + slash + "x" + slash + "evil_7.mp4"},
        {".._7.mp4", ".._7.mp4"},
        {"..", QString(2, QChar(0x2024))},
        {QString("a") + QChar(0) + "/b", QString("a") + QChar(0x2400) + slash + "b"},
    };
    for (const auto& c : cases) {
        // As the system joins them: the folder, a slash, the name.
        const QString host = DevicePaths::toHost(store + "/" + c.name);
        EXPECT_EQ(host, "/m/Library/Tamsel/" + c.host) << c.name.toStdString();
        // A name read back from the folder maps to the same file.
        EXPECT_EQ(DevicePaths::toHost(store + "/" + c.host), host) << c.name.toStdString();
    }
    EXPECT_EQ(DevicePaths::toHost(store + "/."), "/m/Library/Tamsel");
}

TEST(DevicePaths, ANameTooLongForTheFileSystemKeepsItsEndsAndStaysDistinct) {
    ScopedEnv env("TAMSEL_MOBILE_ROOT", "/m");
    const QString store = "/private/var/mobile/Library/Tamsel//";
    const QString a = QString(4096, QChar(0x00E9)) + "A_1700000000.mp4"; // two bytes a letter
    const QString b = QString(4096, QChar(0x00E9)) + "B_1700000000.mp4";
    const QString emoji = QString::fromUtf8("\xF0\x9F\x8E\xAE").repeated(300) + "_1.mp4";
    QSet<QString> names;
    for (const QString& name : {a, b, emoji}) {
        const QString host = DevicePaths::toHost(store + name);
        ASSERT_TRUE(host.startsWith("/m/Library/Tamsel/")) << host.toStdString();
        const QString entry = host.mid(QString("/m/Library/Tamsel/").size());
        EXPECT_LE(entry.toUtf8().size(), DevicePaths::MaximumEntryNameBytes);
        EXPECT_TRUE(entry.startsWith(name.left(10))) << entry.toStdString();
        EXPECT_TRUE(entry.endsWith(name.right(12))) << entry.toStdString();
        EXPECT_FALSE(entry.toUtf8().contains("\xEF\xBF\xBD")) << "a character split in two";
        EXPECT_EQ(DevicePaths::toHost(store + entry), host);
        names.insert(entry);
    }
    EXPECT_EQ(names.size(), 3);
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
