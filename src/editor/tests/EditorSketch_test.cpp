// The sketch tool in the full editor starts only on the channels selected in it: with none
// selected a stroke opens no undo step and writes nothing.

#include "host/TQHostSampleScene.h"
#include "src/editor/tests/EditorFixture.h"

namespace editor_test {
namespace {

class EditorSketch : public EditorFixture {
protected:
    void press(double t, double v) {
        const CGPoint at = view.getPointScreen(CGPointMake(t, v));
        view.mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, at));
        view.mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, at));
    }
};

TEST_F(EditorSketch, press__writesOnlyOnSelectedChannels) {
    TQChannelObjectRootBase* title = object(kTQHostSampleTitleObject);
    host.setSelectedObjects({title});
    ASSERT_FALSE(shownChannels().empty());
    static_cast<TQCurveEditorCtrlBase&>(ctrl).setCurrentTool(TQTool::kSketch);
    ctrl.deselectAllChannels();
    const std::unique_ptr<TQChannelBase> before(title->cloneChannel());
    recorder.clearCalls();
    press(1.2345, 0.0);
    EXPECT_EQ(recorder.count("startCaptureModifiedChannels"), 0u);
    EXPECT_TRUE(*title == *before);

    const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->channeItemAtIndex(0);
    const unsigned keys = item->channel()->numberOfKeyframes();
    item->select(1);
    press(1.2345, 0.0);
    EXPECT_EQ(recorder.count("startCaptureModifiedChannels"), 1u);
    EXPECT_EQ(item->channel()->numberOfKeyframes(), keys + 1);
}

}  // namespace
}  // namespace editor_test
