// Box deformation: the box that setup freezes, deformations that end where they should
// however the corners got there, the write order that keeps keypoints of one channel from
// taking each other's place, linked components, and the snap of the last deformation.
//
// The keypoints lie at 1..5 s with values and handles that make every normalised coordinate
// exact in binary, so that a box mapped back onto itself gives back the very channel it
// started from.

#include <memory>
#include <vector>

#include "tests/support/EngineFixture.h"

namespace engine_test {
namespace {

struct Box {
    CGPoint bl, br, tr, tl;
    Box moved(double dx) const {
        return {bl + CGPointMake(dx, 0), br + CGPointMake(dx, 0), tr + CGPointMake(dx, 0),
                tl + CGPointMake(dx, 0)};
    }
    Box rightSideAt(double x) const { return {bl, CGPointMake(x, br.y), CGPointMake(x, tr.y), tl}; }
};

// The first keypoint's input handle has no length: mirrored, its output handle would point
// back in time until the two trade places.
constexpr const char* kKeys =
    "1=0(0,0|0.25,0.125) 2=0.5(-0.25,-0.125|0.25,0.125) 3=1(-0.25,-0.125|0.25,0.125) "
    "4=0.25(-0.25,-0.125|0.25,0.125) 5=0.75(-0.25,-0.125|0.25,0.125)";

// Logs, at each write of a keyframe's time, where the keyframe stood before it.
class TimeWriteLog : public TQChannel {
public:
    TimeWriteLog(const char* name, TQChannelId id) : TQChannel(name, id) {}
    void setKeyframeTime(TQKeyframeHandle handle, const CMTime* time, const double* newValue,
                         bool* collided) override {
        CMTime before = kCMTimeInvalid;
        if (getKeyframe(handle, &before, nullptr)) written.push_back(CMTimeGetSeconds(before));
        TQChannel::setKeyframeTime(handle, time, newValue, collided);
    }
    std::vector<double> written;
};

class CtrlDeform : public EngineFixture {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        if (onGrid) return std::make_unique<FrameGridController>();
        return EngineFixture::makeController();
    }
    // Every keypoint of the items, as a band would select them; answers the frozen box.
    Box setupAll(std::initializer_list<TQCurveEditorChannelItemPtr> of) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (const auto& i : of)
            for (TQKeyframeHandle h : i->channel()->getKeyframes(false)) {
                CMTime t = kCMTimeInvalid;
                i->channel()->getKeyframe(h, &t, nullptr);
                list->addSelection(keypointEntry(i, CMTimeGetSeconds(t)));
            }
        const CGRect r = ctrl().setupDeformSelected(list);
        const double x1 = r.origin.x + r.size.width, y1 = r.origin.y + r.size.height;
        return {r.origin, CGPointMake(x1, r.origin.y), CGPointMake(x1, y1),
                CGPointMake(r.origin.x, y1)};
    }
    void deform(const Box& b, char last = 0) {
        ctrl().deformSelected(view.getSelection(), b.bl, b.br, b.tr, b.tl, last);
    }
    bool onGrid = false;
};

TEST_F(CtrlDeform, setupDeformSelected__a_box_around_the_keypoints_alone) {
    build(std::string("A: ") + kKeys + "; B: 2=-1 9=3");
    const Box box = setupAll({item("A"), item("B")});
    EXPECT_EQ(box.bl, CGPointMake(1.0, -1.0)) << "handles reach past the box, not widening it";
    EXPECT_EQ(box.tr, CGPointMake(9.0, 3.0));
    EXPECT_EQ(ctrl().setupDeformSelected(select("A@4 A@4")), CGRectMake(4.0, 0.25, 1e-6, 1e-6))
        << "a degenerate extent is widened";
    EXPECT_EQ(ctrl().setupDeformSelected(select("A>2 B<9")), CGRectZero)
        << "tangent entries freeze nothing";
    EXPECT_TRUE(ctrl().deformKeys().empty());
    deform(setupAll({item("B"), item("A")}).moved(0.5));
    EXPECT_EQ(sceneText(*object), "A: 1.5=0 2.5=0.5 3.5=1 4.5=0.25 5.5=0.75; B: 2.5=-1 9.5=3")
        << "every curve moves, whatever the order of the selection";
}

