// The channel list of the full editor in its QTreeView, driven through Qt: the user's clicks,
// double-click and typing reach the outline's own routing, and what the outline decides
// (selection, expansion, the editor of a cell) shows in the tree view.
#include <gtest/gtest.h>

#include <QHeaderView>
#include <QLineEdit>
#include <QTest>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "qt/TQQtOutlineView.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

namespace {

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
