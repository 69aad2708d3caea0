#pragma once

#include <QByteArray>
#include <QString>
#include <QTemporaryDir>
#include <optional>
#include <vector>

namespace testing_support {

// Sets environment variables for its lifetime and restores the old values.
class ScopedEnv {
  public:
    ScopedEnv() = default;
    ScopedEnv(const char* name, const QByteArray& value) { set(name, value); }
    ~ScopedEnv();
    ScopedEnv(const ScopedEnv&) = delete;
    ScopedEnv& operator=(const ScopedEnv&) = delete;

    void set(const char* name, const QByteArray& value);
    void unset(const char* name);

  private:
    std::vector<std::pair<QByteArray, std::optional<QByteArray>>> saved_;
    void remember(const char* name);
};

// A temporary directory that becomes the device's "/private/var/mobile/" for
// its lifetime, so "/private/var/mobile/Library/Tamsel/" lands inside it.
class MobileRoot {
  public:
    MobileRoot();
    QString hostPath(const QString& relative = QString()) const;
    // Creates "Library/Tamsel" (or only "Library" when `withTempDir` is false).
    void makeLibrary(bool withTempDir = true) const;

  private:
    QTemporaryDir dir_;
    ScopedEnv env_;
};

// Writes `size` bytes to `hostPath`, creating parents.
void writeFile(const QString& hostPath, qint64 size);

// A checksum of a file's bytes (empty when it cannot be read), to show that
// a file was not written to or arrived whole.
QByteArray hashOf(const QString& path);

} // namespace testing_support
