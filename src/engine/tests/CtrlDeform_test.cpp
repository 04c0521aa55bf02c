// Box deformation: the box that setup freezes, deformations that end where they should
// however the corners got there, the write order that keeps keypoints of one channel from
// taking each other's place, linked components, and the snap of the last deformation.
//
// The scene's keypoints lie at 1..5 s with values and handles that make every normalised
// coordinate exact in binary, so that a box mapped back onto itself gives back the very
// channel it started from.

#include <cmath>
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

Box lerp(const Box& a, const Box& b, double f) {
    auto mix = [f](CGPoint p, CGPoint q) {
        return CGPointMake(p.x + (q.x - p.x) * f, p.y + (q.y - p.y) * f);
    };
    return {mix(a.bl, b.bl), mix(a.br, b.br), mix(a.tr, b.tr), mix(a.tl, b.tl)};
}

// What a keyframe (found by its time before) should hold after: time, value, handles.
struct KeyAfter {
    double from, to, value, inU, inV, outU, outV;
};

constexpr double kHandleU = 0.25;
constexpr double kHandleV = 0.125;

class CtrlDeformTest : public EngineFixture {
protected:
    TQChannel* addBoxChannel(const char* name, TQChannelFolder* parent = nullptr) {
        TQChannel* c = addChannel(
            name, {{1.0, 0.0}, {2.0, 0.5}, {3.0, 1.0}, {4.0, 0.25}, {5.0, 0.75}}, parent);
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
    // A clone of the channel with its keyframes rewritten.
    static std::unique_ptr<TQChannel> expectedAfter(const TQChannel& c,
                                                    const std::vector<KeyAfter>& keys) {
        auto out = cloneOf(c);
        std::vector<TQKeyframeHandle> handles;
        handles.reserve(keys.size());
        for (const KeyAfter& k : keys) handles.push_back(out->getKeyframe(seconds(k.from)));
        for (size_t i = 0; i < keys.size(); ++i) {
            const KeyAfter& k = keys[i];
            out->setKeyframeValue(handles[i], k.value);
            out->setKeyframeInputTangents(handles[i], k.inU, k.inV);
            out->setKeyframeOutputTangents(handles[i], k.outU, k.outV);
            const CMTime to = seconds(k.to);
            out->setKeyframeTime(handles[i], &to);
        }
        return out;
    }
    // The box scene's keyframes moved in time by `dt`, mirrored about 1 s first if asked.
    static std::vector<KeyAfter> boxKeysAfter(double dt, bool mirrored) {
        std::vector<KeyAfter> out;
        const double values[] = {0.0, 0.5, 1.0, 0.25, 0.75};
        for (int i = 0; i < 5; ++i) {
            const double t = 1.0 + i;
            if (mirrored)  // the output handle, turned back in time, becomes the input one
                out.push_back(
                    {t, 2.0 - t + dt, values[i], -kHandleU, kHandleV, kHandleU, -kHandleV});
            else
                out.push_back({t, t + dt, values[i], -kHandleU, -kHandleV, kHandleU, kHandleV});
        }
        return out;
    }
};

TEST_F(CtrlDeformTest, setupDeformSelected__boxAroundKeypointsAlone) {
    auto a = boxItem(addBoxChannel("A"));
    auto b = boxItem(addChannel("B", {{2.0, -1.0}, {9.0, 3.0}}));
    const TQChannel& channelB = *b->channel();
    {
        SCOPED_TRACE("handles reach past the box and do not widen it");
        const auto before = cloneOf(*a->channel());
        const Box box = setupAll({a, b});
        EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()), CGRectMake(1.0, -1.0, 8.0, 4.0));
        EXPECT_EQ(ctrl().deformKeys().size(), 7u);
        deform(box);
        EXPECT_EQ(*a->channel(), *before)
            << "the box setup answered maps every keypoint onto itself";
    }
    {
        SCOPED_TRACE("one time and one value: a degenerate extent is widened");
        selectInView({keypointEntry(a, 2.0), keypointEntry(b, 2.0)});
        EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()),
                  CGRectMake(2.0, -1.0, 1e-6, 1.5));
        selectInView({keypointEntry(a, 4.0), tangentEntry(a, 1.0, true), keypointEntry(a, 4.0)});
        EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()),
                  CGRectMake(4.0, 0.25, 1e-6, 1e-6));
    }
    {
        SCOPED_TRACE("tangent entries alone freeze nothing, and a deform then changes nothing");
        const auto before = cloneOf(channelB);
        selectInView({tangentEntry(b, 2.0, true), tangentEntry(b, 6.0, false)});
        EXPECT_EQ(ctrl().setupDeformSelected(view.getSelection()), CGRectZero);
        EXPECT_TRUE(ctrl().deformKeys().empty());
        deform(boxOf(CGRectMake(0.0, 0.0, 3.0, 3.0)));
        EXPECT_EQ(channelB, *before);
    }
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
    for (int i = 1; i <= 40; ++i) deform(lerp(start, end, i / 40.0));
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
    EXPECT_EQ(*c, *expectedAfter(*original, boxKeysAfter(0.0, true)))
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
    for (const auto& k : boxKeysAfter(0.0, false)) c->setKeyframe(seconds(k.from), k.value);
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
        TQCompoundChannel* position = addCompound(linked ? "Linked" : "Free", 2, linked,
                                                  {{1.0, 0.0}, {2.0, 0.5}, {3.0, 1.0}});
        auto* x = static_cast<TQChannel*>(position->getChild(0));
        auto* y = static_cast<TQChannel*>(position->getChild(1));
        auto xItem = boxItem(x);
        boxItem(y);
        const auto yBefore = cloneOf(*y);
        // Half a second later, and twice as tall: the selected component alone changes value.
        Box box = setupAll({xItem});
        box.tl.y = box.tr.y = 2.0;
        deform(moved(box, 0.5));
        EXPECT_EQ(keyTimes(x), (std::vector<double>{1.5, 2.5, 3.5}));
        EXPECT_NEAR(keyValueAt(x, 3.5), 2.0, kValueTolerance);
        if (linked) {
            std::vector<KeyAfter> retimed;
            for (double t : {1.0, 2.0, 3.0}) {
                double inU = 0, inV = 0, outU = 0, outV = 0;
                const TQKeyframeHandle h = yBefore->getKeyframe(seconds(t));
                yBefore->getKeyframeInputTangents(h, &inU, &inV);
                yBefore->getKeyframeOutputTangents(h, &outU, &outV);
                retimed.push_back({t, t + 0.5, keyValueAt(yBefore.get(), t), inU, inV, outU, outV});
            }
            EXPECT_EQ(*y, *expectedAfter(*yBefore, retimed))
                << "the other component's keyframes move in time with the box, values kept";
        } else {
            EXPECT_EQ(*y, *yBefore);
        }
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
    // A fifth of a frame wider: every keypoint but the first leaves its frame.
    const Box wider = rightSideAt(setupAll({item}), 5.0 + 1.0 / 150.0);
    auto onFrame = [](double t) { return std::fabs(t * 30.0 - std::round(t * 30.0)) < 1e-6; };
    deform(wider);
    const std::vector<double> during = keyTimes(item->channel());
    EXPECT_FALSE(onFrame(during.back())) << "a drag step must leave times where the box puts them";
    deform(wider, 1);
    const std::vector<double> after = keyTimes(item->channel());
    ASSERT_EQ(after.size(), during.size());
    for (size_t i = 0; i < after.size(); ++i) {
        EXPECT_TRUE(onFrame(after[i])) << "keypoint " << i << " at " << after[i];
        EXPECT_NEAR(after[i], during[i], 1.0 / 60.0)
            << "keypoint " << i << " snaps to its nearest frame";
    }
}

}  // namespace
}  // namespace engine_test
