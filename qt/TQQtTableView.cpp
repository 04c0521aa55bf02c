#include "qt/TQQtTableView.h"

#include <QHeaderView>
#include <QKeyEvent>
#include <QMimeData>
#include <QStyledItemDelegate>

// Tells the view which editor is open, and ends the table's edit when the editor goes
// without handing its text over (Escape).
class TQQtTableDelegate final : public QStyledItemDelegate {
public:
    explicit TQQtTableDelegate(TQQtTableView& view) : QStyledItemDelegate(&view), _view(view) {}

    QWidget* createEditor(QWidget* parent, const QStyleOptionViewItem& option,
                          const QModelIndex& index) const override {
        QWidget* editor = QStyledItemDelegate::createEditor(parent, option, index);
        _view._editor = editor;
        return editor;
    }
    void destroyEditor(QWidget* editor, const QModelIndex& index) const override {
        if (_view._editor == editor) _view._editor = nullptr;
        if (RWTableView* table = _view.table()) table->userEndEditing({}, true);
        QStyledItemDelegate::destroyEditor(editor, index);
    }

private:
    TQQtTableView& _view;
};

// ---- The item model --------------------------------------------------------------------------

namespace {

QString text(const std::string& s) { return QString::fromStdString(s); }

}  // namespace

void TQQtTableModel::setTable(RWTableView* table) {
    beginResetModel();
    _table = table;
    endResetModel();
}

int TQQtTableModel::rowCount(const QModelIndex& parent) const {
    return _table && !parent.isValid() ? static_cast<int>(_table->numberOfRows()) : 0;
}

int TQQtTableModel::columnCount(const QModelIndex& parent) const {
    return _table && !parent.isValid() ? static_cast<int>(_table->numberOfColumns()) : 0;
}

QVariant TQQtTableModel::data(const QModelIndex& index, int role) const {
    if (!_table || !index.isValid()) return {};
    RWCell* cell = _table->preparedCellAtColumn(index.column(), index.row());
    if (!cell) return {};
    if (const auto* box = dynamic_cast<const RWButtonCell*>(cell)) {
        if (role != Qt::CheckStateRole) return {};
        return box->state() == RWOnState ? Qt::Checked : Qt::Unchecked;
    }
    if (role == Qt::DisplayRole || role == Qt::EditRole) return text(cell->stringValue());
    return {};
}

bool TQQtTableModel::setData(const QModelIndex& index, const QVariant& value, int role) {
    if (!_table || !index.isValid()) return false;
    if (role == Qt::CheckStateRole) {
        const bool on = value.toInt() == Qt::Checked;
        _table->userSetObjectValue(index.column(), index.row(), RWObjectValue(on ? 1 : 0));
    } else if (role == Qt::EditRole) {
        // Only the edit the table opened takes text: an editor that outlives it (closed by
        // a Cancel) commits nothing.
        const auto edited = _table->editedCell();
        if (!edited || edited->first != index.column() || edited->second != index.row())
            return false;
        _table->userEndEditing(value.toString().toStdString());
    } else {
        return false;
    }
    // What the data source made of it; a refused value shows the old one again.
    emit dataChanged(this->index(index.row(), 0), this->index(index.row(), columnCount() - 1));
    return true;
}

Qt::ItemFlags TQQtTableModel::flags(const QModelIndex& index) const {
    // Between rows (and past the last) the rows may land.
    if (!_table || !index.isValid()) return Qt::ItemIsDropEnabled;
    Qt::ItemFlags flags =
        Qt::ItemIsEnabled | Qt::ItemIsSelectable | Qt::ItemIsDragEnabled | Qt::ItemIsDropEnabled;
    const RWTableColumn* column = _table->tableColumnAt(index.column());
    if (!column || !column->isEditable()) return flags;
    if (dynamic_cast<const RWButtonCell*>(column->dataCell().get()))
        flags |= Qt::ItemIsUserCheckable;
    else
        flags |= Qt::ItemIsEditable;
    return flags;
}

QVariant TQQtTableModel::headerData(int section, Qt::Orientation orientation, int role) const {
    if (!_table || orientation != Qt::Horizontal || role != Qt::DisplayRole) return {};
    const RWTableColumn* column = _table->tableColumnAt(section);
    return column ? QVariant(text(column->title())) : QVariant();
}

QStringList TQQtTableModel::mimeTypes() const {
    QStringList types;
    if (_table)
        for (const std::string& type : _table->registeredDraggedTypes()) types << text(type);
    return types;
}

QMimeData* TQQtTableModel::mimeData(const QModelIndexList& indexes) const {
    if (!_table) return nullptr;
    RWIndexSet rows;
    for (const QModelIndex& index : indexes) rows.addIndex(index.row());
    if (!_table->userBeginDragRows(rows)) return nullptr;
    auto* data = new QMimeData;
    // The rows travel with the data source; the data only names what the drag is.
    for (const std::string& type : _table->draggedTypes()) data->setData(text(type), {});
    return data;
}

bool TQQtTableModel::canDropMimeData(const QMimeData* data, Qt::DropAction, int, int,
                                     const QModelIndex&) const {
    if (!_table || !data || !_table->isDragging()) return false;
    for (const std::string& type : _table->registeredDraggedTypes())
        if (data->hasFormat(text(type))) return true;
    return false;
}

