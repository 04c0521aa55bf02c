#include "qt/TQQtEditMenu.h"

#include <QKeySequence>

TQQtEditMenu::TQQtEditMenu(QWidget* parent, TQQtUndoHistory* history)
    : QObject(parent), _history(history), _menu(new QMenu(QObject::tr("&Edit"), parent)) {
    _undo = _menu->addAction(QObject::tr("Undo"));
    _undo->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_Z));
    _redo = _menu->addAction(QObject::tr("Redo"));
    _redo->setShortcut(QKeySequence(Qt::CTRL | Qt::SHIFT | Qt::Key_Z));
    // Shortcuts work wherever the focus is in the window, not only in the menu bar.
    _undo->setShortcutContext(Qt::WindowShortcut);
    _redo->setShortcutContext(Qt::WindowShortcut);
    QObject::connect(_undo, &QAction::triggered, this, [this] { perform(true); });
    QObject::connect(_redo, &QAction::triggered, this, [this] { perform(false); });
    QObject::connect(_menu, &QMenu::aboutToShow, this, [this] { refresh(); });
    refresh();
}

void TQQtEditMenu::setHistory(TQQtUndoHistory* history) {
    _history = history;
    refresh();
}

QString TQQtEditMenu::actionTitle(const QString& verb, const std::string& description) {
    if (description.empty()) return verb;
    return verb + QLatin1Char(' ') + QString::fromStdString(description);
}

void TQQtEditMenu::refresh() {
    const bool canUndo = _history && _history->canUndo();
    const bool canRedo = _history && _history->canRedo();
    _undo->setText(
        actionTitle(QObject::tr("Undo"), canUndo ? _history->undoDescription() : std::string()));
    _redo->setText(
        actionTitle(QObject::tr("Redo"), canRedo ? _history->redoDescription() : std::string()));
    _undo->setEnabled(canUndo);
    _redo->setEnabled(canRedo);
}

void TQQtEditMenu::perform(bool undo) {
    if (!_history) return;
    // A shortcut can fire before the menu was refreshed: ask the history, not the action.
    if (undo ? _history->canUndo() : _history->canRedo()) {
        if (undo)
            _history->undo();
        else
            _history->redo();
    }
    refresh();
}
