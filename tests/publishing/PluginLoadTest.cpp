// The plug-in loader refuses what it cannot use. (The plug-in that loads is
// used end to end by PublishEndToEndTest: the form filled by name, the
// category preselected through the shared method table.)

#include "platform/publishing/PublishingPluginLoader.h"
#include "platform/runtime/ClassRegistry.h"
#include "platform/services/PublishingPlugin.h"

#include <gtest/gtest.h>

using namespace platform;

TEST(PublishingPlugin, AMissingPluginOrOneForAnotherAbiVersionIsRefused) {
    auto loader = PublishingPluginLoader::sharedLoader();
    EXPECT_TRUE(loader->isInstalled(PublishingPlugin::youTubePluginPath)) << "built beside";
    QString why;
    EXPECT_FALSE(
        loader->loadExecutable(QStringLiteral("/System/Library/Publishing/none.so"), &why));
    EXPECT_FALSE(why.isEmpty());
    EXPECT_FALSE(loader->loadExecutable(QStringLiteral(TAMSEL_WRONG_ABI_PLUGIN), &why));
    EXPECT_TRUE(why.contains(QStringLiteral("ABI version"))) << why.toStdString();
    EXPECT_EQ(ClassRegistry::classNamed(QStringLiteral("WrongAbiAgent")), nullptr)
        << "it registers nothing";
}
