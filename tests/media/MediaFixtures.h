#pragma once

#include "MediaGenerator.h"

#include <QString>

namespace mediatest {

// Writes a movie for `movieSpec` once per test run (into a directory that lives as
// long as the process) and returns its path; an equal MovieSpec returns the same
// file. Fails the calling test when the generator fails.
QString movieFor(const testmedia::MovieSpec& movieSpec);

// A fresh path in the run's directory, for outputs.
QString scratchPath(const QString& name);

} // namespace mediatest
