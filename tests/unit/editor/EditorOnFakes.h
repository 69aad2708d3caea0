#pragma once

#include "editor/TXVideoEditorViewController.h"
#include "fakes/FakePlatform.h"
#include "fakes/FakePlayer.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"

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

// The editor on real widgets (offscreen) and fake media: the recording is a
// ten-second 320x240 movie that exists only in the fake world, the device has
// a temporary mobile root, and the layout is the tablet's unless a test says
// otherwise.
class EditorOnFakes : public ::testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;

    // Builds the editor on `url` (the recording when empty) and runs the main
    // queue until its item has loaded.
    void makeEditor(const QColor& tint = QColor(), const QUrl& url = QUrl());
    // Runs what the main queue holds, as the event loop would.
    static void settle();
    // Lets the worker queues finish, then the main queue.
    static void drainQueues();

    fakes::FakePlayer& player() const;
    // A bar's items in short: buttons without "Button", "|" a flexible and
    // "-" a fixed space ("cancel | title | share - save").
    std::string top() const { return bar(*editor->topToolBar); }
    std::string bottom() const { return bar(*editor->bottomToolBar); }
    std::string bar(const platform::Toolbar& toolbar) const;
    // Every file under the mobile root, the editor's temporary directory
    // included.
    QStringList filesOnDevice() const;

    static const QUrl recording;

    testing_support::MobileRoot root;
    testing_support::LogCapture log;
    fakes::FakePlatform fakes;
    std::shared_ptr<TXVideoEditorViewController> editor;
    std::shared_ptr<RecordingEditorDelegate> delegate = std::make_shared<RecordingEditorDelegate>();
};
