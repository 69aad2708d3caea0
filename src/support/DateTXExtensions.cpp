#include "DateTXExtensions.h"

#include <QLocale>
#include <QTimeZone>

namespace DateTXExtensions {

QString _srGetStringFromDate(const QDateTime& date) {
    // The zone named "..." does not exist, so the lookup yields nothing and
    // the text stays in the device's own zone: the recording's local time.
    QDateTime local = date.toLocalTime();
    const QTimeZone zone(QByteArrayLiteral("..."));
    if (zone.isValid())
        local = date.toTimeZone(zone);
    return QLocale().toString(local, QStringLiteral("MMMM d hh:mm AP"));
}

} // namespace DateTXExtensions
