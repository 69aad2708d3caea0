#include "StringFormat.h"

QString stringWithFormat(const QString& format, const QStringList& arguments) {
    QString out;
    out.reserve(format.size() + 32);
    qsizetype next = 0;
    for (qsizetype i = 0; i < format.size(); ++i) {
        const QChar c = format[i];
        if (c != QLatin1Char('%') || i + 1 >= format.size()) {
            out += c;
            continue;
        }
        if (format[i + 1] == QLatin1Char('%')) {
            out += QLatin1Char('%');
            ++i;
            continue;
        }
        if (format[i + 1] == QLatin1Char('@')) {
            out += arguments.value(next++);
            ++i;
            continue;
        }
        // "%n$@"
        qsizetype j = i + 1;
        while (j < format.size() && format[j].isDigit())
            ++j;
        if (j > i + 1 && j + 1 < format.size() && format[j] == QLatin1Char('$') &&
            format[j + 1] == QLatin1Char('@')) {
            out += arguments.value(format.mid(i + 1, j - i - 1).toInt() - 1);
            i = j + 1;
            continue;
        }
        out += c;
    }
    return out;
}
