#pragma once

#include "platform/publishing/YouTubeUploadClient.h"

#include <QList>

namespace youtube_publishing {

// The categories a video can be assigned to in most regions, for the form to
// offer before the service's own list for the user's region has arrived, or
// when it cannot be had (offline, not signed in). Titles in the user's
// language where the plug-in has them.
QList<platform::YouTubeVideoCategory> builtInCategories();

} // namespace youtube_publishing
