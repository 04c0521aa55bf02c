// Curve sets over the reference host's objects, each edit followed by the whole set as text: a
// root per object, "Cube[X Y- Z*]" (the last part of each item's name) with "-" on a disabled
// item and "*" on a selected one.
#include "src/curvesets/TQCurveSet.h"

#include <gtest/gtest.h>

#include <sstream>

#include "host/TQHostAppDelegate.h"

namespace {

std::vector<TQChannelRef> refs(std::initializer_list<const char*> paths) {
    std::vector<TQChannelRef> out;
    for (const char* p : paths) out.emplace_back(BNString(p));
    return out;
}

std::string text(const TQCurveSet& set) {
    std::ostringstream out;
    for (const auto& root : set.roots()) {
        out << (out.tellp() > 0 ? " " : "") << root->rootName().value_or("?") << "[";
        const char* gap = "";
        for (const auto& item : root->children()) {
            const BNString& name = item->simpleName();
            out << gap << name.substr(name.rfind('.') + 1)
                << (item->isEnabledItem() == 0 ? "-" : "") << (item->isSelected() ? "*" : "");
            gap = " ";
        }
        out << "]";
    }
    return out.str();
}

class CurveSetFixture : public ::testing::Test {
protected:
    void SetUp() override {
        cube = host.scene().addObject("Cube");
        ball = host.scene().addObject("Ball");
    }

