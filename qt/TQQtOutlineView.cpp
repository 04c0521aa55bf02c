#include "qt/TQQtOutlineView.h"

#include <QApplication>
#include <QCursor>
#include <QHeaderView>
#include <QKeyEvent>
#include <QLineEdit>
#include <QMenu>
#include <QPainter>
#include <QScrollBar>
#include <QTimer>
#include <QToolTip>

#include <cmath>

#include "qt/TQQtCellDrawing.h"
#include "qt/TQQtEvents.h"
#include "qt/TQQtMenu.h"

// ---- The item model -----------------------------------------------------------------------

void TQQtOutlineModel::setOutline(RWOutlineView* outline) {
    beginResetModel();
    _outline = outline;
    endResetModel();
}

const RWOutlineNode* TQQtOutlineModel::nodeForIndex(const QModelIndex& index) const {
    if (!_outline) return nullptr;
    if (!index.isValid()) return &_outline->rootNode();
    return static_cast<const RWOutlineNode*>(index.internalPointer());
}

QModelIndex TQQtOutlineModel::indexForNode(const RWOutlineNode* node, int column) const {
    if (!_outline || !node || node == &_outline->rootNode()) return {};
    return createIndex(static_cast<int>(node->indexInParent()), column,
                       const_cast<RWOutlineNode*>(node));
}

QModelIndex TQQtOutlineModel::index(int row, int column, const QModelIndex& parent) const {
    const RWOutlineNode* node = nodeForIndex(parent);
    if (!node || column < 0 || column >= columnCount()) return {};
    const RWOutlineNode* child = _outline->childNode(*node, row);
    return child ? createIndex(row, column, const_cast<RWOutlineNode*>(child)) : QModelIndex();
}

QModelIndex TQQtOutlineModel::parent(const QModelIndex& child) const {
    if (!child.isValid() || !_outline) return {};
    return indexForNode(nodeForIndex(child)->parent());
}

int TQQtOutlineModel::rowCount(const QModelIndex& parent) const {
    if (parent.column() > 0) return 0;
    const RWOutlineNode* node = nodeForIndex(parent);
    return node ? static_cast<int>(_outline->childCount(*node)) : 0;
}

int TQQtOutlineModel::columnCount(const QModelIndex&) const {
    return _outline ? static_cast<int>(_outline->numberOfColumns()) : 0;
}

bool TQQtOutlineModel::hasChildren(const QModelIndex& parent) const {
    if (!parent.isValid()) return rowCount(parent) > 0;
    const RWOutlineNode* node = nodeForIndex(parent);
    return parent.column() == 0 && node && node->isExpandable();
}

QVariant TQQtOutlineModel::data(const QModelIndex& index, int role) const {
    const RWOutlineNode* node = nodeForIndex(index);
    if (!index.isValid() || !node || node->row() < 0) return {};
    const int64_t row = node->row();
    switch (role) {
        case Qt::DisplayRole: {
            RWCell* cell = _outline->preparedCellAtColumn(index.column(), row);
            return cell ? QString::fromStdString(cell->stringValue()) : QVariant();
        }
        case Qt::EditRole:
            if (_outline->editedRow() == row && _outline->editedColumn() == index.column())
                return QString::fromStdString(_outline->editingText());
            return {};
        default: return {};
    }
}

Qt::ItemFlags TQQtOutlineModel::flags(const QModelIndex& index) const {
    if (!index.isValid() || !_outline) return Qt::NoItemFlags;
    Qt::ItemFlags flags = Qt::ItemIsEnabled | Qt::ItemIsSelectable;
    const RWTableColumn& column = *_outline->tableColumns()[static_cast<size_t>(index.column())];
    if (column.isEditable() && column.dataCell() && column.dataCell()->isEditable())
        flags |= Qt::ItemIsEditable;
    return flags;
}

QVariant TQQtOutlineModel::headerData(int section, Qt::Orientation orientation, int role) const {
    if (!_outline || orientation != Qt::Horizontal || role != Qt::DisplayRole || section < 0 ||
        section >= columnCount())
        return {};
    return QString::fromStdString(_outline->tableColumns()[static_cast<size_t>(section)]->title());
}

// ---- The cells and the editor ---------------------------------------------------------------

