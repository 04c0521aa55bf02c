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

constexpr double kSecondTolerance = 1e-6;
constexpr double kPixelTolerance = 1.5;

// A button of a panel, by its title, as the user finds it.
std::shared_ptr<RWButton> button(RWWindow& panel, const std::string& title) {
    return panel.contentView()->subview<RWButton>(
        [&](const RWButton& b) { return b.title() == title; });
}

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTQCurveEditorTimescale); }

// A host whose frame duration and text step can be anything, zero included.
class OddTimeHost : public TQRecordingAppDelegate {
public:
    using TQRecordingAppDelegate::TQRecordingAppDelegate;
    CMTime getFrameDuration() override { return frame; }
    CMTime secondsPerTextStep() override { return textStep; }
    CMTime frame = kCMTimeZero;
    CMTime textStep = kCMTimeZero;
};

class TimelineTest : public editor_test::EditorFixture {
protected:
    void SetUp() override {
        EditorFixture::SetUp();
        ctrl.followsZoom = true;
        // The title and the logo, as a user would show them.
        host.setSelectedObjects({host.scene().objectNamed(kTQHostSampleTitleObject),
                                 host.scene().objectNamed(kTQHostSampleBehaviorObject)});
        view.setAutoZoom(0);
        previousModal = RWApplicationServices().modal;
        RWServiceSet mine;
        mine.modal = &modal;
        RWInstallServices(mine);
        ASSERT_TRUE(frame());
        ctrl.ranges.clear();
    }
    void TearDown() override {
        RWServiceSet back;
        back.modal = previousModal;
        RWInstallServices(back);
        EditorFixture::TearDown();
    }

    bool frame() {
        clock.advance(1.0);
        return view.displayLayer(&encoder);
    }
    void showRange(double start, double duration) {
        const CMTime s = seconds(start);
        const CMTime d = seconds(duration);
        view.setDisplayRange(&s, &d);
    }
    TQChannel* channel(const char* object, TQHostProperty property, size_t axis = 0) {
        const auto& paths = TQHostPropertyPaths(TQHostObjectFamily::Kestrel, property);
        return dynamic_cast<TQChannel*>(
            TQChannelRef(paths[axis]).getChannel(host.scene().objectNamed(object)));
    }
    // The stippled grid lines of the last frame, by world x.
    std::vector<double> gridLines() const {
        std::vector<double> xs;
        for (const auto& p : view.primitives())
            if (const auto* line = dynamic_cast<const HXDLine*>(p.get()); line && line->stippled())
                xs.push_back(line->start().x);
        return xs;
    }
    // The extent lines of the last frame: unstippled lines in the extent colour, by world x.
    std::multiset<double> extentLines() const {
        const HXDColor colour = TQCurveEditorViewBase::drawingColor(view.endpointsColor());
        std::multiset<double> xs;
        for (const auto& p : view.primitives())
            if (const auto* line = dynamic_cast<const HXDLine*>(p.get());
                line && !line->stippled() && line->color() == colour)
                xs.insert(std::round(line->start().x * 3000.0) / 3000.0);
        return xs;
    }
    std::vector<const HXDText*> texts() const {
        std::vector<const HXDText*> out;
        for (const auto& p : view.primitives())
            if (const auto* t = dynamic_cast<const HXDText*>(p.get())) out.push_back(t);
        return out;
    }
    // Every keypoint of the channel, selected in the view.
    void selectKeypointsOf(TQChannel* c) {
        const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->itemWithChannel(c);
        ASSERT_TRUE(item) << c->getName() << " is not shown";
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            auto entry = std::make_shared<TQCurveSelection>();
            entry->setHandle(h);
            entry->setFlags(TQSelectionKeypoint);
            entry->setCurveId(item->channelId());
            view.getSelection()->addSelection(entry);
        }
    }
    static std::vector<double> keyTimes(const TQChannel* c) {
        std::vector<double> out;
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            CMTime t = kCMTimeInvalid;
            c->getKeyframe(h, &t, nullptr);
            out.push_back(CMTimeGetSeconds(t));
        }
        return out;
    }

    RWScriptedModal modal;
    RWModalService* previousModal = nullptr;
    HXDRecordingEncoder encoder{800, 400};
};

