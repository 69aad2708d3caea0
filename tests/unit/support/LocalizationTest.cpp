// Framework strings in the user's language, application display names and
// the date line, against the string tables the product ships.

#include "support/BundleTXExtensions.h"
#include "support/DateTXExtensions.h"
#include "support/FrameworkStrings.h"
#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QLocale>
#include <QTemporaryDir>
#include <gtest/gtest.h>
#include <time.h>

using testing_support::ScopedEnv;

namespace {

// Sets the user's language environment for one test.
struct Languages : ScopedEnv {
    explicit Languages(const char* lang, const char* language = nullptr) {
        unset("LC_ALL");
        unset("LC_MESSAGES");
        set("LANG", lang);
        if (language)
            set("LANGUAGE", language);
        else
            unset("LANGUAGE");
    }
};

QString localized(const QString& key) {
    return BundleTXExtensions::_txLocalizedStringFromFrameworkBundleWithKey_bundleID(
        key, "org.example.Racer");
}

void writeText(const QString& path, const QByteArray& text) {
    QDir().mkpath(QFileInfo(path).absolutePath());
    QFile file(path);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(text);
}

} // namespace

// A region falls back to its plain language; without languages or a match
// the framework's own lookup decides, which walks the rest of the list
// after the first preferred language, tried by name. The photo framework's
// tables are searched in order (the title format is only in the last).
TEST(FrameworkStrings, AreLookedUpInTheUsersLanguage) {
    const struct {
        const char *lang, *language, *key, *expected;
        bool photos;
    } cases[] = {
        {"de_AT.UTF-8", nullptr, "DONE", "Fertig", false},
        {"C", nullptr, "SAVE", "Save", false},
        {"C", nullptr, "NO_SUCH_KEY", "NO_SUCH_KEY", false},
        {"it_IT.UTF-8", "it:ja", "CANCEL", "キャンセル", false},
        {"de_DE.UTF-8", nullptr, "NO_SUCH_KEY", "NO_SUCH_KEY", false},
        {"de_DE.UTF-8", nullptr, "CLOSE", "Schließen", true},
        {"de_DE.UTF-8", nullptr, "VIEW_BUTTON_TITLE_FORMAT", "Auf %@ ansehen", true},
        {"de_DE.UTF-8", nullptr, "NOT_A_KEY", "NOT_A_KEY", true},
    };
    for (const auto& c : cases) {
        Languages env(c.lang, c.language);
        EXPECT_EQ(c.photos ? TXLocalizedFrameworkString(c.key) : localized(c.key),
                  QString::fromUtf8(c.expected))
            << c.lang << " " << c.key;
    }
    Languages env("de_AT.UTF-8");
    EXPECT_EQ(BundleTXExtensions::_txLocalizedStringFromFrameworkBundleWithKey_bundleID(
                  "DONE", "any.other.id"),
              QStringLiteral("Fertig"))
        << "the bundle identifier does not change the text";
}

TEST(FrameworkStrings, EveryShippedLanguageHasEveryKey) {
    const auto english = BundleTXExtensions::localizedDictionaryForLanguage("en");
    ASSERT_TRUE(english);
    for (const char* key : {"SHARE_TEXT_FORMAT", "DONE", "CANCEL", "SAVE"})
        EXPECT_TRUE(english->contains(key)) << key;
    EXPECT_EQ(english->value("SHARE_TEXT_FORMAT").toString().count("%@"), 2);
    for (const char* language : {"de", "fr", "es", "ja"}) {
        SCOPED_TRACE(language);
        const auto table = BundleTXExtensions::localizedDictionaryForLanguage(language);
        ASSERT_TRUE(table);
        EXPECT_EQ(table->keys(), english->keys());
        EXPECT_EQ(table->value("SHARE_TEXT_FORMAT").toString().count("%@"), 2);
    }
    EXPECT_FALSE(BundleTXExtensions::localizedDictionaryForLanguage("xx"));

    const auto photos = TXQuillonFrameworkBundle();
    ASSERT_TRUE(photos);
    for (const char* language : {"en", "de", "fr", "es", "ja"}) {
        Languages env((QByteArray(language) + "_XX.UTF-8").constData());
        for (const char* key :
             {"PUBLISHED_VIDEO", "VIEW_BUTTON_TITLE_FORMAT", "FAILED_PUBLISH_VIDEO", "CLOSE"})
            EXPECT_NE(TXLocalizedFrameworkString(key), QString::fromLatin1(key))
                << language << " " << key;
    }
}

