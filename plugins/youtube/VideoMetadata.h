#pragma once

#include <QString>

namespace youtube_publishing {

// A title or description made fit for YouTube, and what had to change.
struct FittedText {
    QString text;
    bool shortened = false; // cut at the limit (between whole characters)
    bool replaced = false;  // "<" and ">" became "‹" and "›"
};

// The service's limits on a video's text. Pure functions, any thread.
namespace VideoMetadata {

constexpr int titleCharacterLimit = 100;
constexpr int descriptionByteLimit = 5000;

// One line (line breaks become spaces), trimmed, without "<" or ">", at most
// 100 characters (code points), never cut inside a character a reader sees
// as one (an emoji with its modifiers, a letter with its accents).
FittedText fitTitle(const QString& title);

// Without "<" or ">", at most 5,000 bytes in UTF-8, cut between whole
// characters as the title is.
FittedText fitDescription(const QString& description);

} // namespace VideoMetadata
} // namespace youtube_publishing
