#pragma once
// The outline view model of platform/ui (RWOutlineView) in a QTreeView, bound both ways.
//
// TQQtOutlineModel is a QAbstractItemModel over the outline's cached tree: its indexes point
// at the outline's nodes, so the data source is asked for children through the outline, once
// per item, and a reload of the outline resets the model.
//
// TQQtOutlineView shows that model. Its geometry is the outline's: uniform rows of the
// outline's height, its indentation, its column widths (the first column, the outline
// column, takes what the others leave). Each cell is drawn by the outline's prepared cell for
// it (the data source's value after the delegate's adjustments). The user's presses, drags,
// releases, moves and keys go to the outline's own routing, not to the tree view's: the
// outline decides selection, expansion, cell tracking, editing and drags, and the tree view
// follows what it decides (selected rows, expanded items, the editor of the edited cell). The
// editor's Return, Tab, Backtab, Escape and loss of focus end the edit with the matching
// movement.
//
// The view keeps the outline alive (shared) and detaches from it when it dies.

#include <QAbstractItemModel>
#include <QLineEdit>
#include <QPointer>
#include <QStyledItemDelegate>
#include <QTreeView>

#include "platform/ui/RWOutlineView.h"
#include "qt/TQQtControlBinding.h"
#include "qt/TQQtServices.h"

class TQQtOutlineModel final : public QAbstractItemModel {
public:
    explicit TQQtOutlineModel(QObject* parent = nullptr) : QAbstractItemModel(parent) {}

    RWOutlineView* outline() const { return _outline; }
    // Resets the model over another outline (or none).
    void setOutline(RWOutlineView* outline);

    QModelIndex index(int row, int column, const QModelIndex& parent = {}) const override;
    QModelIndex parent(const QModelIndex& child) const override;
    int rowCount(const QModelIndex& parent = {}) const override;
    int columnCount(const QModelIndex& parent = {}) const override;
    bool hasChildren(const QModelIndex& parent = {}) const override;
    // The cell's text (display), the edit's text (edit), the delegate's tip (tool tip).
    QVariant data(const QModelIndex& index, int role) const override;
    Qt::ItemFlags flags(const QModelIndex& index) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role) const override;

    const RWOutlineNode* nodeForIndex(const QModelIndex& index) const;
    QModelIndex indexForNode(const RWOutlineNode* node, int column = 0) const;

    // Around the outline's reload, whose nodes die in between.
    void beginReload() { beginResetModel(); }
    void endReload() { endResetModel(); }

private:
    RWOutlineView* _outline = nullptr;  // the view keeps it alive
};

class TQQtOutlineView final : public QTreeView,
                              public TQQtControlBinding<RWOutlineView>,
                              public RWOutlineViewObserver {
public:
    explicit TQQtOutlineView(QWidget* parent = nullptr);
    ~TQQtOutlineView() override;

    // The outline shown (the binding's model; the tree view's model is the item model).
    const std::shared_ptr<RWOutlineView>& outlineShared() const {
        return TQQtControlBinding<RWOutlineView>::model();
    }
    RWOutlineView* outline() const { return outlineShared().get(); }
    void setOutline(std::shared_ptr<RWOutlineView> outline) {
        TQQtControlBinding<RWOutlineView>::setModel(std::move(outline));
    }
    TQQtOutlineModel* outlineModel() const { return _model; }
    // The editor of the cell being edited, or null.
    QLineEdit* editor() const { return _editor; }
    // The effects of rows dragged away that are showing now.
    int animationEffectsShown() const { return _effects; }

    // RWOutlineViewObserver
    void outlineWillReload(RWOutlineView&) override;
    void outlineDidReload(RWOutlineView&) override;
    void outlineDidChangeExpansion(RWOutlineView&, const RWOutlineNode& node) override;
    void outlineDidChangeSelection(RWOutlineView&) override;
    void outlineNeedsDisplay(RWOutlineView&, const CGRect& rect) override;
    void outlineDidBeginEditing(RWOutlineView&, int64_t column, int64_t row) override;
    void outlineDidEndEditing(RWOutlineView&) override;
    void outlineWantsKeyboardFocus(RWOutlineView&) override;
    void outlineScrollRowToVisible(RWOutlineView&, int64_t row) override;
    void outlineDidChangeDrag(RWOutlineView&) override;
    void outlineShowAnimationEffect(RWOutlineView&, const CGPoint& pointInWindow) override;
    void outlineDidChangeColumns(RWOutlineView&) override;
    // A QMenu of the menu, validated as it opens, at the pointer; the chosen item performs
    // through the menu.
    void outlinePopUpContextMenu(RWOutlineView&, const RWMenuPtr& menu, const CGPoint&) override;

    // The editor's widget ended the edit with a movement.
    void editorFinished(QLineEdit* editor, int64_t movement);

protected:
    void syncFromModel() override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseDoubleClickEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void leaveEvent(QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    bool viewportEvent(QEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void scrollContentsBy(int dx, int dy) override;

private:
    friend class TQQtOutlineDelegate;
    void attach(RWOutlineView* outline);
    void sendMouse(QMouseEvent* event, int64_t clickCount);
    // The tree view's expansion, selection, widths and visible part from the outline's.
    void syncExpansion();
    void syncSelection();
    void syncColumns();
    void syncVisibleRect();

    TQQtOutlineModel* _model;
    TQQtViewHost _viewHost;
    RWOutlineView* _observed = nullptr;
    QPointer<QLineEdit> _editor;
    bool _syncing = false;
    int _effects = 0;
};
