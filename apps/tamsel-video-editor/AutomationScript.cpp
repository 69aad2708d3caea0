#include "AutomationScript.h"

#include <QKeySequence>
#include <QRegularExpression>
#include <cmath>

namespace {

// Splits a line into words; a word in double quotes may hold blanks.
QStringList words(const QString& line) {
    QStringList out;
    static const QRegularExpression word(QStringLiteral(R"re("((?:[^"\\]|\\.)*)"|(\S+))re"));
    for (auto it = word.globalMatch(line); it.hasNext();) {
        const auto match = it.next();
        if (match.capturedStart(1) >= 0) {
            QString quoted = match.captured(1);
            quoted.replace(QStringLiteral("\\\""), QStringLiteral("\""))
                .replace(QStringLiteral("\\\\"), QStringLiteral("\\"));
            out.append(quoted);
        } else {
            out.append(match.captured(2));
        }
    }
    return out;
}

std::optional<double> number(const QString& word, bool positive = false) {
    bool ok = false;
    const double v = word.toDouble(&ok);
    if (!ok || !std::isfinite(v) || v < 0 || (positive && v == 0))
        return std::nullopt;
    return v;
}

QString stripComment(const QString& line) {
    bool quoted = false;
    for (qsizetype i = 0; i < line.size(); ++i) {
        if (line[i] == QLatin1Char('"') && (i == 0 || line[i - 1] != QLatin1Char('\\')))
            quoted = !quoted;
        else if (line[i] == QLatin1Char('#') && !quoted)
            return line.left(i);
    }
    return line;
}

} // namespace

std::optional<QList<AutomationCommand>> parseAutomationScript(const QString& text, QString* error) {
    QList<AutomationCommand> commands;
    const QStringList lines = text.split(QLatin1Char('\n'));
    for (int n = 0; n < lines.size(); ++n) {
        const QStringList w = words(stripComment(lines[n]));
        if (w.isEmpty())
            continue;
        auto fail = [&](const QString& why) {
            if (error)
                *error = QStringLiteral("line %1: %2").arg(n + 1).arg(why);
            return std::nullopt;
        };
        AutomationCommand c;
        c.line = n + 1;
        const QString& verb = w[0];
        if (verb == QLatin1String("tap")) {
            if (w.size() != 2)
                return fail(QStringLiteral("tap takes one name"));
            c.kind = AutomationCommand::Kind::Tap;
            c.target = w[1];
        } else if (verb == QLatin1String("drag")) {
            std::optional<double> seconds;
            if (w.size() != 3 || !QStringList{"playhead", "start", "end"}.contains(w[1]) ||
                !(seconds = number(w[2])))
                return fail(
                    QStringLiteral("drag takes playhead, start or end and a time in seconds"));
            c.kind = AutomationCommand::Kind::Drag;
            c.target = w[1];
            c.value = *seconds;
        } else if (verb == QLatin1String("shake") || verb == QLatin1String("dump") ||
                   verb == QLatin1String("dismiss")) {
            if (w.size() != 1)
                return fail(QStringLiteral("%1 takes nothing").arg(verb));
            c.kind = verb == QLatin1String("shake")  ? AutomationCommand::Kind::Shake
                     : verb == QLatin1String("dump") ? AutomationCommand::Kind::Dump
                                                     : AutomationCommand::Kind::Dismiss;
        } else if (verb == QLatin1String("share")) {
            // The sheet comes once the store has answered: the command waits
            // for it, and for the activity to be offered.
            if (w.size() != 2)
                return fail(QStringLiteral("share takes an activity type or title, or cancel"));
            c.kind = AutomationCommand::Kind::Share;
            c.target = w[1];
            c.timeout = 10;
        } else if (verb == QLatin1String("screenshot")) {
            if (w.size() != 2)
                return fail(QStringLiteral("screenshot takes a file name"));
            c.kind = AutomationCommand::Kind::Screenshot;
            c.text = w[1];
        } else if (verb == QLatin1String("key")) {
            const QKeySequence key =
                w.size() == 2 ? QKeySequence::fromString(w[1], QKeySequence::PortableText)
                              : QKeySequence();
            if (key.count() != 1 || key[0].key() == Qt::Key_unknown)
                return fail(QStringLiteral("key takes one key, such as Space, I or Ctrl+S"));
            c.kind = AutomationCommand::Kind::Key;
            c.text = key.toString(QKeySequence::PortableText);
        } else if (verb == QLatin1String("press")) {
            if (w.size() != 2)
                return fail(QStringLiteral("press takes the title of a button"));
            c.kind = AutomationCommand::Kind::Press;
            c.text = w[1];
        } else if (verb == QLatin1String("fill")) {
            if (w.size() != 3 || !QStringList{"title", "description"}.contains(w[1]))
                return fail(QStringLiteral("fill takes title or description and a text"));
            c.kind = AutomationCommand::Kind::Fill;
            c.target = w[1];
            c.text = w[2];
        } else if (verb == QLatin1String("resize")) {
            std::optional<double> width, height;
            if (w.size() != 3 || !(width = number(w[1], true)) || !(height = number(w[2], true)))
                return fail(QStringLiteral("resize takes a width and a height"));
            c.kind = AutomationCommand::Kind::Resize;
            c.value = *width;
            c.value2 = *height;
        } else if (verb == QLatin1String("sleep")) {
            std::optional<double> seconds;
            if (w.size() != 2 || !(seconds = number(w[1])))
                return fail(QStringLiteral("sleep takes seconds"));
            c.kind = AutomationCommand::Kind::Sleep;
            c.value = *seconds;
        } else if (verb == QLatin1String("wait")) {
            if (w.size() < 2)
                return fail(QStringLiteral("wait for what?"));
            c.kind = AutomationCommand::Kind::Wait;
            c.target = w[1];
            qsizetype next = 2;
            if (c.target == QLatin1String("log")) {
                if (w.size() < 3)
                    return fail(QStringLiteral("wait log takes a text"));
                c.text = w[2];
                next = 3;
            } else if (!QStringList{"ready", "frame", "playing", "paused", "exporting=false",
                                    "alert", "form", "publishing"}
                            .contains(c.target)) {
                return fail(QStringLiteral("cannot wait for %1").arg(c.target));
            }
            if (w.size() > next + 1)
                return fail(QStringLiteral("too many words"));
            if (w.size() == next + 1) {
                const auto timeout = number(w[next], true);
                if (!timeout)
                    return fail(QStringLiteral("the timeout is seconds"));
                c.timeout = *timeout;
            }
        } else {
            return fail(QStringLiteral("unknown command %1").arg(verb));
        }
        commands.append(c);
    }
    return commands;
}
