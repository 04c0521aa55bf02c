#include <gtest/gtest.h>

#include <QWidget>

#include <string>
#include <vector>

#include "qt/TQQtEditMenu.h"

namespace {

// A history of named steps: undo moves the last step to the redo side.
class FakeHistory final : public TQQtUndoHistory {
public:
    std::vector<std::string> done;
    std::vector<std::string> undone;
    bool canUndo() override { return !done.empty(); }
    bool canRedo() override { return !undone.empty(); }
    std::string undoDescription() override { return done.empty() ? std::string() : done.back(); }
    std::string redoDescription() override { return undone.empty() ? std::string() : undone.back(); }
    bool undo() override { return move(done, undone); }
    bool redo() override { return move(undone, done); }

private:
    static bool move(std::vector<std::string>& from, std::vector<std::string>& to) {
        if (from.empty()) return false;
        to.push_back(from.back());
        from.pop_back();
        return true;
    }
};

class EditMenuTest : public ::testing::Test {
protected:
    QWidget window;
    FakeHistory history;
    TQQtEditMenu menu{&window, &history};
};

TEST_F(EditMenuTest, refresh__names_the_steps_and_enables_only_what_the_history_allows) {
    {
        SCOPED_TRACE("empty history");
        menu.refresh();
        EXPECT_EQ(menu.undoAction()->text().toStdString(), "Undo");
        EXPECT_FALSE(menu.undoAction()->isEnabled()) << "nothing to undo";
        EXPECT_FALSE(menu.redoAction()->isEnabled()) << "nothing to redo";
    }
    {
        SCOPED_TRACE("one step done");
        history.done = {"Move Keypoint"};
        menu.refresh();
        EXPECT_EQ(menu.undoAction()->text().toStdString(), "Undo Move Keypoint");
        EXPECT_TRUE(menu.undoAction()->isEnabled());
        EXPECT_EQ(menu.redoAction()->text().toStdString(), "Redo");
    }
}

TEST_F(EditMenuTest, trigger__undoes_and_redoes_through_the_history_and_follows_it) {
    history.done = {"Add Keypoint", "Move Keypoint"};
    menu.refresh();
    menu.undoAction()->trigger();
    EXPECT_EQ(history.undone, std::vector<std::string>{"Move Keypoint"}) << "undo must reach the history";
    EXPECT_EQ(menu.undoAction()->text().toStdString(), "Undo Add Keypoint") << "titles follow at once";
    EXPECT_EQ(menu.redoAction()->text().toStdString(), "Redo Move Keypoint");
    menu.redoAction()->trigger();
    EXPECT_EQ(history.done.size(), 2u) << "redo must reach the history";

    menu.setHistory(nullptr);
    menu.undoAction()->trigger();  // a detached menu does nothing, and shows nothing to do
    EXPECT_EQ(history.done.size(), 2u);
    EXPECT_FALSE(menu.undoAction()->isEnabled());
}

TEST_F(EditMenuTest, shortcuts__ctrl_z_and_ctrl_shift_z) {
    EXPECT_EQ(menu.undoAction()->shortcut(), QKeySequence(Qt::CTRL | Qt::Key_Z));
    EXPECT_EQ(menu.redoAction()->shortcut(), QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_Z));
}

}  // namespace
