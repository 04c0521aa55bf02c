// The full editor's timeline view on the sample project: the display range as the view's
// horizontal volume, the time grid, the value labels, the extent lines, the keypoint label's
// time text, and typed numbers that move keypoints in time as one undo step.
#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <set>
#include <vector>

#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/ui/RWButton.h"
#include "src/editor/tests/EditorFixture.h"

namespace {

using namespace editor_test;
constexpr double kPixelTolerance = 1.5;

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

    bool frame() {
        clock.advance(1.0);
        return view.displayLayer(&encoder);
    }
    void showRange(double start, double duration) {
        const CMTime s = seconds(start), d = seconds(duration);
        view.setDisplayRange(&s, &d);
    }
    // The world x of the last frame's lines: stippled (the grid) or in the extent colour.
    std::multiset<double> lines(bool grid) const {
        const HXDColor extent = TQCurveEditorViewBase::drawingColor(view.endpointsColor());
        std::multiset<double> xs;
        for (const auto& p : view.primitives())
            if (const auto* line = dynamic_cast<const HXDLine*>(p.get());
                line && line->stippled() == grid && (grid || line->color() == extent))
                xs.insert(std::round(line->start().x * 3000.0) / 3000.0);
        return xs;
    }
    std::vector<const HXDText*> texts() const {
        std::vector<const HXDText*> out;
        for (const auto& p : view.primitives())
            if (const auto* t = dynamic_cast<const HXDText*>(p.get())) out.push_back(t);
        return out;
    }
    // Opens the typing panel with a key; the script types more and ends with a button.
    bool type(const char* key, const char* more, const char* button) {
        modal.pushScript([=, this](RWWindow& panel, RWModalService&) {
            shown = panel.contentView()->subview<RWTextField>()->stringValue();
            panelFrame = panel.frame();
            panel.contentView()->subview<RWTextField>()->insertText(more);
            panel.contentView()
                ->subview<RWButton>([&](const RWButton& b) { return b.title() == button; })
                ->userClick();
        });
        return view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, key));
    }

    HXDRecordingEncoder encoder{800, 400};
    std::string shown;
    CGRect panelFrame = CGRectZero;
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
    EXPECT_NEAR(view.getCurrentViewVolume().origin.x, -1.5, 1e-6);
    EXPECT_NEAR(view.getCurrentViewVolume().size.width, 4.0, 1e-6);
    EXPECT_NEAR(view.zoomX(), 800.0 / 4.0, 1e-9) << "points per second of the view";
    EXPECT_EQ(view.gridSpacingX(), 0.5) << "the host's text step";
    EXPECT_EQ(view.getSelectionViewVolume(), CGRectZero) << "a rubber band is forgotten";
    EXPECT_EQ(item->originalCurveDirty(), 1) << "every curve is sampled again";
    EXPECT_GE(viewHost.redrawRequests(), 1);
    EXPECT_TRUE(ctrl.ranges.size() == 1 && ctrl.ranges[0].start == seconds(-1.5) &&
                ctrl.ranges[0].duration == seconds(4.0));
    const CMTime two = seconds(2.0);
    view.setDisplayRange(nullptr, &two);
    EXPECT_NEAR(view.getCurrentViewVolume().origin.x, -1.5, 1e-6) << "a missing part stays";
    EXPECT_NEAR(view.getCurrentViewVolume().size.width, 2.0, 1e-6);

    // From a start before zero, lines begin at 0 and run to the right edge (4.2 s); a closer
    // step lands on the same whole seconds.
    const struct {
        CMTime step;
        std::multiset<double> lines;
    } cases[] = {{CMTimeMake(1, 1), {0, 1, 2, 3, 4}},
                 {CMTimeMake(2, 1), {0, 2, 4}},
                 {CMTimeMake(1, 30), {0, 1, 2, 3, 4}}};
    for (const auto& c : cases) {
        ASSERT_TRUE(host.setSecondsPerTextStep(c.step));
        showRange(-1.8, 6.0);
        ASSERT_TRUE(frame());
        EXPECT_EQ(lines(true), c.lines) << "step " << CMTimeGetSeconds(c.step);
    }
    // Each line spans the view, in the grid colour.
    const auto* line = dynamic_cast<const HXDLine*>(view.primitives().front().get());
    ASSERT_TRUE(line && line->stippled());
    EXPECT_EQ(line->color(), TQCurveEditorViewBase::drawingColor(view.gridColor()));
    EXPECT_NEAR(view.getPointScreen(CGPointMake(0.0, line->start().y)).y, 400.0, kPixelTolerance);
    EXPECT_NEAR(view.getPointScreen(CGPointMake(0.0, line->end().y)).y, 0.0, kPixelTolerance);
    showRange(-6.0, 4.0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(lines(true).empty()) << "a view that ends before zero has no lines";

    SCOPED_TRACE("a zero frame duration and text step neither divide nor loop");
    ZeroTimeHost zero(&host);
    ctrl.setAppDelegate(&zero);
    showRange(0.0, 6.0);
    EXPECT_EQ(view.gridSpacingX(), 0.0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(lines(true).empty());
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
    EXPECT_EQ(view.getCoordinates(nullptr, frame12, 0.5), "(13.0, 0.5)");
    host.setDisplayTimeAsFrames(false);
    host.setStartTimecode(30);
    EXPECT_EQ(view.getCoordinates(nullptr, frame12, 0.5), "(00:00:01:12, 0.5)");
    // An amplitude channel's value in decibels, without decimals.
    TQChannel* volume = channel(kTQHostSampleQuaternionObject, TQHostTypedPaths(family()).volume);
    auto decibels = std::make_shared<TQCurveEditorChannelItem>();
    decibels->initWithChannel(volume, 10, &host, 0);
    EXPECT_EQ(view.getCoordinates(decibels.get(), frame12, 0.5), "(00:00:01:12,-6)");

    EXPECT_TRUE(texts().empty()) << "no value labels while no single channel is shown";
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Opacity), true);
    ASSERT_TRUE(frame());
    // Each names the value of its row, from the bottom up, five points in.
    std::string labels;
    for (const HXDText* label : texts()) {
        const CGPoint at = view.getPointScreen(label->position());
        labels.append(label->string()).append("@").append(std::to_string(std::lround(at.x)));
        labels.append(",").append(std::to_string(std::lround(at.y))).append(" ");
    }
    EXPECT_EQ(labels, "-5.00@5,46 22.50@5,126 50.00@5,206 77.50@5,286 105.00@5,366 ");

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
    auto expectBeside = [&](const char* after) {
        ASSERT_TRUE(frame());
        const CGPoint keypoint = keypointOnScreen();
        ASSERT_TRUE(CGRectContainsPoint(CGRectMake(0, 0, 700, 350), keypoint)) << after;
        const HXDText* label = nullptr;
        for (const HXDText* text : texts())
            if (text->string().rfind("(", 0) == 0) label = text;
        ASSERT_TRUE(label) << after;
        const CGPoint at = view.getPointScreen(label->position());
        EXPECT_NEAR(at.x - keypoint.x, 5.0 + 1.0, 2.0) << after;
        EXPECT_NEAR(at.y - keypoint.y, 5.0, 5.0) << after;
    };
    expectBeside("the first frame");
    view.zoomWithFactor(3.0, 1.0);
    expectBeside("a zoom by a factor");
    view.setMouseOrigin(keypointOnScreen());
    view.zoom(-120.0, 0.0);
    expectBeside("a drag zoom");
}

