#pragma once
// A window or panel of platform/ui (RWWindow) bound to a top-level widget (a QDialog, a
// QMainWindow): the widget shows the model's title and is shown or hidden with the model, and
// the model follows when Qt shows or hides the widget; the user's close is the model's
// performClose, so the model's delegate may refuse it, and a refused close leaves the widget
// open. While the widget is on screen the model's frame follows where it is (screen points,
// TQQtScreen.h), so that the framework can place panels relative to it.
//
// The binding watches the widget through an event filter and does not own it; it detaches
// itself when either the widget or the binding goes first. The window is not owned either: it
// outlives the binding.

#include <QObject>
#include <QPointer>
#include <QWidget>

#include "platform/ui/RWWindow.h"

class TQQtWindowBinding final : public QObject, public RWWindowObserver {
public:
    TQQtWindowBinding(RWWindow& window, QWidget* widget);
    ~TQQtWindowBinding() override;

    void windowDidChange(RWWindow& window) override;

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void takeFrameFromWidget();

    RWWindow& _window;
    QPointer<QWidget> _widget;
    bool _closing = false;
};
