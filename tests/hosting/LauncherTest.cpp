// The host side against a real extension process.

#include "platform/hosting/host/ExtensionLauncher.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <gtest/gtest.h>
#include <optional>

using namespace platform;
using testing_support::waitUntil;

namespace {

QString echoExtension() {
    return QCoreApplication::applicationDirPath() + "/tamsel_echo_extension";
}

struct LauncherRun {
    ExtensionLauncher launcher;
    QList<QStringList> reports;
    std::optional<std::pair<int, bool>> ended;

    LauncherRun() {
        QObject::connect(&launcher, &ExtensionLauncher::extensionDidFinishWithActivityTypes,
                         [this](const QStringList& types) { reports.append(types); });
        QObject::connect(&launcher, &ExtensionLauncher::extensionEnded,
                         [this](int code, bool crashed) {
                             ended = {code, crashed};
                         });
    }
};

// One input item, which the echo extension reports back.
QList<ExtensionItem> oneItem() {
    return {{"A", {ItemProvider::withItem(QStringLiteral("value"))}}};
}

} // namespace

// The request, the report and the dismissal are tested through tamsel-edit
// (TamselEditTest) and end to end; here, what may go wrong with the process.
TEST(ExtensionLauncher, ReportsAProgramThatCannotStart) {
    LauncherRun run;
    QString error;
    EXPECT_FALSE(run.launcher.start("/nonexistent/extension", {}, {}, &error));
    EXPECT_FALSE(error.isEmpty());
}

TEST(ExtensionLauncher, WaitsForQueuedWorkThatOutlastsTheGrace) {
    LauncherRun run;
    // The work takes five times the grace; the extension says it is at it.
    ASSERT_TRUE(run.launcher.start(echoExtension(), {"--busy-after-dismiss", "1500"}, oneItem()));
    ASSERT_TRUE(waitUntil([&] { return !run.reports.isEmpty(); }));
    run.launcher.dismiss(300);
    ASSERT_TRUE(waitUntil([&] { return run.ended.has_value(); }));
    EXPECT_EQ(run.ended->first, 0);
    EXPECT_FALSE(run.ended->second) << "killed while its queued work ran";
}

TEST(ExtensionLauncher, KillsADismissedExtensionThatFallsSilent) {
    LauncherRun run;
    ASSERT_TRUE(run.launcher.start(echoExtension(), {"--hang-after-dismiss"}, oneItem()));
    ASSERT_TRUE(waitUntil([&] { return !run.reports.isEmpty(); }));
    run.launcher.dismiss(300);
    ASSERT_TRUE(waitUntil([&] { return run.ended.has_value(); }));
    EXPECT_TRUE(run.ended->second);
    EXPECT_EQ(run.launcher.process().exitStatus(), QProcess::CrashExit);
}
