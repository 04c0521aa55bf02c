#include "qt/TQQtPopUpButton.h"

#include "qt/TQQtMenu.h"

TQQtPopUpButton::TQQtPopUpButton(QWidget* parent) : QToolButton(parent), _menu(new QMenu(this)) {
    setMenu(_menu);
    setPopupMode(QToolButton::InstantPopup);
    setToolButtonStyle(Qt::ToolButtonTextOnly);
    connect(_menu, &QMenu::aboutToShow, this, [this] { aboutToShow(); });
    syncFromModel();
}

void TQQtPopUpButton::syncFromModel() {
    const RWPopUpButton* m = model().get();
    setEnabled(m && m->isEnabled());
    setText(m ? QString::fromStdString(m->title()) : QString());
    setAutoRaise(m && !m->isBordered());
}

void TQQtPopUpButton::aboutToShow() {
    const std::shared_ptr<RWPopUpButton> m = model();
    if (!m) {
        _menu->clear();
        return;
    }
    m->userWillPopUp();
    // Only the top level is the button's: a choice in a submenu runs that item itself.
    const RWMenu* top = m->menu().get();
    std::weak_ptr<RWPopUpButton> weak = m;
    TQQtFillMenu(*_menu, m->menu(), [weak, top](RWMenu& menu, int64_t index) {
        const std::shared_ptr<RWPopUpButton> held = weak.lock();
        if (held && &menu == top && held->menu().get() == top)
            held->userSelectItemAtIndex(index);
        else
            menu.performActionForItemAtIndex(index);
    });
    const int selected = int(m->indexOfSelectedItem());
    const QList<QAction*> actions = _menu->actions();
    if (selected >= 0 && selected < actions.size()) {
        actions[selected]->setCheckable(true);
        actions[selected]->setChecked(true);
    }
}