class TQQtOutlineDelegate final : public QStyledItemDelegate {
public:
    explicit TQQtOutlineDelegate(TQQtOutlineView& view) : QStyledItemDelegate(&view), _view(view) {}

    void paint(QPainter* painter, const QStyleOptionViewItem& option,
               const QModelIndex& index) const override {
        QStyleOptionViewItem background = option;
        initStyleOption(&background, index);
        background.text.clear();
        const QWidget* widget = option.widget;
        QStyle* style = widget ? widget->style() : QApplication::style();
        style->drawControl(QStyle::CE_ItemViewItem, &background, painter, widget);
        RWOutlineView* outline = _view.outline();
        const RWOutlineNode* node = _view.outlineModel()->nodeForIndex(index);
        if (!outline || !node || node->row() < 0) return;
        // The edited cell shows its editor only.
        if (outline->editedRow() == node->row() && outline->editedColumn() == index.column())
            return;
        RWCell* cell = outline->preparedCellAtColumn(index.column(), node->row());
        if (!cell) return;
        QPalette palette = option.palette;
        if (option.state & QStyle::State_Selected)
            palette.setColor(QPalette::Text, palette.color(QPalette::HighlightedText));
        TQQtCellDrawing drawing(*painter, palette);
        if (cell->fontSize() > 0.0) {
            QFont font = painter->font();
            // The cell's size is in the points of a 72 dpi desktop: pixels here.
            font.setPixelSize(static_cast<int>(std::lround(cell->fontSize() * 1.2)));
            painter->setFont(font);
        }
        const QRect r = option.rect;
        // The cell draws its text at its frame's top: centre a line in the row.
        const double line = painter->fontMetrics().height();
        const double top = std::max(0.0, (r.height() - line) / 2.0);
        const bool text = !dynamic_cast<RWButtonCell*>(cell);
        cell->drawWithFrame(CGRectMake(r.x() + (text ? 2 : 0), r.y() + (text ? top : 0),
                                       r.width() - (text ? 4 : 0), r.height() - (text ? top : 0)),
                            drawing);
    }

    QSize sizeHint(const QStyleOptionViewItem& option, const QModelIndex& index) const override {
        QSize size = QStyledItemDelegate::sizeHint(option, index);
        if (RWOutlineView* outline = _view.outline())
            size.setHeight(static_cast<int>(std::lround(outline->rowHeight())));
        return size;
    }

    QWidget* createEditor(QWidget* parent, const QStyleOptionViewItem&,
                          const QModelIndex&) const override {
        auto* editor = new QLineEdit(parent);
        editor->setFrame(false);
        if (RWOutlineView* outline = _view.outline())
            editor->setText(QString::fromStdString(outline->editingText()));
        editor->selectAll();
        editor->installEventFilter(const_cast<TQQtOutlineDelegate*>(this));
        _view._editor = editor;
        return editor;
    }
    // The text reaches the outline when the edit ends, with how it ended (eventFilter).
    void setEditorData(QWidget*, const QModelIndex&) const override {}
    void setModelData(QWidget*, QAbstractItemModel*, const QModelIndex&) const override {}

protected:
    bool eventFilter(QObject* object, QEvent* event) override {
        auto* editor = qobject_cast<QLineEdit*>(object);
        if (!editor || editor != _view._editor)
            return QStyledItemDelegate::eventFilter(object, event);
        if (event->type() == QEvent::KeyPress) {
            const auto* key = static_cast<QKeyEvent*>(event);
            int64_t movement = -1;
            switch (key->key()) {
                case Qt::Key_Return:
                case Qt::Key_Enter: movement = RWReturnTextMovement; break;
                case Qt::Key_Tab: movement = RWTabTextMovement; break;
                case Qt::Key_Backtab: movement = RWBacktabTextMovement; break;
                case Qt::Key_Escape: movement = RWCancelTextMovement; break;
                default: break;
            }
            if (movement < 0) return false;
            _view.editorFinished(editor, movement);
            return true;
        }
        if (event->type() == QEvent::FocusOut) {
            _view.editorFinished(editor, RWOtherTextMovement);
            return false;
        }
        return QStyledItemDelegate::eventFilter(object, event);
    }

private:
    TQQtOutlineView& _view;
};

