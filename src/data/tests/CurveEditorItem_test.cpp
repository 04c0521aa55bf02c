#include "src/data/TQCurveEditorItem.h"

#include <gtest/gtest.h>

#include "platform/channels/TQChannelBehavior.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQCompoundChannel.h"
#include "tests/support/TQRecordingAppDelegate.h"

namespace {

CMTime sec(double s) { return TQTarnTimeForChannelSeconds(s, 0x40000); }

// scene
//   Cube (object root, id 7)
//     Opacity (id 202)
//     Transform (folder, id 100)
//       Position (compound, id 101): X (1), Y (2)
//       Extra (folder, id 300): Deep (1)
class ItemFixture : public ::testing::Test {
protected:
    template <class T>
    static T* add(TQChannelFolder* parent, const char* name, TQChannelId id) {
        return static_cast<T*>(parent->addChild(std::make_unique<T>(name, id)));
    }
    void SetUp() override {
        scene = std::make_unique<TQChannelFolder>("Scene", 0);
        cube = add<TQChannelObjectRootBase>(scene.get(), "Cube", 7);
        opacity = add<TQChannel>(cube, "Opacity", 202);
        transform = add<TQChannelFolder>(cube, "Transform", 100);
        position = add<TQCompoundChannel>(transform, "Position", 101);
        x = add<TQChannel>(position, "X", 1);
        y = add<TQChannel>(position, "Y", 2);
        extra = add<TQChannelFolder>(transform, "Extra", 300);
        deep = add<TQChannel>(extra, "Deep", 1);
        host.answers.sceneChannelRoot = scene.get();
        TQCurveEditorItem::resetColorIndex();
    }

    TQCurveEditorChannelItemPtr channelItem(TQChannelBase* c, double samples = 0) {
        auto item = std::make_shared<TQCurveEditorChannelItem>();
        item->initWithChannel(c, samples, &host, 1);
        return item;
    }

    TQRecordingAppDelegate host;
    std::unique_ptr<TQChannelFolder> scene;
    TQChannelObjectRootBase* cube = nullptr;
    TQChannel* opacity = nullptr;
    TQChannelFolder* transform = nullptr;
    TQCompoundChannel* position = nullptr;
    TQChannel* x = nullptr;
    TQChannel* y = nullptr;
    TQChannelFolder* extra = nullptr;
    TQChannel* deep = nullptr;
};

}  // namespace

TEST_F(ItemFixture, folderItem__flattensSubfoldersIntoChannelItemsWithTheirStates) {
    auto root = std::make_shared<TQCurveEditorFolderItem>();
    root->initWithChannel(cube, 10, &host, 1);
    std::vector<BNString> names;
    for (const auto& c : root->children()) names.push_back(c->simpleName());
    EXPECT_EQ(names, (std::vector<BNString>{"Opacity", "Position.X", "Position.Y", "Extra.Deep"}));
    EXPECT_FALSE(root->isCollapsed()) << "building a folder item opens its folder";
    deep->setFlag(kTQChannelFlagHidden);
    auto again = std::make_shared<TQCurveEditorFolderItem>();
    again->initWithChannel(cube, 10, &host, 1);
    EXPECT_EQ(again->numberOfChildren(), 3u) << "hidden channels are excluded";
    deep->resetFlag(kTQChannelFlagHidden);

    // An empty folder counts as enabled and animated.
    auto empty = std::make_shared<TQCurveEditorFolderItem>();
    empty->initWithRoot(cube, 0, &host, 1);
    EXPECT_TRUE(empty->isEnabledItem() == 1 && empty->isAnimatedChannel());
    // A folder added to a folder comes in itself, once per valid child of it not there yet:
    // merged roots rely on it, kept so.
    auto merged = std::make_shared<TQCurveEditorFolderItem>();
    merged->initWithRoot(cube, 0, &host, 1);
    const TQCurveEditorItemPtr first = root->childrenAtIndex(0), folder = root;
    merged->addChild(first);
    merged->addChild(root);
    EXPECT_EQ(merged->children(), (std::vector{first, folder, folder, folder}));

    // A component's item stands for its compound, its own channel first.
    auto item = channelItem(y);
    EXPECT_TRUE(item->isCompound() && !channelItem(opacity)->isCompound());
    EXPECT_EQ(item->compoundChannelComponents(), (std::vector<TQChannelBase*>{y, x}));
    auto orphan = std::make_shared<TQCurveEditorChannelItem>();
    orphan->initWithChannel(x, 0, nullptr, 1);
    EXPECT_EQ(orphan->channelBase(), nullptr) << "without a host there is no scene to look in";
}

