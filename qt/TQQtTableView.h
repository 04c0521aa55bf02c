#pragma once
// The table view model of platform/ui (RWTableView) in a QTableView, bound both ways.
//
// TQQtTableModel is a QAbstractTableModel over the table: each cell shows the table's prepared
// cell (the data source's value after the delegate's adjustments): a text cell as text, a
// check box cell as a check state. A reload of the table resets the model.
//
// TQQtTableView shows it with Qt's own mechanics: the user's selection, edits, check box clicks
// and drags of rows within the table go to the table's user... entries, and what the table then
// holds is shown. An edit open when the table reloads is handed over first (a reload ends the
// edit, as the model's contract says); an edit the table drops is closed without a word. A row
// is dragged with the table's dragged types as its data and dropped between rows (a drop on a
// row lands above it); a drag released anywhere else ends with nothing done. Delete and
// Backspace send the table's delete action.
//
// The view keeps the table alive (shared) and detaches from it when it dies.

#include <QAbstractTableModel>
#include <QPointer>
#include <QTableView>

#include "platform/ui/RWTableView.h"
#include "qt/TQQtControlBinding.h"

class TQQtTableModel final : public QAbstractTableModel {
public:
    explicit TQQtTableModel(QObject* parent = nullptr) : QAbstractTableModel(parent) {}

    RWTableView* table() const { return _table; }
    // Resets the model over another table (or none).
    void setTable(RWTableView* table);
    void reset() {
        beginResetModel();
        endResetModel();
    }

    int rowCount(const QModelIndex& parent = {}) const override;
    int columnCount(const QModelIndex& parent = {}) const override;
    QVariant data(const QModelIndex& index, int role) const override;
    bool setData(const QModelIndex& index, const QVariant& value, int role) override;
    Qt::ItemFlags flags(const QModelIndex& index) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role) const override;

    QStringList mimeTypes() const override;
    QMimeData* mimeData(const QModelIndexList& indexes) const override;
    Qt::DropActions supportedDragActions() const override { return Qt::CopyAction; }
    Qt::DropActions supportedDropActions() const override {
        return Qt::CopyAction | Qt::MoveAction;
    }
    bool canDropMimeData(const QMimeData* data, Qt::DropAction action, int row, int column,
                         const QModelIndex& parent) const override;
    bool dropMimeData(const QMimeData* data, Qt::DropAction action, int row, int column,
                      const QModelIndex& parent) override;

private:
    RWTableView* _table = nullptr;  // the view keeps it alive
};

class TQQtTableView final : public QTableView,
                            public TQQtControlBinding<RWTableView>,
                            public RWTableViewObserver {
public:
    explicit TQQtTableView(QWidget* parent = nullptr);
    ~TQQtTableView() override;

    const std::shared_ptr<RWTableView>& tableShared() const {
        return TQQtControlBinding<RWTableView>::model();
    }
    RWTableView* table() const { return tableShared().get(); }
    void setTable(std::shared_ptr<RWTableView> table) {
        TQQtControlBinding<RWTableView>::setModel(std::move(table));
    }
    TQQtTableModel* tableModel() const { return _model; }
    // The editor of the cell being edited, or null.
    QWidget* editor() const { return _editor; }
    using QTableView::edit;

    // RWTableViewObserver
    void tableWillReload(RWTableView&) override;
    void tableDidReload(RWTableView&) override;
    void tableDidChangeSelection(RWTableView&) override;
    void tableScrollRowToVisible(RWTableView&, int64_t row) override;
    void tableDidAbortEditing(RWTableView&) override;

protected:
    void syncFromModel() override;
    bool edit(const QModelIndex& index, EditTrigger trigger, QEvent* event) override;
    void startDrag(Qt::DropActions supportedActions) override;
    void keyPressEvent(QKeyEvent* event) override;

private:
    friend class TQQtTableDelegate;
    void syncSelection();
    void syncColumns();
    void closeOpenEditor(bool commit);

    TQQtTableModel* _model;
    RWTableView* _observed = nullptr;
    QPointer<QWidget> _editor;
    bool _syncing = false;
};
