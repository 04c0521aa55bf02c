// The controller's core: queries, the maximum view volume, sets, sampling, the selection's
// repair and the value panel.

#include <cfloat>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "platform/channels/TQChannelTypes.h"
#include "tests/support/EngineFixture.h"

using namespace engine_test;

class CtrlCore : public EngineFixture {};

TEST_F(CtrlCore, queries__selected_bounds_and_the_maximum_view_volume) {
    build("A: 1=5 3=-2");
    double minX = 0, maxX = 0, minY = 0, maxY = 0;
    EXPECT_FALSE(ctrl().getSelected(select("A@1"), &minX, &maxX, &minY, &maxY));
    EXPECT_EQ(std::vector({minX, maxY}), std::vector({double(FLT_MAX), -double(FLT_MAX)}));
    // The primary entry, a curve entry and a stale one are not measured.
    TQCurveSelectionList* list = select("A@1 A@3 A~ A@1");
    list->selectionAtIndex(3)->setHandle(reinterpret_cast<TQKeyframeHandle>(uintptr_t{0xdead}));
    EXPECT_TRUE(ctrl().getSelected(list, &minX, &maxX, nullptr, &maxY));
    EXPECT_EQ(std::vector({minX, maxX, maxY}), std::vector({3.0, 3.0, -2.0}));

    // The volume as "x width bottom top"; the padding is 5 %.
    const auto volume = [this] {
        const CGRect r = ctrl().getMaxViewVolume();
        return (std::ostringstream() << r.origin.x << " " << r.size.width << " " << r.origin.y
                                     << " " << r.origin.y + r.size.height)
            .str();
    };
    ASSERT_EQ(view.getZoomPadding(), 0.05);
    set->removeItemWithIdentifier(item("A")->channelId());
    EXPECT_EQ(volume(), "0 10 -1 1") << "empty";
    build("Low: 0=-50 1=-40");
    view.setCurrentViewVolume(CGRectMake(0, -60, 10, 0.5));
    // The running maximum starts at the smallest positive double, not at -infinity.
    EXPECT_EQ(volume(), "0 10 -60 0.025");
    view.setCurrentViewVolume(CGRectMake(0, -45, 10, 0.5));
    EXPECT_EQ(volume(), "0 10 -50.025 0.025") << "reaches down to the curves";
    set->removeItemWithIdentifier(item("Low")->channelId());
    build("High: 0=40 1=50");
    view.setCurrentViewVolume(CGRectMake(0, 0, 10, 0.5));
    EXPECT_EQ(volume(), "0 10 0 50.025") << "reaches up to the curves";
}

