#include "VideoMetadata.h"

#include <gtest/gtest.h>

using namespace youtube_publishing;

TEST(VideoMetadata, TitlesBecomeOneTrimmedLineWithoutAngleBrackets) {
    const FittedText fitted = VideoMetadata::fitTitle(QStringLiteral("  A <b>\nrun\r\n "));
    EXPECT_EQ(fitted.text, QStringLiteral("A ‹b› run"));
    EXPECT_TRUE(fitted.replaced);
    EXPECT_FALSE(fitted.shortened);
    EXPECT_EQ(VideoMetadata::fitTitle(QStringLiteral(" \n ")).text, "");
}

TEST(VideoMetadata, TitlesAreCutAtAHundredCharactersBetweenWholeCharacters) {
    const QString exact(100, QLatin1Char('a'));
    EXPECT_FALSE(VideoMetadata::fitTitle(exact).shortened);
    // U+1F44D U+1F3FD: two code points (four UTF-16 units) that read as one.
    const QString thumb = QStringLiteral("\U0001F44D\U0001F3FD");
    const FittedText emoji = VideoMetadata::fitTitle(QString(99, QLatin1Char('a')) + thumb);
    EXPECT_TRUE(emoji.shortened);
    EXPECT_EQ(emoji.text, QString(99, QLatin1Char('a')));
    // Astral characters count once each, not as two UTF-16 units.
    const QString faces = QString(thumb.left(2)).repeated(100);
    EXPECT_FALSE(VideoMetadata::fitTitle(faces).shortened);
    // A letter and its combining accent stay together.
    const FittedText accent =
        VideoMetadata::fitTitle(QString(99, QLatin1Char('a')) + QStringLiteral("e\u0301"));
    EXPECT_EQ(accent.text, QString(99, QLatin1Char('a')));
}

TEST(VideoMetadata, DescriptionsKeepTheirLinesAndAreCutAtFiveThousandBytes) {
    EXPECT_EQ(VideoMetadata::fitDescription(QStringLiteral("T\nL <3")).text,
              QStringLiteral("T\nL ‹3"));
    const QString e = QStringLiteral("é"); // two bytes in UTF-8
    EXPECT_FALSE(VideoMetadata::fitDescription(e.repeated(2500)).shortened);
    const FittedText cut = VideoMetadata::fitDescription(e.repeated(2501));
    EXPECT_TRUE(cut.shortened);
    EXPECT_EQ(cut.text.toUtf8().size(), 5000);
    const FittedText odd = VideoMetadata::fitDescription(QStringLiteral("x") + e.repeated(2500));
    EXPECT_EQ(odd.text.toUtf8().size(), 4999) << "never half a character";
}
