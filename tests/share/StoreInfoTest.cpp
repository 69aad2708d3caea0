// TXStoreInfo's dictionary and TXStoreManager's record, over a fake service.

#include "ShareFakes.h"
#include "platform/runtime/MainQueue.h"
#include "support/TempDir.h"
#include "support/Wait.h"
#include "youtube/TXStoreManager.h"

#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;

namespace {

class StoreManagerTest : public ::testing::Test {
  protected:
    void SetUp() override {
        testing_support::writeText(
            dataHome.filePath("applications/org.example.Installed.desktop"),
            "[Desktop Entry]\nType=Application\nName=Installed Here\nExec=true\n");
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
    testing_support::InPlace<StoreLookup, testing_support::FakeStoreLookup> store;
    int calls = 0;
    bool onMainThread = false;
};

} // namespace

TEST_F(StoreManagerTest, AsksForOneIdentifierAndCompletesOnceOnTheMainThread) {
    store->response.results = {testing_support::storeItem(
        "Racer", "Example Games", "https://store.example/apps/org.example.Racer",
        {"Games", "Action"})};
    const auto info = load("org.example.Racer");
    ASSERT_TRUE(info);
    EXPECT_EQ(calls, 1);
    EXPECT_TRUE(onMainThread);
    const auto request = store->requests.value(0);
    EXPECT_EQ(request.profile, StoreLookupRequest::Profile::ProductKey);
    EXPECT_EQ(request.localizationStyle, 1);
    EXPECT_EQ(
        request.parameters.value(StoreLookupRequest::BundleIdentifiersParameter).toStringList(),
        QStringList{"org.example.Racer"});
    EXPECT_EQ(info->dictionary(), (QVariantMap{{"TXStoreInfoBundleIDKey", "org.example.Racer"},
                                               {"TXStoreInfoAppNameKey", "Racer"},
                                               {"TXStoreInfoAuthorKey", "Example Games"},
                                               {"TXStoreInfoItemURLKey",
                                                "https://store.example/apps/org.example.Racer"},
                                               {"TXStoreInfoCategoriesKey", "Games,Action"}}));
    info->categories = QStringList{};
    EXPECT_FALSE(info->dictionary().contains(TXStoreInfoCategoriesKey)) << "an empty list";
}

// An empty answer and a failed lookup take the same path: a record all the
// same, with empty strings where the store would have spoken.
TEST_F(StoreManagerTest, AnUnknownApplicationStillGivesARecord) {
    for (const bool fails : {false, true}) {
        SCOPED_TRACE(fails ? "failed" : "empty");
        store->error = fails ? makeError(-1, "StoreLookup", "no catalogue answered") : nullptr;
        const auto installed = load("org.example.Installed");
        ASSERT_TRUE(installed);
        EXPECT_EQ(calls, 1);
        EXPECT_EQ(installed->dictionary(),
                  (QVariantMap{{"TXStoreInfoBundleIDKey", "org.example.Installed"},
                               {"TXStoreInfoAppNameKey", "Installed Here"},
                               {"TXStoreInfoAuthorKey", ""},
                               {"TXStoreInfoItemURLKey", ""}}))
            << "the installed application's own name";
        const auto nowhere = load("org.example.Nowhere");
        ASSERT_TRUE(nowhere);
        EXPECT_FALSE(nowhere->dictionary().contains(TXStoreInfoAppNameKey))
            << "neither the store nor this desktop knows it";
    }
}
