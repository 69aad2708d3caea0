#pragma once

#include "platform/ui/Alert.h"
#include "platform/ui/ViewController.h"

#include <QJsonObject>
#include <QObject>
#include <QString>

// What the editor has presented over itself, as automation scripts see it:
// the publishing form of an activity and the alert on top. Everything is
// found by walking the presentation chain from the editor and read by name
// (the form's members through Qt's meta-object system), so nothing here
// links to an activity or a plug-in. Main thread only.
namespace PresentedSnapshot {

// The controller on top of the presentation chain that starts at `from`.
platform::ViewController* topOfChain(platform::ViewController* from);

// The alert on top of the chain, or null.
platform::Alert* alert(platform::ViewController* from);

// The upload form of a publishing agent in the chain (the root of a
// navigation stack whose controller has a "_table"), or null.
platform::ViewController* publishingForm(platform::ViewController* from);

// alert (its title, or null), and, while a publishing form is presented,
// publishingDescription (the text of its description field),
// publishingCategory (the category id it publishes in) and uploadProgress
// (0 to 1); each null otherwise.
QJsonObject dump(platform::ViewController* from);

// Presses the button of the alert's action titled `title`, as the user's
// mouse does. Empty on success, else why it could not.
QString pressAlertAction(platform::ViewController* from, const QString& title);

} // namespace PresentedSnapshot
