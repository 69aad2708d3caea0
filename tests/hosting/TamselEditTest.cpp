// The tamsel-edit command as a host application uses it.

#include <QCoreApplication>
#include <QJsonArray>
#include <QJsonDocument>
#include <QProcess>
#include <gtest/gtest.h>

namespace {

struct Result {
    int exitCode = -1;
    QByteArray out, err;
};

Result tamselEdit(const QStringList& arguments) {
    QProcess process;
    process.start(QCoreApplication::applicationDirPath() + "/tamsel-edit", arguments);
    if (!process.waitForFinished(60000))
        process.kill();
    return {process.exitCode(), process.readAllStandardOutput(), process.readAllStandardError()};
}

QString echo() {
    return QCoreApplication::applicationDirPath() + "/tamsel_echo_extension";
}

} // namespace

TEST(TamselEdit, SendsTheInputItemsAndPrintsWhatTheExtensionReports) {
    const Result r = tamselEdit({"--extension", echo(), "rec.mp4", "--app-name", "Racer",
                                 "--tint-color", "#ff8800", "--share-message", ""});
    EXPECT_EQ(r.exitCode, 0) << r.err.toStdString();
    // The echo extension reports the titles of the items it was sent.
    EXPECT_EQ(QJsonDocument::fromJson(r.out).array(),
              QJsonArray({"TXVideoEditorExtensionMovieURLKey", "TXVideoEditorExtensionAppNameKey",
                          "TXVideoEditorExtensionBundleIdentifierKey",
                          "TXVideoEditorExtensionOverrideShareMessageKey",
                          "TXVideoEditorExtensionOverrideTintColorKey"}));
}

TEST(TamselEdit, RefusesNonsenseArguments) {
    for (const QStringList& args : {QStringList{"--tint-color", "not-a-colour"},
                                    QStringList{"--frobnicate"}, QStringList{"a.mp4", "b.mp4"},
                                    QStringList{"--device", "watch"}, QStringList{"--app-name"}}) {
        const Result r = tamselEdit(args);
        EXPECT_EQ(r.exitCode, 2) << args.join(' ').toStdString();
        EXPECT_TRUE(r.err.contains("usage: tamsel-edit")) << args.join(' ').toStdString();
    }
}
