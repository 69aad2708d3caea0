// The framework's string tables: every language has every key, and the share
// text takes the application's name and its developer's.

#include "platform/runtime/DevicePaths.h"
#include "platform/services/StringsTable.h"

#include <QDir>
#include <gtest/gtest.h>

TEST(FrameworkStrings, EveryLanguageHasEveryKey) {
    const QDir framework(
        platform::DevicePaths::toHost("/System/Library/Frameworks/Tamsel.framework"));
    const QStringList languages = framework.entryList({"*.lproj"}, QDir::Dirs);
    ASSERT_GE(languages.size(), 2) << framework.path().toStdString();
    QSet<QString> all;
    QHash<QString, QVariantMap> tables;
    for (const QString& language : languages) {
        const auto table =
            platform::readStringsFile(framework.filePath(language + "/Localizable.strings"));
        ASSERT_TRUE(table) << language.toStdString();
        tables.insert(language, *table);
        for (const QString& key : table->keys())
            all.insert(key);
    }
    ASSERT_TRUE(all.contains("SHARE_TEXT_FORMAT"));
    for (const QString& language : languages) {
        for (const QString& key : all)
            EXPECT_TRUE(tables[language].contains(key))
                << language.toStdString() << " lacks " << key.toStdString();
        EXPECT_EQ(tables[language].value("SHARE_TEXT_FORMAT").toString().count("%@"), 2)
            << language.toStdString();
    }
}
