#include "DesktopEntry.h"

#include <QFile>

namespace platform {
namespace {

QString unescape(const QString& raw) {
    QString out;
    out.reserve(raw.size());
    for (qsizetype i = 0; i < raw.size(); ++i) {
        const QChar c = raw.at(i);
        if (c != QLatin1Char('\\') || i + 1 == raw.size()) {
            out += c;
            continue;
        }
        switch (raw.at(++i).unicode()) {
        case 's':
            out += QLatin1Char(' ');
            break;
        case 'n':
            out += QLatin1Char('\n');
            break;
        case 't':
            out += QLatin1Char('\t');
            break;
        case 'r':
            out += QLatin1Char('\r');
            break;
        default:
            out += raw.at(i);
            break;
        }
    }
    return out;
}

} // namespace

std::optional<DesktopEntry> DesktopEntry::parse(const QString& text) {
    DesktopEntry entry;
    bool inGroup = false;
    bool sawGroup = false;
    for (const QString& rawLine : text.split(QLatin1Char('\n'))) {
        const QString line = rawLine.trimmed();
        if (line.isEmpty() || line.startsWith(QLatin1Char('#')))
            continue;
        if (line.startsWith(QLatin1Char('['))) {
            inGroup = line == QLatin1String("[Desktop Entry]");
            sawGroup = sawGroup || inGroup;
            continue;
        }
        const qsizetype eq = line.indexOf(QLatin1Char('='));
        if (!inGroup || eq <= 0)
            continue;
        const QString key = line.left(eq).trimmed();
        if (!entry.values_.contains(key)) // the first of duplicate keys wins
            entry.values_.insert(key, unescape(line.mid(eq + 1).trimmed()));
    }
    if (!sawGroup)
        return std::nullopt;
    return entry;
}

std::optional<DesktopEntry> DesktopEntry::read(const QString& hostPath) {
    QFile file(hostPath);
    if (!file.open(QIODevice::ReadOnly))
        return std::nullopt;
    return parse(QString::fromUtf8(file.readAll()));
}

QHash<QString, QString> DesktopEntry::localizedValues(const QString& key) const {
    QHash<QString, QString> out;
    const QString prefix = key + QLatin1Char('[');
    for (auto [name, value] : values_.asKeyValueRange()) {
        if (!name.startsWith(prefix) || !name.endsWith(QLatin1Char(']')))
            continue;
        QString localization = name.mid(prefix.size(), name.size() - prefix.size() - 1);
        localization = localization.section(QLatin1Char('@'), 0, 0).section(QLatin1Char('.'), 0, 0);
        localization.replace(QLatin1Char('_'), QLatin1Char('-'));
        if (!localization.isEmpty())
            out.insert(localization, value);
    }
    return out;
}

} // namespace platform