// "Hidden in curve editors" reads backwards, deliberately: the flagged root itself, or a
// flagged folder deeper down, is left out only when hidden channels are not ignored; a flagged
// folder right under the root only when they are; a flagged channel right under the root only
// when they are, deeper down either way.
TEST_F(ItemFixture, folderItem__hiddenInCurveEditorsReadsBackwards) {
    const auto shown = [&](TQChannelBase* flagged, char ignore) {
        flagged->setFlag(kTQChannelFlagHiddenInCurveEditor);
        auto root = std::make_shared<TQCurveEditorFolderItem>();
        root->initWithChannel(cube, 0, &host, ignore);
        std::string out;
        for (const auto& c : root->children()) out += c->simpleName() + " ";
        flagged->resetFlag(kTQChannelFlagHiddenInCurveEditor);
        return out;
    };
    const struct {
        TQChannelBase* flagged;
        char ignore;
        const char* want;
    } rows[] = {
        {cube, 0, ""},
        {cube, 1, "Opacity Position.X Position.Y Extra.Deep "},
        {transform, 0, "Opacity Position.X Position.Y Extra.Deep "},
        {transform, 1, "Opacity "},
        {extra, 0, "Opacity Position.X Position.Y "},
        {extra, 1, "Opacity Position.X Position.Y Extra.Deep "},
        {deep, 0, "Opacity Position.X Position.Y "},
        {deep, 1, "Opacity Position.X Position.Y "},
        {opacity, 0, "Opacity Position.X Position.Y Extra.Deep "},
        {opacity, 1, "Position.X Position.Y Extra.Deep "},
    };
    for (const auto& r : rows)
        EXPECT_EQ(shown(r.flagged, r.ignore), r.want)
            << r.flagged->getName() << " ignoring " << int(r.ignore);
    opacity->setFlag(kTQChannelFlagHidden);
    EXPECT_TRUE(channelItem(opacity)->isHidden() && !channelItem(x)->isHidden());
}

TEST_F(ItemFixture, refreshOriginalCurve__pinsSamplesOntoKeyframes) {
    // Samples at 0, 1, 2, 3, 4 seconds (count 5).
    opacity->setKeyframe(sec(0), 0.0);
    opacity->setKeyframe(sec(1.4), 3.0);  // between samples 1 and 2: takes sample 2
    opacity->setKeyframe(sec(1.6), 4.0);  // same gap: takes sample 3, whose value is lost
    opacity->setKeyframe(sec(9), 7.0);    // past the last sample: changes nothing
    auto item = channelItem(opacity, 5);
    item->refreshOriginalCurve(kCMTimeZero, sec(1));
    ASSERT_EQ(item->numberOfSamples(), 5u);
    const CMTime* u = item->samplesU();
    const double* v = item->samplesV();
    // A keyframe past the last sample pins nothing.
    EXPECT_EQ(std::vector(u + 2, u + 5), (std::vector{sec(1.4), sec(1.6), sec(4)}));
    EXPECT_EQ(std::vector(v + 2, v + 5), (std::vector{3.0, 4.0, opacity->getCurveValue(sec(4))}));
    EXPECT_TRUE(!item->originalCurveDirty() && !item->processedSamplesV())
        << "both curves go stale together";

    const double* before = item->samplesV();
    item->refreshOriginalCurve(kCMTimeZero, sec(1));
    EXPECT_EQ(item->samplesV(), before) << "a clean curve is not fetched again";
}

