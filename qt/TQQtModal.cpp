#include "qt/TQQtModal.h"

#include <QApplication>
#include <QDialogButtonBox>
#include <QDoubleValidator>
#include <QLineEdit>
#include <QLocale>
#include <QMessageBox>
#include <QVBoxLayout>

#include <cmath>

#include "platform/ui/RWAlert.h"
#include "qt/TQQtPanelDialog.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

namespace {

// Qt's exec() answers an int; the framework's codes all fit one.
int dialogCode(RWModalResponse code) { return static_cast<int>(code); }

}  // namespace

TQQtModalService::TQQtModalService() { registerDialog("TQCurveEditorValueView", &makeValueDialog); }

TQQtModalService::~TQQtModalService() {
    if (!_installed) return;
    RWServiceSet back;
    back.modal = _previous;
    RWInstallServices(back);
}

void TQQtModalService::install() {
    if (_installed) return;
    _previous = RWApplicationServices().modal;
    RWServiceSet mine;
    mine.modal = this;
    RWInstallServices(mine);
    _installed = true;
}

void TQQtModalService::registerDialog(const std::string& windowTitle, DialogFactory factory) {
    if (factory)
        _factories[windowTitle] = std::move(factory);
    else
        _factories.erase(windowTitle);
}

RWModalResponse TQQtModalService::runModalForWindow(RWWindow& window) {
    std::unique_ptr<QDialog> dialog;
    if (auto* alert = dynamic_cast<RWAlert*>(&window))
        dialog = makeAlertDialog(*alert);
    else if (const auto found = _factories.find(window.title()); found != _factories.end())
        dialog = found->second(window);
    if (!dialog && TQQtPanelDialog::canShow(window))
        dialog = std::make_unique<TQQtPanelDialog>(window, QApplication::activeWindow());
    if (!dialog) return RWModalResponseAbort;
    dialog->setModal(true);
    _runs.push_back(Run{dialog.get(), false});
    const int result = dialog->exec();
    _runs.pop_back();
    return result;
}

void TQQtModalService::stopModalWithCode(RWModalResponse code) {
    // Dialogs deleted behind the service's back leave null entries: skip to a live run.
    while (!_runs.empty() && !_runs.back().dialog) _runs.pop_back();
    if (_runs.empty() || _runs.back().stopped) return;
    _runs.back().stopped = true;
    _runs.back().dialog->done(dialogCode(code));
}

std::unique_ptr<QDialog> TQQtModalService::makeAlertDialog(RWAlert& alert) {
    auto box = std::make_unique<QMessageBox>(QApplication::activeWindow());
    box->setIcon(alert.alertStyle() == RWAlertStyleCritical        ? QMessageBox::Critical
                 : alert.alertStyle() == RWAlertStyleInformational ? QMessageBox::Information
                                                                   : QMessageBox::Warning);
    box->setWindowTitle(QString::fromStdString(alert.messageText()));
    box->setText(QString::fromStdString(alert.messageText()));
    box->setInformativeText(QString::fromStdString(alert.informativeText()));
    box->setStandardButtons(QMessageBox::Ok);
    return box;
}

std::unique_ptr<QDialog> TQQtModalService::makeValueDialog(RWWindow& window) {
    auto* valueWindow = dynamic_cast<TQCurveEditorValueWindow*>(&window);
    if (!valueWindow) return nullptr;

    QWidget* parent = QApplication::activeWindow();
    auto dialog = std::make_unique<QDialog>(parent, Qt::Dialog);
    dialog->setWindowTitle(QObject::tr("Value"));
    auto* layout = new QVBoxLayout(dialog.get());
    auto* line = new QLineEdit(dialog.get());
    line->setObjectName(QStringLiteral("value"));
    // The C locale: a value is typed as the labels show it, with a point.
    auto* validator = new QDoubleValidator(line);
    validator->setLocale(QLocale::c());
    validator->setNotation(QDoubleValidator::StandardNotation);
    line->setValidator(validator);
    line->setText(QLocale::c().toString(valueWindow->value, 'g', 10));
    line->selectAll();
    layout->addWidget(line);
    auto* buttons =
        new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, dialog.get());
    layout->addWidget(buttons);

    QDialog* raw = dialog.get();
    QObject::connect(buttons, &QDialogButtonBox::rejected, raw,
                     [raw] { raw->done(dialogCode(RWModalResponseCancel)); });
    QObject::connect(buttons, &QDialogButtonBox::accepted, raw, [raw, line, valueWindow] {
        bool ok = false;
        const double typed = QLocale::c().toDouble(line->text().trimmed(), &ok);
        // A text that is not a finite number keeps the panel open rather than setting garbage.
        if (!ok || !std::isfinite(typed)) {
            line->selectAll();
            return;
        }
        valueWindow->value = typed;
        raw->done(dialogCode(RWModalResponseOK));
    });

    // At the point of the click: window points with y up, in the window the click was in.
    if (parent) {
        const QPoint local(
            static_cast<int>(std::lround(valueWindow->location.x)),
            static_cast<int>(std::lround(parent->height() - valueWindow->location.y)));
        dialog->move(parent->mapToGlobal(local));
    }
    return dialog;
}
