#include "qt/TQQtMenu.h"

#include <QPainter>
#include <QPixmap>

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
        if (!item->keyEquivalent().empty()) {
            // Shown beside the title; the shortcut works only while the menu itself is up.
            action->setShortcut(TQQtKeySequenceOfKeyEquivalent(item->keyEquivalent(),
                                                               item->keyEquivalentModifierMask()));
            action->setShortcutContext(Qt::WidgetShortcut);
        }
        // Qt's check marks know on and off only: a mixed item shows a dash instead.
        action->setCheckable(item->state() == RWOnState);
        action->setChecked(item->state() == RWOnState);
        if (item->state() == RWMixedState) action->setIcon(TQQtMixedStateIcon());
        // Held weakly: the menu may be rebuilt while the QMenu is still up.
        std::weak_ptr<RWMenu> weak = menu;
        QObject::connect(action, &QAction::triggered, &into, [weak, i, chosen] {
            if (const RWMenuPtr held = weak.lock()) chosen(*held, i);
        });
    }
}

}  // namespace

QKeySequence TQQtKeySequenceOfKeyEquivalent(const std::string& key, uint64_t modifierMask) {
    // Command is the key of shortcuts here, as in the views (TQQtEvents.h).
    int modifiers = 0;
    if (modifierMask & RWEventModifierFlagCommand) modifiers |= Qt::CTRL;
    if (modifierMask & RWEventModifierFlagShift) modifiers |= Qt::SHIFT;
    if (modifierMask & RWEventModifierFlagOption) modifiers |= Qt::ALT;
    if (modifierMask & RWEventModifierFlagControl) modifiers |= Qt::META;
    const QString text = QString::fromStdString(key).toUpper();
    const QKeySequence plain(text);
    if (text.isEmpty() || plain.isEmpty()) return {};
    return QKeySequence(plain[0].key() | Qt::KeyboardModifiers(modifiers));
}

void TQQtFillMenu(QMenu& into, const RWMenuPtr& menu, const TQQtMenuChoice& chosen) {
    into.clear();
    if (!menu) return;
    menu->update();
    fill(into, menu, chosen);
}

QIcon TQQtMixedStateIcon() {
    QIcon icon;
    for (const qreal ratio : {1.0, 2.0}) {
        constexpr int kSize = 16;
        QPixmap pixmap(static_cast<int>(kSize * ratio), static_cast<int>(kSize * ratio));
        pixmap.setDevicePixelRatio(ratio);
        pixmap.fill(Qt::transparent);
        QPainter painter(&pixmap);
        painter.setRenderHint(QPainter::Antialiasing);
        painter.setPen(QPen(QColor(200, 200, 204), 2.0, Qt::SolidLine, Qt::RoundCap));
        painter.drawLine(QPointF(4.5, 8.0), QPointF(11.5, 8.0));
        painter.end();
        icon.addPixmap(pixmap);
    }
    return icon;
}

bool TQQtRunContextMenu(const RWMenuPtr& menu, const QPoint& globalPosition, QWidget* parent) {
    if (!menu || menu->numberOfItems() == 0) return false;
    QMenu shown(parent);
    // Validated now, as the menu opens: what the items say is true of this moment.
    TQQtFillMenu(shown, menu,
                 [](RWMenu& holder, int64_t index) { holder.performActionForItemAtIndex(index); });
    return shown.exec(globalPosition) != nullptr;
}
