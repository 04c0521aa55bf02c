#pragma once
// The two curve set panels of the full editor as an interface file would lay them out: the
// manager (the table of custom sets with the columns "Name", "Relative" and "Shortcut", the add
// and remove pair, Duplicate, and Cancel, Apply and Done) and the new-set panel (a name field,
// Cancel and OK). Every control sends its action to the owner; Return presses Done and OK,
// Escape the Cancel buttons. Titles and texts come from the strings table.
//
// The panels own their controls; the manager's table lives in the manager's content, which is
// why the outlet of the table is a plain pointer.

#include "platform/ui/RWAction.h"
#include "src/editor/TQCurveEditorCtrl.h"

// Makes both panels and connects them to the outlets a host hands to connectOutlets.
void TQInstantiateCurveSetPanels(RWActionTarget* owner, TQCurveEditorOutlets& outlets);
