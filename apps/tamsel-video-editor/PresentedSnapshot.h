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
// Whether an alert is on top and fully on screen.
bool isAlertShown(platform::ViewController* from);

// The upload form of a publishing agent in the chain (the root of a
// navigation stack whose controller has a "_table"), or null.
platform::ViewController* publishingForm(platform::ViewController* from);

// alert (its title, or null), and, while a publishing form is presented,
// publishingDescription (the text of its description field),
// publishingCategory (the category id it publishes in) and uploadProgress
// (0 to 1); each null otherwise.
QJsonObject dump(platform::ViewController* from);

// Whether the publishing form is on top (no alert over it) and fully on
// screen.
bool isPublishingFormOnTop(platform::ViewController* from);

// Whether the publishing progress overlay covers a presented screen, faded
// in, its spinner turning.
bool isPublishing(platform::ViewController* from);

// Presses the button titled `title` on the screen on top of the chain (an
// alert's action, a navigation bar's item, a button of a form), as the
// user's mouse does. Empty on success, else why it could not.
QString pressButton(platform::ViewController* from, const QString& title);

// Types `text` into the publishing form's field `field` ("title" or
// "description": section 0, row 0 or 1 of its table) in place of what it
// holds, as the user's mouse and keyboard do. Empty on success, else why it
// could not.
QString fillField(platform::ViewController* from, const QString& field, const QString& text);

} // namespace PresentedSnapshot
