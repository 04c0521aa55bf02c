#pragma once
// The simplify and generate panels of the editor's interface file, as a host that has no
// interface file of its own lays them out: each a panel with its content (labels, a slider
// and a scrubber per parameter, Cancel and OK), its controls put into the outlets and aimed at
// `owner` (the editor's controller) with the actions that TQCurveEditorCtrl answers. Return
// presses OK and Escape Cancel. The ranges of the controls are the controller's to set
// (setupController); the scrubbers show whole numbers.
//
// The panels and controls are shared with the outlets; the owner is not owned.

#include "platform/ui/RWAction.h"

struct TQCurveEditorOutlets;

// The simplify panel: tolerance and smoothness; reducePanel, tolerance, toleranceSlider,
// smoothness and smoothnessSlider.
void TQInstantiateSimplifyPanel(TQCurveEditorOutlets& outlets, RWActionTarget* owner);
// The generate panel: the number of cycles; generatePanel, numberOfCyclesSlider and
// numberOfCycles.
void TQInstantiateGeneratePanel(TQCurveEditorOutlets& outlets, RWActionTarget* owner);
