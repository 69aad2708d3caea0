// The editor's share sheet.

#include "TXVideoEditorViewController.h"

void TXVideoEditorViewController::shareAction() {
    // The activity sheet and its publishing activity come with their own
    // change; until then the share button offers nothing.
}
