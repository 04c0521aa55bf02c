#include "src/curvesets/TQCurveSet.h"

#include <gtest/gtest.h>

#include "host/TQHostAppDelegate.h"

namespace {

std::vector<TQChannelRef> refs(std::initializer_list<const char*> paths) {
    std::vector<TQChannelRef> out;
    for (const char* p : paths) out.emplace_back(BNString(p));
    return out;
}

std::vector<BNString> names(const TQCurveSet& set) {
    std::vector<BNString> out;
    for (const auto& item : set.allItems())
        out.push_back(item->rootName().value_or("") + ":" + item->simpleName());
    return out;
}

class CurveSetFixture : public ::testing::Test {
protected:
    void SetUp() override {
        cube = host.scene().addObject("Cube");
        ball = host.scene().addObject("Ball");
        position = refs({"./1/100/101/1", "./1/100/101/2", "./1/100/101/3"});
    }

    TQCurveSetPtr relativeSet(const std::vector<TQChannelRef>& paths) {
        auto set = std::make_shared<TQCurveSetMutable>();
        set->initWithName("Position", &host);
        set->setRelative(true);
        set->setReferences(&paths);
        return set;
    }

    TQCurveEditorChannelItemPtr itemFor(TQChannelBase* object, const char* path) {
        auto item = std::make_shared<TQCurveEditorChannelItem>();
        item->initWithChannel(TQChannelRef(BNString(path)).getChannel(object), 10, &host, 1);
        return item;
    }

    TQHostAppDelegate host;
    TQChannelObjectRootBase* cube = nullptr;
    TQChannelObjectRootBase* ball = nullptr;
    std::vector<TQChannelRef> position;
};

}  // namespace

TEST_F(CurveSetFixture, filterList__keepsRootEmptiedByFilterButDropsRootEmptyFromStart) {
    auto set = relativeSet(refs({"./1/200/202"}));
    auto full = std::make_shared<TQCurveEditorFolderItem>();
    full->initWithChannel(cube, 10, &host, 1);
    auto bare = std::make_shared<TQCurveEditorFolderItem>();
    bare->initWithRoot(ball, 0, &host, 1);
    set->setReferences(&position);  // the cube has these, but they are filtered by path only
    set->setRelative(true);         // freezes nothing: no roots yet
    EXPECT_FALSE(set->hasReferences());
    set->addRootItem(bare);
    EXPECT_EQ(set->numberOfItems(), 0u) << "a root without children at the outset goes";
    set->addRootItem(full);
    EXPECT_EQ(set->numberOfItems(), 1u) << "a root emptied by the filter stays";
    EXPECT_EQ(set->numberOfChannelItems(), 0u);
}

TEST_F(CurveSetFixture, absoluteRefresh__dropsItemsWhoseChannelWent) {
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName("Mine", &host);
    set->appendItem(itemFor(cube, "./1/200/202"));
    set->appendItem(itemFor(ball, "./1/200/202"));
    ASSERT_EQ(set->numberOfItems(), 2u) << "items go under the root of their object";
    host.scene().removeObject(ball);
    set->refresh(10, false);
    EXPECT_EQ(set->numberOfItems(), 1u);
    EXPECT_EQ(set->numberOfChannelItems(), 1u);
    EXPECT_TRUE(set->removeItemWithIdentifier(set->channeItemAtIndex(0)->channelId()));
    EXPECT_EQ(set->numberOfItems(), 0u) << "the root left empty is filtered out";
}

TEST_F(CurveSetFixture, mutable__appendInsertAndRemoval) {
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName("Mine", &host);
    EXPECT_FALSE(set->removeItemWithIdentifier(1)) << "nothing to remove from an empty set";
    auto x = itemFor(cube, "./1/100/101/1"), z = itemFor(cube, "./1/100/101/3");
    set->appendItem(x);
    set->appendItem(z);
    {
        x->enableItem(0);
        set->appendItem(x);
        EXPECT_EQ(set->numberOfChannelItems(), 2u) << "a present item is not added twice";
        EXPECT_EQ(x->isEnabledItem(), 1) << "but its enableItem has run";
    }
    auto y = itemFor(cube, "./1/100/101/2");
    set->insertItem(y, 987654);
    EXPECT_EQ(set->numberOfChannelItems(), 2u) << "no such child: nothing inserted";
    set->insertItem(y, z->channelId());
    EXPECT_EQ(names(*set),
              (std::vector<BNString>{"Cube:Transform.Position.X", "Cube:Transform.Position.Y",
                                     "Cube:Transform.Position.Z"}));
    EXPECT_EQ(set->channeItemAtIndex(2), z);
    EXPECT_EQ(set->channeItemAtIndex(3), nullptr);
    EXPECT_EQ(set->itemWithIdentifier(y->channelId()), y);

    EXPECT_FALSE(set->removeItemNotInList({x, z}));
    EXPECT_EQ(set->numberOfChannelItems(), 2u);

    const uint32_t rootId = set->rootItemAtIndex(0)->channelId();
    EXPECT_TRUE(set->removeItemWithIdentifier(rootId)) << "a root id removes the whole root";
    EXPECT_EQ(set->numberOfItems(), 0u);
    EXPECT_FALSE(set->removeItem(x));
}

