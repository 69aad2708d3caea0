#pragma once

#include "platform/services/Bundle.h"

#include <QString>
#include <memory>

// The bundle of the platform's photo framework (the one holding its album
// class), cached once found. Null, and looked up again on the next call,
// while it is not installed. Callable from any thread.
std::shared_ptr<platform::Bundle> TXQuillonFrameworkBundle();

// The photo framework's text for `key`, searched in its four tables in order
// (device-specific, general, then two supplementary ones); the key itself when
// none has it. Callable from any thread.
QString TXLocalizedFrameworkString(const QString& key);
