#pragma once

#include <QString>
#include <QStringList>

// Fills a format of the string tables: each "%@" takes the next argument,
// "%n$@" the n-th (so a translation may reorder them), "%%" is a percent
// sign. A placeholder without an argument becomes empty; anything else is
// copied as it is. Any thread.
QString stringWithFormat(const QString& format, const QStringList& arguments);