TEST_F(CurveSetFixture, removal__pathsStayForRemoveItemAndGoForRemoveSelected) {
    auto set = relativeSet(position);
    host.scene().setSelection({cube});
    set->refresh(10, false);
    set->removeItem(set->channeItemAtIndex(0));
    EXPECT_EQ(set->numberOfChannelItems(), 2u);
    set->refresh(10, false);
    EXPECT_EQ(set->numberOfChannelItems(), 3u) << "removeItem keeps the path: the channel returns";

    set->channeItemAtIndex(0)->select(true);
    auto* mutableSet = static_cast<TQCurveSetMutable*>(set.get());
    EXPECT_TRUE(mutableSet->removeSelectedItem());
    set->refresh(10, false);
    EXPECT_EQ(set->numberOfChannelItems(), 2u) << "removeSelectedItem erases the path";
    EXPECT_EQ(set->references()->size(), 2u);
}

TEST_F(CurveSetFixture, removeSelectedItem__onlyFirstSelectedRoot) {
    auto set = relativeSet(position);
    host.scene().setSelection({cube, ball});
    set->refresh(10, false);
    set->rootItemAtIndex(0)->select(true);
    set->rootItemAtIndex(1)->select(true);
    static_cast<TQCurveSetMutable*>(set.get())->removeSelectedItem();
    ASSERT_EQ(set->numberOfItems(), 1u);
    EXPECT_EQ(set->rootItemAtIndex(0)->rootName(), "Ball");
}

TEST_F(CurveSetFixture, identity__namesShortcutsIdsAndCopies) {
    auto a = relativeSet(position), b = relativeSet(refs({"./1/304"}));
    EXPECT_TRUE(a->isEqual(*b)) << "sets are equal by name alone";
    EXPECT_NE(a->curveSetId(), b->curveSetId());
    EXPECT_EQ(a->shortcut(), 0);
    a->setCurveSetShortcut("U");
    EXPECT_EQ(a->curveSetShortcut(), "u");
    EXPECT_EQ(a->shortcut(), 'u');
    b->setCurveSetShortcut("ÄRGER");
    EXPECT_EQ(b->curveSetShortcut(), "ärger") << "every character, beyond ASCII too";
    EXPECT_EQ(b->shortcut(), 0x00E4) << "a character, not the first byte of its UTF-8";

    host.scene().setSelection({cube});
    a->refresh(10, false);
    a->removeItem(a->channeItemAtIndex(0));  // leaves a path with no item
    auto copy = a->copy();
    EXPECT_NE(dynamic_cast<TQCurveSetMutable*>(copy.get()), nullptr) << "copies keep the class";
    EXPECT_EQ(*copy->references(), position) << "the source's paths survive, unmatched ones too";
    EXPECT_EQ(copy->curveSetShortcut(), "u");
    EXPECT_EQ(copy->numberOfChannelItems(), 2u);
    EXPECT_TRUE(copy->isRelative());
    copy->setRelative(false);
    EXPECT_FALSE(copy->hasReferences()) << "an absolute set keeps no paths";
    EXPECT_NE(copy->channeItemAtIndex(0)->channelId(), a->channeItemAtIndex(0)->channelId());

    TQCurveSetMutable fromSet;
    fromSet.initWithCurveSet(*a);
    EXPECT_EQ(fromSet.curveSetShortcut(), "") << "initWithCurveSet leaves the shortcut";
    EXPECT_EQ(*fromSet.references(), position);
}

TEST_F(CurveSetFixture, enabling__validateCarriesStatesAndDeselectSparesDisabled) {
    auto set = relativeSet(position);
    host.scene().setSelection({cube});
    set->refresh(10, false);
    set->channeItemAtIndex(1)->enableItem(0);
    EXPECT_EQ(set->numberOfEnabledItems(), 2u);
    set->refresh(10, false);
    EXPECT_EQ(set->numberOfEnabledItems(), 2u) << "a relative rebuild carries the states over";
    EXPECT_EQ(set->channeItemAtIndex(1)->isEnabledItem(), 0);

    set->disableAll();
    EXPECT_EQ(set->numberOfEnabledItems(), 0u);
    set->channeItemAtIndex(0)->select(true);
    EXPECT_EQ(set->selectedItem(), set->channeItemAtIndex(0));
    set->deselectAll();
    EXPECT_TRUE(set->channeItemAtIndex(0)->isSelected()) << "a disabled item keeps its selection";
    set->enableAll(true, set->channeItemAtIndex(2).get());
    EXPECT_EQ(set->numberOfEnabledItems(), 2u) << "the excluded item is left alone";
    set->deselectAll();
    EXPECT_EQ(set->numberOfSelectedItems(), 0u);
}