bool TQQtTableModel::dropMimeData(const QMimeData* data, Qt::DropAction action, int row, int column,
                                  const QModelIndex& parent) {
    if (!canDropMimeData(data, action, row, column, parent)) return false;
    // On a row: the gap above it. Past the rows: the end.
    const int target = row >= 0 ? row : parent.isValid() ? parent.row() : rowCount();
    return _table->userDropAtRow(target);
}

// ---- The view --------------------------------------------------------------------------------

TQQtTableView::TQQtTableView(QWidget* parent)
    : QTableView(parent), _model(new TQQtTableModel(this)) {
    QTableView::setModel(_model);
    setItemDelegate(new TQQtTableDelegate(*this));
    setSelectionBehavior(QAbstractItemView::SelectRows);
    setEditTriggers(QAbstractItemView::DoubleClicked | QAbstractItemView::EditKeyPressed |
                    QAbstractItemView::SelectedClicked);
    setDragEnabled(true);
    setAcceptDrops(true);
    setDropIndicatorShown(true);
    setDragDropMode(QAbstractItemView::DragDrop);
    setDragDropOverwriteMode(false);
    setDefaultDropAction(Qt::CopyAction);
    verticalHeader()->hide();
    horizontalHeader()->setStretchLastSection(true);
    connect(selectionModel(), &QItemSelectionModel::selectionChanged, this, [this] {
        if (_syncing || !table()) return;
        RWIndexSet rows;
        for (const QModelIndex& index : selectionModel()->selectedIndexes())
            rows.addIndex(index.row());
        table()->userSelectRows(rows);
        syncSelection();  // what the table kept
    });
}

TQQtTableView::~TQQtTableView() {
    if (_observed) _observed->removeTableObserver(this);
    _model->setTable(nullptr);
}

void TQQtTableView::syncFromModel() {
    RWTableView* shown = table();
    if (shown != _observed) {
        if (_observed) _observed->removeTableObserver(this);
        _observed = shown;
        if (_observed) _observed->addTableObserver(this);
        _model->setTable(shown);
    }
    setEnabled(shown && shown->isEnabled());
    setVisible(!shown || !shown->isHidden());
    if (!shown) return;
    setSelectionMode(shown->allowsMultipleSelection() ? QAbstractItemView::ExtendedSelection
                                                      : QAbstractItemView::SingleSelection);
    syncColumns();
    syncSelection();
}

void TQQtTableView::syncColumns() {
    const RWTableView* shown = table();
    if (!shown) return;
    if (_model->columnCount() != static_cast<int>(shown->numberOfColumns())) _model->reset();
    for (int i = 0; i < static_cast<int>(shown->numberOfColumns()); ++i)
        setColumnWidth(i, static_cast<int>(shown->tableColumnAt(i)->width()));
}

void TQQtTableView::syncSelection() {
    const RWTableView* shown = table();
    if (!shown) return;
    const bool wasSyncing = _syncing;
    _syncing = true;
    QItemSelection selection;
    for (int64_t row : shown->selectedRowIndexes()) {
        const int r = static_cast<int>(row);
        selection.select(_model->index(r, 0), _model->index(r, _model->columnCount() - 1));
    }
    selectionModel()->select(selection, QItemSelectionModel::ClearAndSelect);
    _syncing = wasSyncing;
}

void TQQtTableView::closeOpenEditor(bool commit) {
    QWidget* editor = _editor;
    if (!editor) return;
    if (commit) commitData(editor);
    closeEditor(editor, QAbstractItemDelegate::NoHint);
}

void TQQtTableView::tableWillReload(RWTableView&) { closeOpenEditor(true); }

void TQQtTableView::tableDidReload(RWTableView&) {
    const bool wasSyncing = _syncing;
    _syncing = true;
    _model->reset();
    _syncing = wasSyncing;
    syncSelection();
}

void TQQtTableView::tableDidChangeSelection(RWTableView&) { syncSelection(); }

void TQQtTableView::tableScrollRowToVisible(RWTableView&, int64_t row) {
    scrollTo(_model->index(static_cast<int>(row), 0));
}

void TQQtTableView::tableDidAbortEditing(RWTableView&) { closeOpenEditor(false); }

bool TQQtTableView::edit(const QModelIndex& index, EditTrigger trigger, QEvent* event) {
    // The table decides which cells take an edit, and knows of every edit it took.
    RWTableView* shown = table();
    if (!shown || !index.isValid() || !(_model->flags(index) & Qt::ItemIsEditable))
        return QTableView::edit(index, trigger, event);
    if (trigger == QAbstractItemView::AllEditTriggers || (editTriggers() & trigger)) {
        if (!shown->editColumn(index.column(), index.row())) return false;
        if (QTableView::edit(index, trigger, event)) return true;
        shown->userEndEditing({}, true);
        return false;
    }
    return QTableView::edit(index, trigger, event);
}

void TQQtTableView::startDrag(Qt::DropActions supportedActions) {
    QTableView::startDrag(supportedActions);
    // Released outside the table (or refused): the drag ends with nothing done.
    if (RWTableView* shown = table()) shown->userEndDrag();
}

void TQQtTableView::keyPressEvent(QKeyEvent* event) {
    const bool erase = event->key() == Qt::Key_Delete || event->key() == Qt::Key_Backspace;
    if (erase && state() != QAbstractItemView::EditingState && table()) {
        table()->delete_(nullptr);
        event->accept();
        return;
    }
    QTableView::keyPressEvent(event);
}
