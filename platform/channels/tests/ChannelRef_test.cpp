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
        for (TQChannelId step : {1u, 100u, 101u}) {
            node = static_cast<TQChannelFolder*>(node)->addChild(
                std::make_unique<TQChannelFolder>("Folder", step));
        }
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

TEST_F(ChannelRefTest, construct__pathBelowRootAndFromTop) {
    {
        const TQChannelRef ref(xA, objectA);
        EXPECT_EQ(ref.getText(), "./1/100/101/1");
        EXPECT_EQ(ref.getChannel(objectA), xA);
        EXPECT_EQ(xA->getRef(true), ref) << "getRef(true) is relative to the object root";
    }
    {
        const TQChannelRef ref(xA, nullptr);
        EXPECT_EQ(ref.getText(), "./7/1/100/101/1") << "null root: path from the top";
        EXPECT_EQ(ref.getChannel(&scene), xA);
        EXPECT_EQ(xA->getRef(false), ref);
    }
    {
        const TQChannelRef self(objectA, objectA);
        EXPECT_EQ(self.getText(), ".");
        EXPECT_EQ(self.getChannel(objectB), objectB) << "'.' names whatever root it is given";
    }
}

TEST_F(ChannelRefTest, equality__samePlaceUnderAnotherObject) {
    const TQChannelRef refA(xA, xA->getChannelRoot());
    const TQChannelRef refB(xB, xB->getChannelRoot());
    EXPECT_EQ(refA, refB);
    EXPECT_EQ(refA.getChannel(objectB), xB) << "a relative path resolves under any object";
    const TQChannelRef y(objectA->findChild(1), objectA);
    EXPECT_FALSE(refA == y);
    EXPECT_FALSE(TQChannelRef(xA, nullptr) == TQChannelRef(xB, nullptr))
        << "paths from the top include the object's id";
}

TEST_F(ChannelRefTest, getChannel__deadWhileRootLives) {
    const TQChannelRef ref(xA, objectA);
    const TQChannelRef copy = ref;  // value semantics: the copy dies with the original
    {
        delete xA;  // deleted on its own: it leaves its folder first
        EXPECT_EQ(ref.getChannel(objectA), nullptr);
        EXPECT_EQ(copy.getChannel(objectA), nullptr);
        EXPECT_NE(ref.getChannel(objectB), nullptr) << "the other object is untouched";
    }
    {
        auto* folder100 = static_cast<TQChannelFolder*>(objectB->findChild(1))->findChild(100);
        ASSERT_NE(folder100, nullptr);
        EXPECT_TRUE(static_cast<TQChannelFolder*>(objectB->findChild(1))->removeChild(folder100));
        EXPECT_EQ(ref.getChannel(objectB), nullptr) << "a missing middle step kills the path";
    }
    EXPECT_EQ(ref.getChannel(static_cast<TQChannelBase*>(nullptr)), nullptr);
}

TEST_F(ChannelRefTest, text__malformedResolvesToNothing) {
    for (const char* text : {"", "1/100", "/1", "./", "./1/", "./a", "./1//2", "./-1", "./+1",
                             "./ 1", "./1 ", "./4294967296", "..", "./1/100x"}) {
        const TQChannelRef ref{BNString(text)};
        EXPECT_FALSE(ref.isValid()) << "'" << text << "' should not parse";
        EXPECT_EQ(ref.getChannel(objectA), nullptr) << "'" << text << "' resolved";
        EXPECT_EQ(ref.getText(), text) << "the text of a bad reference is kept for saving";
    }
    EXPECT_EQ(TQChannelRef(BNString("./x")), TQChannelRef(BNString("./x")));
    EXPECT_FALSE(TQChannelRef(BNString("./x")) == TQChannelRef(BNString("./y")));
    EXPECT_FALSE(TQChannelRef() == TQChannelRef(BNString(".")));
}

TEST_F(ChannelRefTest, text__roundTrip) {
    const TQChannelRef parsed(BNString("./1/100/101/1"));
    ASSERT_TRUE(parsed.isValid());
    EXPECT_EQ(parsed, TQChannelRef(xA, objectA));
    EXPECT_EQ(parsed.getChannel(objectA), xA);
    const TQChannelRef big(BNString("./43/4294967295"));
    ASSERT_TRUE(big.isValid());
    EXPECT_EQ(big.getText(), "./43/4294967295");
    EXPECT_EQ(TQChannelRef(BNString("./007")).getText(), "./7") << "leading zeros are one id";
}

TEST_F(ChannelRefTest, construct__badArguments) {
    EXPECT_FALSE(TQChannelRef(nullptr, objectA).isValid());
    const TQChannelRef foreign(xA, objectB);
    EXPECT_FALSE(foreign.isValid()) << "a root that is no ancestor names nothing";
    EXPECT_EQ(foreign.getChannel(objectB), nullptr);
    TQChannel detached("Loose", 5);
    EXPECT_EQ(TQChannelRef(&detached, nullptr).getText(), ".");
    EXPECT_EQ(detached.getRef(true).getText(), ".") << "no object root: from its own top";
}

TEST_F(ChannelRefTest, getChannel__manySiblingsUseIndexAndFollowChanges) {
    TQChannelFolder wide("Wide", 0);
    for (TQChannelId id = 1000; id > 0; id -= 10) {
        wide.addChild(std::make_unique<TQChannel>("C", id));
    }
    wide.addChild(nullptr);
    wide.addChild(std::make_unique<TQChannel>("Duplicate", 500));
    const TQChannelRef ref(BNString("./500"));
    TQChannelBase* first = ref.getChannel(&wide);
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first->getName(), "C") << "of equal ids the first in display order wins";
    EXPECT_TRUE(wide.removeChild(first));
    ASSERT_NE(ref.getChannel(&wide), nullptr);
    EXPECT_EQ(ref.getChannel(&wide)->getName(), "Duplicate") << "the index followed a removal";
    wide.insertChild(0, std::make_unique<TQChannel>("Inserted", 3));
    EXPECT_EQ(TQChannelRef(BNString("./3")).getChannel(&wide)->getName(), "Inserted");
    EXPECT_EQ(TQChannelRef(BNString("./4")).getChannel(&wide), nullptr);
}

TEST_F(ChannelRefTest, orderAndHash__agreeWithEquality) {
    const TQChannelRef refA(xA, objectA), refB(xB, objectB), folder(xA->getParent(), objectA);
    EXPECT_EQ(std::hash<TQChannelRef>{}(refA), std::hash<TQChannelRef>{}(refB));
    EXPECT_FALSE(refA < refB || refB < refA) << "equal references are unordered";
    EXPECT_TRUE(folder < refA) << "a folder sorts before what lies below it";
    EXPECT_TRUE(refA < TQChannelRef(BNString("bad"))) << "invalid references sort last";
    EXPECT_NE(TQChannelRef(BNString("./1/2")).hash(), TQChannelRef(BNString("./2/1")).hash());
}

}  // namespace
