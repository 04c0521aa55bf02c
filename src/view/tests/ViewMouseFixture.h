#pragma once
// The drawing fixture with gestures: RWEvent sequences through the view at world points of
// the last frame. The stub host is 800 x 400 points at scale 1 with the view at the window's
// origin, so a window point is a drawable pixel. Each drag step moves the manual clock past
// the 1/30 s gate unless told otherwise.

#include <cstdint>
#include <string>
#include <vector>

#include "src/resources/TQStrings.h"
#include "src/view/tests/ViewDrawFixture.h"

namespace view_test {

inline constexpr uint64_t kShift = RWEventModifierFlagShift;
inline constexpr uint64_t kControl = RWEventModifierFlagControl;
inline constexpr uint64_t kOption = RWEventModifierFlagOption;
inline constexpr uint64_t kCommand = RWEventModifierFlagCommand;
// Past the gate between two drag steps.
inline constexpr double kStepSeconds = 0.05;
// A time or value that went through the single-precision projection and back.
inline constexpr double kDragTolerance = 1e-3;

class ViewMouseFixture : public ViewDrawFixture {
protected:
    RWEvent mouseAt(RWEventType type, const CGPoint& world, uint64_t mods,
                    int64_t clicks = 1) const {
        return RWEvent::mouseEvent(type, view.getPointScreen(world), mods, clicks);
    }
    void down(double t, double v, uint64_t mods = 0, int64_t clicks = 1) {
        view.mouseDown(mouseAt(RWEventType::LeftMouseDown, CGPointMake(t, v), mods, clicks));
    }
    void dragTo(double t, double v, uint64_t mods = 0, double after = kStepSeconds) {
        clock.advance(after);
        view.mouseDragged(mouseAt(RWEventType::LeftMouseDragged, CGPointMake(t, v), mods));
    }
    void up(double t, double v, uint64_t mods = 0) {
        view.mouseUp(mouseAt(RWEventType::LeftMouseUp, CGPointMake(t, v), mods));
    }
    // A whole click: down and up at one point.
    void click(double t, double v, uint64_t mods = 0, int64_t clicks = 1) {
        down(t, v, mods, clicks);
        up(t, v, mods);
    }

    // The keyframe handles of the view's selection, in order.
    std::vector<TQKeyframeHandle> selectedHandles() {
        std::vector<TQKeyframeHandle> out;
        for (const auto& e : view.getSelection()->getSelectionArray())
            out.push_back(e->getHandle());
        return out;
    }
    static TQKeyframeHandle keyAt(const TQCurveEditorChannelItemPtr& item, double t) {
        return item->channel()->getKeyframe(seconds(t));
    }
    // The keyframe's time and value, or NaNs when the handle is stale.
    static std::pair<double, double> keyOf(const TQCurveEditorChannelItemPtr& item,
                                           TQKeyframeHandle h) {
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        if (!item->channel()->getKeyframe(h, &t, &v)) return {NAN, NAN};
        return {CMTimeGetSeconds(t), v};
    }

    size_t countCalls(const char* operation) const { return recorder.count(operation); }
    // The description of the last undo step opened, as the host received it; empty if none.
    std::string lastUndoStep() const {
        for (auto it = recorder.calls().rbegin(); it != recorder.calls().rend(); ++it)
            if (it->operation == "startCaptureModifiedChannels") return it->text;
        return {};
    }
};

}  // namespace view_test
