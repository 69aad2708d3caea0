#pragma once

#include <QDateTime>
#include <QString>

namespace DateTXExtensions {

// "March 5 02:07 PM": full month name, unpadded day, two-digit 12-hour hour,
// minutes and the AM/PM marker, in the current locale and the device's own
// time zone. Callable from any thread.
QString _srGetStringFromDate(const QDateTime& date);

} // namespace DateTXExtensions