// ---- The view -------------------------------------------------------------------------------

TQQtOutlineView::TQQtOutlineView(QWidget* parent)
    : QTreeView(parent), _model(new TQQtOutlineModel(this)), _viewHost(viewport()) {
    QTreeView::setModel(_model);
    setItemDelegate(new TQQtOutlineDelegate(*this));
    setUniformRowHeights(true);
    setHeaderHidden(true);
    setRootIsDecorated(true);
    setExpandsOnDoubleClick(false);
    setItemsExpandable(false);
    setAllColumnsShowFocus(true);
    setSelectionMode(QAbstractItemView::ExtendedSelection);
    setSelectionBehavior(QAbstractItemView::SelectRows);
    setEditTriggers(QAbstractItemView::NoEditTriggers);
    setVerticalScrollMode(QAbstractItemView::ScrollPerPixel);
    setHorizontalScrollMode(QAbstractItemView::ScrollPerPixel);
    setMouseTracking(true);
    // The outline column takes the width the others leave: nothing to scroll sideways.
    setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    header()->setStretchLastSection(false);
    connect(header(), &QHeaderView::sectionResized, this, [this](int section, int, int size) {
        if (_syncing) return;
        if (RWOutlineView* outline = this->outline()) outline->setColumnWidth(section, size);
    });
    syncFromModel();
}

TQQtOutlineView::~TQQtOutlineView() {
    attach(nullptr);
    setOutline(nullptr);
    QTreeView::setModel(nullptr);
}

void TQQtOutlineView::attach(RWOutlineView* outline) {
    if (_observed == outline) return;
    if (_observed) {
        _observed->removeOutlineObserver(this);
        if (_observed->viewHost() == &_viewHost) _observed->setViewHost(nullptr);
    }
    _observed = outline;
    if (_observed) {
        _observed->addOutlineObserver(this);
        _observed->setViewHost(&_viewHost);
    }
    _model->setOutline(outline);
}

void TQQtOutlineView::syncFromModel() {
    RWOutlineView* outline = this->outline();
    attach(outline);
    setEnabled(outline && outline->isEnabled());
    if (!outline) return;
    setIndentation(static_cast<int>(std::lround(outline->indentationPerLevel())));
    syncColumns();
    syncExpansion();
    syncSelection();
    syncVisibleRect();
}

void TQQtOutlineView::syncColumns() {
    RWOutlineView* outline = this->outline();
    if (!outline) return;
    _syncing = true;
    for (int64_t i = 0; i < outline->numberOfColumns(); ++i) {
        const int width =
            static_cast<int>(std::lround(outline->tableColumns()[static_cast<size_t>(i)]->width()));
        if (header()->sectionSize(static_cast<int>(i)) != width)
            header()->resizeSection(static_cast<int>(i), width);
    }
    _syncing = false;
}

void TQQtOutlineView::syncExpansion() {
    RWOutlineView* outline = this->outline();
    if (!outline) return;
    _syncing = true;
    for (int64_t row = 0; row < outline->numberOfRows(); ++row) {
        const RWOutlineNode* node = outline->nodeAtRow(row);
        if (node->isExpanded()) expand(_model->indexForNode(node));
    }
    _syncing = false;
}

void TQQtOutlineView::syncSelection() {
    RWOutlineView* outline = this->outline();
    if (!outline || !selectionModel()) return;
    _syncing = true;
    QItemSelection selection;
    const int last = _model->columnCount() - 1;
    for (int64_t row : outline->selectedRowIndexes()) {
        const RWOutlineNode* node = outline->nodeAtRow(row);
        if (node) selection.select(_model->indexForNode(node, 0), _model->indexForNode(node, last));
    }
    selectionModel()->select(selection, QItemSelectionModel::ClearAndSelect);
    _syncing = false;
}

void TQQtOutlineView::syncVisibleRect() {
    RWOutlineView* outline = this->outline();
    if (outline && outline->numberOfColumns() > 0) {
        // The outline column takes the width the others leave.
        double others = 0.0;
        for (int64_t i = 1; i < outline->numberOfColumns(); ++i)
            others += outline->tableColumns()[static_cast<size_t>(i)]->width();
        const double width = std::max(60.0, viewport()->width() - others);
        if (std::fabs(outline->tableColumns()[0]->width() - width) >= 1.0)
            outline->setColumnWidth(0, width);
    }
    if (outline)
        outline->setVisibleRect(CGRectMake(horizontalOffset(), verticalOffset(),
                                           viewport()->width(), viewport()->height()));
}

