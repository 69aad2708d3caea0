#include "AutomationScript.h"

#include <gtest/gtest.h>

using Kind = AutomationCommand::Kind;

TEST(AutomationScript, ReadsEveryCommandWithCommentsQuotesAndDefaults) {
    QString error;
    const auto script = parseAutomationScript(R"(# a comment
tap playButton   # and another
drag end 4.5

wait log "Export # Failed, \"quoted\"" 12
wait frame
resize 400 700
sleep 0.25
shake
screenshot /tmp/a.png
dump
dismiss
)",
                                              &error);
    ASSERT_TRUE(script) << error.toStdString();
    ASSERT_EQ(script->size(), 10);
    EXPECT_EQ((*script)[0].kind, Kind::Tap);
    EXPECT_EQ((*script)[0].target, "playButton");
    EXPECT_EQ((*script)[1].line, 3);
    EXPECT_EQ((*script)[1].target, "end");
    EXPECT_DOUBLE_EQ((*script)[1].value, 4.5);
    EXPECT_EQ((*script)[2].text, "Export # Failed, \"quoted\"");
    EXPECT_DOUBLE_EQ((*script)[2].timeout, 12);
    EXPECT_DOUBLE_EQ((*script)[3].timeout, 30) << "the default timeout";
    EXPECT_DOUBLE_EQ((*script)[4].value2, 700);
    EXPECT_EQ((*script)[7].text, "/tmp/a.png");
    EXPECT_EQ((*script)[9].kind, Kind::Dismiss);
}

TEST(AutomationScript, FillsTheFormPressesButtonsByTitleAndWaitsForPublishing) {
    QString error;
    const auto script = parseAutomationScript(R"(wait form
fill title "My run"
fill description ""
press "Publish"
wait publishing 5
wait alert 90
press "View on YouTube"
)",
                                              &error);
    ASSERT_TRUE(script) << error.toStdString();
    ASSERT_EQ(script->size(), 7);
    EXPECT_EQ((*script)[0].target, "form");
    EXPECT_EQ((*script)[1].kind, Kind::Fill);
    EXPECT_EQ((*script)[1].target, "title");
    EXPECT_EQ((*script)[1].text, "My run");
    EXPECT_EQ((*script)[2].text, "");
    EXPECT_EQ((*script)[3].kind, Kind::Press);
    EXPECT_EQ((*script)[4].target, "publishing");
    EXPECT_DOUBLE_EQ((*script)[5].timeout, 90);
    EXPECT_EQ((*script)[6].text, "View on YouTube");
    for (const char* bad : {"press View on YouTube", "fill tags x", "fill title", "press"})
        EXPECT_FALSE(parseAutomationScript(bad, &error)) << bad;
}

TEST(AutomationScript, RefusesAnythingElseNamingTheLine) {
    const char* bad[] = {"tap",           "tap a b",      "drag middle 3", "drag end -1",
                         "drag end soon", "wait forever", "wait log",      "wait ready 0",
                         "resize 400",    "sleep nan",    "dump now",      "frobnicate"};
    for (const char* line : bad) {
        QString error;
        EXPECT_FALSE(parseAutomationScript(QString("dump\n") + line, &error)) << line;
        EXPECT_TRUE(error.startsWith("line 2: ")) << line << " " << error.toStdString();
    }
}

TEST(AutomationScript, ShareNamesAnActivityByTypeOrQuotedTitleOrCancels) {
    QString error;
    const auto script = parseAutomationScript(
        "share org.tamsel.activity.Mail\nshare \"Save to Files…\"\nshare cancel\n", &error);
    ASSERT_TRUE(script) << error.toStdString();
    ASSERT_EQ(script->size(), 3);
    EXPECT_EQ((*script)[0].kind, Kind::Share);
    EXPECT_EQ((*script)[0].target, "org.tamsel.activity.Mail");
    EXPECT_EQ((*script)[1].target, "Save to Files…");
    EXPECT_EQ((*script)[2].target, "cancel");
    EXPECT_GT((*script)[0].timeout, 0) << "it waits for the sheet";
    EXPECT_FALSE(parseAutomationScript("share\n", &error));
    EXPECT_FALSE(parseAutomationScript("share Mail now\n", &error));
}

TEST(AutomationScript, KeysAreOneKeyWithItsModifiers) {
    QString error;
    const auto script = parseAutomationScript("key Space\nkey ctrl+s\nkey Shift+Right\n", &error);
    ASSERT_TRUE(script) << error.toStdString();
    ASSERT_EQ(script->size(), 3);
    EXPECT_EQ((*script)[0].kind, Kind::Key);
    EXPECT_EQ((*script)[0].text, "Space");
    EXPECT_EQ((*script)[1].text, "Ctrl+S");
    EXPECT_EQ((*script)[2].text, "Shift+Right");
    for (const char* line : {"key", "key Ctrl+S Ctrl+Z", "key Ctrl+S,Ctrl+Z", "key Frobnicate"}) {
        EXPECT_FALSE(parseAutomationScript(line, &error)) << line;
        EXPECT_TRUE(error.startsWith("line 1: ")) << line;
    }
}
