#include "support/LogCapture.h"

#include "platform/publishing/PublishingAgent.h"
#include "platform/publishing/PublishingPluginLoader.h"
#include "platform/runtime/ClassRegistry.h"
#include "platform/runtime/MethodTable.h"
#include "platform/services/PublishingPlugin.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"

#include "support/Wait.h"

#include <QApplication>
#include <QVariantMap>
#include <gtest/gtest.h>

using namespace platform;

namespace {

// Stands in for the activity that borrows the form's category preselection.
class Borrower : public QObject {
    Q_OBJECT
};

std::shared_ptr<PublishingAgent> makeAgent() {
    auto loader = PublishingPluginLoader::sharedLoader();
    QString why;
    if (!loader->loadExecutable(PublishingPlugin::youTubePluginPath, &why)) {
        ADD_FAILURE() << why.toStdString();
        return nullptr;
    }
    return ClassRegistry::makeInstance<PublishingAgent>(
        loader->classNamed(PublishingPlugin::youTubeAgentClassName));
}

} // namespace

// The editor loads the plug-in from its device path: in this build tree that
// is build/share/tamsel/System/Library/Publishing, next to the executables.
TEST(PublishingPlugin, LoadsFromItsDevicePathAndItsAgentIsMadeByName) {
    auto loader = PublishingPluginLoader::sharedLoader();
    ASSERT_TRUE(loader->isInstalled(PublishingPlugin::youTubePluginPath));
    auto agent = makeAgent();
    ASSERT_NE(agent, nullptr);
    // Loading again costs nothing and registers nothing twice.
    testing_support::LogCapture log;
    QString why;
    EXPECT_TRUE(loader->loadExecutable(PublishingPlugin::youTubePluginPath, &why));
    EXPECT_TRUE(log.startingWith(QStringLiteral("ClassRegistry")).isEmpty());

    auto navigation = agent->navigationController();
    ASSERT_NE(navigation, nullptr);
    ASSERT_FALSE(navigation->viewControllers().isEmpty());
    QObject* form = navigation->viewControllers().first().get();
    auto* table = form->property("_table").value<QObject*>();
    ASSERT_NE(table, nullptr);
    QObject* description = nullptr;
    ASSERT_TRUE(QMetaObject::invokeMethod(table, "cellForRowAtIndexPath",
                                          Q_RETURN_ARG(QObject*, description), Q_ARG(int, 0),
                                          Q_ARG(int, 1)));
    ASSERT_NE(description, nullptr);
    EXPECT_TRUE(description->setProperty("value", QStringLiteral("T L")));
    EXPECT_EQ(description->property("value").toString(), "T L");
    EXPECT_NE(form->property("_picker").value<QObject*>(), nullptr);
    QObject* categoryCell = nullptr;
    EXPECT_TRUE(
        QMetaObject::invokeMethod(form, "_categoryCell", Q_RETURN_ARG(QObject*, categoryCell)));
    EXPECT_NE(categoryCell, nullptr);
}

// One method table for the host and the plug-in: the form registered its
// operation in the host's table, an exchange made here reaches the form's
// code in the plug-in, and the plug-in's form runs what the host put there.
TEST(PublishingPlugin, SharesTheHostsMethodTableSoAnExchangeReachesTheForm) {
    auto agent = makeAgent();
    ASSERT_NE(agent, nullptr);
    auto navigation = agent->navigationController();
    QObject* form = navigation->viewControllers().first().get();
    const QByteArray operation("_selectComedyPickerRow");
    ASSERT_TRUE(MethodTable::respondsTo(form->metaObject(), operation));

    QVariantList seen;
    MethodTable::addMethod(&Borrower::staticMetaObject, operation,
                           [&](QObject* receiver, const QVariantList&) {
                               seen = receiver->property("_categories").toList();
                               return QVariant();
                           });
    ASSERT_TRUE(MethodTable::exchangeImplementations(form->metaObject(),
                                                     &Borrower::staticMetaObject, operation));
    // Showing the form brings its categories, which runs the operation.
    Window window;
    window.resize(540, 620);
    window.setRootViewController(navigation);
    window.show();
    EXPECT_TRUE(testing_support::waitUntil([&] { return !seen.isEmpty(); }));
    ASSERT_FALSE(seen.isEmpty());
    EXPECT_TRUE(seen.first().toMap().contains(QStringLiteral("id")));
    EXPECT_TRUE(seen.first().toMap().contains(QStringLiteral("label")));
    // Swapped back, the form's own code runs again: a row is selected.
    ASSERT_TRUE(MethodTable::exchangeImplementations(form->metaObject(),
                                                     &Borrower::staticMetaObject, operation));
    MethodTable::invoke(form, operation);
    EXPECT_GE(form->property("_picker").value<QObject*>()->property("selectedRow").toInt(), 0);
}

TEST(PublishingPlugin, APluginBuiltForAnotherAbiVersionIsRefusedAndRegistersNothing) {
    QString why;
    EXPECT_FALSE(PublishingPluginLoader::sharedLoader()->loadExecutable(
        QStringLiteral(TAMSEL_WRONG_ABI_PLUGIN), &why));
    EXPECT_TRUE(why.contains(QStringLiteral("ABI version"))) << why.toStdString();
    EXPECT_EQ(ClassRegistry::classNamed(QStringLiteral("WrongAbiAgent")), nullptr);
}

TEST(PublishingPlugin, AMissingFileIsReportedWithTheLoadersText) {
    QString why;
    EXPECT_FALSE(PublishingPluginLoader::sharedLoader()->loadExecutable(
        QStringLiteral("/System/Library/Publishing/none.so"), &why));
    EXPECT_FALSE(why.isEmpty());
}

#include "PluginLoadTest.moc"
