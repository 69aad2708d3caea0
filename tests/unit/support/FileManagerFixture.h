#pragma once

#include "support/FileManager.h"
#include "support/LogCapture.h"
#include "support/ScriptedFileSystem.h"
#include "support/TempDir.h"

#include <QDateTime>
#include <QFile>
#include <gtest/gtest.h>

// A file manager on a scripted file system whose "/private/var/mobile/" is a
// fresh temporary directory, with a clock the test sets.
class FileManagerFixture : public ::testing::Test {
  protected:
    FileManagerFixture() {
        root.makeLibrary();
        manager = FileManager::create(fileSystem, [this] { return now; });
    }

    QString tempHost(const QString& name = QString()) const {
        return root.hostPath(QStringLiteral("Library/Tamsel") +
                             (name.isEmpty() ? QString() : "/" + name));
    }
    QString tempDevice(const QString& name) const { return TXScreenRecorderTempDirectory + name; }
    QUrl tempUrl(const QString& name) const { return QUrl::fromLocalFile(tempDevice(name)); }

    // A file of `size` bytes in the temporary directory, last modified
    // `ageSeconds` before the fixture's clock.
    void addFile(const QString& name, qint64 size, double ageSeconds = 0) {
        testing_support::writeFile(tempHost(name), size);
        QFile file(tempHost(name));
        ASSERT_TRUE(file.open(QIODevice::ReadWrite));
        ASSERT_TRUE(file.setFileTime(now.addMSecs(qint64(-ageSeconds * 1000)),
                                     QFileDevice::FileModificationTime));
    }

    bool exists(const QString& name) const { return QFile::exists(tempHost(name)); }

    testing_support::MobileRoot root;
    std::shared_ptr<testing_support::ScriptedFileSystem> fileSystem =
        std::make_shared<testing_support::ScriptedFileSystem>();
    QDateTime now = QDateTime::fromSecsSinceEpoch(1700000000, Qt::UTC);
    std::shared_ptr<FileManager> manager;
    testing_support::LogCapture logs;
};