TEST_F(ItemFixture, maxY__processedCurveWidensAtMostFiveTimes) {
    opacity->setKeyframe(sec(0), 0.0);
    opacity->setKeyframe(sec(1), 1.0);
    opacity->addBehavior(std::make_unique<TQOscillateBehavior>(100.0, 1.0));
    auto item = channelItem(opacity);
    // Range 0..1 and a peak near 100 widen to 5; the minimum mirrors it: 1 + (0 - 1) * 5.
    EXPECT_EQ(std::pair(item->minY(), item->maxY()), std::pair(-4.0, 5.0));
    EXPECT_EQ(item->processedCurveDirty(), 1) << "samples taken to measure are not for drawing";
}

TEST_F(ItemFixture, newSampleCount__readersTakeOnlyWhatTheHeldArraysHoldUntilTheNextFetch) {
    opacity->setKeyframe(sec(0), 0.0);
    opacity->setKeyframe(sec(4), 4.0);
    opacity->addBehavior(std::make_unique<TQOscillateBehavior>(1.0, 1.0));
    auto item = channelItem(opacity, 5);
    item->refreshOriginalCurve(kCMTimeZero, sec(1));
    item->refreshProcessedCurve(kCMTimeZero, sec(1));
    const auto extremes = [&] { return std::pair(item->minY(), item->maxY()); };
    const auto before = extremes();
    item->setNumberOfSamples(5000);  // the arrays still hold 5
    EXPECT_EQ(extremes(), before) << "extremes of the samples held";
    item->takeCurveSnapshot(1);
    ASSERT_TRUE(item->snapshotChannel());
    ASSERT_EQ(item->numberOfSamplesSnapshot(), 5u) << "the ghost is the curve as last drawn";
    EXPECT_EQ(item->samplesVSnapshot()[4], 4.0);

    item->refreshOriginalCurve(kCMTimeZero, sec(0.001));
    EXPECT_EQ(item->numberOfSamples(), 5000u) << "the next fetch takes the new count";
    item->takeCurveSnapshot(0);
    EXPECT_EQ(item->numberOfSamplesSnapshot(), 5000u);
    EXPECT_EQ(item->snapshotChannel(), nullptr) << "a ghost without its channel";
}

TEST_F(ItemFixture, ghost__keptWithoutSamplesAndClearedWhenChannelGoes) {
    opacity->setKeyframe(sec(0), 1.0);
    auto item = channelItem(opacity, 4);
    item->takeCurveSnapshot(1);
    EXPECT_EQ(item->numberOfSamplesSnapshot(), 0u) << "no samples yet: nothing taken";
    item->refreshOriginalCurve(kCMTimeZero, sec(1));
    item->refreshProcessedCurve(kCMTimeZero, sec(1));
    item->takeCurveSnapshot(1);
    ASSERT_TRUE(item->numberOfSamplesSnapshot() == 4u && item->snapshotChannel());
    EXPECT_TRUE(*item->snapshotChannel() == *opacity);
    item->setOriginalCurveDirty(1);
    EXPECT_TRUE(item->samplesU() == nullptr && item->samplesV() == nullptr) << "stale samples go";
    item->takeCurveSnapshot(1);
    EXPECT_EQ(item->numberOfSamplesSnapshot(), 4u) << "an earlier ghost survives";

    cube->removeChild(opacity);  // the channel vanishes under the live item
    EXPECT_EQ(
        std::tuple(item->channel(), item->isValid(), item->isHidden(), item->numberOfKeypoints(),
                   item->minY(), item->compoundChannelComponents().size()),
        std::tuple(nullptr, false, true, 0u, 0.0, 0u));
    item->refreshOriginalCurve(kCMTimeZero, sec(1));
    item->refreshProcessedCurve(kCMTimeZero, sec(1));
    item->takeCurveSnapshot(1);
    EXPECT_TRUE(!item->numberOfSamples() && !item->processedSamplesU() &&
                !item->processedSamplesV() && !item->numberOfSamplesSnapshot() &&
                !item->snapshotChannel());
}
