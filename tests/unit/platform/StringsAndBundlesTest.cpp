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

namespace {
void write(const QString& path, const QByteArray& bytes) {
    QDir().mkpath(QFileInfo(path).absolutePath());
    QFile file(path);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(bytes);
}
} // namespace

TEST(StringsTable, ReadsQuotedAndBareKeysCommentsEscapesAndUtf16AndRefusesMalformedTablesWhole) {
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

    for (const char* text :
         {R"("A" = "unterminated;)", R"("A" "B";)", R"("A" = "B")", R"("A" = ;)", "= \"x\";"})
        EXPECT_FALSE(parseStrings(QString::fromUtf8(text))) << text;
    EXPECT_TRUE(parseStrings(""));
    EXPECT_FALSE(readStringsFile("/nonexistent/Localizable.strings"));

    QTemporaryDir dir;
    QStringEncoder encoder(QStringEncoder::Utf16LE, QStringEncoder::Flag::WriteBom);
    write(dir.filePath("t.strings"), encoder(QStringLiteral("\"KEY\" = \"Grüße\";")));
    const auto utf16 = readStringsFile(dir.filePath("t.strings"));
    ASSERT_TRUE(utf16);
    EXPECT_EQ(utf16->value("KEY").toString(), QStringLiteral("Grüße"));
}

TEST(PreferredLanguages, FollowGettextOrder) {
    ScopedEnv env;
    const struct {
        const char *all, *messages, *language, *lang;
        QStringList expected;
    } cases[] = {
        {nullptr, nullptr, nullptr, "de_AT.UTF-8", {"de-AT"}},
        {nullptr, nullptr, "fr_CA:de::fr_CA", "de_AT.UTF-8", {"fr-CA", "de"}},
        {nullptr, "ja_JP.UTF-8", nullptr, "de_AT.UTF-8", {"ja-JP"}},
        {"es_ES.UTF-8@euro", "ja_JP.UTF-8", nullptr, "de_AT.UTF-8", {"es-ES"}},
        {"C", "ja_JP.UTF-8", "de", "de_AT.UTF-8", {}}, // LANGUAGE means nothing in C
        {"POSIX", "ja_JP.UTF-8", "de", "de_AT.UTF-8", {}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.expected.join(',').toStdString());
        for (auto [name, value] : {std::pair{"LC_ALL", c.all},
                                   {"LC_MESSAGES", c.messages},
                                   {"LANGUAGE", c.language},
                                   {"LANG", c.lang}})
            value ? env.set(name, value) : env.unset(name);
        EXPECT_EQ(preferredLanguages(), c.expected);
    }
}

TEST(Bundle, LooksUpTablesInPreferredLocalizationsThenEnglish) {
    QTemporaryDir dir;
    write(dir.filePath("B.bundle/en.lproj/Localizable.strings"), R"("A" = "en A"; "B" = "en B";)");
    write(dir.filePath("B.bundle/de.lproj/Localizable.strings"), R"("A" = "de A";)");
    write(dir.filePath("B.bundle/pt-BR.lproj/Localizable.strings"), R"("A" = "pt-BR A";)");
    write(dir.filePath("B.bundle/de.lproj/Other.strings"), R"("A" = "de other A";)");
    write(dir.filePath("B.bundle/de.lproj/Broken.strings"), R"("A" = )");
    auto bundle = Bundle::bundleWithPath(dir.filePath("B.bundle"));
    ASSERT_TRUE(bundle);
    EXPECT_EQ(bundle, Bundle::bundleWithPath(dir.filePath("B.bundle")));
    EXPECT_FALSE(Bundle::bundleWithPath(dir.filePath("missing.bundle")));

    ScopedEnv env("LANG", "de_CH.UTF-8");
    env.unset("LC_ALL");
    env.unset("LC_MESSAGES");
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
    EXPECT_EQ(names, (QHash<QString, QString>{{"de-AT", "Rennwagen"}, {"ja", "レーサー"}}));
    EXPECT_FALSE(DesktopEntry::parse("Name=No group\n"));
}
