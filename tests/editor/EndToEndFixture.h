#pragma once

#include "support/TempDir.h"

#include <QByteArray>
#include <QJsonObject>
#include <QProcess>
#include <QSize>
#include <QString>
#include <QStringList>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using testing_support::hashOf;

// What the host prints when the user saved to the album and left.
inline const QByteArray kSavedToAlbumReport = "[\"org.tamsel.activity.SaveToAlbum\"]";

// Runs tamsel-edit with an automation script on a generated recording, in a
// device, an album and a temporary directory of its own.
class EndToEnd : public ::testing::Test {
  protected:
    struct Run {
        int exitCode = -1;
        QByteArray out, err;
        QList<QJsonObject> dumps; // the script's dump lines, in order
        QByteArray hostReport;    // the last line: what the host received
    };

    static void SetUpTestSuite();
    static void TearDownTestSuite();

    // Runs the script on `movie` (the suite's ten-second recording when
    // empty); `extra` go to tamsel-edit.
    Run edit(const QString& script, const QString& movie = QString(), const QStringList& extra = {},
             const QProcessEnvironment& env = {});

    // Runs the same under a fresh X server (xvfb-run) of the given screen
    // size; `run.exitCode` is -1 and `skipped` set when there is no xvfb-run.
    Run editUnderXvfb(const QString& script, const QSize& screen, const QStringList& extra = {},
                      const QProcessEnvironment& env = {}, bool* skipped = nullptr);

    // Starts what edit() runs without waiting for it, for tests that kill
    // one side.
    void start(QProcess& host, const QString& script, const QString& movie = QString(),
               const QStringList& extra = {}, const QProcessEnvironment& env = {});

    QStringList albumFiles() const;
    // Everything in the temporary store, in its folders too, hidden or not.
    QStringList tempFiles() const;
    // Either nothing in the album, or whole clips only: each one opens and
    // lasts about `seconds`; nothing hidden, no temporary name.
    void expectWholeClipsOnly(double seconds) const;
    static QString recording() { return dir->filePath("recording.mp4"); }

    static QTemporaryDir* dir;
    QTemporaryDir mobile;
    QTemporaryDir album;
    // A command that tamsel-edit runs under (prlimit ..., say); none when empty.
    QStringList launchPrefix;

  private:
    QStringList xvfbCommand_;
};
