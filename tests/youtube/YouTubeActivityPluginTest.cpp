// A device without the publishing plug-in, or with a plug-in that lacks the
// agent class, stops the process when the activity first needs the agent.

#include "ActivityFixture.h"

namespace {

class DeathFixture : public ActivityFixture {
  protected:
    void SetUp() override { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

} // namespace

TEST_F(DeathFixture, APluginThatDoesNotLoadStopsTheProcessWithTheLoadersText) {
    EXPECT_DEATH(
        {
            FakePluginLoaderInPlace broken(
                nullptr, QStringLiteral("libtamsel-youtube-publishing.so: cannot open shared "
                                        "object file: No such file or directory"));
            activity->prepareWithActivityItems(items());
            activity->activityViewController();
        },
        "libtamsel-youtube-publishing.so: cannot open shared object file: No such file or "
        "directory");
}

TEST_F(DeathFixture, APluginWithoutTheAgentClassStopsTheProcess) {
    EXPECT_DEATH(
        {
            FakePluginLoaderInPlace classless(nullptr);
            activity->prepareWithActivityItems(items());
            activity->activityViewController();
        },
        "Unable to find class YouTubePublishingAgent");
}
