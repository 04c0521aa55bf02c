// The outline view model over a small tree, with no display: rows follow expansion with the
// selection moving along, presses select as a desktop list does, edits end by their movement,
// and the number formatter reads back what it shows.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWNumberFormatter.h"
#include "platform/ui/RWOutlineView.h"
#include "platform/ui/RWTextField.h"

namespace {

// Two groups "a" and "b" of three leaves each ("a0".."b2"); leaves hold a value, typed text
// is recorded.
struct Node {
    std::string name;
    std::vector<std::shared_ptr<Node>> children;
};

class Tree : public RWOutlineViewDataSource {
public:
    Tree() {
        for (const char* group : {"a", "b"}) {
            auto g = std::make_shared<Node>(Node{group, {}});
            for (int i = 0; i < 3; ++i)
                g->children.push_back(std::make_shared<Node>(Node{group + std::to_string(i), {}}));
            roots.push_back(g);
        }
    }
    static Node* node(const RWOutlineItem& item) { return static_cast<Node*>(item.get()); }
    const std::vector<std::shared_ptr<Node>>& kids(const RWOutlineItem& item) {
        return item ? node(item)->children : roots;
    }
    int64_t numberOfChildrenOfItem(RWOutlineView&, const RWOutlineItem& item) override {
        return static_cast<int64_t>(kids(item).size());
    }
    bool isItemExpandable(RWOutlineView&, const RWOutlineItem& item) override {
        return !node(item)->children.empty();
    }
    RWOutlineItem childOfItem(RWOutlineView&, int64_t i, const RWOutlineItem& item) override {
        return kids(item)[static_cast<size_t>(i)];
    }
    RWObjectValue objectValueForTableColumn(RWOutlineView&, const RWTableColumn&,
                                            const RWOutlineItem& item) override {
        return RWObjectValue(node(item)->name);
    }
    void setObjectValue(RWOutlineView&, const RWObjectValue& value, const RWTableColumn& column,
                        const RWOutlineItem& item) override {
        typed.push_back(column.identifier() + ":" + node(item)->name + "=" + value.stringValue());
    }
    std::vector<std::shared_ptr<Node>> roots;
    std::vector<std::string> typed;
};

class OutlineTest : public ::testing::Test {
protected:
    void SetUp() override {
        for (const char* id : {"name", "value"}) {
            auto column = std::make_shared<RWTableColumn>(id, 100);
            auto cell = std::make_shared<RWTextFieldCell>();
            cell->setEditable(true);
            column->setDataCell(cell);
            outline.addTableColumn(column);
        }
        outline.setAllowsMultipleSelection(true);
        outline.setDataSource(&tree);
        outline.reloadData();
    }
    std::vector<std::string> rows() {
        std::vector<std::string> out;
        for (int64_t r = 0; r < outline.numberOfRows(); ++r)
            out.push_back(Tree::node(outline.itemAtRow(r))->name);
        return out;
    }
    void press(int64_t row, uint64_t flags = 0, double x = 50) {
        const CGPoint p = outline.convertPointToWindow(CGPointMake(x, row * 20.0 + 10));
        outline.mouseDown(RWEvent::mouseEvent(RWEventType::LeftMouseDown, p, flags));
        outline.mouseUp(RWEvent::mouseEvent(RWEventType::LeftMouseUp, p, flags));
    }
    Tree tree;
    RWOutlineView outline;
};

TEST_F(OutlineTest, expansion__rowsAndSelectionFollow) {
    EXPECT_EQ(rows(), (std::vector<std::string>{"a", "b"}));
    outline.selectRowIndexes(RWIndexSet{1}, false);
    outline.expandItem(tree.roots[0].get());
    EXPECT_EQ(rows(), (std::vector<std::string>{"a", "a0", "a1", "a2", "b"}));
    EXPECT_EQ(outline.selectedRowIndexes(), (RWIndexSet{4})) << "b stays selected";
    outline.expandItem(tree.roots[1].get());
    outline.selectRowIndexes(RWIndexSet{2, 6}, false);
    outline.collapseItem(tree.roots[0].get());
    EXPECT_EQ(outline.selectedRowIndexes(), (RWIndexSet{3})) << "a1 hidden, b1 moves up";
    EXPECT_EQ(outline.rowForItem(tree.roots[1]->children[1]), 3);
    EXPECT_EQ(outline.levelForRow(3), 1);
    // A reload keeps what was open.
    outline.reloadData();
    EXPECT_EQ(rows(), (std::vector<std::string>{"a", "b", "b0", "b1", "b2"}));
    // The disclosure triangle opens and closes.
    press(0, 0, 8);
    EXPECT_TRUE(outline.isItemExpanded(tree.roots[0].get()));
    const CGRect name = outline.frameOfCellAtColumn(0, 1);
    EXPECT_EQ(name.origin.x, outline.indentationPerLevel() * 2) << "a level-1 cell's indent";
}

TEST_F(OutlineTest, presses__selectAsAList) {
    outline.expandItem(tree.roots[0].get());
    press(1);
    press(3, RWEventModifierFlagShift);
    EXPECT_EQ(outline.selectedRowIndexes(), (RWIndexSet{1, 2, 3}));
    press(2, RWEventModifierFlagCommand);
    EXPECT_EQ(outline.selectedRowIndexes(), (RWIndexSet{1, 3}));
    press(3);
    EXPECT_EQ(outline.selectedRowIndexes(), (RWIndexSet{3})) << "a plain click: its row alone";
    press(9);
    EXPECT_TRUE(outline.selectedRowIndexes().empty()) << "below the rows: nothing";
}

TEST_F(OutlineTest, editing__endsByMovement) {
    outline.expandItem(tree.roots[0].get());
    outline.editColumn(1, 1, true);
    EXPECT_EQ(outline.editingText(), "a0");
    outline.userEndEditing("x", RWReturnTextMovement);
    EXPECT_EQ(outline.editedRow(), 2) << "Return: the next row";
    outline.userEndEditing("y", RWBacktabTextMovement);
    EXPECT_EQ(outline.editedColumn(), 0) << "Backtab: the previous cell";
    outline.userEndEditing("z", RWCancelTextMovement);
    EXPECT_FALSE(outline.isEditing());
    EXPECT_EQ(tree.typed, (std::vector<std::string>{"value:a0=x", "value:a1=y"}));
}

// Nothing to act on changes nothing: an item not in the outline, no edit open, a single
// selection asked for every row, and no data source at all.
TEST_F(OutlineTest, guards__nothingToActOnChangesNothing) {
    outline.expandItem(&tree);
    outline.userEndEditing("x", RWReturnTextMovement);
    outline.setAllowsMultipleSelection(false);
    outline.selectAll();
    EXPECT_TRUE(outline.selectedRowIndexes().empty() && tree.typed.empty());
    EXPECT_EQ(rows(), (std::vector<std::string>{"a", "b"}));
    RWOutlineView bare;
    bare.reloadData();
    EXPECT_EQ(bare.numberOfRows(), 0);
}

TEST(NumberFormatterTest, patterns__showAndReadBack) {
    RWNumberFormatter f;
    ASSERT_TRUE(f.setFormat("#,##0.000"));
    for (const auto& [value, text] : {std::pair{1234.5, "1,234.500"},
                                      {-0.25, "-0.250"},
                                      {0.0, "0.000"},
                                      {1e6, "1,000,000.000"},
                                      {-0.0001, "0.000"}}) {
        EXPECT_EQ(f.stringForObjectValue(value), text);
        RWObjectValue back;
        ASSERT_TRUE(f.getObjectValue(&back, text, nullptr)) << text;
        EXPECT_NEAR(back.doubleValue(), value, 5e-4) << text;
    }
    for (const char* bad : {"abc", "1.2.3", "", "12 apples", "nan"})
        EXPECT_FALSE(f.getObjectValue(nullptr, bad, nullptr)) << bad;
    ASSERT_TRUE(f.setFormat("0.#%;(0.#%)"));
    EXPECT_EQ(f.stringForObjectValue(-2.5), "(2.5%)");
    EXPECT_FALSE(f.setFormat("text only")) << "a format needs a digit";
}

}  // namespace
