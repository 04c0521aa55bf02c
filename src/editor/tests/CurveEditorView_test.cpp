// The full editor's timeline view on the sample project: the display range as the view's
// horizontal volume, the time grid, the value labels, the extent lines, the keypoint label's
// time text, and typed numbers that move keypoints in time as one undo step. Each test notes
// what the view holds and draws after its steps; the notes are recorded in
// baselines/timeline.txt (see TextBaseline.h).
#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/ui/RWButton.h"
#include "src/editor/tests/EditorFixture.h"
#include "tests/support/TextBaseline.h"

namespace {

using namespace editor_test;

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTQCurveEditorTimescale); }

// A host whose frame duration and text step are zero.
class ZeroTimeHost : public TQRecordingAppDelegate {
public:
    using TQRecordingAppDelegate::TQRecordingAppDelegate;
    CMTime getFrameDuration() override { return kCMTimeZero; }
    CMTime secondsPerTextStep() override { return kCMTimeZero; }
};

class TimelineTest : public EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        ctrl.followsZoom = true;
        // The title and the logo, as a user would show them.
        host.setSelectedObjects(
            {object(kTQHostSampleTitleObject), object(kTQHostSampleBehaviorObject)});
        view.setAutoZoom(0);
        ASSERT_TRUE(frame());
        ctrl.ranges.clear();
    }
    void TearDown() override {
        EXPECT_TRUE(tests_support::matchesBaselineBlock(
            "timeline", ::testing::UnitTest::GetInstance()->current_test_info()->name(),
            notes.str(), "src/editor/tests/baselines"));
        EditorFixture::TearDown();
    }

    bool frame() {
        clock.advance(1.0);
        return view.displayLayer(&encoder);
    }
    void showRange(double start, double duration) {
        const CMTime s = seconds(start), d = seconds(duration);
        view.setDisplayRange(&s, &d);
    }
    // The world x of the last frame's lines: stippled (the grid) or in the extent colour. Grid
    // lines not in the grid colour or not spanning the view from bottom to top are counted.
    std::string lines(bool grid) const {
        const HXDColor extent = TQCurveEditorViewBase::drawingColor(view.endpointsColor());
        const HXDColor gridColor = TQCurveEditorViewBase::drawingColor(view.gridColor());
        auto screenY = [&](double y) { return std::lround(view.getPointScreen({0.0, y}).y); };
        std::multiset<double> xs;
        int odd = 0;
        for (const auto& p : view.primitives())
            if (const auto* line = dynamic_cast<const HXDLine*>(p.get());
                line && line->stippled() == grid && (grid || line->color() == extent)) {
                xs.insert(std::round(line->start().x * 3000.0) / 3000.0);
                odd += grid && (line->color() != gridColor || screenY(line->start().y) != 400 ||
                                screenY(line->end().y) != 0);
            }
        std::ostringstream out;
        for (double x : xs) out << " " << x;
        if (odd) out << " (" << odd << " odd)";
        return out.str();
    }
    std::vector<const HXDText*> texts() const {
        std::vector<const HXDText*> out;
        for (const auto& p : view.primitives())
            if (const auto* t = dynamic_cast<const HXDText*>(p.get())) out.push_back(t);
        return out;
    }
    // A frame drawn: the view's volume, zoom and time grid step, the display ranges it reported
    // since the last note, its grid and extent lines, and each text where it sits on screen.
    void note(const std::string& step) {
        ASSERT_TRUE(frame());
        const CGRect v = view.getCurrentViewVolume();
        notes << step << ": x " << v.origin.x << " w " << v.size.width << " zoom " << view.zoomX()
              << " step " << view.gridSpacingX();
        for (const CMTimeRange& r : ctrl.ranges)
            notes << " reported " << r.start.value << "/" << r.start.timescale << "+"
                  << r.duration.value << "/" << r.duration.timescale;
        ctrl.ranges.clear();
        notes << " | grid" << lines(true) << " | extent" << lines(false) << " |";
        for (const HXDText* text : texts()) {
            const CGPoint at = view.getPointScreen(text->position());
            notes << " " << text->string() << "@" << std::lround(at.x) << "," << std::lround(at.y);
        }
        notes << "\n";
    }
    // Opens the typing panel with a key; the script types more and ends with a button.
    bool type(const char* key, const char* more, const char* button) {
        modal.pushScript([=, this](RWWindow& panel, RWModalService&) {
            const CGRect frame = panel.frame();
            notes << "panel shows " << panel.contentView()->subview<RWTextField>()->stringValue()
                  << " centred at " << CGRectGetMidX(frame) << " hanging from "
                  << CGRectGetMaxY(frame) << "\n";
            panel.contentView()->subview<RWTextField>()->insertText(more);
            panel.contentView()
                ->subview<RWButton>([&](const RWButton& b) { return b.title() == button; })
                ->userClick();
        });
        return view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, key));
    }

    HXDRecordingEncoder encoder{800, 400};
    std::ostringstream notes;
};

