#include "AutomationScript.h"

#include <gtest/gtest.h>

using Kind = AutomationCommand::Kind;

// Every command is run by the end-to-end tests; here, what a script may
// spell in more than one way.
TEST(AutomationScript, ReadsCommentsQuotesDefaultsAndKeysAsWritten) {
    QString error;
    const auto script = parseAutomationScript(R"(# a comment
tap playButton   # and another

wait log "Export # Failed, \"quoted\"" 12
wait frame
resize 400 700
fill description ""
share "Save to Files…"
key ctrl+s
)",
                                              &error);
    ASSERT_TRUE(script) << error.toStdString();
    ASSERT_EQ(script->size(), 7);
    const auto& s = *script;
    EXPECT_EQ(s[0].kind, Kind::Tap);
    EXPECT_EQ(s[0].target, "playButton");
    EXPECT_EQ(s[1].line, 4);
    EXPECT_EQ(s[1].text, "Export # Failed, \"quoted\"");
    EXPECT_DOUBLE_EQ(s[1].timeout, 12);
    EXPECT_DOUBLE_EQ(s[2].timeout, 30) << "the default timeout";
    EXPECT_DOUBLE_EQ(s[3].value2, 700);
    EXPECT_EQ(s[4].kind, Kind::Fill);
    EXPECT_EQ(s[4].text, "");
    EXPECT_EQ(s[5].target, "Save to Files…");
    EXPECT_GT(s[5].timeout, 0) << "it waits for the sheet";
    EXPECT_EQ(s[6].text, "Ctrl+S");
}

TEST(AutomationScript, RefusesAnythingElseNamingTheLine) {
    QStringList bad = {"tap",           "tap a b",      "drag middle 3", "drag end -1",
                       "drag end soon", "wait forever", "wait log",      "wait ready 0",
                       "resize 400",    "sleep nan",    "dump now",      "frobnicate"};
    bad += {"press", "press View on YouTube", "fill tags x", "fill title", "share"};
    bad += {"share Mail now", "key", "key Ctrl+S Ctrl+Z", "key Ctrl+S,Ctrl+Z", "key Frobnicate"};
    for (const QString& line : bad) {
        QString error;
        EXPECT_FALSE(parseAutomationScript("dump\n" + line, &error)) << line.toStdString();
        EXPECT_TRUE(error.startsWith("line 2: ")) << error.toStdString();
    }
}