TEST(AppNames, DisplayNameComesFromTheInstalledDesktopEntryInTheUsersLanguage) {
    QTemporaryDir home, dirs;
    ScopedEnv env("XDG_DATA_HOME", home.path().toLocal8Bit());
    env.set("XDG_DATA_DIRS", dirs.path().toLocal8Bit());
    writeText(
        home.path() + "/applications/org.example.Racer.desktop",
        "[Desktop Entry]\nType=Application\nName=Racer\nName[de]=Rennwagen\nName[fr_CA]=Bolide\n");
    writeText(dirs.path() + "/applications/org.example.Nameless.desktop",
              "[Desktop Entry]\nType=Application\n");

    for (const auto& [lang, name] :
         {std::pair{"de_AT.UTF-8", "Rennwagen"}, std::pair{"fr_CA.UTF-8", "Bolide"},
          std::pair{"es_ES.UTF-8", "Racer"}}) {
        Languages env(lang);
        EXPECT_EQ(BundleTXExtensions::_txLocalizedAppNameFromBundleID("org.example.Racer"),
                  QString(name))
            << lang;
    }
    const auto nameless =
        BundleTXExtensions::_txLocalizedAppNameFromBundleID("org.example.Nameless");
    ASSERT_TRUE(nameless);
    EXPECT_TRUE(nameless->isEmpty());
    EXPECT_FALSE(nameless->isNull());
    EXPECT_FALSE(BundleTXExtensions::_txLocalizedAppNameFromBundleID("org.example.Missing"));
    EXPECT_FALSE(
        BundleTXExtensions::_txLocalizedAppNameFromBundleID("../applications/org.example.Racer"));
}

TEST(AppNames, BundleNameEntriesAreTriedInOrder) {
    QTemporaryDir dir;
    const QString plain = dir.path() + "/Plain.bundle";
    QDir().mkpath(plain);
    auto bundle = platform::Bundle::bundleWithPath(plain);
    ASSERT_TRUE(bundle);
    EXPECT_EQ(BundleTXExtensions::_txLocalizedAppName(*bundle), QString(""));

    const QString named = dir.path() + "/Named.bundle";
    writeText(named + "/Info.json", R"({"BundleName": "Short", "BundleDisplayName": "Long Name"})");
    writeText(named + "/de.lproj/InfoPlist.strings", R"("BundleDisplayName" = "Langer Name";)");
    bundle = platform::Bundle::bundleWithPath(named);
    for (const auto& [lang, name] :
         {std::pair{"de_DE.UTF-8", "Langer Name"}, std::pair{"C", "Long Name"}}) {
        Languages env(lang);
        EXPECT_EQ(BundleTXExtensions::_txLocalizedAppName(*bundle), QString(name)) << lang;
    }
    const QString shortOnly = dir.path() + "/Short.bundle";
    writeText(shortOnly + "/Info.json", R"({"BundleName": "Short"})");
    EXPECT_EQ(BundleTXExtensions::_txLocalizedAppName(*platform::Bundle::bundleWithPath(shortOnly)),
              QStringLiteral("Short"));
}

TEST(DateLine, IsLocalTimeWithTwelveHourClock) {
    QLocale::setDefault(QLocale(QLocale::English, QLocale::UnitedStates));
    ScopedEnv env("TZ", "Asia/Tokyo");
    tzset();

    EXPECT_EQ(DateTXExtensions::_srGetStringFromDate(
                  QDateTime(QDate(2016, 3, 5), QTime(14, 7), Qt::LocalTime)),
              QStringLiteral("March 5 02:07 PM"));
    // The same instant given in UTC still reads as the device's local time.
    EXPECT_EQ(
        DateTXExtensions::_srGetStringFromDate(QDateTime(QDate(2016, 3, 5), QTime(5, 7), Qt::UTC)),
        QStringLiteral("March 5 02:07 PM"));
    EXPECT_EQ(DateTXExtensions::_srGetStringFromDate(
                  QDateTime(QDate(2016, 11, 21), QTime(0, 5), Qt::LocalTime)),
              QStringLiteral("November 21 12:05 AM"));

    QLocale::setDefault(QLocale::c());
}
