// Moving keypoints: the order of the channel calls, the clamp at time 0, the frame grid, the
// linked compounds, and the nudge and curve forms.

#include <string>
#include <vector>

#include "src/engine/tests/EngineFixture.h"

namespace engine_test {
namespace {

constexpr double kTimeTolerance = 1.0 / kTimescale;  // one tick of the channels' timescale

// A channel that logs every moveKeyframe (name and source axis time) into a shared log, so a
// test sees the order in which keypoints of one or several channels were moved.
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

class CtrlMovesTest : public EngineFixture {
protected:
    TQChannel* addLoggingChannel(const char* name,
                                 std::initializer_list<std::pair<double, double>> keys) {
        auto* c = static_cast<TQChannel*>(object->addChild(
            std::make_unique<MoveLoggingChannel>(name, nextChannelId++, &moveLog)));
        for (const auto& [t, v] : keys) c->setKeyframe(seconds(t), v);
        return c;
    }

    std::vector<std::string> moveLog;
};

TEST_F(CtrlMovesTest, moveSelected__leadingKeypointMovesFirst) {
    TQChannel* c = addLoggingChannel("A", {{1.0, 0.0}, {2.0, 0.0}, {3.0, 0.0}});
    auto item = addItem(c);
    {
        SCOPED_TRACE("moved right by 1");
        // The anchor is listed first, the others out of time order on purpose.
        TQCurveSelectionList* list = selectInView(
            {keypointEntry(item, 2.0), keypointEntry(item, 3.0), keypointEntry(item, 1.0)});
        ctrl().moveSelected(list, seconds(3.0), 0.0, 1, 0);
        EXPECT_EQ(moveLog, (std::vector<std::string>{"A@3", "A@2", "A@1"}))
            << "moving forward must start with the latest keypoint";
        EXPECT_EQ(keyTimes(c), (std::vector<double>{2.0, 3.0, 4.0}));
        EXPECT_NEAR(keyValueAt(c, 4.0), 0.0, kValueTolerance)
            << "a move in time alone keeps values";
    }
    moveLog.clear();
    {
        SCOPED_TRACE("moved left by 1");
        TQCurveSelectionList* list = selectInView(
            {keypointEntry(item, 3.0), keypointEntry(item, 4.0), keypointEntry(item, 2.0)});
        ctrl().moveSelected(list, seconds(2.0), 0.0, 1, 0);
        EXPECT_EQ(moveLog, (std::vector<std::string>{"A@2", "A@3", "A@4"}))
            << "moving backward must start with the earliest keypoint";
        EXPECT_EQ(keyTimes(c), (std::vector<double>{1.0, 2.0, 3.0}));
    }
}

TEST_F(CtrlMovesTest, moveSelected__groupClampsAtZeroUnlessNegativeAllowed) {
    {
        SCOPED_TRACE("clamped");
        TQChannel* c = addChannel("A", {{0.5, 0.0}, {1.5, 0.0}, {4.0, 0.0}});
        auto item = addItem(c);
        TQCurveSelectionList* list =
            selectInView({keypointEntry(item, 1.5), keypointEntry(item, 0.5)});
        ctrl().moveSelected(list, seconds(0.5), 0.0, 1, 0);
        EXPECT_EQ(keyTimes(c), (std::vector<double>{0.0, 0.5, 4.0}))
            << "the earliest keypoint must stop at 0 while the other keeps moving";
    }
    {
        SCOPED_TRACE("negative range allowed");
        ctrl().allowNegativeRange(true);
        TQChannel* c = addChannel("B", {{0.5, 0.0}, {1.5, 0.0}});
        auto item = addItem(c);
        TQCurveSelectionList* list =
            selectInView({keypointEntry(item, 1.5), keypointEntry(item, 0.5)});
        ctrl().moveSelected(list, seconds(0.5), 0.0, 1, 0);
        EXPECT_EQ(keyTimes(c), (std::vector<double>{-0.5, 0.5}));
    }
}

TEST_F(CtrlMovesTest, moveSelected__valueMovesBySameScreenDistanceOnEveryCurve) {
    TQChannel* a = addChannel("A", {{1.0, 10.0}});
    TQChannel* b = addChannel("B", {{2.0, 100.0}});
    auto ia = addItem(a);
    auto ib = addItem(b);
    ia->setScaleY(2.0);
    ia->setOffsetY(0.0);
    ib->setScaleY(50.0);
    ib->setOffsetY(0.0);
    // The anchor's V is 10 / 2 = 5; ask for V 6, one unit up.
    TQCurveSelectionList* list = selectInView({keypointEntry(ia, 1.0), keypointEntry(ib, 2.0)});
    ctrl().moveSelected(list, seconds(1.0), 6.0, 1, 1);
    EXPECT_NEAR(keyValueAt(a, 1.0), 12.0, kValueTolerance);
    EXPECT_NEAR(keyValueAt(b, 2.0), 150.0, kValueTolerance) << "each curve through its own scale";
    EXPECT_EQ(keyTimes(b), (std::vector<double>{2.0}))
        << "a constrained move at the present time keeps it";
}

// Two selected components of a linked compound of three: the first entry moves the compound,
// the second is found in the moved set. Under an offset, the lookup must still find it.
TEST_F(CtrlMovesTest, moveSelected__linkedComponentsMoveOnceAlsoUnderOffset) {
    ctrl()._linked = true;
    // The whole object starts 2 s late on the editor's axis.
    object->setTimeOffset(seconds(2.0));
    TQCompoundChannel* compound = addCompound("Position", 3, true, {{1.0, 0.0}, {3.0, 0.0}});
    const auto components = compound->getComponents();
    auto ix = addItem(components[0]);
    auto iy = addItem(components[1]);
    ix->setScaleY(1.0);
    iy->setScaleY(1.0);
    {
        SCOPED_TRACE("moved in time");
        TQCurveSelectionList* list = selectInView({keypointEntry(ix, 1.0), keypointEntry(iy, 1.0)});
        ctrl().moveSelected(list, seconds(3.5), 0.0, 1, 0);
        for (TQChannel* component : components) {
            const std::vector<double> times = keyTimes(component);
            ASSERT_EQ(times.size(), 2u);
            EXPECT_NEAR(times[0], 1.5, kTimeTolerance)
                << component->getName() << " must move once, also with a time offset";
        }
    }
    {
        SCOPED_TRACE("value only");
        TQCurveSelectionList* list = selectInView({keypointEntry(ix, 1.5), keypointEntry(iy, 1.5)});
        ctrl().moveSelected(list, seconds(3.5), 0.5, 1, 1);
        for (TQChannel* component : components)
            EXPECT_EQ(keyTimes(component).size(), 2u)
                << "a move to the same time must not add keyframes";
        EXPECT_NEAR(keyValueAt(components[1], 1.5), 0.5, kValueTolerance);
        EXPECT_NEAR(keyValueAt(components[2], 1.5), 0.0, kValueTolerance) << "values are per entry";
    }
}

TEST_F(CtrlMovesTest, offsetSelected__nudgesWithoutMovingInTimeWhenXIsZero) {
    TQChannel* c = addLoggingChannel("A", {{1.0, 1.0}, {2.0, 2.0}});
    auto item = addItem(c);
    item->setScaleY(4.0);
    TQCurveSelectionList* list = selectInView({keypointEntry(item, 1.0), keypointEntry(item, 2.0)});
    ctrl().offsetSelected(list, kCMTimeZero, 0.5);
    EXPECT_TRUE(moveLog.empty()) << "a purely vertical nudge must not call moveKeyframe";
    EXPECT_NEAR(keyValueAt(c, 1.0), 3.0, kValueTolerance);
    EXPECT_NEAR(keyValueAt(c, 2.0), 4.0, kValueTolerance);

    ctrl().offsetSelected(list, seconds(0.5), 0.0);
    EXPECT_EQ(moveLog, (std::vector<std::string>{"A@2", "A@1"}));
    EXPECT_EQ(keyTimes(c), (std::vector<double>{1.5, 2.5}));
}

TEST_F(CtrlMovesTest, moves__emptyOrVanishedSelectionDoesNothing) {
    ctrl().moveSelected(nullptr, seconds(1.0), 0.0, 1, 0);
    ctrl().offsetSelected(nullptr, seconds(1.0), 0.0);
    ctrl().offsetCurve(nullptr, seconds(1.0), 0.0);
    TQChannel* c = addChannel("A", {{1.0, 0.0}});
    auto item = addItem(c);
    auto entry = keypointEntry(item, 1.0);
    ASSERT_TRUE(set->removeItemWithIdentifier(item->channelId()));
    TQCurveSelectionList* list = selectInView({entry});
    ctrl().moveSelected(list, seconds(2.0), 1.0, 1, 0);
    EXPECT_EQ(keyTimes(c), (std::vector<double>{1.0}))
        << "an entry of a removed item must not move";
    EXPECT_TRUE(list->empty()) << "validateSelection takes the entry out";
}

TEST_F(CtrlMovesTest, sortKeypoints__byTimeBothWaysWithTiesAndNulls) {
    const auto key = [](double t) {
        auto k = std::make_shared<TQKeyframe>();
        k->setU(seconds(t));
        return k;
    };
    std::vector<TQKeyframePtr> keys{key(2.0), key(1.0), nullptr, key(1.0), key(-1.0)};
    const TQKeyframe* firstOne = keys[1].get();
    ctrl().sortKeypoints(keys, false);
    ASSERT_EQ(keys.size(), 5u);
    EXPECT_NEAR(CMTimeGetSeconds(keys[0]->u()), -1.0, kTimeTolerance);
    EXPECT_EQ(keys[1], nullptr) << "a null element counts as time 0";
    EXPECT_EQ(keys[2].get(), firstOne) << "equal times keep a valid, stable order";
    EXPECT_NEAR(CMTimeGetSeconds(keys[4]->u()), 2.0, kTimeTolerance);
    ctrl().sortKeypoints(keys, true);
    EXPECT_NEAR(CMTimeGetSeconds(keys[0]->u()), 2.0, kTimeTolerance);
    EXPECT_EQ(keys[1].get(), firstOne) << "turned around, equal times still keep their order";
    EXPECT_EQ(keys[3], nullptr);
    EXPECT_NEAR(CMTimeGetSeconds(keys[4]->u()), -1.0, kTimeTolerance);
}

// The full editor puts times on a 1/30 s grid.
class CtrlMovesGridTest : public EngineFixture {
protected:
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<FrameGridController>();
    }
};

TEST_F(CtrlMovesGridTest, moveSelected__singleKeypointLandsOnFrameGroupKeepsSpacing) {
    const double frame = 1.0 / 30.0;
    {
        SCOPED_TRACE("single keypoint, 1.4 frames right");
        TQChannel* c = addChannel("A", {{1.0, 0.0}});
        auto item = addItem(c);
        TQCurveSelectionList* list = selectInView({keypointEntry(item, 1.0)});
        ctrl().moveSelected(list, seconds(1.0 + 1.4 * frame), 0.0, 1, 0);
        EXPECT_NEAR(keyTimes(c)[0], 1.0 + frame, kTimeTolerance);
    }
    {
        SCOPED_TRACE("a group off the grid keeps its spacing");
        TQChannel* c = addChannel("C", {{1.0, 0.0}, {1.0 + 0.5 * frame, 0.0}});
        auto item = addItem(c);
        TQCurveSelectionList* list =
            selectInView({keypointEntry(item, 1.0), keypointEntry(item, 1.0 + 0.5 * frame)});
        ctrl().moveSelected(list, seconds(1.0 + 2.2 * frame), 0.0, 1, 0);
        const std::vector<double> times = keyTimes(c);
        ASSERT_EQ(times.size(), 2u);
        EXPECT_NEAR(times[0], 1.0 + 2.0 * frame, kTimeTolerance) << "the anchor lands on the grid";
        EXPECT_NEAR(times[1] - times[0], 0.5 * frame, kTimeTolerance) << "spacing must be kept";
    }
}

}  // namespace
}  // namespace engine_test