TEST_F(TimelineTest, displayRangeModified__takesTheVolumeFromTheRangeAndTellsTheController) {
    view.setSelectionViewVolume(CGRectMake(1.0, 1.0, 2.0, 2.0));
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(
        ctrl.selectedCurveSet()->channeItemAtIndex(0).get());
    ASSERT_TRUE(item);
    item->setOriginalCurveDirty(0);
    viewHost.resetRedrawRequests();
    host.setSecondsPerTextStep(CMTimeMake(1, 2));

    showRange(-1.5, 4.0);

    const CGRect& volume = view.getCurrentViewVolume();
    EXPECT_NEAR(volume.origin.x, -1.5, kSecondTolerance);
    EXPECT_NEAR(volume.size.width, 4.0, kSecondTolerance);
    EXPECT_NEAR(view.zoomX(), 800.0 / 4.0, 1e-9) << "points per second of the view";
    EXPECT_EQ(view.gridSpacingX(), 0.5) << "the host's text step";
    EXPECT_EQ(view.getSelectionViewVolume(), CGRectZero) << "a rubber band is forgotten";
    EXPECT_EQ(item->originalCurveDirty(), 1) << "every curve is sampled again";
    EXPECT_GE(viewHost.redrawRequests(), 1);
    ASSERT_EQ(ctrl.ranges.size(), 1u);
    EXPECT_NEAR(CMTimeGetSeconds(ctrl.ranges[0].start), -1.5, kSecondTolerance);
    EXPECT_NEAR(CMTimeGetSeconds(ctrl.ranges[0].duration), 4.0, kSecondTolerance);
}

