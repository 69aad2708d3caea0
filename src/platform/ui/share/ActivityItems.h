#pragma once

#include <QList>
#include <QStringList>
#include <QUrl>
#include <QVariantList>

namespace platform {

// How the built-in activities read the sheet's items: texts are QString
// items, links are QUrl items that are not local files, files are local file
// URLs (a file that does not exist is left out).
namespace ActivityItems {

QList<QUrl> files(const QVariantList& items);
QStringList texts(const QVariantList& items);
QList<QUrl> links(const QVariantList& items);
// Web links (http and https), also those written as text.
QList<QUrl> webLinks(const QVariantList& items);
// The texts and the links, one a line, in the items' order: what a message
// says about the files it carries.
QString messageText(const QVariantList& items);

} // namespace ActivityItems
} // namespace platform
