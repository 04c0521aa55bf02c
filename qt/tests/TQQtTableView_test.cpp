// The table model of platform/ui in a QTableView: rows and check boxes shown from the data
// source, the user's changes, edits that a reload hands over and an abort drops, and rows
// dragged between rows. The channel list of the full editor in its QTreeView, driven through
// Qt: the user's clicks, double-click and typing reach the outline's own routing, and what the
// outline decides (selection, expansion, the editor of a cell) shows in the tree view.
#include <gtest/gtest.h>

#include <QLineEdit>
#include <QMimeData>
#include <QTest>

#include <memory>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtOutlineView.h"
#include "qt/TQQtTableView.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

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

using Ctrl = TQCurveEditorListController;

class QtOutlineViewTest : public ::testing::Test {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
        view.setViewHost(&viewHost);
        list->addStandardColumns();
        list->setCurveListController(&controller);
        controller.setMainCurveEditorController(&ctrl);
        controller.setOutlineView(list.get());
        controller.awakeFromNib();
        ctrl.init();
        ctrl.setAppDelegate(&host);
        ctrl.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.channels = list.get();
        outlets.channelsList = &controller;
        ctrl.connectOutlets(outlets);
        ctrl.setupController();
        host.addNotificationReceiver(&ctrl);
        widget.resize(400, 300);
        widget.setOutline(list);
        widget.show();
        ctrl.updateUI();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&widget));
    }
    void TearDown() override {
        widget.setOutline(nullptr);
        host.removeNotificationReceiver(&ctrl);
        view.setViewHost(nullptr);
    }
    // The centre of a cell, in the viewport.
    QPoint cell(const char* column, int64_t row) {
        const CGRect f = list->frameOfCellAtColumn(list->columnWithIdentifier(column), row);
        const CGRect visible = list->visibleRect();
        return QPoint(static_cast<int>(f.origin.x - visible.origin.x + f.size.width / 2),
                      static_cast<int>(f.origin.y - visible.origin.y + f.size.height / 2));
    }
    QModelIndex indexOfRow(int64_t row, int column = 0) {
        return widget.outlineModel()->indexForNode(list->nodeAtRow(row), column);
    }

    TQHostAppDelegate host;
    RWStubViewHost viewHost{800.0, 400.0, 1.0};
    TQCurveEditorView view;
    TQCurveEditorCtrl ctrl;
    std::shared_ptr<TQCurveEditorChannelList> list = std::make_shared<TQCurveEditorChannelList>();
    Ctrl controller;
    TQQtOutlineView widget;
};

TEST_F(QtOutlineViewTest, treeView__followsTheOutlineAndRoutesTheUser) {
    ASSERT_GT(list->numberOfRows(), 3);
    EXPECT_TRUE(widget.isExpanded(indexOfRow(0))) << "the open object shows open";
    EXPECT_EQ(widget.visualRect(indexOfRow(2)).top(), static_cast<int>(list->rectOfRow(2).origin.y))
        << "rows lie where the outline lays them out";

    // A click selects through the outline; the editor's item follows, and the tree view shows it.
    QTest::mouseClick(widget.viewport(), Qt::LeftButton, {}, cell(Ctrl::kNameColumn, 2));
    EXPECT_EQ(list->selectedRowIndexes(), (RWIndexSet{2}));
    EXPECT_TRUE(Ctrl::editorItem(list->itemAtRow(2))->isSelected());
    EXPECT_TRUE(widget.selectionModel()->isSelected(indexOfRow(2)));

    // The program's selection and collapse show as well.
    list->selectRowIndexes(RWIndexSet{3}, false);
    EXPECT_FALSE(widget.selectionModel()->isSelected(indexOfRow(2)));
    EXPECT_TRUE(widget.selectionModel()->isSelected(indexOfRow(3)));

    // A click in Value (no scrub) opens the editor; what is typed there sets the value.
    const int64_t row = 1;
    auto* item = dynamic_cast<TQCurveEditorChannelItem*>(Ctrl::editorItem(list->itemAtRow(row)));
    ASSERT_NE(item, nullptr);
    QTest::mouseClick(widget.viewport(), Qt::LeftButton, {}, cell(Ctrl::kValueColumn, row));
    EXPECT_TRUE(list->isEditing());
    ASSERT_NE(widget.editor(), nullptr);
    EXPECT_EQ(widget.editor()->text().toStdString(), list->editingText());
    widget.editor()->setText("42");
    QTest::keyClick(widget.editor(), Qt::Key_Return);
    EXPECT_EQ(widget.editor(), nullptr);
    EXPECT_DOUBLE_EQ(item->currentValue() * item->conversionFactor(), 42.0);

    list->collapseItem(list->itemAtRow(0).get());
    EXPECT_FALSE(widget.isExpanded(indexOfRow(0)));
    EXPECT_FALSE(Ctrl::editorItem(list->itemAtRow(0))->channelBase() == nullptr);
    auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(Ctrl::editorItem(list->itemAtRow(0)));
    EXPECT_TRUE(folder->isCollapsed()) << "the folder keeps the collapse for the next reload";
}

}  // namespace
