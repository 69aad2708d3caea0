#pragma once

#include <QList>
#include <QString>
#include <optional>

// One command of an automation script.
struct AutomationCommand {
    enum class Kind {
        Tap,
        Drag,
        Shake,
        Resize,
        Sleep,
        Wait,
        Dump,
        Dismiss,
        Screenshot,
        Share,
        Key,
        Press,
        Fill,
    };
    Kind kind = Kind::Dump;
    int line = 0;        // 1-based line in the script
    QString target;      // tap: item name; drag: playhead|start|end; wait:
                         // ready|playing|paused|exporting=false|log|alert|form|
                         // publishing; share: an activity's type or title, or
                         // cancel; fill: title|description
    QString text;        // wait log: the text to look for; screenshot: the file;
                         // key: the key in portable text ("Ctrl+S"); press: the
                         // button's title; fill: the text
    double value = 0;    // drag: seconds; sleep: seconds; resize: width
    double value2 = 0;   // resize: height
    double timeout = 30; // wait, share: seconds
};

// Parses a script: one command a line, "#" starts a comment, blank lines are
// skipped. Returns nullopt with `error` ("line N: why") on the first line
// that is not a command.
std::optional<QList<AutomationCommand>> parseAutomationScript(const QString& text, QString* error);
