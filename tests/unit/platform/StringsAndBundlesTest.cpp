#include "platform/services/Bundle.h"
#include "platform/services/DesktopEntry.h"
#include "platform/services/PreferredLanguages.h"
#include "platform/services/StringsTable.h"
#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QStringEncoder>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::ScopedEnv;

TEST(StringsTable, ReadsQuotedAndBareKeysCommentsAndEscapes) {
    const auto table = parseStrings(QStringLiteral(R"(/* header
   spanning lines */
"GREETING" = "Hello, \"%@\"!";   // trailing comment
BARE_KEY = "a\nb\tc\\d";
"UNI" = "\U00e9t\u00e9";
"EMPTY" = "";
)"));
    ASSERT_TRUE(table);
    EXPECT_EQ(table->value("GREETING").toString(), QStringLiteral("Hello, \"%@\"!"));
    EXPECT_EQ(table->value("BARE_KEY").toString(), QStringLiteral("a\nb\tc\\d"));
    EXPECT_EQ(table->value("UNI").toString(), QStringLiteral("été"));
    EXPECT_TRUE(table->contains("EMPTY"));
    EXPECT_EQ(table->size(), 4);
}

TEST(StringsTable, MalformedTablesAreRefusedWhole) {
    for (const char* text :
         {R"("A" = "unterminated;)", R"("A" "B";)", R"("A" = "B")", R"("A" = ;)", "= \"x\";"})
        EXPECT_FALSE(parseStrings(QString::fromUtf8(text))) << text;
    EXPECT_TRUE(parseStrings(""));
    EXPECT_FALSE(readStringsFile("/nonexistent/Localizable.strings"));
}

TEST(StringsTable, ReadsUtf16FilesWithAByteOrderMark) {
    QTemporaryDir dir;
    QFile file(dir.filePath("t.strings"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    QStringEncoder encoder(QStringEncoder::Utf16LE, QStringEncoder::Flag::WriteBom);
    file.write(encoder(QStringLiteral("\"KEY\" = \"Grüße\";")));
    file.close();
    const auto table = readStringsFile(file.fileName());
    ASSERT_TRUE(table);
    EXPECT_EQ(table->value("KEY").toString(), QStringLiteral("Grüße"));
}

TEST(PreferredLanguages, FollowGettextOrder) {
    ScopedEnv env;
    env.unset("LC_ALL");
    env.unset("LC_MESSAGES");
    env.unset("LANGUAGE");
    env.set("LANG", "de_AT.UTF-8");
    EXPECT_EQ(preferredLanguages(), QStringList{"de-AT"});

    env.set("LANGUAGE", "fr_CA:de::fr_CA");
    EXPECT_EQ(preferredLanguages(), (QStringList{"fr-CA", "de"}));

    env.set("LC_MESSAGES", "ja_JP.UTF-8");
    env.unset("LANGUAGE");
    EXPECT_EQ(preferredLanguages(), QStringList{"ja-JP"});
    env.set("LC_ALL", "es_ES.UTF-8@euro");
    EXPECT_EQ(preferredLanguages(), QStringList{"es-ES"});

    // LANGUAGE means nothing in the C locale.
    env.set("LC_ALL", "C");
    env.set("LANGUAGE", "de");
    EXPECT_TRUE(preferredLanguages().isEmpty());
    env.set("LC_ALL", "POSIX");
    EXPECT_TRUE(preferredLanguages().isEmpty());
}

TEST(Bundle, LooksUpTablesInPreferredLocalizationsThenEnglish) {
    QTemporaryDir dir;
    auto write = [&](const QString& rel, const QByteArray& text) {
        QDir().mkpath(QFileInfo(dir.filePath(rel)).absolutePath());
        QFile f(dir.filePath(rel));
        ASSERT_TRUE(f.open(QIODevice::WriteOnly));
        f.write(text);
    };
    write("B.bundle/en.lproj/Localizable.strings", "\"A\" = \"en A\"; \"B\" = \"en B\";");
    write("B.bundle/de.lproj/Localizable.strings", "\"A\" = \"de A\";");
    write("B.bundle/pt-BR.lproj/Localizable.strings", "\"A\" = \"pt-BR A\";");
    write("B.bundle/de.lproj/Other.strings", "\"A\" = \"de other A\";");
    write("B.bundle/de.lproj/Broken.strings", "\"A\" = ");
    auto bundle = Bundle::bundleWithPath(dir.filePath("B.bundle"));
    ASSERT_TRUE(bundle);
    EXPECT_EQ(bundle, Bundle::bundleWithPath(dir.filePath("B.bundle")));
    EXPECT_FALSE(Bundle::bundleWithPath(dir.filePath("missing.bundle")));

    ScopedEnv env;
    env.unset("LC_ALL");
    env.unset("LC_MESSAGES");
    env.set("LANG", "de_CH.UTF-8");
    env.set("LANGUAGE", "de_CH:pt_BR");
    EXPECT_EQ(bundle->preferredLocalizations(), (QStringList{"de", "pt-BR", "en"}));
    EXPECT_EQ(bundle->localizedStringForKey("A", "", ""), "de A");
    EXPECT_EQ(bundle->localizedStringForKey("B", "", "Localizable"), "en B");
    EXPECT_EQ(bundle->localizedStringForKey("A", "", "Other"), "de other A");
    EXPECT_EQ(bundle->localizedStringForKey("A", "", "Broken"), "A");
    EXPECT_EQ(bundle->localizedStringForKey("C", "fallback", ""), "fallback");
    EXPECT_EQ(bundle->localizedStringForKey("C", "", ""), "C");
    EXPECT_FALSE(bundle->pathForResource("Localizable", "strings", "", "de").isEmpty());
    EXPECT_TRUE(bundle->pathForResource("Localizable", "strings", "", "fr").isEmpty());
}

TEST(DesktopEntry, ReadsTheMainGroupWithLocalizedKeysAndEscapes) {
    const auto entry = DesktopEntry::parse(QStringLiteral(
        "# comment\n[Other]\nName=Wrong\n[Desktop Entry]\nName = "
        "Racer\\sDeluxe\nName[de_AT@euro]=Rennwagen\n"
        "Name[ja]=レーサー\nName=Duplicate\nComment=a\\nb\n[Desktop Action New]\nName=New\n"));
    ASSERT_TRUE(entry);
    EXPECT_EQ(entry->value("Name"), "Racer Deluxe");
    EXPECT_EQ(entry->value("Comment"), "a\nb");
    const auto names = entry->localizedValues("Name");
    EXPECT_EQ(names.value("de-AT"), "Rennwagen");
    EXPECT_EQ(names.value("ja"), "レーサー");
    EXPECT_EQ(names.size(), 2);
    EXPECT_FALSE(DesktopEntry::parse("Name=No group\n"));
}
