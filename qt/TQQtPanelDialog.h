#pragma once
// A window of platform/ui with laid-out content (RWWindow::contentView) as a QDialog, what the
// modal service shows for the framework's panels. Each control of the content becomes the
// widget bound to it (text fields, buttons, sliders, scrubbers, tables, segmented controls) at
// its frame, a text field that is not editable shown as a label without a frame; the dialog
// sits at the window's frame on the screen (TQQtScreen.h), without a title bar or border of
// the window manager when the window's style mask is 0, and the window's first responder takes
// the focus.
//
// Keys: Return outside a text field and Escape anywhere click the buttons that have them as
// key equivalents (a text field ends its edit with Return, sending its own action). A click
// on a button first ends the edits of the editable text fields, without their actions: text a
// field refuses holds the click back. The buttons take no focus, so that
// pressing one never ends that edit by itself.
//
// The dialog's close is the window's performClose (TQQtWindowBinding); a close that ends no
// run (nobody stops it) rejects the dialog, which ends the run with 0.
//
// The dialog does not own the window or the controls; the window outlives the dialog.

#include <QDialog>

#include <utility>
#include <vector>

#include "platform/ui/RWWindow.h"

class RWControl;
class TQQtTextField;

class TQQtPanelDialog final : public QDialog {
public:
    TQQtPanelDialog(RWWindow& window, QWidget* parent);

    // Whether a window has content this dialog can show.
    static bool canShow(const RWWindow& window) { return window.contentView() != nullptr; }

    // The widget bound to a control of the content, or null.
    QWidget* widgetOf(const RWControl* control) const;

    void reject() override;
    // Showing gives the first responder the focus, with the selection its model has (the
    // dialog's own focus on showing would select the whole text).
    void setVisible(bool visible) override;

protected:
    void keyPressEvent(QKeyEvent* event) override;

private:
    // Clicks the enabled button whose key equivalent this is; false when there is none.
    bool clickButtonWithKey(const char* key);
    // Ends the edit of every editable text field; false when one refused its text.
    bool settleTextFields();
    void placeAtWindowFrame();

    RWWindow& _window;
    std::vector<std::pair<const RWControl*, QWidget*>> _widgets;
};