// ---- What the outline decided ---------------------------------------------------------------

void TQQtOutlineView::outlineWillReload(RWOutlineView&) {
    if (_editor) {
        QLineEdit* editor = _editor;
        _editor = nullptr;
        closeEditor(editor, QAbstractItemDelegate::NoHint);
    }
    _model->beginReload();
}

void TQQtOutlineView::outlineDidReload(RWOutlineView&) {
    _model->endReload();
    syncColumns();
    syncExpansion();
    syncSelection();
}

void TQQtOutlineView::outlineDidChangeExpansion(RWOutlineView&, const RWOutlineNode& node) {
    _syncing = true;
    const QModelIndex index = _model->indexForNode(&node);
    if (node.isExpanded())
        expand(index);
    else
        collapse(index);
    _syncing = false;
    // Rows below moved: the selection follows them.
    syncSelection();
}

void TQQtOutlineView::outlineDidChangeSelection(RWOutlineView&) { syncSelection(); }

void TQQtOutlineView::outlineNeedsDisplay(RWOutlineView&, const CGRect& rect) {
    // Only the rows in the rectangle are drawn again, and so asked for again.
    const QRect area(static_cast<int>(std::floor(rect.origin.x)) - horizontalOffset(),
                     static_cast<int>(std::floor(rect.origin.y)) - verticalOffset(),
                     static_cast<int>(std::ceil(rect.size.width)) + 1,
                     static_cast<int>(std::ceil(rect.size.height)) + 1);
    viewport()->update(area.intersected(viewport()->rect().adjusted(-1, -1, 1, 1)));
}

void TQQtOutlineView::outlineDidBeginEditing(RWOutlineView& outline, int64_t column, int64_t row) {
    const QModelIndex index =
        _model->indexForNode(outline.nodeAtRow(row), static_cast<int>(column));
    if (!index.isValid()) return;
    scrollTo(index);
    edit(index);
    if (_editor) _editor->setFocus();
}

void TQQtOutlineView::outlineDidEndEditing(RWOutlineView&) {
    if (!_editor) return;
    QLineEdit* editor = _editor;
    _editor = nullptr;
    closeEditor(editor, QAbstractItemDelegate::NoHint);
}

void TQQtOutlineView::editorFinished(QLineEdit* editor, int64_t movement) {
    RWOutlineView* outline = this->outline();
    if (!outline || editor != _editor) return;
    const std::string text = editor->text().toStdString();
    outline->userEndEditing(text, movement);
}

void TQQtOutlineView::outlineWantsKeyboardFocus(RWOutlineView&) {
    if (!_editor) setFocus();
}

void TQQtOutlineView::outlineScrollRowToVisible(RWOutlineView& outline, int64_t row) {
    scrollTo(_model->indexForNode(outline.nodeAtRow(row)));
}

void TQQtOutlineView::outlineDidChangeDrag(RWOutlineView& outline) {
    if (outline.isDragging())
        viewport()->setCursor(Qt::ClosedHandCursor);
    else
        viewport()->unsetCursor();
}

void TQQtOutlineView::outlinePopUpContextMenu(RWOutlineView&, const RWMenuPtr& menu,
                                              const CGPoint&) {
    // The menu opens under the pointer, where the press that asked for it is.
    QMenu shown(this);
    TQQtFillMenu(shown, menu,
                 [](RWMenu& chosen, int64_t index) { chosen.performActionForItemAtIndex(index); });
    if (!shown.isEmpty()) shown.exec(QCursor::pos());
}

