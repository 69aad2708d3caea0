#pragma once

#include <QString>

namespace platform {

// The identifiers of the activities the platform's activity sheet offers; the
// editor collects those the user completed and hands them to its host.
inline const QString SaveToAlbumActivityType = QStringLiteral("org.tamsel.activity.SaveToAlbum");
inline const QString MailActivityType = QStringLiteral("org.tamsel.activity.Mail");
inline const QString MessageActivityType = QStringLiteral("org.tamsel.activity.Message");
inline const QString CopyToPasteboardActivityType =
    QStringLiteral("org.tamsel.activity.CopyToPasteboard");
inline const QString PostToFacebookActivityType =
    QStringLiteral("org.tamsel.activity.PostToSocialNetwork");
inline const QString SaveToFilesActivityType = QStringLiteral("org.tamsel.activity.SaveToFiles");
inline const QString ShowInFolderActivityType = QStringLiteral("org.tamsel.activity.ShowInFolder");

} // namespace platform