    std::shared_ptr<TQCurveSetMutable> relativeSet(const std::vector<TQChannelRef>& paths) {
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
    const std::vector<TQChannelRef> position =
        refs({"./1/100/101/1", "./1/100/101/2", "./1/100/101/3"});
};

TEST_F(CurveSetFixture, relative__pathsRebuildTheItemsAndCarryTheirStates) {
    auto set = relativeSet(position);
    host.scene().setSelection({cube, ball});
    set->refresh(10, false);
    EXPECT_EQ(text(*set), "Cube[X Y Z] Ball[X Y Z]");
    // removeItem keeps the path, so the channel comes back; removeSelectedItem erases it,
    // taking only the first selected root.
    set->removeItem(set->channeItemAtIndex(0));
    EXPECT_EQ(text(*set), "Cube[Y Z] Ball[X Y Z]");
    set->refresh(10, false);
    EXPECT_EQ(text(*set), "Cube[X Y Z] Ball[X Y Z]");
    set->channeItemAtIndex(0)->select(true);
    EXPECT_TRUE(set->removeSelectedItem());
    set->refresh(10, false);
    EXPECT_EQ(text(*set), "Cube[Y Z] Ball[Y Z]");
    EXPECT_EQ(set->references()->size(), 2u);
    set->rootItemAtIndex(0)->select(true);
    set->rootItemAtIndex(1)->select(true);
    set->removeSelectedItem();
    EXPECT_EQ(text(*set), "Ball[]") << "the paths went with the cube's items";

    // A rebuild carries enable states over; a disabled item keeps its selection through
    // deselectAll; enableAll leaves the excluded item alone.
    host.scene().setSelection({cube});
    set->setReferences(&position);
    set->refresh(10, false);
    set->appendItem(itemFor(ball, "./1/200/202"));  // its path joins the set's, for the cube too
    EXPECT_EQ(set->references()->size(), 4u);
    set->refresh(10, false);
    set->channeItemAtIndex(1)->enableItem(0);
    set->refresh(10, false);
    EXPECT_EQ(text(*set), "Cube[X Y- Z Opacity]");
    EXPECT_EQ(set->numberOfEnabledItems(), 3u);
    set->disableAll();
    set->channeItemAtIndex(0)->select(true);
    EXPECT_EQ(set->selectedItem(), set->channeItemAtIndex(0));
    set->deselectAll();
    set->enableAll(true, set->channeItemAtIndex(2).get());
    EXPECT_EQ(text(*set), "Cube[X* Y Z- Opacity]");
    set->deselectAll();
    EXPECT_EQ(text(*set), "Cube[X Y Z- Opacity]");
}

TEST_F(CurveSetFixture, filter__aRootEmptiedByTheFilterStaysOneEmptyFromTheStartGoes) {
    auto set = relativeSet(refs({"./1/200/202"}));
    auto full = std::make_shared<TQCurveEditorFolderItem>();
    full->initWithChannel(cube, 10, &host, 1);
    auto bare = std::make_shared<TQCurveEditorFolderItem>();
    bare->initWithRoot(ball, 0, &host, 1);
    set->setReferences(&position);  // the cube has these, but they are filtered by path only
    set->setRelative(true);         // freezes nothing: no roots yet
    EXPECT_FALSE(set->hasReferences());
    set->addRootItem(bare);
    set->addRootItem(full);
    EXPECT_EQ(text(*set), "Cube[]");
}

TEST_F(CurveSetFixture, mutable__appendInsertAndRemoveKeepOneItemPerChannel) {
    auto set = std::make_shared<TQCurveSetMutable>();
    set->initWithName("Mine", &host);
    EXPECT_FALSE(set->removeItemWithIdentifier(1)) << "nothing to remove from an empty set";
    auto x = itemFor(cube, "./1/100/101/1"), y = itemFor(cube, "./1/100/101/2"),
         z = itemFor(cube, "./1/100/101/3");
    set->appendItem(x);
    set->appendItem(z);
    x->enableItem(0);
    set->appendItem(x);  // present: not added twice, but enabled again
    set->insertItem(y, 987654);
    EXPECT_EQ(text(*set), "Cube[X Z]") << "no such child: nothing inserted";
    y->enableItem(0);
    set->insertItem(y, z->channelId());  // enabled as it comes in
    set->appendItem(itemFor(ball, "./1/200/202"));
    set->insertItem(x, z->channelId());
    EXPECT_EQ(text(*set), "Cube[X Y Z] Ball[Opacity]") << "present: not inserted again";
    set->insertItem(nullptr, z->channelId());
    set->insertItem(itemFor(ball, "./1/100/101/1"), z->channelId());
    EXPECT_EQ(text(*set), "Cube[X Y Z] Ball[Opacity]") << "only before a child of its own object";
    EXPECT_EQ(std::tuple(set->channeItemAtIndex(2), set->channeItemAtIndex(4),
                         set->itemWithIdentifier(y->channelId())),
              std::tuple(z, nullptr, y));
    EXPECT_FALSE(set->removeItemNotInList({x, y, z}));
    EXPECT_EQ(text(*set), "Cube[X Y Z]");
    set->setItem(nullptr);
    EXPECT_EQ(text(*set), "Cube[X Y Z]");
    set->setItem(y);
    EXPECT_FALSE(set->removeItem(nullptr) || set->removeItem(z)) << "z is no longer there";
    EXPECT_EQ(text(*set), "Cube[Y]");
    EXPECT_TRUE(set->removeItemWithIdentifier(y->channelId()));
    EXPECT_EQ(text(*set), "") << "a root left empty goes with its last child";

    host.scene().removeObject(cube);
    set->appendItem(itemFor(ball, "./1/200/202"));
    set->refresh(10, false);
    EXPECT_EQ(text(*set), "Ball[Opacity]") << "items whose channel went are dropped";
    const uint32_t rootId = set->rootItemAtIndex(0)->channelId();
    EXPECT_TRUE(set->removeItemWithIdentifier(rootId)) << "a root id removes the whole root";
    EXPECT_EQ(text(*set), "");
    EXPECT_FALSE(set->removeItem(x));
}

TEST_F(CurveSetFixture, identity__namesShortcutsIdsAndCopies) {
    auto a = relativeSet(position), b = relativeSet(refs({"./1/304"}));
    EXPECT_TRUE(a->isEqual(*b) && a->curveSetId() != b->curveSetId() && a->shortcut() == 0)
        << "sets are equal by name alone";
    a->setCurveSetShortcut("U");
    EXPECT_EQ(a->curveSetShortcut() + char(a->shortcut()), "uu");
    b->setCurveSetShortcut("ÄRGER");
    EXPECT_EQ(b->curveSetShortcut(), "ärger") << "every character, beyond ASCII too";
    EXPECT_EQ(b->shortcut(), 0x00E4) << "a character, not the first byte of its UTF-8";

    host.scene().setSelection({cube});
    a->refresh(10, false);
    a->removeItem(a->channeItemAtIndex(0));  // leaves a path with no item
    auto copy = a->copy();
    EXPECT_NE(dynamic_cast<TQCurveSetMutable*>(copy.get()), nullptr) << "copies keep the class";
    EXPECT_EQ(*copy->references(), position) << "the source's paths survive, unmatched ones too";
    EXPECT_EQ(std::tuple(copy->curveSetShortcut(), text(*copy), copy->isRelative()),
              std::tuple("u", "Cube[Y Z]", true));
    copy->setRelative(false);
    EXPECT_FALSE(copy->hasReferences()) << "an absolute set keeps no paths";
    EXPECT_NE(copy->channeItemAtIndex(0)->channelId(), a->channeItemAtIndex(0)->channelId());

    TQCurveSetMutable fromSet;
    fromSet.initWithCurveSet(*a);
    EXPECT_EQ(std::pair(fromSet.curveSetShortcut(), *fromSet.references()),
              std::pair(BNString(), position))
        << "initWithCurveSet leaves the shortcut";
}

}  // namespace