TEST_F(TimelineTest, extent_lines__one_pair_per_object_of_the_selected_channels) {
    const double last = std::round((6.0 - 1.0 / 30.0) * 3000) / 3000;
    ctrl.showAll();
    ASSERT_TRUE(frame());
    EXPECT_TRUE(lines(false).empty()) << "nothing selected among two objects";
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 0), true);
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 1), true);
    ASSERT_TRUE(frame());
    EXPECT_EQ(lines(false), (std::multiset<double>{0.0, last})) << "two channels of one object";
    // The lower third starts a second in: its extent adds its own pair.
    host.setSelectedObjects({object(kTQHostSampleTitleObject), object(kTQHostSampleOffsetObject)});
    ctrl.showAll();
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Opacity), true);
    ctrl.selectChannel(channel(kTQHostSampleOffsetObject, TQHostProperty::Opacity), true);
    ASSERT_TRUE(frame());
    EXPECT_EQ(lines(false), (std::multiset<double>{0.0, 1.0, last, last}));
}

TEST_F(TimelineTest, typed_numbers__move_the_selected_keypoints_as_one_undo_step) {
    TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const std::unique_ptr<TQChannelBase> before(x->cloneChannel());
    const std::vector<double> times = keyTimes(x);
    selectKeypoints(x);
    viewHost.setScreenOrigin(CGPointMake(100.0, 200.0));
    EXPECT_TRUE(type("1", "2", "OK"));  // the user goes on typing: "12"
    EXPECT_EQ(shown, "1") << "the key that opened the panel is in its field";
    // Centred on the view's top edge, hanging below it.
    EXPECT_EQ(CGPointMake(CGRectGetMidX(panelFrame), CGRectGetMaxY(panelFrame)),
              CGPointMake(100.0 + 400.0, 200.0 + 400.0));
    // A digit puts the earliest keypoint on that frame; the others keep their distance.
    const std::vector<double> after = keyTimes(x);
    ASSERT_EQ(after.size(), times.size());
    for (size_t i = 0; i < times.size(); ++i)
        EXPECT_NEAR(after[i], times[i] + 12.0 / 30.0 - times[0], 1.0 / 60.0) << "keypoint " << i;
    EXPECT_EQ(host.undoDescription(), "Move Keypoint");
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*x == *before) << "one undo step takes the move back exactly";

    // A sign moves each keypoint onto the frame so many frames later.
    TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const std::vector<double> yTimes = keyTimes(y);
    selectKeypoints(y);
    EXPECT_TRUE(type("+", "6", "OK"));
    for (size_t i = 0; i < yTimes.size(); ++i)
        EXPECT_NEAR(keyTimes(y)[i], std::round(yTimes[i] * 30.0 + 6.0) / 30.0, 1e-9) << i;

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
