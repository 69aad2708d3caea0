#include "BuiltInCategories.h"

#include "PluginStrings.h"

namespace youtube_publishing {

QList<platform::YouTubeVideoCategory> builtInCategories() {
    return {
        {QStringLiteral("1"), localized("CATEGORY_1", "Film & Animation")},
        {QStringLiteral("2"), localized("CATEGORY_2", "Autos & Vehicles")},
        {QStringLiteral("10"), localized("CATEGORY_10", "Music")},
        {QStringLiteral("15"), localized("CATEGORY_15", "Pets & Animals")},
        {QStringLiteral("17"), localized("CATEGORY_17", "Sports")},
        {QStringLiteral("19"), localized("CATEGORY_19", "Travel & Events")},
        {QStringLiteral("20"), localized("CATEGORY_20", "Gaming")},
        {QStringLiteral("22"), localized("CATEGORY_22", "People & Blogs")},
        {QStringLiteral("23"), localized("CATEGORY_23", "Comedy")},
        {QStringLiteral("24"), localized("CATEGORY_24", "Entertainment")},
        {QStringLiteral("25"), localized("CATEGORY_25", "News & Politics")},
        {QStringLiteral("26"), localized("CATEGORY_26", "Howto & Style")},
        {QStringLiteral("27"), localized("CATEGORY_27", "Education")},
        {QStringLiteral("28"), localized("CATEGORY_28", "Science & Technology")},
        {QStringLiteral("29"), localized("CATEGORY_29", "Nonprofits & Activism")},
    };
}

} // namespace youtube_publishing
