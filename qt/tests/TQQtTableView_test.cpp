// The table model of platform/ui in a QTableView: rows and check boxes shown from the data
// source, the user's changes, edits that a reload hands over and an abort drops, and rows
// dragged between rows.
#include <gtest/gtest.h>

#include <QLineEdit>
#include <QMimeData>
#include <QTest>

#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWTextField.h"
#include "qt/TQQtTableView.h"

namespace {

// Named rows with a flag. A drag moves its row to the gap dropped on.
class Rows : public RWTableViewDataSource {
public:
    int64_t numberOfRowsInTableView(RWTableView&) override { return int64_t(names.size()); }
    RWObjectValue objectValueForTableColumn(RWTableView&, const RWTableColumn& column,
                                            int64_t row) override {
        if (column.identifier() == "Name") return RWObjectValue(names[size_t(row)]);
        return RWObjectValue(flags[size_t(row)] ? 1 : 0);
    }
    void setObjectValue(RWTableView&, const RWObjectValue& value, const RWTableColumn& column,
                        int64_t row) override {
        if (column.identifier() == "Flag")
            flags[size_t(row)] = value.intValue() != 0;
        else
            names[size_t(row)] = value.stringValue();
    }
    bool writeRows(RWTableView&, const std::vector<int64_t>& rows, RWPasteboard& board) override {
        dragged = rows.front();
        board.declareTypes({"RowDrag"});
        return true;
    }
    uint64_t validateDrop(RWTableView&, RWDraggingInfo&, int64_t,
                          RWTableViewDropOperation) override {
        return RWDragOperationMove;
    }
    bool acceptDrop(RWTableView& table, RWDraggingInfo&, int64_t row,
                    RWTableViewDropOperation) override {
        const std::string name = names[size_t(dragged)];
        names.erase(names.begin() + dragged);
        names.insert(names.begin() + (row > dragged ? row - 1 : row), name);
        table.reloadData();
        return true;
    }
    std::vector<std::string> names{"A", "B", "C"};
    std::vector<bool> flags{false, true, false};
    int64_t dragged = -1;
};

class QtTableViewTest : public ::testing::Test {
protected:
    void SetUp() override {
        auto name = std::make_shared<RWTableColumn>("Name", 120);
        name->setTitle("Name");
        name->setDataCell(std::make_shared<RWTextFieldCell>());
        auto flag = std::make_shared<RWTableColumn>("Flag", 40);
        flag->setDataCell(std::make_shared<RWButtonCell>());
        table->addTableColumn(name);
        table->addTableColumn(flag);
        table->setDataSource(&rows);
        table->registerForDraggedTypes({"RowDrag"});
        table->reloadData();
        view.setTable(table);
        view.show();
    }
    TQQtTableModel& model() { return *view.tableModel(); }
    QModelIndex at(int row, int column) { return model().index(row, column); }
    QString shown(int row) { return model().data(at(row, 0), Qt::DisplayRole).toString(); }
    QLineEdit* openEditor(int row) {
        view.setFocus();
        view.edit(at(row, 0));
        return qobject_cast<QLineEdit*>(view.editor());
    }

    Rows rows;
    std::shared_ptr<RWTableView> table = std::make_shared<RWTableView>();
    TQQtTableView view;
};

TEST_F(QtTableViewTest, cells_selection_and_edits_go_both_ways) {
    ASSERT_EQ(model().rowCount(), 3);
    EXPECT_EQ(shown(1), "B");
    EXPECT_EQ(model().data(at(1, 1), Qt::CheckStateRole).toInt(), Qt::Checked);
    model().setData(at(0, 1), Qt::Checked, Qt::CheckStateRole);
    EXPECT_TRUE(rows.flags[0]);
    view.selectionModel()->select(at(2, 0), QItemSelectionModel::ClearAndSelect);
    EXPECT_EQ(table->selectedRow(), 2) << "the user's selection reaches the table";
    table->selectRowIndexes(RWIndexSet{0}, false);
    EXPECT_TRUE(view.selectionModel()->isRowSelected(0, {})) << "and the table's shows";

    QLineEdit* editor = openEditor(0);
    ASSERT_NE(editor, nullptr);
    editor->setText("Alpha");
    table->reloadData();
    EXPECT_EQ(rows.names[0], "Alpha") << "a reload hands the open edit over";
    EXPECT_EQ(view.editor(), nullptr);
    editor = openEditor(2);
    ASSERT_NE(editor, nullptr);
    editor->setText("Lost");
    table->abortEditing();
    view.setFocus();
    QCoreApplication::processEvents();
    EXPECT_EQ(rows.names[2], "C") << "an aborted edit hands nothing over";
}

TEST_F(QtTableViewTest, rows_dragged_land_between_rows_and_foreign_drops_are_refused) {
    std::unique_ptr<QMimeData> data(model().mimeData({at(0, 0)}));
    ASSERT_NE(data, nullptr);
    EXPECT_TRUE(model().dropMimeData(data.get(), Qt::CopyAction, 2, 0, {}));
    EXPECT_EQ(rows.names, (std::vector<std::string>{"B", "A", "C"}));
    EXPECT_EQ(shown(1), "A");
    data.reset(model().mimeData({at(2, 0)}));
    EXPECT_TRUE(model().dropMimeData(data.get(), Qt::CopyAction, -1, -1, at(0, 0)))
        << "a drop on a row lands above it";
    EXPECT_EQ(rows.names, (std::vector<std::string>{"C", "B", "A"}));

    QMimeData foreign;
    foreign.setData("RowDrag", {});
    EXPECT_FALSE(model().dropMimeData(&foreign, Qt::CopyAction, 0, 0, {}))
        << "no drag of this table is under way";
    EXPECT_EQ(rows.names, (std::vector<std::string>{"C", "B", "A"}));
}

}  // namespace
