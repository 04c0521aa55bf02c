#pragma once
// Modal runs of the framework's panels on Qt: each RWWindow that the framework runs modally
// is shown as a QDialog, chosen by the window's title, and runModalForWindow returns when the
// dialog ends (OK 1, Cancel 0) or when someone calls stopModal, stopModalWithCode or
// abortModal during the run. Runs nest; the stop calls end the innermost one.
//
// A window whose title has no dialog registered is shown as a TQQtPanelDialog when it has
// laid-out content (the framework's number panels); otherwise it is not shown: the run answers
// RWModalResponseAbort at once, as a run that nothing could show.
//
// The first stop of a run decides its answer: a later one (a field that ends its edit as the
// dialog goes away after Cancel) changes nothing.
//
// Built in: an alert (RWAlert) as a QMessageBox with one OK button, whatever its title;
// "TQCurveEditorValueView", the number panel of a keypoint's value
// (TQCurveEditorValueWindow), placed at the point the window names in the active window.
//
// Not installed by TQQtServiceInstaller: a test that drives gestures must not block in a
// dialog nobody answers. An application installs it with install() for its lifetime.

#include <QDialog>
#include <QPointer>

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "platform/ui/RWServices.h"

class RWAlert;

class TQQtModalService final : public RWModalService {
public:
    // Makes the dialog of a window, or null when it cannot show this window. The dialog
    // writes its answer into the window when it is accepted.
    using DialogFactory = std::function<std::unique_ptr<QDialog>(RWWindow& window)>;

    TQQtModalService();
    ~TQQtModalService() override;
    TQQtModalService(const TQQtModalService&) = delete;
    TQQtModalService& operator=(const TQQtModalService&) = delete;

    void registerDialog(const std::string& windowTitle, DialogFactory factory);

    // Installs this service as the process-wide modal service, until it dies.
    void install();

    RWModalResponse runModalForWindow(RWWindow& window) override;
    void stopModal() override { stopModalWithCode(RWModalResponseStop); }
    void stopModalWithCode(RWModalResponse code) override;
    void abortModal() override { stopModalWithCode(RWModalResponseAbort); }

    // The dialog of the innermost run, or null.
    QDialog* activeDialog() const { return _runs.empty() ? nullptr : _runs.back().dialog.data(); }

    static std::unique_ptr<QDialog> makeAlertDialog(RWAlert& alert);
    // The value panel: a line that takes a number, OK and Cancel.
    static std::unique_ptr<QDialog> makeValueDialog(RWWindow& window);

private:
    std::map<std::string, DialogFactory> _factories;
    struct Run {
        QPointer<QDialog> dialog;
        bool stopped = false;
    };
    std::vector<Run> _runs;
    bool _installed = false;
    RWModalService* _previous = nullptr;
};