void TQQtOutlineView::outlineShowAnimationEffect(RWOutlineView& outline,
                                                 const CGPoint& pointInWindow) {
    // A puff where the row vanished: a small ring that grows and fades for a quarter second.
    const CGPoint inside = outline.convertPointFromWindow(pointInWindow);
    const QPoint local(static_cast<int>(inside.x) - horizontalOffset(),
                       static_cast<int>(inside.y) - verticalOffset());
    auto* puff = new QWidget(nullptr, Qt::ToolTip | Qt::FramelessWindowHint);
    puff->setAttribute(Qt::WA_TranslucentBackground);
    puff->setAttribute(Qt::WA_TransparentForMouseEvents);
    puff->setAttribute(Qt::WA_DeleteOnClose);
    puff->resize(40, 40);
    puff->move(viewport()->mapToGlobal(local) - QPoint(20, 20));
    puff->setWindowOpacity(0.8);
    puff->show();
    ++_effects;
    QPointer<TQQtOutlineView> self(this);
    QTimer::singleShot(250, puff, [puff, self] {
        puff->close();
        if (self) --self->_effects;
    });
}

void TQQtOutlineView::outlineDidChangeColumns(RWOutlineView& outline) {
    // A column added or removed changes the item model; a new width only the header.
    if (_model->columnCount() != outline.numberOfColumns()) _model->setOutline(&outline);
    syncColumns();
    syncExpansion();
    syncSelection();
}

// ---- The user -------------------------------------------------------------------------------

void TQQtOutlineView::sendMouse(QMouseEvent* event, int64_t clickCount) {
    RWOutlineView* outline = this->outline();
    const std::optional<RWEvent> e = TQQtEvents::mouseEvent(*event, _viewHost, clickCount);
    if (!outline || !e || !outline->isEnabled()) return;
    event->accept();
    // The outline may replace the rows under the call: it stays alive meanwhile.
    const std::shared_ptr<RWOutlineView> keep = outlineShared();
    switch (e->type()) {
        case RWEventType::LeftMouseDown: outline->mouseDown(*e); break;
        case RWEventType::RightMouseDown: outline->rightMouseDown(*e); break;
        case RWEventType::LeftMouseDragged: outline->mouseDragged(*e); break;
        case RWEventType::LeftMouseUp: outline->mouseUp(*e); break;
        case RWEventType::MouseMoved: outline->mouseMoved(*e); break;
        default: break;
    }
}

void TQQtOutlineView::mousePressEvent(QMouseEvent* event) { sendMouse(event, 1); }

void TQQtOutlineView::mouseDoubleClickEvent(QMouseEvent* event) { sendMouse(event, 2); }

void TQQtOutlineView::mouseMoveEvent(QMouseEvent* event) { sendMouse(event, 1); }

void TQQtOutlineView::mouseReleaseEvent(QMouseEvent* event) { sendMouse(event, 1); }

void TQQtOutlineView::leaveEvent(QEvent* event) {
    QTreeView::leaveEvent(event);
    if (RWOutlineView* outline = this->outline())
        outline->mouseLeftView(
            RWEvent::mouseEvent(RWEventType::MouseExited, outline->mouseLocationInWindow()));
}

void TQQtOutlineView::keyPressEvent(QKeyEvent* event) {
    RWOutlineView* outline = this->outline();
    if (!outline || state() == QAbstractItemView::EditingState) {
        QTreeView::keyPressEvent(event);
        return;
    }
    const std::shared_ptr<RWOutlineView> keep = outlineShared();
    outline->keyDown(TQQtEvents::keyEvent(*event));
    event->accept();
}

bool TQQtOutlineView::viewportEvent(QEvent* event) {
    if (event->type() == QEvent::ToolTip) {
        RWOutlineView* outline = this->outline();
        const auto* help = static_cast<QHelpEvent*>(event);
        const std::optional<std::string> tip =
            outline ? outline->toolTipAtPoint(CGPointMake(help->pos().x() + horizontalOffset(),
                                                          help->pos().y() + verticalOffset()))
                    : std::nullopt;
        if (tip)
            QToolTip::showText(help->globalPos(), QString::fromStdString(*tip), viewport());
        else
            QToolTip::hideText();
        return true;
    }
    return QTreeView::viewportEvent(event);
}

void TQQtOutlineView::resizeEvent(QResizeEvent* event) {
    QTreeView::resizeEvent(event);
    syncVisibleRect();
}

void TQQtOutlineView::scrollContentsBy(int dx, int dy) {
    QTreeView::scrollContentsBy(dx, dy);
    syncVisibleRect();
}
