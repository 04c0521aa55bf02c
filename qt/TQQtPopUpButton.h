#pragma once
// The pop-up button of platform/ui as a QToolButton that pops up a QMenu at once. The button
// shows the model's title. Just before the menu opens the model hears userWillPopUp (its
// observers may rebuild the model's menu), and the QMenu is then filled from what the model's
// menu holds, the selected item checked. Choosing an action is the model's
// userSelectItemAtIndex.

#include <QMenu>
#include <QToolButton>

#include "platform/ui/RWPopUpButton.h"
#include "qt/TQQtControlBinding.h"

class TQQtPopUpButton final : public QToolButton, public TQQtControlBinding<RWPopUpButton> {
public:
    explicit TQQtPopUpButton(QWidget* parent = nullptr);

    QMenu* popUpMenu() const { return _menu; }

protected:
    void syncFromModel() override;

private:
    void aboutToShow();

    QMenu* _menu;
};
