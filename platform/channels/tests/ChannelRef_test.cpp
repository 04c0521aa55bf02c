#include "platform/channels/TQChannelRef.h"

#include <gtest/gtest.h>

#include <memory>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelObjectRootBase.h"

namespace {

// scene (folder 0)
//   object A (root 7) / 1 / 100 / 101 / {1, 2}
//   object B (root 8) / 1 / 100 / 101 / {1, 2}
class ChannelRefTest : public ::testing::Test {
protected:
    static TQChannelObjectRootBase* addObject(TQChannelFolder& scene, TQChannelId id,
                                              TQChannel** x) {
        auto* root = static_cast<TQChannelObjectRootBase*>(
            scene.addChild(std::make_unique<TQChannelObjectRootBase>("Object", id)));
        TQChannelBase* node = root;
        for (TQChannelId step : {1u, 100u, 101u})
            node = static_cast<TQChannelFolder*>(node)->addChild(
                std::make_unique<TQChannelFolder>("Folder", step));
        auto* position = static_cast<TQChannelFolder*>(node);
        *x = static_cast<TQChannel*>(position->addChild(std::make_unique<TQChannel>("X", 1)));
        position->addChild(std::make_unique<TQChannel>("Y", 2));
        return root;
    }
    void SetUp() override {
        objectA = addObject(scene, 7, &xA);
        objectB = addObject(scene, 8, &xB);
    }
    TQChannelFolder scene{"Scene", 0};
    TQChannelObjectRootBase* objectA = nullptr;
    TQChannelObjectRootBase* objectB = nullptr;
    TQChannel* xA = nullptr;
    TQChannel* xB = nullptr;
};

TEST_F(ChannelRefTest, paths__belowTheObjectRootFromTheTopAndTheRootItself) {
    const TQChannelRef ref(xA, objectA);
    EXPECT_EQ(ref.getText(), "./1/100/101/1");
    EXPECT_EQ(ref.getIds(), (std::vector<TQChannelId>{1, 100, 101, 1}));
    EXPECT_EQ(ref.getChannel(objectA), xA);
    EXPECT_EQ(xA->getRef(true), ref) << "getRef(true) is relative to the object root";
    EXPECT_EQ(ref, TQChannelRef(xB, objectB)) << "the same place under another object";
    EXPECT_EQ(ref.getChannel(objectB), xB) << "a relative path resolves under any object";
    EXPECT_FALSE(ref == TQChannelRef(objectA->findChild(1), objectA));

    const TQChannelRef top(xA, nullptr);
    EXPECT_EQ(top.getText(), "./7/1/100/101/1") << "null root: the path from the top";
    EXPECT_EQ(top.getChannel(&scene), xA);
    EXPECT_EQ(xA->getRef(false), top);
    EXPECT_FALSE(top == TQChannelRef(xB, nullptr)) << "paths from the top include the object's id";

    const TQChannelRef self(objectA, objectA);
    EXPECT_EQ(self.getText(), ".");
    EXPECT_EQ(self.depth(), 0u);
    EXPECT_EQ(self.getChannel(objectB), objectB) << "'.' names whatever root it is given";
    TQChannel detached("Loose", 5);
    EXPECT_EQ(detached.getRef(true).getText(), ".") << "no object root: from its own top";

    EXPECT_FALSE(TQChannelRef(nullptr, objectA).isValid());
    const TQChannelRef foreign(xA, objectB);
    EXPECT_FALSE(foreign.isValid()) << "a root that is no ancestor names nothing";
    EXPECT_EQ(foreign.getChannel(objectB), nullptr);
    EXPECT_EQ(ref.getChannel(static_cast<TQChannelBase*>(nullptr)), nullptr);
    EXPECT_EQ(TQChannelRef(BNString("./1/100/101/1/9")).getChannel(objectA), nullptr)
        << "a channel has no children";
}

TEST_F(ChannelRefTest, getChannel__deadOnceAStepIsGone) {
    const TQChannelRef ref(xA, objectA);
    const TQChannelRef copy = ref;  // value semantics: the copy dies with the original
    delete xA;                      // deleted on its own: it leaves its folder first
    EXPECT_EQ(ref.getChannel(objectA), nullptr);
    EXPECT_EQ(copy.getChannel(objectA), nullptr);
    EXPECT_EQ(ref.getChannel(objectB), xB) << "the other object is untouched";
    auto* first = static_cast<TQChannelFolder*>(objectB->findChild(1));
    EXPECT_TRUE(first->removeChild(first->findChild(100)));
    EXPECT_EQ(ref.getChannel(objectB), nullptr) << "a missing middle step kills the path";
}

TEST_F(ChannelRefTest, text__roundTripsAndKeepsWhatDoesNotParse) {
    for (const char* text : {"", "1/100", "/1", "./", "./1/", "./a", "./1//2", "./-1", "./+1",
                             "./ 1", "./1 ", "./4294967296", "..", "./1/100x", "x./1", ".12/3"}) {
        const TQChannelRef ref{BNString(text)};
        EXPECT_FALSE(ref.isValid()) << "'" << text << "' should not parse";
        EXPECT_EQ(ref.getChannel(objectA), nullptr) << "'" << text << "' resolved";
        EXPECT_EQ(ref.getText(), text) << "the text of a bad reference is kept for saving";
        EXPECT_EQ(ref.depth(), 0u);
    }
    const TQChannelRef parsed(BNString("./1/100/101/1"));
    EXPECT_EQ(parsed, TQChannelRef(xA, objectA));
    EXPECT_EQ(parsed.getChannel(objectA), xA);
    EXPECT_EQ(TQChannelRef(BNString("./43/4294967295")).getText(), "./43/4294967295");
    EXPECT_EQ(TQChannelRef(BNString("./007")).getText(), "./7") << "leading zeros are one id";
    EXPECT_EQ(TQChannelRef(BNString(".")).getText(), ".");
    EXPECT_EQ(TQChannelRef(BNString("./x")), TQChannelRef(BNString("./x")));
    EXPECT_FALSE(TQChannelRef(BNString("./x")) == TQChannelRef(BNString("./y")));
    EXPECT_FALSE(TQChannelRef() == TQChannelRef(BNString(".")));
}

TEST_F(ChannelRefTest, orderAndHash__agreeWithEquality) {
    const TQChannelRef refA(xA, objectA), refB(xB, objectB), folder(xA->getParent(), objectA);
    const TQChannelRef bad(BNString("bad")), worse(BNString("worse"));
    EXPECT_EQ(std::hash<TQChannelRef>{}(refA), std::hash<TQChannelRef>{}(refB));
    EXPECT_FALSE(refA < refB || refB < refA) << "equal references are unordered";
    EXPECT_TRUE(folder < refA && !(refA < folder)) << "a folder sorts before what lies below it";
    EXPECT_TRUE(refA < bad && !(bad < refA)) << "invalid references sort last";
    EXPECT_TRUE(bad < worse && !(worse < bad)) << "and among themselves by text";
    EXPECT_NE(TQChannelRef(BNString("./1/2")).hash(), TQChannelRef(BNString("./2/1")).hash());
    EXPECT_NE(TQChannelRef(BNString("./1")).hash(), TQChannelRef(BNString("./1/0")).hash());
    EXPECT_EQ(bad.hash(), TQChannelRef(BNString("bad")).hash());
}

}  // namespace
