// The store-lookup service's two catalogues and how their answers combine.

#include "LocalHttpServer.h"
#include "platform/services/store/AppStreamCatalogue.h"
#include "platform/services/store/CatalogueStoreLookup.h"
#include "platform/services/store/RemoteCatalogue.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

const char* kCollection = R"(<?xml version="1.0" encoding="UTF-8"?>
<components version="0.14" origin="tamsel-test">
  <component type="desktop-application">
    <id>org.example.Racer</id>
    <name>Racer</name>
    <name xml:lang="de">Renner</name>
    <summary>Races</summary>
    <developer_name>Example Games</developer_name>
    <categories><category>Game</category><category>ActionGame</category></categories>
  </component>
  <component type="desktop-application">
    <id>org.example.Notes.desktop</id>
    <name>Notes</name>
    <summary>Notes</summary>
  </component>
  <component type="desktop-application">
    <id>com.example.painter</id>
    <name>Painter</name>
    <summary>Paints</summary>
    <developer_name>Brush Works</developer_name>
    <launchable type="desktop-id">org.example.Painter.desktop</launchable>
  </component>
</components>
)";

const char* kMetainfo = R"(<?xml version="1.0" encoding="UTF-8"?>
<component type="desktop-application">
  <id>org.example.Meta</id>
  <metadata_license>CC0-1.0</metadata_license>
  <name>Meta App</name>
  <summary>Installed with its metainfo only</summary>
  <developer_name>Meta Makers</developer_name>
</component>
)";

void write(const QString& path, const QByteArray& text) {
    QDir().mkpath(QFileInfo(path).path());
    QFile file(path);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(text);
}

// Answers from a test: set once, read on the service thread.
class ScriptedCatalogue final : public StoreCatalogue {
  public:
    std::optional<StoreRecord> record;
    bool answers = true;
    void lookupApplication(const QString&, Done done) override {
        if (answers)
            done(record);
    }
};

struct Outcome {
    bool called = false;
    int calls = 0;
    StoreLookupResponse response;
    ErrorPtr error;
};

StoreLookupRequest requestFor(const QString& id) {
    StoreLookupRequest request;
    request.parameters.insert(StoreLookupRequest::BundleIdentifiersParameter, QStringList{id});
    return request;
}

// Starts a lookup and waits (on the event loop) for its one callback.
std::shared_ptr<Outcome> lookUp(StoreLookup& lookup, const QString& id) {
    auto outcome = std::make_shared<Outcome>();
    lookup.startRequest(requestFor(id), [outcome](const StoreLookupResponse& r, ErrorPtr e) {
        QMetaObject::invokeMethod(qApp, [outcome, r, e] {
            outcome->called = true;
            ++outcome->calls;
            outcome->response = r;
            outcome->error = e;
        });
    });
    waitUntil([&] { return outcome->called; }, 15000);
    return outcome;
}

QVariantMap firstItem(const Outcome& outcome) {
    return outcome.response.results.isEmpty() ? QVariantMap()
                                              : outcome.response.results.first().toMap();
}

class CatalogueTest : public ::testing::Test {
  protected:
    void SetUp() override {
        write(catalogue.filePath("collection/test.xml"), kCollection);
        write(catalogue.filePath("metainfo/org.example.Meta.metainfo.xml"), kMetainfo);
    }
    std::shared_ptr<AppStreamCatalogue> appStream() {
        return std::make_shared<AppStreamCatalogue>(
            QStringList{catalogue.filePath("collection"), catalogue.filePath("metainfo")});
    }
    QTemporaryDir catalogue;
    testing_support::ScopedEnv locale{"LANGUAGE", ""};
    testing_support::ScopedEnv lang{"LC_ALL", "C"};
};

} // namespace

