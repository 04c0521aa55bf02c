#pragma once
// The engine fixture with a controller that does what the full editor's does with the
// horizontal requests of the view: it applies them to the view's display range. It also
// counts the view's calls on it.

#include <cmath>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

namespace view_test {

using namespace engine_test;

// Screen positions go through a single-precision matrix.
inline constexpr double kPixelTolerance = 1e-3;
inline constexpr double kWorldTolerance = 1e-5;

class RangeController : public TQCurveEditorCtrlBase {
public:
    void didSetViewContentsHorizontalOrigin(double origin, double andDuration) override {
        ++originRequests;
        const CMTime start = seconds(origin);
        const CMTime duration = seconds(andDuration);
        getView()->setDisplayRange(&start, &duration);
    }
    void didSetViewContentsHorizontalOffset(double offset) override {
        offsets.push_back(offset);
        const CMTime start = seconds(CMTimeGetSeconds(getView()->getDisplayRange().start) + offset);
        getView()->setDisplayRange(&start, nullptr);
    }
    void currentViewVolumeChangedTo(const CGRect* volume) override {
        ++volumeChanges;
        lastVolume = *volume;
    }
    void windowWasPanned(double fraction) override { panned.push_back(fraction); }

    int originRequests = 0;
    std::vector<double> offsets;
    int volumeChanges = 0;
    CGRect lastVolume = CGRectZero;
    std::vector<double> panned;
};

class ViewFixture : public EngineFixture {
protected:
    void SetUp() override {
        EngineFixture::SetUp();
        const CMTime start = seconds(0.0);
        const CMTime duration = seconds(10.0);
        view.setDisplayRange(&start, &duration);
    }

    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<RangeController>();
    }

    RangeController& range() { return static_cast<RangeController&>(ctrl()); }

    // Words posted through the delegate, in order.
    std::vector<TQNotificationWord> postedWords() const {
        std::vector<TQNotificationWord> out;
        for (const TQDelegateCall& call : recorder.calls())
            if (call.operation == "postNotification") out.push_back(call.word);
        return out;
    }

    static void expectRectNear(const CGRect& actual, const CGRect& expected, double tolerance,
                               const char* what) {
        EXPECT_NEAR(actual.origin.x, expected.origin.x, tolerance) << what << ": x";
        EXPECT_NEAR(actual.origin.y, expected.origin.y, tolerance) << what << ": y";
        EXPECT_NEAR(actual.size.width, expected.size.width, tolerance) << what << ": width";
        EXPECT_NEAR(actual.size.height, expected.size.height, tolerance) << what << ": height";
    }
};

}  // namespace view_test