TEST_F(TimelineTest, drawGrid__wholeSecondsFromZeroAtTheTextStep) {
    // The range starts before zero: lines begin at 0, and run to the right edge (4.2 s).
    const struct {
        CMTime step;
        std::vector<double> lines;
    } cases[] = {
        {CMTimeMake(1, 1), {0, 1, 2, 3, 4}},
        {CMTimeMake(2, 1), {0, 2, 4}},
        // A closer step lands on the same whole seconds.
        {CMTimeMake(1, 4), {0, 1, 2, 3, 4}},
        {CMTimeMake(1, 30), {0, 1, 2, 3, 4}},
    };
    for (const auto& c : cases) {
        ASSERT_TRUE(host.setSecondsPerTextStep(c.step));
        showRange(-1.8, 6.0);
        ASSERT_TRUE(frame());
        EXPECT_EQ(gridLines(), c.lines) << "step " << CMTimeGetSeconds(c.step);
    }
    // Each line spans the view, stippled, in the grid colour.
    const auto* line = dynamic_cast<const HXDLine*>(view.primitives().front().get());
    ASSERT_TRUE(line && line->stippled());
    EXPECT_EQ(line->color(), TQCurveEditorViewBase::drawingColor(view.gridColor()));
    EXPECT_NEAR(view.getPointScreen(CGPointMake(0.0, line->start().y)).y, 400.0, kPixelTolerance);
    EXPECT_NEAR(view.getPointScreen(CGPointMake(0.0, line->end().y)).y, 0.0, kPixelTolerance);

    showRange(-6.0, 4.0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(gridLines().empty()) << "a view that ends before zero has no lines";
}

TEST_F(TimelineTest, zeroFrameDurationOrTextStep__neitherDividesNorLoops) {
    OddTimeHost odd(&host);
    ctrl.setAppDelegate(&odd);
    showRange(0.0, 6.0);
    EXPECT_EQ(view.gridSpacingX(), 0.0);
    ASSERT_TRUE(frame());
    EXPECT_TRUE(gridLines().empty());
    // The label's time falls back to seconds.
    EXPECT_EQ(view.getCoordinates(nullptr, seconds(0.4), 0.5),
              view.TQCurveEditorViewBase::getCoordinates(nullptr, seconds(0.4), 0.5));

    // A typed number moves nothing: no frame is zero seconds long.
    TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const std::unique_ptr<TQChannelBase> before(x->cloneChannel());
    selectKeypointsOf(x);
    view.moveSelectedKeypointsInTime(12.0, false);
    EXPECT_TRUE(*x == *before);
    ctrl.setAppDelegate(&recorder);
}

TEST_F(TimelineTest, getCoordinates__framesOrTimecodeFromTheHostsFirstFrameAndStart) {
    const CMTime frame12 = CMTimeMake(12, 30);
    host.setDisplayTimeAsFrames(true);
    host.setFirstFrameNumber(1);
    EXPECT_EQ(view.getCoordinates(nullptr, frame12, 0.5), "(13.0, 0.5)");

    host.setDisplayTimeAsFrames(false);
    host.setStartTimecode(30);
    EXPECT_EQ(view.getCoordinates(nullptr, frame12, 0.5), "(00:00:01:12, 0.5)");

    // An amplitude channel's value in decibels, without decimals.
    TQChannelBase* object = host.scene().objectNamed(kTQHostSampleQuaternionObject);
    auto* volume = dynamic_cast<TQChannel*>(
        TQChannelRef(TQHostTypedPaths(TQHostObjectFamily::Kestrel).volume).getChannel(object));
    auto item = std::make_shared<TQCurveEditorChannelItem>();
    item->initWithChannel(volume, 10, &host, 0);
    EXPECT_EQ(view.getCoordinates(item.get(), frame12, 0.5), "(00:00:01:12,-6)");
}

TEST_F(TimelineTest, drawCurveUnits__valueLabelsAtTheLeftEdgeForOneShownChannel) {
    ASSERT_TRUE(frame());
    EXPECT_TRUE(texts().empty()) << "no labels while no single channel is shown";

    TQChannel* opacity = channel(kTQHostSampleTitleObject, TQHostProperty::Opacity);
    ctrl.selectChannel(opacity, true);
    ASSERT_TRUE(frame());
    const TQCurveEditorItemPtr item = ctrl.selectedChannel();
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
    ASSERT_TRUE(channelItem);
    const std::vector<const HXDText*> labels = texts();
    ASSERT_GE(labels.size(), 3u);
    // Each label names the value of its row, at the step, from the bottom of the view up.
    const double step = view.gridSpacingY() * view.gridZoomY();
    const double pixel = view.getCurrentViewVolume().size.height / 400.0;
    for (size_t i = 0; i < labels.size(); ++i) {
        const CGPoint at = labels[i]->position();
        const CGPoint screen = view.getPointScreen(at);
        // Three points in, then a point's nudge from the label and one from the text's place.
        EXPECT_NEAR(screen.x, 3.0 + 1.0 + 1.0, kPixelTolerance) << "label " << i;
        const double row = at.y - 2.0 / view.zoomY();
        EXPECT_NEAR(std::remainder(row, step), 0.0, pixel) << "label " << i << " off the step";
        EXPECT_EQ(
            labels[i]->string(),
            *view.getScale(channelItem, channelItem->offsetY() +
                                            channelItem->scaleY() * std::round(row / step) * step));
        if (i > 0) {
            EXPECT_GT(at.y, labels[i - 1]->position().y);
        }
    }
}

TEST_F(TimelineTest, drawEndpoints__oneLinePairPerObjectExtent) {
    const double lastFrame = 6.0 - 1.0 / 30.0;
    ctrl.showAll();
    ASSERT_EQ(ctrl.numberOfRootItems(), 2u) << "the title and the logo are shown";
    ASSERT_TRUE(frame());
    EXPECT_TRUE(extentLines().empty()) << "nothing selected among two objects";

    // Two channels of one object: its extent once.
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 0), true);
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Position, 1), true);
    ASSERT_TRUE(frame());
    EXPECT_EQ(extentLines(), (std::multiset<double>{0.0, std::round(lastFrame * 3000) / 3000}));

    // The lower third starts a second in: its extent adds its own pair.
    host.setSelectedObjects({host.scene().objectNamed(kTQHostSampleTitleObject),
                             host.scene().objectNamed(kTQHostSampleOffsetObject)});
    ctrl.showAll();
    ctrl.selectChannel(channel(kTQHostSampleTitleObject, TQHostProperty::Opacity), true);
    ctrl.selectChannel(channel(kTQHostSampleOffsetObject, TQHostProperty::Opacity), true);
    ASSERT_TRUE(frame());
    EXPECT_EQ(extentLines(), (std::multiset<double>{0.0, 1.0, std::round(lastFrame * 3000) / 3000,
                                                    std::round(lastFrame * 3000) / 3000}));
}

