#pragma once

#include <QString>

namespace youtube_publishing {

// The plug-in's texts in the user's language, from the string table
// "YouTubePublishing" of the bundle "/System/Library/Publishing/
// YouTubePublishing.bundle"; `english` when no table has the key. Any thread.
QString localized(const char* key, const char* english);

} // namespace youtube_publishing
