// The sketch tool in the full editor starts only on the channels selected in it: with none
// selected a press opens no undo step and writes nothing.

#include "host/TQHostSampleScene.h"
#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

TEST_F(EditorFixture, sketch__writesOnlyOnSelectedChannels) {
    host.setSelectedObjects({object(kTQHostSampleTitleObject)});
    static_cast<TQCurveEditorCtrlBase&>(ctrl).setCurrentTool(TQTool::kSketch);
    ctrl.deselectAllChannels();
    const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->channeItemAtIndex(0);
    const unsigned keys = item->channel()->numberOfKeyframes();
    const CGPoint at = view.getPointScreen(CGPointMake(1.2345, 0.0));
    for (const bool selected : {false, true}) {
        item->select(selected);
        recorder.clearCalls();
        view.mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, at));
        view.mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, at));
        EXPECT_EQ(recorder.count("startCaptureModifiedChannels"), selected ? 1u : 0u);
        EXPECT_EQ(item->channel()->numberOfKeyframes(), keys + (selected ? 1 : 0));
    }
}

}  // namespace
}  // namespace editor_test
