#pragma once

#include "editor/EndToEndFixture.h"

// tamsel-edit on a desktop of the test's own: an AppStream catalogue that
// knows Racer by Example Games, no remote catalogue (tests have no network),
// the test's programs first on the PATH, no session bus (so no keyring of the
// user's), English, and XDG folders in a temporary directory. `env` holds it
// for edit().
class ShareDesktop : public EndToEnd {
  protected:
    void SetUp() override;
    // A program on the PATH: a shell script with `body`.
    void program(const QString& name, const QByteArray& body);
    // The lines of a file on the desktop, empty when there is none.
    QStringList lines(const QString& name) const;

    QTemporaryDir desktop;
    QProcessEnvironment env;
};