TEST_F(CatalogueTest, AppStreamFindsAnApplicationByIdDesktopIdOrLaunchable) {
    auto local = appStream();
    const auto racer = local->lookupNow("org.example.Racer");
    ASSERT_TRUE(racer);
    EXPECT_EQ(racer->name, "Racer");
    EXPECT_EQ(racer->developerName, "Example Games");
    EXPECT_EQ(racer->categories, (QStringList{"Game", "ActionGame"}));
    EXPECT_EQ(racer->storeLink, "appstream://org.example.Racer");

    const auto notes = local->lookupNow("org.example.Notes");
    ASSERT_TRUE(notes) << "found with .desktop added";
    EXPECT_EQ(notes->storeLink, "appstream://org.example.Notes.desktop");
    EXPECT_TRUE(notes->developerName.isEmpty());

    const auto painter = local->lookupNow("org.example.Painter");
    ASSERT_TRUE(painter) << "found by its desktop-file launchable";
    EXPECT_EQ(painter->name, "Painter");

    const auto meta = local->lookupNow("org.example.Meta");
    ASSERT_TRUE(meta) << "a folder of metainfo files is read too";
    EXPECT_EQ(meta->developerName, "Meta Makers");

    EXPECT_FALSE(local->lookupNow("org.example.Unknown"));
}

TEST_F(CatalogueTest, AppStreamNamesFollowTheUsersLanguage) {
    testing_support::ScopedEnv german("LC_ALL", "de_AT.UTF-8");
    const auto racer = appStream()->lookupNow("org.example.Racer");
    ASSERT_TRUE(racer);
    EXPECT_EQ(racer->name, "Renner");
}

TEST_F(CatalogueTest, AnEmptyCatalogueKnowsNothing) {
    QTemporaryDir empty;
    AppStreamCatalogue local({empty.path()});
    EXPECT_FALSE(local.lookupNow("org.example.Racer"));
}

TEST(RemoteCatalogueAnswer, ReadsNameDeveloperAndCategoriesAndLinksTheWebPage) {
    const QUrl base("https://store.example/");
    auto record = RemoteCatalogue::parseAnswer(
        R"({"id":"org.example.Racer","name":"Racer","developer_name":"Example Games",
            "categories":["Game","ActionGame"],"summary":"Races"})",
        base, "org.example.Racer", nullptr);
    ASSERT_TRUE(record);
    EXPECT_EQ(record->name, "Racer");
    EXPECT_EQ(record->developerName, "Example Games");
    EXPECT_EQ(record->categories, (QStringList{"Game", "ActionGame"}));
    EXPECT_EQ(record->storeLink, "https://store.example/apps/org.example.Racer");

    record = RemoteCatalogue::parseAnswer(R"({"name":"Racer","developer":{"name":"Ex"}})", base,
                                          "org.example.Racer", nullptr);
    ASSERT_TRUE(record);
    EXPECT_EQ(record->developerName, "Ex") << "the newer form of the developer";
    EXPECT_TRUE(record->categories.isEmpty());

    QString why;
    EXPECT_FALSE(RemoteCatalogue::parseAnswer("<html>busy</html>", base, "x", &why));
    EXPECT_FALSE(why.isEmpty());
    EXPECT_FALSE(RemoteCatalogue::parseAnswer("[1,2]", base, "x", nullptr));
    EXPECT_FALSE(RemoteCatalogue::parseAnswer(R"({"summary":"no name"})", base, "x", nullptr));
}

// The real service, its remote catalogue talking HTTP to a local server.
class StoreServiceTest : public CatalogueTest {
  protected:
    std::shared_ptr<CatalogueStoreLookup> service(std::chrono::milliseconds deadline) {
        const QUrl base = server.baseUrl();
        return std::make_shared<CatalogueStoreLookup>(
            [this] { return appStream(); },
            [base] { return std::make_shared<RemoteCatalogue>(base); }, deadline);
    }
    testing_support::LocalHttpServer server;
    testing_support::LogCapture log;
};

