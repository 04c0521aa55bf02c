// Tangent operations. The fixture's view maps 10 s by 2 units onto 800 x 400 pixels, so one
// world unit is 80 pixels across and 200 up: angles in the world and on the screen differ,
// which is what the screen-space follow of the opposite handle is about.

#include <cmath>
#include <numbers>
#include <string>

#include "tests/support/EngineFixture.h"

namespace engine_test {
namespace {

constexpr double kPixelTolerance = 1e-2;  // the projection is single precision
constexpr double kAngleTolerance = 1e-4;  // radians

double angleOf(const CGPoint& p) { return std::atan2(p.y, p.x); }
double lengthOf(const CGPoint& p) { return std::hypot(p.x, p.y); }
CGPoint rotated(const CGPoint& p, double angle, double scale) {
    return CGPointMake(scale * (p.x * std::cos(angle) - p.y * std::sin(angle)),
                       scale * (p.x * std::sin(angle) + p.y * std::cos(angle)));
}

class CtrlTangents : public EngineFixture {
protected:
    struct Key {
        TQChannel* channel = nullptr;
        TQCurveEditorChannelItemPtr item;
        double time = 0.0;
    };

    // One Bezier keypoint at `t` s with both handles set ("b" broken, "s" scaled).
    Key key(const char* name, double t, double value, CGPoint in, CGPoint out,
            const char* flags = "", double scaleY = 1.0) {
        Key k{addChannel(name, {{t, value}}), nullptr, t};
        k.item = addItem(k.channel);
        k.item->setScaleY(scaleY);
        k.item->setOffsetY(0.0);
        const TQKeyframeHandle h = k.channel->getKeyframe(seconds(t));
        k.channel->setKeyframeInputTangents(h, in.x, in.y, true);
        k.channel->setKeyframeOutputTangents(h, out.x, out.y, true);
        k.channel->setKeyframeTangentsBroken(h, std::string(flags).find('b') != std::string::npos);
        k.channel->setKeyframeTangentsScaled(h, std::string(flags).find('s') != std::string::npos);
        k.item->setOriginalCurveDirty(0);
        return k;
    }
    CGPoint keyWorld(const Key& k) {
        double value = 0.0;
        k.channel->getKeyframe(k.channel->getKeyframe(seconds(k.time)), nullptr, &value);
        return CGPointMake(k.time, ctrl().convertFromChannelCoords(k.item.get(), value));
    }
    CGPoint handleWorld(const Key& k, bool output) {
        const TQKeyframeHandle h = k.channel->getKeyframe(seconds(k.time));
        double value = 0.0, u = 0.0, v = 0.0;
        k.channel->getKeyframe(h, nullptr, &value);
        output ? k.channel->getKeyframeOutputTangents(h, &u, &v)
               : k.channel->getKeyframeInputTangents(h, &u, &v);
        return CGPointMake(k.time + u, ctrl().convertFromChannelCoords(k.item.get(), value + v));
    }
    // The handle as the user sees it: pixels from its keypoint.
    CGPoint screenVector(const Key& k, bool output) {
        return view.getPointScreen(handleWorld(k, output)) - view.getPointScreen(keyWorld(k));
    }
    // The world point `screen` pixels from the keypoint.
    CGPoint pointerAt(const Key& k, const CGPoint& screen) {
        return view.getPointWorld(view.getPointScreen(keyWorld(k)) + screen);
    }
    // The handle shown `screen` pixels from its keypoint, as the user drags it.
    void dragTo(const Key& k, bool output, const CGPoint& screen) {
        const CGPoint w = pointerAt(k, screen);
        ctrl().setTangents(tangentEntry(k.item, k.time, output).get(), w.x, w.y);
    }
};

// A pair that is not straight, dragged on screen to twice its length and turned: the other
// handle turns by as much, and doubles unless the pair is scaled.
TEST_F(CtrlTangents, setTangents__the_other_handle_turns_alike_and_scales_unless_weighted) {
    for (const char* flags : {"", "s"}) {
        SCOPED_TRACE(flags);
        object->removeAllChildren();
        const Key k = key("A", 5.0, 0.3, {-0.3, 0.2}, {0.5, 0.1}, flags);
        const CGPoint other = screenVector(k, false);
        dragTo(k, true, rotated(screenVector(k, true), 0.4, 2.0));
        const CGPoint after = screenVector(k, false);
        EXPECT_NEAR(lengthOf(after), (*flags ? 1.0 : 2.0) * lengthOf(other), kPixelTolerance);
        EXPECT_NEAR(std::remainder(angleOf(after) - angleOf(other), 2 * std::numbers::pi), 0.4,
                    kAngleTolerance);
    }
}

TEST_F(CtrlTangents, setTangents45__snaps_to_screen_multiples_of_45_degrees) {
    const Key k = key("A", 5.0, 0.0, {-0.5, -0.1}, {0.37, 0.05}, "b");
    for (const auto& [pointer, snapped] :
         {std::pair{40.0, 45.0}, {80.0, 90.0}, {-10.0, 0.0}, {150.0, 135.0}}) {
        const double a = pointer * std::numbers::pi / 180.0;
        const CGPoint p = pointerAt(k, CGPointMake(100.0 * std::cos(a), 100.0 * std::sin(a)));
        ctrl().setTangents45(tangentEntry(k.item, 5.0, true).get(), p.x, p.y, 0);
        EXPECT_NEAR(angleOf(screenVector(k, true)) * 180.0 / std::numbers::pi, snapped, 1e-3)
            << "with flag clear the steps are absolute screen directions: " << pointer;
    }
}

// The first entry's handle goes to the pointer; selected keypoints copy its movement on its
// side, in the world (the 45-degree form: the same handle on screen, whatever their scale);
// handle entries after the first are left alone.
TEST_F(CtrlTangents, selected_forms__keypoints_follow_the_first_entry) {
    for (const bool snap : {false, true}) {
        SCOPED_TRACE(snap ? "45" : "free");
        object->removeAllChildren();
        const Key a = key("A", 2.0, 0.2, {-0.5, -0.1}, {0.5, 0.1}, "b");
        const Key b = key("B", 4.0, 0.5, {-0.2, -0.3}, {0.2, 0.3}, "b", 2.0);
        const Key c = key("C", 6.0, -0.1, {-0.4, 0.0}, {0.4, 0.0}, "b", 0.5);
        const Key d = key("D", 8.0, 0.0, {-0.4, 0.0}, {0.4, 0.0}, "b");
        const std::string dBefore = keyText(*d.channel, true);
        const CGPoint before[] = {handleWorld(b, true), handleWorld(c, true)};
        TQCurveSelectionList* list =
            selectInView({tangentEntry(a.item, 2.0, true), keypointEntry(b.item, 4.0),
                          keypointEntry(c.item, 6.0), tangentEntry(d.item, 8.0, false)});
        const CGPoint delta = CGPointMake(0.3, 0.1);
        const CGPoint p =
            snap ? pointerAt(a, CGPointMake(60.0, 57.0)) : handleWorld(a, true) + delta;
        snap ? ctrl().setTangents45Selected(list, p.x, p.y, 0)
             : ctrl().setTangentsSelected(list, p.x, p.y);
        const CGPoint first = screenVector(a, true);
        EXPECT_NEAR(snap ? angleOf(first) : lengthOf(handleWorld(a, true) - p),
                    snap ? std::numbers::pi / 4.0 : 0.0, kAngleTolerance);
        for (int i = 0; i < 2; ++i) {
            const Key& k = i ? c : b;
            EXPECT_NEAR(lengthOf(snap ? screenVector(k, true) - first
                                      : handleWorld(k, true) - before[i] - delta),
                        0.0, kPixelTolerance)
                << k.channel->getName();
        }
        EXPECT_EQ(keyText(*d.channel, true), dBefore);
        EXPECT_EQ(list->selectionAtIndex(1)->getFlags(), TQSelectionKeypoint)
            << "the entry's word is restored";
    }
    ctrl().setTangentsSelected(nullptr, 0.0, 0.0);
}

}  // namespace
}  // namespace engine_test
