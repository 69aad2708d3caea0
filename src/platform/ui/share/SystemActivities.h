#pragma once

#include "platform/runtime/Implementation.h"
#include "platform/ui/Activity.h"

#include <QList>
#include <memory>

namespace platform {

// The activities the platform's sheet brings of its own, new for each sheet,
// in the sheet's own order: mail, message, copy, Facebook, save to files,
// show in folder. Each decides itself whether it can work on this desktop.
// Main thread only.
namespace SystemActivities {

using Maker = QList<std::shared_ptr<Activity>>();
Implementation<Maker>& implementation();
QList<std::shared_ptr<Activity>> builtInActivities();

} // namespace SystemActivities
} // namespace platform