TEST_F(TimelineTest, keypointLabel__besideItsKeypointAfterEveryKindOfZoom) {
    // The logo's last bounce, at 2.47 s: in view at every zoom below.
    TQChannel* x = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const TQCurveEditorItemPtr item = ctrl.selectedCurveSet()->itemWithChannel(x);
    ASSERT_TRUE(item);
    const TQKeyframeHandle key = x->getKeyframes(false)[6];
    auto entry = std::make_shared<TQCurveSelection>();
    entry->setHandle(key);
    entry->setFlags(TQSelectionKeypoint);
    entry->setCurveId(item->channelId());
    view.getSelection()->addSelection(entry);
    view.setPrintText(1);

    auto keypointOnScreen = [&] {
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        x->getKeyframe(key, &t, &v);
        return view.getPointScreen(
            CGPointMake(CMTimeGetSeconds(t), ctrl.convertFromChannelCoords(item.get(), v)));
    };
    auto expectBeside = [&](const char* after) {
        ASSERT_TRUE(frame());
        const CGPoint keypoint = keypointOnScreen();
        ASSERT_TRUE(keypoint.x > 0.0 && keypoint.x < 700.0 && keypoint.y > 0.0 &&
                    keypoint.y < 350.0)
            << "the keypoint left the view after " << after;
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
    view.frameAll(1);
    expectBeside("framing everything");
}

// ---- Typed numbers ---------------------------------------------------------------------------

TEST_F(TimelineTest, keyDown__aDigitMovesTheEarliestSelectedKeypointToThatFrame) {
    TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const std::unique_ptr<TQChannelBase> before(x->cloneChannel());
    const std::vector<double> times = keyTimes(x);
    selectKeypointsOf(x);
    viewHost.setScreenOrigin(CGPointMake(100.0, 200.0));
    std::string shown;
    CGRect panelFrame = CGRectZero;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        shown = panel.contentView()->subview<RWTextField>()->stringValue();
        panelFrame = panel.frame();
        panel.contentView()->subview<RWTextField>()->insertText(
            "2");  // the user goes on typing: "12"
        panel.contentView()->subview<RWTextField>()->userEndEditing(
            panel.contentView()->subview<RWTextField>()->stringValue());
    });
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "1")));
    EXPECT_EQ(shown, "1") << "the key that opened the panel is in its field";
    // Centred on the view's top edge, hanging below it.
    EXPECT_EQ(panelFrame.origin.x + panelFrame.size.width / 2.0, 100.0 + 400.0);
    EXPECT_EQ(panelFrame.origin.y + panelFrame.size.height, 200.0 + 400.0);

    const std::vector<double> after = keyTimes(x);
    ASSERT_EQ(after.size(), times.size());
    const double shift = 12.0 / 30.0 - times[0];
    for (size_t i = 0; i < times.size(); ++i)
        EXPECT_NEAR(after[i], times[i] + shift, 1.0 / 30.0 / 2.0) << "keypoint " << i;
    EXPECT_EQ(host.undoDescription(), "Move Keypoint");
    ASSERT_TRUE(host.undo());
    EXPECT_TRUE(*x == *before) << "one undo step takes the move back exactly";
}

TEST_F(TimelineTest, keyDown__aSignMovesBySoManyFramesAndTextThatIsNoNumberChangesNothing) {
    TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const std::vector<double> times = keyTimes(y);
    selectKeypointsOf(y);
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        panel.contentView()->subview<RWTextField>()->insertText("6");
        button(panel, "OK")->userClick();
    });
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "+")));
    const std::vector<double> moved = keyTimes(y);
    // Each keypoint on the frame six frames later (each is put on the grid by itself).
    for (size_t i = 0; i < times.size(); ++i)
        EXPECT_NEAR(moved[i], std::round(times[i] * 30.0 + 6.0) / 30.0, 1e-9) << "keypoint " << i;

    // Text that is no number cannot end the edit; the panel stays until Cancel.
    const std::unique_ptr<TQChannelBase> before(y->cloneChannel());
    std::optional<std::string> refused;
    modal.pushScript([&](RWWindow& panel, RWModalService&) {
        refused = panel.contentView()->subview<RWTextField>()->userEndEditing("-1e");
        button(panel, "Cancel")->userClick();
    });
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "-")));
    EXPECT_TRUE(refused.has_value()) << "the field must refuse text that is no number";
    EXPECT_TRUE(*y == *before);
    EXPECT_EQ(host.undoDescription(), "Move Keypoint") << "no step for a cancelled panel";

    // Other keys go on; digits without a selected keypoint open nothing.
    EXPECT_FALSE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "a")));
    view.getSelection()->reset();
    EXPECT_TRUE(view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, "5")));
    EXPECT_EQ(modal.runs().size(), 2u) << "no panel without a selected keypoint";
}

}  // namespace