TEST_F(TimelineTest, display_range__drives_the_volume_and_the_grid_of_whole_seconds) {
    view.setSelectionViewVolume(CGRectMake(1.0, 1.0, 2.0, 2.0));
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(
        ctrl.selectedCurveSet()->channeItemAtIndex(0).get());
    ASSERT_TRUE(item);
    item->setOriginalCurveDirty(0);
    viewHost.resetRedrawRequests();
    host.setSecondsPerTextStep(CMTimeMake(1, 2));
    showRange(-1.5, 4.0);
    EXPECT_EQ(view.getSelectionViewVolume(), CGRectZero) << "a rubber band is forgotten";
    EXPECT_EQ(item->originalCurveDirty(), 1) << "every curve is sampled again";
    EXPECT_GE(viewHost.redrawRequests(), 1);
    note("-1.5 s + 4 s, a text step of 0.5 s");
    const CMTime two = seconds(2.0);
    view.setDisplayRange(nullptr, &two);
    note("a length of 2 s alone");

    // From a start before zero, lines begin at 0 and run to the right edge (4.2 s); a closer
    // step lands on the same whole seconds. A view that ends before zero has none.
    for (const CMTime step : {CMTimeMake(1, 1), CMTimeMake(2, 1), CMTimeMake(1, 30)}) {
        ASSERT_TRUE(host.setSecondsPerTextStep(step));
        showRange(-1.8, 6.0);
        note(std::to_string(step.value) + "/" + std::to_string(step.timescale) + " s a step");
    }
    showRange(-6.0, 4.0);
    note("-6 s + 4 s");

    SCOPED_TRACE("a zero frame duration and text step neither divide nor loop");
    ZeroTimeHost zero(&host);
    ctrl.setAppDelegate(&zero);
    showRange(0.0, 6.0);
    note("zero steps");
    EXPECT_EQ(view.getCoordinates(nullptr, seconds(0.4), 0.5),
              view.TQCurveEditorViewBase::getCoordinates(nullptr, seconds(0.4), 0.5));
    TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const std::unique_ptr<TQChannelBase> before(x->cloneChannel());
    selectKeypoints(x);
    view.moveSelectedKeypointsInTime(12.0, false);
    EXPECT_TRUE(*x == *before) << "no frame is zero seconds long";
    ctrl.setAppDelegate(&recorder);
}