// An absent selection, entry or frame is a no-op: no channel changes, the host hears nothing.
TEST_F(CtrlCore, absent_arguments__change_nothing_and_announce_nothing) {
    build("A: 1=5(-0.2,0|0.2,0) 3=-2");
    const auto before = snapshot();
    recorder.clearCalls();
    TQCurveEditorCtrlBase& c = ctrl();
    const CMTime t = seconds(2.0);
    const CGPoint p = CGPointMake(2.0, 1.0);
    double u = 0.0, y = 0.0;
    EXPECT_EQ(c.getKeypointPosition(nullptr), CGPointZero);
    c.getSelectedVertex(nullptr, &u, &y);
    EXPECT_FALSE(c.getSelected(nullptr, &u, &u, &y, &y));
    EXPECT_EQ(c.addVertex(nullptr, t), nullptr);
    EXPECT_EQ(c.addVertex(nullptr, t, 1.0, 1), nullptr);
    EXPECT_EQ(c.setupDeformSelected(nullptr), CGRectZero);
    unsigned count = 7;
    const CMTime* samplesU = &t;
    const double* samplesV = &u;
    c.getSamples(nullptr, 0, t, t, &samplesU, &samplesV, &count);
    EXPECT_TRUE(!samplesU && !samplesV && !count);
    const std::function<void(TQCurveSelectionList*)> onLists[] = {
        [&](auto* l) { c.willModify(l); },
        [&](auto* l) { c.didModify(l); },
        [&](auto* l) { c.willModifyValue(l); },
        [&](auto* l) { c.didModifyValue(l); },
        [&](auto* l) { c.validateSelection(l); },
        [&](auto* l) { c.purgeSelected(l); },
        [&](auto* l) { c.cleanSelection(l); },
        [&](auto* l) { c.deleteSelected(l); },
        [&](auto* l) { c.duplicateSelected(l); },
        [&](auto* l) { c.reverseSelected(l); },
        [&](auto* l) { c.lockSelected(l); },
        [&](auto* l) { c.disableSelected(l); },
        [&](auto* l) { c.easeBothSelected(l); },
        [&](auto* l) { c.moveSelected(l, t, 1, 1, 0); },
        [&](auto* l) { c.offsetSelected(l, t, 1); },
        [&](auto* l) { c.offsetCurve(l, t, 1); },
        [&](auto* l) { c.deformSelected(l, p, p, p, p, 1); },
        [&](auto* l) { c.setTangentsSelected(l, 2, 1); },
        [&](auto* l) { c.setTangents45Selected(l, 2, 1, 0); },
        [&](auto* l) { c.breakTangentsSelected(l); },
        [&](auto* l) { c.alignTangentsSelected(l); },
        [&](auto* l) { c.weightTangentsSelected(l, 1); },
        [&](auto* l) { c.setBezierPointSelected(l); },
        [&](auto* l) { c.flattenSelected(l); },
    };
    for (const auto& edit : onLists) edit(nullptr);
    const std::function<void(const TQCurveSelection*)> onEntries[] = {
        [&](auto* e) { c.setCurveInterpolation(e, 1); },
        [&](auto* e) { c.deleteVertex(e, t); },
        [&](auto* e) { c.setTangents(e, 2, 1); },
        [&](auto* e) { c.setTangents45(e, 2, 1, 0); },
        [&](auto* e) { c.saveTangents(e); },
        [&](auto* e) { c.breakTangents(e); },
        [&](auto* e) { c.weightTangents(e, 1); },
        [&](auto* e) { c.setBezierPoint(e); },
    };
    for (const auto& edit : onEntries) edit(nullptr);
    // Nor is there a free frame to duplicate onto without a frame.
    recorder.answers.frameDuration = kCMTimeZero;
    c.duplicateSelected(select("A@1"));
    EXPECT_TRUE(sceneIs(*before));
    EXPECT_EQ(recorder.bracketText(), "");
}

TEST_F(CtrlCore, sets__append_remove_refresh_and_first_channel) {
    // Group: W, then the compound Pos (X, Y), so the append recurses once.
    auto* group = static_cast<TQChannelFolder*>(
        object->addChild(std::make_unique<TQChannelFolder>("Group", nextChannelId++)));
    addChannel("W", {{1, 0}}, group);
    TQCompoundChannel* pos = addCompound("Pos", 2, false, {{1, 0}});
    group->addChild(object->takeChild(pos));
    const TQCurveEditorItemPtr last = ctrl().appendFolder(group, set);
    ASSERT_NE(last, nullptr);
    EXPECT_TRUE(last->channelBase() == pos->getChild(1) && ctrl().numberOfChannelItems() == 3u);
    EXPECT_EQ(recorder.bracketText(), "2*[!20000]") << "once per level, nothing per item";
    EXPECT_EQ(ctrl().appendFolder(nullptr, set), nullptr);
    // A refresh drops the items of channels that went, and the view's selection and box.
    selectInView({keypointEntry(std::dynamic_pointer_cast<TQCurveEditorChannelItem>(last), 1)});
    view.setEditBox(CGRectMake(0, 0, 1, 1));
    pos->removeChild(pos->getChild(1));
    ctrl().refreshSelectedCurveSet();
    EXPECT_EQ(ctrl().numberOfChannelItems(), 2u);
    EXPECT_EQ(selectionText(), "");
    EXPECT_FALSE(view.fourCornerBoxInitialized());
    // Selected but disabled items are passed over.
    set->channeItemAtIndex(0)->select(1);
    set->channeItemAtIndex(0)->enableItem(0);
    set->channeItemAtIndex(1)->select(1);
    EXPECT_EQ(ctrl().getFirstChannel(), set->channeItemAtIndex(1));
    // A removal posts one word; by selection it is also a controller undo step.
    recorder.clearCalls();
    EXPECT_TRUE(ctrl().removeChannelWithIdentifier(set->channeItemAtIndex(0)->channelId(), set));
    EXPECT_FALSE(ctrl().removeChannelWithIdentifier(1, nullptr));
    EXPECT_TRUE(ctrl().removeSelectedChannelFromSelectedCurveSet() &&
                ctrl().numberOfChannelItems() == 0u);
    EXPECT_EQ(recorder.bracketText(), "!20000 +2.0:Remove Channel from Curve Set !20000");
    // A set without removal removes nothing, appends nothing and posts nothing.
    auto plain = std::make_shared<TQCurveSet>();
    plain->initWithName("Plain", &recorder);
    ctrl().setSelectedCurveSet(plain);
    recorder.clearCalls();
    EXPECT_FALSE(ctrl().removeSelectedChannelFromSelectedCurveSet() ||
                 ctrl().appendChannel(static_cast<TQChannel*>(pos->getChild(0)), plain));
    EXPECT_EQ(recorder.bracketText(), "");
}