TEST_F(CtrlDeform, deformSelected__ends_where_it_should_however_the_corners_got_there) {
    build(std::string("A*2: ") + kKeys);
    TQChannel* c = item("A")->channel();
    item("A")->setOffsetY(0.5);
    c->setTimeOffset(seconds(0.5));
    const std::unique_ptr<TQChannelBase> original(c->cloneChannel());
    // A free distortion in forty steps: every corner elsewhere, so the squared term counts.
    const Box start = setupAll({item("A")});
    const Box end{CGPointMake(1.25, -0.25), CGPointMake(6.75, 0.5), CGPointMake(6.0, 1.75),
                  CGPointMake(2.0, 1.25)};
    for (int i = 1; i <= 40; ++i) {
        const auto mix = [i](CGPoint p, CGPoint q) {
            return CGPointMake(p.x + (q.x - p.x) * i / 40, p.y + (q.y - p.y) * i / 40);
        };
        deform({mix(start.bl, end.bl), mix(start.br, end.br), mix(start.tr, end.tr),
                mix(start.tl, end.tl)});
    }
    const std::unique_ptr<TQChannelBase> stepped(c->cloneChannel());
    *c = static_cast<const TQChannel&>(*original);
    setupAll({item("A")});
    deform(end);
    EXPECT_TRUE(*c == *stepped) << "forty steps end exactly where one step to their end ends";
    // The output handles take the distortion's cross term with u squared, the input ones not.
    EXPECT_EQ(keyText(*c, true, 4),
              "0.75=0(0,0|0.4368,0.4648) 2.312=1.812(-0.3555,-0.4414|0.5334,0.4336) "
              "3.5=3.5(-0.2617,-0.4102|0.6536,0.4023) 4.781=1.781(-0.2852,-0.418|0.3474,0.4102) "
              "5.688=3.375(-0.1914,-0.3867|0.08081,0.3789)");

    // The right side pulled through the left one (through a box of no width) and back:
    // mirrored in time each keypoint keeps its input handle before it, then all come back.
    *c = static_cast<const TQChannel&>(*original);
    c->setTimeOffset(kCMTimeZero);
    const std::unique_ptr<TQChannelBase> unshifted(c->cloneChannel());
    const Box box = setupAll({item("A")});
    for (double x : {3.0, 1.0, -1.0, -3.0}) deform(box.rightSideAt(x));
    EXPECT_EQ(keyText(*c, true),
              "-3=0.75(-0.25,0.125|0.25,-0.125) -2=0.25(-0.25,0.125|0.25,-0.125) "
              "-1=1(-0.25,0.125|0.25,-0.125) 0=0.5(-0.25,0.125|0.25,-0.125) "
              "1=0(-0.25,0.125|0,0)");
    for (double x : {-1.0, 1.0, 3.0, 5.0}) deform(box.rightSideAt(x));
    EXPECT_TRUE(*c == *unshifted);
}

TEST_F(CtrlDeform, deformSelected__the_leading_keypoint_first_so_none_takes_anothers_place) {
    // A move of exactly one spacing puts every keypoint on its neighbour's time: the one
    // leading the move is written first, in a box mirrored in time as well.
    auto* c = static_cast<TimeWriteLog*>(
        object->addChild(std::make_unique<TimeWriteLog>("A", nextChannelId++)));
    for (double t : {1.0, 2.0, 3.0, 4.0, 5.0}) c->setKeyframe(seconds(t), t);
    auto i = addItem(c);
    i->setScaleY(1.0);
    i->setOffsetY(0.0);
    const Box box = setupAll({i});
    const Box mirrored = box.rightSideAt(-3.0);
    const struct {
        Box to;
        std::vector<double> written;  // where each keypoint stood, in the order written
        const char* after;
    } steps[] = {
        {box.moved(1.0), {5, 4, 3, 2, 1}, "2=1 3=2 4=3 5=4 6=5"},
        {box, {2, 3, 4, 5, 6}, "1=1 2=2 3=3 4=4 5=5"},
        {box.rightSideAt(-1.0), {5, 4, 3, 2, 1}, "-1=5 -0.5=4 0=3 0.5=2 1=1"},
        {mirrored, {-1, -0.5, 0, 0.5, 1}, "-3=5 -2=4 -1=3 0=2 1=1"},
        {mirrored.moved(-1.0), {-3, -2, -1, 0, 1}, "-4=5 -3=4 -2=3 -1=2 0=1"},
        {mirrored, {0, -1, -2, -3, -4}, "-3=5 -2=4 -1=3 0=2 1=1"},
    };
    for (const auto& step : steps) {
        c->written.clear();
        deform(step.to);
        EXPECT_EQ(c->written, step.written) << step.after;
        EXPECT_EQ(keyText(*c), step.after) << "no keypoint lost or moved twice";
    }
}

// Half a second later and twice as tall: only the selected component's values change; a
// linked component's keyframes follow in time, keeping their values.
TEST_F(CtrlDeform, deformSelected__linked_components_follow_in_time) {
    for (const char* linked : {"linked", ""}) {
        SCOPED_TRACE(linked);
        TearDown();
        items.clear();
        SetUp();
        build("Pos.X: 1=0 2=0.5 3=1; Pos.Y: 1=0 2=0.5 3=1");
        static_cast<TQCompoundChannel*>(item("X")->channel()->getParent())->setLinked(*linked);
        Box box = setupAll({item("X")});
        box.tl.y = box.tr.y = 2.0;
        item("Y")->refreshOriginalCurve(kCMTimeZero, seconds(0.5));
        deform(box.moved(0.5));
        EXPECT_EQ(sceneText(*object), *linked ? "X: 1.5=0 2.5=1 3.5=2; Y: 1.5=0 2.5=0.5 3.5=1"
                                              : "X: 1.5=0 2.5=1 3.5=2; Y: 1=0 2=0.5 3=1");
        EXPECT_EQ(item("Y")->originalCurveDirty(), *linked ? 1 : 0) << "Y's curve is drawn anew";
    }
}

TEST_F(CtrlDeform, deformSelected__only_the_last_deformation_snaps_to_frames) {
    TearDown();
    onGrid = true;
    SetUp();
    build(std::string("A: ") + kKeys);
    // A fifth of a frame wider: the last keypoint leaves its frame until the last deformation.
    const Box wider = setupAll({item("A")}).rightSideAt(5.0 + 1.0 / 150.0);
    deform(wider);
    EXPECT_EQ(keyText(*item("A")->channel()), "1=0 2.00167=0.5 3.00333=1 4.005=0.25 5.00667=0.75");
    deform(wider, 1);
    EXPECT_EQ(keyText(*item("A")->channel()), "1=0 2=0.5 3=1 4=0.25 5=0.75");
}

}  // namespace
}  // namespace engine_test
