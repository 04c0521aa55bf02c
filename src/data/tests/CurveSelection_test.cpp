#include "src/data/TQCurveSelection.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

TQKeyframeHandle handle(uintptr_t n) { return reinterpret_cast<TQKeyframeHandle>(n); }

TQCurveSelectionPtr entry(uintptr_t h, uint64_t flag, uint32_t curve, int64_t frame = 0) {
    auto e = std::make_shared<TQCurveSelection>();
    e->setHandle(handle(h));
    e->setFlags(flag);
    e->setCurveId(curve);
    e->setKeypointUV(CMTimeMake(frame, 30), 0.5);
    return e;
}

}  // namespace

TEST(TQCurveSelection, isKeypoint__excludesOtherKindsRatherThanMatchingKeypoint) {
    // A handle with no flag counts as a keypoint; no handle, no keypoint.
    EXPECT_EQ(
        (std::vector{entry(7, 0, 1)->isKeypoint(), entry(0, TQSelectionKeypoint, 1)->isKeypoint(),
                     entry(7, TQSelectionInTangent, 1)->isKeypoint(),
                     entry(7, TQSelectionInTangent, 1)->isTangent(),
                     entry(0, TQSelectionCurve, 1)->isCurve()}),
        (std::vector{true, false, false, true, true}));
}

TEST(TQCurveSelection, storedTimes__copiedForEveryKindAnsweringTheKindAndCompared) {
    auto tangent = entry(7, TQSelectionOutTangent, 1, 12);
    CMTime u{};
    double v = 0;
    EXPECT_FALSE(tangent->getKeypointUV(&u, &v));
    EXPECT_EQ(std::pair(u, v), std::pair(CMTimeMake(12, 30), 0.5));
    EXPECT_FALSE(tangent->setKeypointTangents(1, 2, 3, 4));
    double t[4] = {};
    tangent->getKeypointTangents(&t[0], &t[1], &t[2], &t[3]);
    EXPECT_EQ(std::vector<double>(t, t + 4), (std::vector<double>{1, 2, 3, 4}));
    // Keypoints compare by their stored times.
    auto early = entry(1, TQSelectionKeypoint, 1, 3), late = entry(2, TQSelectionKeypoint, 1, 9);
    EXPECT_EQ(
        std::tuple(early->compareKeypointAscending(*late), early->compareKeypointDescending(*late),
                   late->compareKeypointAscending(*late)),
        std::tuple(-1, 1, 0));
}

TEST(TQCurveSelectionList, queries__tangentCountsAsSelectedKeypoint) {
    TQCurveSelectionList list;
    list.addSelection(entry(5, TQSelectionInTangent, 3));
    EXPECT_TRUE(list.isKeypointSelected(handle(5)) && list.isCurveSelected(3) &&
                !list.isCurveSelected(4));
    EXPECT_EQ(list.selectionAtIndex(1), nullptr) << "out of range answers null";
}

TEST(TQCurveSelectionList, equalEntries__ofOtherCurvesGoAlongOnDeletionAndPurge) {
    TQCurveSelectionList curves;
    auto a = entry(0, TQSelectionCurve, 1), b = entry(0, TQSelectionCurve, 2);
    curves.addSelection(a);
    curves.addSelection(b);
    EXPECT_TRUE(curves.isSelection(*b));
    curves.delSelection(*b);
    EXPECT_TRUE(curves.empty()) << "delSelection removes every equal entry, whatever its curve";

    TQCurveSelectionList list;
    list.addSelection(entry(5, TQSelectionKeypoint, 1));
    list.addSelection(entry(5, TQSelectionKeypoint, 2));  // same handle and kind, other curve
    list.addSelection(entry(6, TQSelectionKeypoint, 2));
    TQCurveSelectionList untouched;
    untouched.setSelection(list);
    untouched.purge(99);
    EXPECT_EQ(untouched.size(), 3u) << "purge of an absent curve changes nothing";
    list.purge(1);
    ASSERT_EQ(list.size(), 1u);
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), handle(6));
}

TEST(TQCurveSelectionList, copyVersusSetSelection__deepAndShared) {
    TQCurveSelectionList list;
    list.addSelection(entry(5, TQSelectionKeypoint, 1));
    auto deep = list.copy();
    deep->selectionAtIndex(0)->setFlags(TQSelectionCurve);
    EXPECT_EQ(list.selectionAtIndex(0)->getFlags(), TQSelectionKeypoint) << "copy is deep";

    TQCurveSelectionList shared;
    shared.setSelection(list);
    shared.selectionAtIndex(0)->setFlags(TQSelectionCurve);
    EXPECT_EQ(list.selectionAtIndex(0)->getFlags(), TQSelectionCurve)
        << "setSelection shares entries";

    list.addSelectionFront(entry(9, TQSelectionKeypoint, 1));
    EXPECT_EQ(list.selectionAtIndex(0)->getHandle(), handle(9));
    EXPECT_EQ(shared.size(), 1u) << "the lists themselves stay separate";
}