TEST_F(StoreServiceTest, TheRemoteAnswerWins) {
    server.answer("/api/v2/appstream/org.example.Racer", 200,
                  R"({"name":"Racer Online","developer_name":"Example Games Ltd",
                      "categories":["Game"]})");
    const auto outcome = lookUp(*service(std::chrono::milliseconds(2500)), "org.example.Racer");
    ASSERT_TRUE(outcome->called);
    const QVariantMap item = firstItem(*outcome);
    EXPECT_EQ(item.value(StoreItemKey::displayName).toString(), "Racer Online");
    EXPECT_EQ(item.value(StoreItemKey::artistName).toString(), "Example Games Ltd");
    EXPECT_EQ(item.value(StoreItemKey::genreNames).toStringList(), QStringList{"Game"});
    EXPECT_EQ(item.value(StoreItemKey::shortProductURL).toString(),
              server.baseUrl().toString() + "/apps/org.example.Racer");
    EXPECT_EQ(server.requests(), QStringList{"/api/v2/appstream/org.example.Racer"});
}

TEST_F(StoreServiceTest, GarbageOrAnUnknownApplicationFallsBackToTheDesktopsCatalogue) {
    server.answer("/api/v2/appstream/org.example.Racer", 200, "<html>502 bad gateway</html>");
    auto outcome = lookUp(*service(std::chrono::milliseconds(2500)), "org.example.Racer");
    EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::displayName).toString(), "Racer");
    EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::shortProductURL).toString(),
              "appstream://org.example.Racer");

    // Not on the remote store (404): the desktop's catalogue still knows it.
    outcome = lookUp(*service(std::chrono::milliseconds(2500)), "org.example.Meta");
    EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::artistName).toString(), "Meta Makers");

    // Known nowhere: no result, no error.
    outcome = lookUp(*service(std::chrono::milliseconds(2500)), "org.example.Nowhere");
    EXPECT_TRUE(outcome->response.results.isEmpty());
    EXPECT_FALSE(outcome->error);
}

TEST_F(StoreServiceTest, AServerThatNeverAnswersDoesNotHoldTheAnswerBack) {
    server.neverAnswer("/api/v2/appstream/org.example.Racer");
    auto lookup = service(std::chrono::milliseconds(300));
    const auto outcome = lookUp(*lookup, "org.example.Racer");
    ASSERT_TRUE(outcome->called);
    EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::displayName).toString(), "Racer");
    // Exactly once, also when the remote answer would come later.
    QCoreApplication::processEvents();
    EXPECT_EQ(outcome->calls, 1);
}

TEST_F(StoreServiceTest, ASlowAnswerAfterTheDeadlineIsNotUsedAndNotDeliveredTwice) {
    server.answerSlowly("/api/v2/appstream/org.example.Racer", 800, R"({"name":"Too Late"})");
    auto lookup = service(std::chrono::milliseconds(200));
    const auto outcome = lookUp(*lookup, "org.example.Racer");
    EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::displayName).toString(), "Racer");
    waitUntil([&] { return server.answered() > 0; }, 5000);
    waitUntil([] { return false; }, 200);
    EXPECT_EQ(outcome->calls, 1);
}

TEST(CatalogueStoreLookupRule, WaitsForTheRemoteUntilTheDeadlineAndReportsSilence) {
    auto local = std::make_shared<ScriptedCatalogue>();
    local->record = StoreRecord{"Local", "Dev", {}, "appstream://x"};
    auto silent = std::make_shared<ScriptedCatalogue>();
    silent->answers = false;
    {
        CatalogueStoreLookup lookup([local] { return local; }, [silent] { return silent; },
                                    std::chrono::milliseconds(100));
        const auto outcome = lookUp(lookup, "x");
        EXPECT_EQ(firstItem(*outcome).value(StoreItemKey::displayName).toString(), "Local");
        EXPECT_FALSE(outcome->error) << "the local catalogue answered";
    }
    {
        auto silentLocal = std::make_shared<ScriptedCatalogue>();
        silentLocal->answers = false;
        CatalogueStoreLookup lookup([silentLocal] { return silentLocal; }, {},
                                    std::chrono::milliseconds(100));
        const auto outcome = lookUp(lookup, "x");
        ASSERT_TRUE(outcome->called) << "the deadline answers for catalogues that do not";
        EXPECT_TRUE(outcome->response.results.isEmpty());
        EXPECT_TRUE(outcome->error);
    }
}
