#include "ShareDesktop.h"

#include "ShareFakes.h"

#include <QFile>

void ShareDesktop::SetUp() {
    testing_support::writeText(desktop.filePath("catalogue/racer.xml"), R"(<?xml version="1.0"?>
<components version="0.14" origin="tamsel-test">
  <component type="desktop-application">
    <id>org.example.Racer</id>
    <name>Racer</name>
    <summary>Races</summary>
    <developer_name>Example Games</developer_name>
  </component>
</components>
)");
    env.insert("PATH", desktop.filePath("bin") + ":/usr/bin:/bin");
    env.insert("TAMSEL_APPSTREAM_DIRS", desktop.filePath("catalogue"));
    env.insert("TAMSEL_STORE_URL", "");
    env.insert("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/tamsel-test-bus");
    env.insert("XDG_CURRENT_DESKTOP", "");
    for (const char* dir : {"DATA_HOME", "DATA_DIRS", "CONFIG_HOME", "CACHE_HOME"})
        env.insert(QStringLiteral("XDG_") + dir, desktop.filePath(QString(dir).toLower()));
    env.insert("LANGUAGE", "en");
    env.insert("LC_ALL", "en_US.UTF-8");
}

void ShareDesktop::program(const QString& name, const QByteArray& body) {
    testing_support::writeText(desktop.filePath("bin/" + name), "#!/bin/sh\n" + body, true);
}

QStringList ShareDesktop::lines(const QString& name) const {
    QFile file(desktop.filePath(name));
    file.open(QIODevice::ReadOnly);
    return QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
}