TEST_F(CtrlCore, samples__refreshed_when_dirty_and_none_for_a_foreign_item) {
    build("A: 0=0 1=1");
    const CMTime* u = nullptr;
    const double* v = nullptr;
    unsigned n = 11;
    ctrl().getSamples(item("A").get(), kTQSamplesOriginalCurve, kCMTimeZero, CMTimeMake(1, 10), &u,
                      &v, &n);
    ASSERT_NE(v, nullptr);
    EXPECT_EQ(std::vector({double(n), v[10]}), std::vector({11.0, 1.0}));
    // A clean processed curve is served as held, even after a new count was asked for: no
    // more than the arrays hold.
    ctrl().getSamples(item("A").get(), 1, kCMTimeZero, CMTimeMake(1, 10), &u, &v, &n);
    item("A")->setNumberOfSamples(5000);
    ctrl().getSamples(item("A").get(), 1, kCMTimeZero, CMTimeMake(1, 10), &u, &v, &n);
    EXPECT_EQ(n, 11u);
    auto stranger = std::make_shared<TQCurveEditorChannelItem>();
    stranger->initWithChannel(addChannel("B", {}), 5, &recorder, 0);
    ctrl().getSamples(stranger.get(), kTQSamplesOriginalCurve, kCMTimeZero, CMTimeMake(1, 10), &u,
                      &v, &n);
    EXPECT_TRUE(u == nullptr && v == nullptr && n == 0u);
}

TEST_F(CtrlCore, sortKeypoints__by_time_both_ways_with_ties_and_nulls) {
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

// The panel shows the value times displayScale and writes the accepted one back in channel
// units, opening no bracket and marking no curve, as it always has; a cancelled panel changes
// nothing, and a boolean channel opens none.
TEST_F(CtrlCore, showValue__writes_the_accepted_value_in_channel_units) {
    RWScriptedModal modal;
    RWInstallServices({.modal = &modal});
    build("A: 1=0.5");
    item("A")->channel()->getInfo()->displayScale = 100.0;
    item("A")->setOriginalCurveDirty(0);
    select("A@1");
    double shown = 0.0;
    for (const auto& [value, response] :
         {std::pair{25.0, RWModalResponseOK}, {99.0, RWModalResponseCancel}})
        modal.pushScript([&, value, response](RWWindow& window, RWModalService& m) {
            shown = dynamic_cast<TQCurveEditorValueWindow&>(window).value;
            static_cast<TQCurveEditorValueWindow&>(window).value = value;
            m.stopModalWithCode(response);
        });
    ctrl().showValueAtPoint(CGPointMake(10, 10), nullptr, CGRectMake(0, 0, 5, 5));
    EXPECT_EQ(shown, 50.0);
    ctrl().showValueAtPoint(CGPointMake(10, 10), nullptr, CGRectMake(0, 0, 5, 5));
    EXPECT_EQ(sceneText(*object) + recorder.bracketText(), "A: 1=0.25");
    EXPECT_FALSE(item("A")->originalCurveDirty());
    auto flag = addItem(
        static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannelBool>("On", 77))));
    flag->channel()->setKeyframe(seconds(1), 1.0);
    selectInView({keypointEntry(flag, 1)});
    ctrl().showValueAtPoint(CGPointMake(0, 0), nullptr, CGRectZero);
    ctrl().setView(nullptr);  // nor without a view and so a selection
    ctrl().showValueAtPoint(CGPointMake(0, 0), nullptr, CGRectZero);
    ctrl().menuAddKeyframe(nullptr);
    ctrl().setView(&view);
    EXPECT_EQ(modal.runs().size(), 2u);
    RWResetServices();
}
