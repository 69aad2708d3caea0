#pragma once

#include "ControlledExportSession.h"
#include "FakePluginLoader.h"
#include "FakePublishingAgent.h"
#include "RecordingUrlOpener.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "youtube/TXYouTubeActivity.h"

#include <QVariantList>
#include <gtest/gtest.h>

#include <optional>
#include <ostream>

// Texts in failure messages as texts.
inline void PrintTo(const QString& text, std::ostream* out) {
    *out << '"' << text.toStdString() << '"';
}

// A YouTube activity as the share sheet holds it, in a temporary device, with
// fakes in place of the export session, the plug-in loader (which answers
// with FakePublishingAgent) and the URL opener. The movie is a real one made
// for the test run.
class ActivityFixture : public ::testing::Test {
  protected:
    ActivityFixture();
    ~ActivityFixture() override;

    // The sheet's items: a share text, a link and the movie.
    QVariantList items() const;
    // Prepares the activity with items() and asks for its controller, as the
    // sheet does once the user picked it.
    std::shared_ptr<platform::ViewController> pick();
    // The host path of the activity's upload file.
    QString movieHostPath() const;

    testing_support::MobileRoot device;
    testing_support::ScopedEnv language; // English unless a test says otherwise
    ControlledExportSessions exports;
    FakePluginLoaderInPlace loader{&FakePublishingAgent::staticMetaObject};
    RecordingUrlOpener opener;
    testing_support::LogCapture log;
    QString moviePath;
    std::shared_ptr<TXYouTubeActivity> activity;
    std::optional<bool> finished; // the completed flag the activity finished with
    int finishes = 0;
};
