// TXStoreInfo's dictionary and TXStoreManager's record, over a fake service.

#include "ShareFakes.h"
#include "platform/runtime/MainQueue.h"
#include "support/TempDir.h"
#include "support/Wait.h"
#include "youtube/TXStoreManager.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::FakeStoreLookup;

namespace {

class StoreManagerTest : public ::testing::Test {
  protected:
    void SetUp() override {
        QDir().mkpath(dataHome.filePath("applications"));
        QFile entry(dataHome.filePath("applications/org.example.Installed.desktop"));
        ASSERT_TRUE(entry.open(QIODevice::WriteOnly));
        entry.write("[Desktop Entry]\nType=Application\nName=Installed Here\nExec=true\n");
    }

    // Looks `id` up and waits for the completion; counts the calls.
    std::shared_ptr<TXStoreInfo> load(const QString& id) {
        std::shared_ptr<TXStoreInfo> received;
        calls = 0;
        TXStoreManager::sharedManager()->loadItemDetailsForBundleIdentifier_completionHandler(
            id, [&](std::shared_ptr<TXStoreInfo> info) {
                ++calls;
                onMainThread = MainQueue::isCurrent();
                received = std::move(info);
            });
        testing_support::waitUntil([&] { return calls > 0; });
        testing_support::waitUntil([] { return false; }, 50);
        return received;
    }

    QTemporaryDir dataHome;
    testing_support::ScopedEnv env{"XDG_DATA_HOME", dataHome.path().toLocal8Bit()};
    testing_support::ScopedEnv dirs{"XDG_DATA_DIRS", dataHome.filePath("none").toLocal8Bit()};
    std::shared_ptr<FakeStoreLookup> store = std::make_shared<FakeStoreLookup>();
    Implementation<StoreLookup::Maker>::Replacement replacement =
        StoreLookup::implementation().replace([this] { return store; });
    int calls = 0;
    bool onMainThread = false;
};

} // namespace

TEST(StoreInfoDictionary, HoldsPresentPropertiesAndJoinsCategories) {
    TXStoreInfo info;
    info.bundleID = "org.example.Racer";
    info.author = "";
    info.itemURL = "";
    QVariantMap dictionary = info.dictionary();
    EXPECT_EQ(dictionary.value(TXStoreInfoBundleIDKey).toString(), "org.example.Racer");
    EXPECT_TRUE(dictionary.contains(TXStoreInfoAuthorKey)) << "an empty string is present";
    EXPECT_EQ(dictionary.value(TXStoreInfoItemURLKey).toString(), "");
    EXPECT_FALSE(dictionary.contains(TXStoreInfoAppNameKey));
    EXPECT_FALSE(dictionary.contains(TXStoreInfoCategoriesKey));

    info.categories = QStringList{"Games", "Action"};
    EXPECT_EQ(info.dictionary().value(TXStoreInfoCategoriesKey).toString(), "Games,Action");
    info.categories = QStringList{};
    EXPECT_FALSE(info.dictionary().contains(TXStoreInfoCategoriesKey));
    EXPECT_EQ(TXStoreInfoCategoriesKey, "TXStoreInfoCategoriesKey");
    EXPECT_EQ(TXStoreInfoAppNameKey, "TXStoreInfoAppNameKey");
}

TEST_F(StoreManagerTest, AsksForOneIdentifierAndCompletesOnceOnTheMainThread) {
    store->response.results = {testing_support::storeItem(
        "Racer", "Example Games", "https://store.example/apps/org.example.Racer",
        {"Games", "Action"})};
    const auto info = load("org.example.Racer");
    ASSERT_TRUE(info);
    EXPECT_EQ(calls, 1);
    EXPECT_TRUE(onMainThread);
    EXPECT_FALSE(store->calledOnMainThread) << "the fake answers from its own thread";
    EXPECT_EQ(info->bundleID, "org.example.Racer");
    EXPECT_EQ(info->appName, "Racer");
    EXPECT_EQ(info->author, "Example Games");
    EXPECT_EQ(info->itemURL, "https://store.example/apps/org.example.Racer");
    EXPECT_EQ(info->categories, (QStringList{"Games", "Action"}));

    const auto request = store->requests().last();
    EXPECT_EQ(request.profile, StoreLookupRequest::Profile::ProductKey);
    EXPECT_EQ(request.localizationStyle, 1);
    EXPECT_EQ(
        request.parameters.value(StoreLookupRequest::BundleIdentifiersParameter).toStringList(),
        QStringList{"org.example.Racer"});
}

TEST_F(StoreManagerTest, AnUnknownApplicationStillGivesARecord) {
    const auto installed = load("org.example.Installed");
    ASSERT_TRUE(installed);
    EXPECT_EQ(installed->appName, "Installed Here") << "the installed application's own name";
    EXPECT_EQ(installed->author, "");
    EXPECT_EQ(installed->itemURL, "");
    EXPECT_FALSE(installed->categories);
    const QVariantMap dictionary = installed->dictionary();
    EXPECT_EQ(dictionary.value(TXStoreInfoItemURLKey).toString(), "");
    EXPECT_TRUE(dictionary.contains(TXStoreInfoAuthorKey));
    EXPECT_FALSE(dictionary.contains(TXStoreInfoCategoriesKey));

    const auto nowhere = load("org.example.Nowhere");
    ASSERT_TRUE(nowhere);
    EXPECT_FALSE(nowhere->appName) << "neither the store nor this desktop knows it";
    EXPECT_EQ(nowhere->bundleID, "org.example.Nowhere");
}

TEST_F(StoreManagerTest, AFailedLookupTakesThePathOfAnEmptyOne) {
    store->error = makeError(-1, "StoreLookup", "no catalogue answered in time");
    store->response.results = {};
    const auto info = load("org.example.Installed");
    ASSERT_TRUE(info);
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(info->appName, "Installed Here");
    EXPECT_EQ(info->author, "");
}
