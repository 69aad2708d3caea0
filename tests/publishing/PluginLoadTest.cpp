// The publishing plug-in loaded as the editor loads it, from its device path:
// in this build tree build/share/tamsel/System/Library/Publishing.

#include "support/LogCapture.h"
#include "support/Wait.h"

#include "platform/publishing/PublishingAgent.h"
#include "platform/publishing/PublishingPluginLoader.h"
#include "platform/runtime/ClassRegistry.h"
#include "platform/runtime/MethodTable.h"
#include "platform/services/PublishingPlugin.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"

#include <QVariantMap>
#include <gtest/gtest.h>

using namespace platform;

namespace {

// Stands in for the activity that borrows the form's category preselection.
class Borrower : public QObject {
    Q_OBJECT
};

} // namespace

// The agent is made by name, its form's members are readable by name, and
// there is one method table for the host and the plug-in: an exchange made
// here reaches the form's code in the plug-in.
TEST(PublishingPlugin, ItsAgentIsMadeByNameAndSharesTheHostsMethodTable) {
    auto loader = PublishingPluginLoader::sharedLoader();
    ASSERT_TRUE(loader->isInstalled(PublishingPlugin::youTubePluginPath));
    QString why;
    ASSERT_TRUE(loader->loadExecutable(PublishingPlugin::youTubePluginPath, &why))
        << why.toStdString();
    testing_support::LogCapture log;
    EXPECT_TRUE(loader->loadExecutable(PublishingPlugin::youTubePluginPath, &why));
    EXPECT_TRUE(log.startingWith(QStringLiteral("ClassRegistry")).isEmpty())
        << "loading again registers nothing twice";
    auto agent = ClassRegistry::makeInstance<PublishingAgent>(
        loader->classNamed(PublishingPlugin::youTubeAgentClassName));
    ASSERT_NE(agent, nullptr);
    auto navigation = agent->navigationController();
    QObject* form = navigation->viewControllers().value(0).get();
    ASSERT_NE(form, nullptr);
    QObject* description = nullptr;
    ASSERT_TRUE(QMetaObject::invokeMethod(
        form->property("_table").value<QObject*>(), "cellForRowAtIndexPath",
        Q_RETURN_ARG(QObject*, description), Q_ARG(int, 0), Q_ARG(int, 1)));
    ASSERT_NE(description, nullptr);
    EXPECT_TRUE(description->setProperty("value", QStringLiteral("T L")));
    EXPECT_EQ(description->property("value").toString(), "T L");
    QObject* categoryCell = nullptr;
    EXPECT_TRUE(
        QMetaObject::invokeMethod(form, "_categoryCell", Q_RETURN_ARG(QObject*, categoryCell)));
    EXPECT_NE(categoryCell, nullptr);

    const QByteArray operation("_selectComedyPickerRow");
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
    window.setRootViewController(navigation);
    window.show();
    ASSERT_TRUE(testing_support::waitUntil([&] { return !seen.isEmpty(); }));
    EXPECT_TRUE(seen.first().toMap().contains(QStringLiteral("id")));
    EXPECT_TRUE(seen.first().toMap().contains(QStringLiteral("label")));
    // Swapped back, the form's own code runs again: a row is selected.
    ASSERT_TRUE(MethodTable::exchangeImplementations(form->metaObject(),
                                                     &Borrower::staticMetaObject, operation));
    MethodTable::invoke(form, operation);
    EXPECT_GE(form->property("_picker").value<QObject*>()->property("selectedRow").toInt(), 0);
}

TEST(PublishingPlugin, AMissingPluginOrOneForAnotherAbiVersionIsRefused) {
    QString why;
    EXPECT_FALSE(PublishingPluginLoader::sharedLoader()->loadExecutable(
        QStringLiteral("/System/Library/Publishing/none.so"), &why));
    EXPECT_FALSE(why.isEmpty());
    EXPECT_FALSE(PublishingPluginLoader::sharedLoader()->loadExecutable(
        QStringLiteral(TAMSEL_WRONG_ABI_PLUGIN), &why));
    EXPECT_TRUE(why.contains(QStringLiteral("ABI version"))) << why.toStdString();
    EXPECT_EQ(ClassRegistry::classNamed(QStringLiteral("WrongAbiAgent")), nullptr)
        << "it registers nothing";
}

#include "PluginLoadTest.moc"
