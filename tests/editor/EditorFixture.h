#pragma once

#include "editor/TXVideoEditorViewController.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"

#include <QTemporaryDir>
#include <gtest/gtest.h>
#include <memory>

// A delegate that records the reports it gets.
struct RecordingEditorDelegate : TXVideoEditorViewControllerDelegate {
    QList<QStringList> reports;
    void videoEditor_didFinishWithActivityTypes(TXVideoEditorViewController*,
                                                const QStringList& types) override {
        reports.append(types);
    }
};

// An editor on a generated recording (ten seconds, 320x240, 30 fps) in a
// device and an album of its own, with the widgets on the offscreen platform.
class EditorTest : public ::testing::Test {
  protected:
    static void SetUpTestSuite();
    static void TearDownTestSuite();
    void SetUp() override;
    void TearDown() override;

    // Makes the editor on `movie` (the landscape recording when empty) and
    // waits for its player item to be ready; false when it never is.
    bool makeEditor(const QString& movie = QString(), const QColor& tint = QColor());

    static QString landscape();
    static QString portrait();

    testing_support::MobileRoot root;
    QTemporaryDir album;
    testing_support::ScopedEnv albumEnv{"TAMSEL_ALBUM_DIR", album.path().toLocal8Bit()};
    std::shared_ptr<TXVideoEditorViewController> editor;
    std::shared_ptr<RecordingEditorDelegate> delegate = std::make_shared<RecordingEditorDelegate>();

    static QTemporaryDir* media;
};
