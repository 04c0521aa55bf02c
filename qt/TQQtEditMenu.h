#pragma once
// The Edit menu of a window over an undo history: "Undo <step>" and "Redo <step>" with the
// usual shortcuts (Ctrl+Z, Ctrl+Shift+Z), enabled only when the history has a step on that
// side. The history stays the host's: the menu reads it through TQQtUndoHistory, and asks
// it to undo or redo. Nothing here knows a channel.
//
// The titles follow the history when refresh() is called: after every change of it (a
// window calls refresh from its notification handler), and each time the menu opens.
//
// Lifetime: the history is not owned and must outlive the menu, or be detached with
// setHistory(nullptr). The QMenu is owned by the parent given to the constructor.

#include <QAction>
#include <QMenu>
#include <QObject>
#include <QString>

#include <string>

// What an Edit menu needs of an undo history. Descriptions name a step ("Move Keypoint")
// without the "Undo " or "Redo " that the menu puts before them.
class TQQtUndoHistory {
public:
    virtual ~TQQtUndoHistory() = default;
    virtual bool canUndo() = 0;
    virtual bool canRedo() = 0;
    virtual std::string undoDescription() = 0;
    virtual std::string redoDescription() = 0;
    virtual bool undo() = 0;
    virtual bool redo() = 0;
};

class TQQtEditMenu final : public QObject {
public:
    explicit TQQtEditMenu(QWidget* parent, TQQtUndoHistory* history = nullptr);

    void setHistory(TQQtUndoHistory* history);
    QMenu* menu() const { return _menu; }
    QAction* undoAction() const { return _undo; }
    QAction* redoAction() const { return _redo; }

    // Titles and enabled states from the history.
    void refresh();

    // "Undo", or "Undo <step>" when the step has a name; the same for "Redo".
    static QString actionTitle(const QString& verb, const std::string& description);

private:
    void perform(bool undo);

    TQQtUndoHistory* _history;  // not owned
    QMenu* _menu;
    QAction* _undo;
    QAction* _redo;
};
