// Box deformation: the box that setup freezes, deformations that end where they should
// however the corners got there, the write order that keeps keypoints of one channel from
// taking each other's place, linked components, and the snap of the last deformation.
//
// The scene's keypoints lie at 1..5 s with values and handles that make every normalised
// coordinate exact in binary, so that a box mapped back onto itself gives back the very
// channel it started from.

#include <memory>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

namespace engine_test {
namespace {

struct Box {
    CGPoint bl, br, tr, tl;
};

Box boxOf(const CGRect& r) {
    const double x1 = r.origin.x + r.size.width;
    const double y1 = r.origin.y + r.size.height;
    return {r.origin, CGPointMake(x1, r.origin.y), CGPointMake(x1, y1),
            CGPointMake(r.origin.x, y1)};
}

Box moved(Box b, double dx) {
    for (CGPoint* p : {&b.bl, &b.br, &b.tr, &b.tl}) p->x += dx;
    return b;
}

// The right side at x.
Box rightSideAt(Box b, double x) {
    b.br.x = x;
    b.tr.x = x;
    return b;
}

constexpr double kHandleU = 0.25;
constexpr double kHandleV = 0.125;

class CtrlDeformTest : public EngineFixture {
protected:
    TQChannel* addBoxChannel(const char* name) {
        TQChannel* c =
            addChannel(name, {{1.0, 0.0}, {2.0, 0.5}, {3.0, 1.0}, {4.0, 0.25}, {5.0, 0.75}});
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            c->setKeyframeInputTangents(h, -kHandleU, -kHandleV);
            c->setKeyframeOutputTangents(h, kHandleU, kHandleV);
        }
        return c;
    }
    // The channel's item, with a vertical mapping as a frame would give it.
    TQCurveEditorChannelItemPtr boxItem(TQChannel* channel, double scaleY = 1.0,
                                        double offsetY = 0.0) {
        auto item = addItem(channel);
        item->setScaleY(scaleY);
        item->setOffsetY(offsetY);
        return item;
    }
    // Every keypoint of the items, as a band would select them; answers the frozen box.
    Box setupAll(std::initializer_list<TQCurveEditorChannelItemPtr> items) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (const auto& item : items)
            for (double t : keyTimes(item->channel())) list->addSelection(keypointEntry(item, t));
        return boxOf(ctrl().setupDeformSelected(list));
    }
    void deform(const Box& b, char last = 0) {
        ctrl().deformSelected(view.getSelection(), b.bl, b.br, b.tr, b.tl, last);
    }
    static std::unique_ptr<TQChannel> cloneOf(const TQChannel& c) {
        return std::unique_ptr<TQChannel>(static_cast<TQChannel*>(c.cloneChannel()));
    }
    // A clone with every keyframe moved by dt in time, after a mirror about 1 s if asked: the
    // handles then turn back in time, the output one becoming the input one.
    static std::unique_ptr<TQChannel> expectedAfter(const TQChannel& c, double dt, bool mirrored) {
        auto out = cloneOf(c);
        for (TQKeyframeHandle h : out->getKeyframes(false)) {
            CMTime t = kCMTimeInvalid;
            double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
            out->getKeyframe(h, &t, nullptr);
            out->getKeyframeInputTangents(h, &inU, &inV);
            out->getKeyframeOutputTangents(h, &outU, &outV);
            double s = CMTimeGetSeconds(t);
            if (mirrored) {
                s = 2.0 - s;
                out->setKeyframeInputTangents(h, -outU, outV);
                out->setKeyframeOutputTangents(h, -inU, inV);
            }
            const CMTime to = seconds(s + dt);
            out->setKeyframeTime(h, &to);
        }
        return out;
    }
};

TEST_F(CtrlDeformTest, setupDeformSelected__boxAroundKeypointsAlone) {
    auto a = boxItem(addBoxChannel("A"));
    auto b = boxItem(addChannel("B", {{2.0, -1.0}, {9.0, 3.0}}));
    const Box box = setupAll({a, b});
    EXPECT_EQ(box.bl, CGPointMake(1.0, -1.0)) << "handles reach past the box, not widening it";
    EXPECT_EQ(box.tr, CGPointMake(9.0, 3.0));
    selectInView({keypointEntry(a, 4.0), keypointEntry(a, 4.0)});
    EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()), CGRectMake(4.0, 0.25, 1e-6, 1e-6))
        << "a degenerate extent is widened";
    selectInView({tangentEntry(a, 2.0, true), tangentEntry(b, 9.0, false)});
    EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()), CGRectZero)
        << "tangent entries freeze nothing";
    EXPECT_TRUE(ctrl().deformKeys().empty());
}

TEST_F(CtrlDeformTest, deformSelected__manySmallStepsEndWhereOneStepEnds) {
    TQChannel* c = addBoxChannel("A");
    c->setTimeOffset(seconds(0.5));
    auto item = boxItem(c, 2.0, 0.5);
    const auto original = cloneOf(*c);
    // A free distortion: every corner elsewhere, so that the squared term counts too.
    const Box start = setupAll({item});
    const Box end{CGPointMake(1.25, -0.25), CGPointMake(6.75, 0.5), CGPointMake(6.0, 1.75),
                  CGPointMake(2.0, 1.25)};
    for (int i = 1; i <= 40; ++i) {
        const double f = i / 40.0;
        auto mix = [f](CGPoint p, CGPoint q) {
            return p + CGPointMake((q.x - p.x) * f, (q.y - p.y) * f);
        };
        deform({mix(start.bl, end.bl), mix(start.br, end.br), mix(start.tr, end.tr),
                mix(start.tl, end.tl)});
    }
    const auto stepped = cloneOf(*c);

    *c = *original;
    setupAll({item});
    deform(end);
    EXPECT_EQ(*c, *stepped) << "forty steps must end exactly where one step to their end ends";
}