TEST_F(TimelineTest, text__time_as_frames_or_timecode_value_labels_and_the_keypoint_label) {
    const CMTime frame12 = CMTimeMake(12, 30);
    host.setDisplayTimeAsFrames(true);
    host.setFirstFrameNumber(1);
    notes << view.getCoordinates(nullptr, frame12, 0.5) << "\n";
    host.setDisplayTimeAsFrames(false);
    host.setStartTimecode(30);
    notes << view.getCoordinates(nullptr, frame12, 0.5) << "\n";
    // An amplitude channel's value in decibels, without decimals.
    TQChannel* volume = channel(kTQHostSampleQuaternionObject, TQHostTypedPaths(family()).volume);
    auto decibels = std::make_shared<TQCurveEditorChannelItem>();
    decibels->initWithChannel(volume, 10, &host, 0);
    notes << view.getCoordinates(decibels.get(), frame12, 0.5) << "\n";

    // Value labels only while a single channel is shown, each naming its row's value.
    note("two objects");
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Opacity), true);
    note("the opacity");

    // The logo's last bounce, at 2.47 s: its label stays beside it through every zoom.
    ctrl.deselectAllChannels();
    TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const TQCurveEditorItemPtr bounce = ctrl.selectedCurveSet()->itemWithChannel(y);
    selectHandles(y, {y->getKeyframes(false)[6]});
    view.setPrintText(1);
    auto keypointOnScreen = [&] {
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        y->getKeyframe(y->getKeyframes(false)[6], &t, &v);
        return view.getPointScreen(
            CGPointMake(CMTimeGetSeconds(t), ctrl.convertFromChannelCoords(bounce.get(), v)));
    };
    // The keypoint on screen and its label's offset from it.
    auto noteBeside = [&](const char* after) {
        ASSERT_TRUE(frame());
        const CGPoint keypoint = keypointOnScreen();
        notes << after << ": keypoint at " << std::lround(keypoint.x) << ","
              << std::lround(keypoint.y);
        for (const HXDText* text : texts())
            if (text->string().rfind("(", 0) == 0) {
                const CGPoint at = view.getPointScreen(text->position());
                notes << ", " << text->string() << " at +" << std::lround(at.x - keypoint.x) << ",+"
                      << std::lround(at.y - keypoint.y);
            }
        notes << "\n";
    };
    noteBeside("the first frame");
    view.zoomWithFactor(3.0, 1.0);
    noteBeside("a zoom by a factor");
    view.setMouseOrigin(keypointOnScreen());
    view.zoom(-120.0, 0.0);
    noteBeside("a drag zoom");
}

TEST_F(TimelineTest, extent_lines__one_pair_per_object_of_the_selected_channels) {
    ctrl.showAll();
    note("nothing selected among two objects");
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 0), true);
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 1), true);
    note("two channels of one object");
    // The lower third starts a second in: its extent adds its own pair.
    host.setSelectedObjects({object(kTQHostSampleTitleObject), object(kTQHostSampleOffsetObject)});
    ctrl.showAll();
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Opacity), true);
    ctrl.selectChannel(channel(kTQHostSampleOffsetObject, TQHostProperty::Opacity), true);
    note("the opacities of two objects");
}

TEST_F(TimelineTest, typed_numbers__move_the_selected_keypoints_as_one_undo_step) {
    TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const std::unique_ptr<TQChannelBase> before(x->cloneChannel());
    notes << "x " << keyText(*x) << "\n";
    selectKeypoints(x);
    viewHost.setScreenOrigin(CGPointMake(100.0, 200.0));
    // The user goes on typing, "12": the earliest keypoint goes to that frame, the others keep
    // their distance.
    EXPECT_TRUE(type("1", "2", "OK"));
    notes << "x " << keyText(*x) << ", undo " << host.undoDescription() << "\n";
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*x == *before) << "one undo step takes the move back exactly";

    // A sign moves each keypoint onto the frame so many frames later.
    TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    notes << "y " << keyText(*y, false, 9) << "\n";
    selectKeypoints(y);
    EXPECT_TRUE(type("+", "6", "OK"));
    notes << "y " << keyText(*y, false, 9) << "\n";

    // Text that is no number cannot end the edit; the panel stays until Cancel.
    const std::unique_ptr<TQChannelBase> moved(y->cloneChannel());
    std::optional<std::string> refused;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        refused = panel.contentView()->subview<RWTextField>()->userEndEditing("-1e");
        panel.contentView()
            ->subview<RWButton>([](const RWButton& b) { return b.title() == "Cancel"; })
            ->userClick();
    });
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "-")));
    EXPECT_TRUE(refused.has_value()) << "the field must refuse text that is no number";
    EXPECT_TRUE(*y == *moved);
    EXPECT_EQ(host.undoDescription(), "Move Keypoint") << "no step for a cancelled panel";

    // Other keys go on; digits without a selected keypoint open nothing.
    EXPECT_FALSE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "a")));
    view.getSelection()->reset();
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "5")));
    EXPECT_EQ(modal.runs().size(), 3u) << "no panel without a selected keypoint";
}

}  // namespace
