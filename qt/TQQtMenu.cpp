#include "qt/TQQtMenu.h"

namespace {

void fill(QMenu& into, const RWMenuPtr& menu, const TQQtMenuChoice& chosen) {
    for (int64_t i = 0; i < menu->numberOfItems(); ++i) {
        const RWMenuItemPtr item = menu->itemAtIndex(i);
        if (item->isSeparatorItem()) {
            into.addSeparator();
            continue;
        }
        const QString title = QString::fromStdString(item->title());
        if (item->hasSubmenu()) {
            QMenu* sub = into.addMenu(title);
            fill(*sub, item->submenu(), chosen);
            sub->setEnabled(item->isEnabled());
            continue;
        }
        QAction* action = into.addAction(title);
        action->setEnabled(item->isEnabled());
        action->setCheckable(item->state() != RWOffState);
        action->setChecked(item->state() == RWOnState);
        // Held weakly: the menu may be rebuilt while the QMenu is still up.
        std::weak_ptr<RWMenu> weak = menu;
        QObject::connect(action, &QAction::triggered, &into, [weak, i, chosen] {
            if (const RWMenuPtr held = weak.lock()) chosen(*held, i);
        });
    }
}

}  // namespace

void TQQtFillMenu(QMenu& into, const RWMenuPtr& menu, const TQQtMenuChoice& chosen) {
    into.clear();
    if (!menu) return;
    menu->update();
    fill(into, menu, chosen);
}
