// Moving keypoints: the order of the channel calls, the clamp at time 0, the frame grid, the
// per-curve scale, the linked compounds under a time offset, and the nudge.

#include <cstdio>
#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

namespace engine_test {
namespace {

using Keys = std::vector<std::pair<double, double>>;
constexpr double kTimeTolerance = 1.0 / kTimescale;  // one tick of the channels' timescale

// Logs every moveKeyframe (name and source time), so that a test sees the order of the moves.
class MoveLoggingChannel : public TQChannel {
public:
    MoveLoggingChannel(const char* name, TQChannelId id, std::vector<std::string>* log)
        : TQChannel(name, id), _log(log) {}
    void moveKeyframe(const CMTime* from, const CMTime* to, bool keepBoth) override {
        char text[64];
        std::snprintf(text, sizeof text, "%s@%g", getName().c_str(),
                      from ? CMTimeGetSeconds(*from) : -1.0);
        _log->push_back(text);
        TQChannel::moveKeyframe(from, to, keepBoth);
    }

private:
    std::vector<std::string>* _log;
};

class CtrlMoves : public EngineFixture {
protected:
    // A logging channel with `keys`, its item at scale `scaleY` and offset 0.
    TQCurveEditorChannelItemPtr logged(const char* name, const Keys& keys, double scaleY = 1.0) {
        auto* c = static_cast<TQChannel*>(object->addChild(
            std::make_unique<MoveLoggingChannel>(name, nextChannelId++, &moveLog)));
        for (const auto& [t, v] : keys) c->setKeyframe(seconds(t), v);
        auto item = addItem(c);
        item->setScaleY(scaleY);
        item->setOffsetY(0.0);
        return item;
    }
    // Keys as (time, value), compared to a tick and a tolerance.
    static void expectKeys(const TQChannel* c, const Keys& want) {
        const std::vector<double> times = keyTimes(c);
        ASSERT_EQ(times.size(), want.size()) << c->getName();
        for (size_t i = 0; i < want.size(); ++i) {
            EXPECT_NEAR(times[i], want[i].first, kTimeTolerance) << c->getName() << " #" << i;
            EXPECT_NEAR(keyValueAt(c, times[i]), want[i].second, kValueTolerance) << c->getName();
        }
    }
    std::vector<std::string> moveLog;
};

TEST_F(CtrlMoves, moveSelected__table) {
    struct Case {
        const char* what;
        Keys keys;
        std::vector<double> selected;  // the anchor first
        double toTime, toValue;
        int constrain;
        bool negative;
        Keys want;
        std::vector<std::string> order;
    };
    const Case cases[] = {
        {"forward starts with the latest",
         {{1, 0}, {2, 0}, {3, 0}},
         {2, 3, 1},
         3,
         0,
         0,
         false,
         {{2, 0}, {3, 0}, {4, 0}},
         {"A@3", "A@2", "A@1"}},
        {"backward starts with the earliest",
         {{2, 0}, {3, 0}, {4, 0}},
         {3, 4, 2},
         2,
         0,
         0,
         false,
         {{1, 0}, {2, 0}, {3, 0}},
         {"A@2", "A@3", "A@4"}},
        {"the earliest stops at 0, the other goes on",
         {{0.5, 0}, {1.5, 0}, {4, 0}},
         {1.5, 0.5},
         0.5,
         0,
         0,
         false,
         {{0, 0}, {0.5, 0}, {4, 0}},
         {"A@0.5", "A@1.5"}},
        {"negative times allowed",
         {{0.5, 0}, {1.5, 0}},
         {1.5, 0.5},
         0.5,
         0,
         0,
         true,
         {{-0.5, 0}, {0.5, 0}},
         {"A@0.5", "A@1.5"}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        object->removeAllChildren();
        moveLog.clear();
        ctrl().allowNegativeRange(c.negative);
        auto item = logged("A", c.keys, 2.0);
        std::vector<TQCurveSelectionPtr> entries;
        for (double t : c.selected) entries.push_back(keypointEntry(item, t));
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (const auto& e : entries) list->addSelection(e);
        ctrl().moveSelected(list, seconds(c.toTime), c.toValue, 1, c.constrain);
        expectKeys(item->channel(), c.want);
        EXPECT_EQ(moveLog, c.order);
    }
}

TEST_F(CtrlMoves, moveSelected__each_curve_by_the_same_screen_distance) {
    auto a = logged("A", {{1, 10}}, 2.0);
    auto b = logged("B", {{2, 100}}, 50.0);
    // The anchor's V is 10 / 2 = 5; ask for V 6, one unit up.
    ctrl().moveSelected(selectInView({keypointEntry(a, 1), keypointEntry(b, 2)}), seconds(1), 6.0,
                        1, 1);
    expectKeys(a->channel(), {{1, 12}});
    expectKeys(b->channel(), {{2, 150}});
}

// Two selected components of a linked compound of three: the first entry moves the compound,
// the second is found in the moved set, also when the object starts 2 s late on the axis.
TEST_F(CtrlMoves, moveSelected__linked_components_move_once_under_an_offset) {
    ctrl()._linked = true;
    object->setTimeOffset(seconds(2.0));
    TQCompoundChannel* compound = addCompound("Position", 3, true, {{1.0, 0.0}, {3.0, 0.0}});
    const auto components = compound->getComponents();
    auto ix = addItem(components[0]);
    auto iy = addItem(components[1]);
    for (const auto& item : {ix, iy}) item->setScaleY(1.0);
    ctrl().moveSelected(selectInView({keypointEntry(ix, 1.0), keypointEntry(iy, 1.0)}),
                        seconds(3.5), 0.0, 1, 0);
    for (TQChannel* c : components) expectKeys(c, {{1.5, 0}, {3, 0}});
    ctrl().moveSelected(selectInView({keypointEntry(ix, 1.5), keypointEntry(iy, 1.5)}),
                        seconds(3.5), 0.5, 1, 1);
    expectKeys(components[1], {{1.5, 0.5}, {3, 0}});
    expectKeys(components[2], {{1.5, 0}, {3, 0}});
}

TEST_F(CtrlMoves, offsetSelected__a_vertical_nudge_moves_nothing_in_time) {
    auto item = logged("A", {{1, 1}, {2, 2}}, 4.0);
    TQCurveSelectionList* list = selectInView({keypointEntry(item, 1), keypointEntry(item, 2)});
    ctrl().offsetSelected(list, kCMTimeZero, 0.5);
    EXPECT_TRUE(moveLog.empty());
    expectKeys(item->channel(), {{1, 3}, {2, 4}});
    ctrl().offsetSelected(list, seconds(0.5), 0.0);
    EXPECT_EQ(moveLog, (std::vector<std::string>{"A@2", "A@1"}));
    expectKeys(item->channel(), {{1.5, 3}, {2.5, 4}});
}

TEST_F(CtrlMoves, moves__empty_or_vanished_selection_does_nothing) {
    ctrl().moveSelected(nullptr, seconds(1.0), 0.0, 1, 0);
    ctrl().offsetSelected(nullptr, seconds(1.0), 0.0);
    ctrl().offsetCurve(nullptr, seconds(1.0), 0.0);
    auto item = logged("A", {{1, 0}});
    auto entry = keypointEntry(item, 1.0);
    ASSERT_TRUE(set->removeItemWithIdentifier(item->channelId()));
    TQCurveSelectionList* list = selectInView({entry});
    ctrl().moveSelected(list, seconds(2.0), 1.0, 1, 0);
    EXPECT_TRUE(moveLog.empty());
    EXPECT_TRUE(list->empty()) << "validateSelection takes the entry out";
}

TEST_F(CtrlMoves, sortKeypoints__by_time_both_ways_with_ties_and_nulls) {
    const auto key = [](double t) {
        auto k = std::make_shared<TQKeyframe>();
        k->setU(seconds(t));
        return k;
    };
    std::vector<TQKeyframePtr> keys{key(2.0), key(1.0), nullptr, key(1.0), key(-1.0)};
    const std::vector<TQKeyframePtr> forward{keys[4], nullptr, keys[1], keys[3], keys[0]};
    ctrl().sortKeypoints(keys, false);
    EXPECT_EQ(keys, forward) << "a null element counts as time 0; ties keep their order";
    ctrl().sortKeypoints(keys, true);
    EXPECT_EQ(keys, (std::vector<TQKeyframePtr>{forward[4], forward[2], forward[3], nullptr,
                                                forward[0]}));
}

class CtrlMovesOnGrid : public CtrlMoves {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<FrameGridController>();
    }
};

TEST_F(CtrlMovesOnGrid, moveSelected__the_anchor_lands_on_a_frame_and_the_group_keeps_spacing) {
    const double f = 1.0 / 30.0;
    auto single = logged("A", {{1, 0}});
    const auto entry = keypointEntry(single, 1);
    ctrl().moveSelected(selectInView({entry}), seconds(1 + 1.4 * f), 0, 1, 0);
    expectKeys(single->channel(), {{1 + f, 0}});
    auto group = logged("C", {{1, 0}, {1 + 0.5 * f, 0}});
    TQCurveSelectionList* both =
        selectInView({keypointEntry(group, 1), keypointEntry(group, 1 + 0.5 * f)});
    ctrl().moveSelected(both, seconds(1 + 2.2 * f), 0, 1, 0);
    expectKeys(group->channel(), {{1 + 2 * f, 0}, {1 + 2.5 * f, 0}});
    // A nudge is put on whole frames too.
    ctrl().offsetSelected(both, seconds(1.4 * f), 0.0);
    expectKeys(group->channel(), {{1 + 3 * f, 0}, {1 + 3.5 * f, 0}});
}

}  // namespace
}  // namespace engine_test