TEST_F(CtrlDeformTest, deformSelected__insideOutAndBackRestoresEveryKeypoint) {
    TQChannel* c = addBoxChannel("A");
    auto item = boxItem(c, 2.0, 0.5);
    const auto original = cloneOf(*c);
    const Box box = setupAll({item});
    // The right side pulled through the left one (through a box of no width) and back.
    for (double x : {3.0, 1.0, -1.0, -3.0}) deform(rightSideAt(box, x));
    EXPECT_EQ(*c, *expectedAfter(*original, 0.0, true))
        << "mirrored in time, each keypoint keeps its input handle before it";
    for (double x : {-1.0, 1.0, 3.0, 5.0}) deform(rightSideAt(box, x));
    EXPECT_EQ(*c, *original);
}

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

TEST_F(CtrlDeformTest, deformSelected__leadingKeypointFirstSoNoneTakesAnothersPlace) {
    // A move of exactly one spacing puts every keypoint on its neighbour's time: the one
    // leading the move is written first, in a box mirrored in time as well.
    auto* c = static_cast<TimeWriteLog*>(
        object->addChild(std::make_unique<TimeWriteLog>("A", nextChannelId++)));
    for (double t : {1.0, 2.0, 3.0, 4.0, 5.0}) c->setKeyframe(seconds(t), t);
    auto item = boxItem(c);
    const Box box = setupAll({item});
    const Box mirrored = rightSideAt(box, -3.0);
    struct Step {
        const char* what;
        Box to;
        std::vector<double> written;  // where each keypoint stood, in the order written
        std::vector<double> after;
    };
    const Step steps[] = {
        {"right", moved(box, 1.0), {5, 4, 3, 2, 1}, {2, 3, 4, 5, 6}},
        {"left", box, {2, 3, 4, 5, 6}, {1, 2, 3, 4, 5}},
        {"mirroring", rightSideAt(box, -1.0), {5, 4, 3, 2, 1}, {-1, -0.5, 0, 0.5, 1}},
        {"mirrored", mirrored, {-1, -0.5, 0, 0.5, 1}, {-3, -2, -1, 0, 1}},
        {"mirrored, left", moved(mirrored, -1.0), {-3, -2, -1, 0, 1}, {-4, -3, -2, -1, 0}},
        {"mirrored, right", mirrored, {0, -1, -2, -3, -4}, {-3, -2, -1, 0, 1}},
    };
    for (const Step& step : steps) {
        SCOPED_TRACE(step.what);
        c->written.clear();
        deform(step.to);
        EXPECT_EQ(c->written, step.written);
        EXPECT_EQ(keyTimes(c), step.after) << "no keypoint lost or moved twice";
    }
}

TEST_F(CtrlDeformTest, deformSelected__linkedComponentsFollow) {
    for (const bool linked : {true, false}) {
        SCOPED_TRACE(linked ? "linked" : "not linked");
        TQCompoundChannel* position =
            addCompound("Position", 2, linked, {{1.0, 0.0}, {2.0, 0.5}, {3.0, 1.0}});
        auto* x = static_cast<TQChannel*>(position->getChild(0));
        auto* y = static_cast<TQChannel*>(position->getChild(1));
        auto xItem = boxItem(x);
        boxItem(y);
        const auto yBefore = cloneOf(*y);
        // Half a second later, and twice as tall: only the selected component's values change.
        Box box = setupAll({xItem});
        box.tl.y = box.tr.y = 2.0;
        deform(moved(box, 0.5));
        EXPECT_EQ(keyTimes(x), (std::vector<double>{1.5, 2.5, 3.5}));
        EXPECT_NEAR(keyValueAt(x, 3.5), 2.0, kValueTolerance);
        EXPECT_EQ(*y, *expectedAfter(*yBefore, linked ? 0.5 : 0.0, false))
            << "a linked component's keyframes follow in time, keeping their values";
    }
}

class SnappingController : public FrameGridController {
public:
    bool shouldConstrainToFrames() const override { return true; }
};

class CtrlDeformSnapTest : public CtrlDeformTest {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<SnappingController>();
    }
};

TEST_F(CtrlDeformSnapTest, deformSelected__onlyTheLastDeformationSnapsToFrames) {
    auto item = boxItem(addBoxChannel("A"));
    // A fifth of a frame wider: the last keypoint leaves its frame until the last deformation.
    const Box wider = rightSideAt(setupAll({item}), 5.0 + 1.0 / 150.0);
    deform(wider);
    EXPECT_NEAR(keyTimes(item->channel()).back(), 5.0 + 1.0 / 150.0, 1e-5);
    deform(wider, 1);
    EXPECT_EQ(keyTimes(item->channel()), (std::vector<double>{1.0, 2.0, 3.0, 4.0, 5.0}));
}

}  // namespace
}  // namespace engine_test
