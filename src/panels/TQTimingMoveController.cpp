#include "src/panels/TQTimingMoveController.h"

#include <cmath>
#include <cstdio>

#include "platform/ui/RWDecimalFormatter.h"
#include "platform/ui/RWServices.h"
#include "src/panels/TQNumberPanelViews.h"

namespace {

// What the panel's field reads while it runs.
const RWDecimalFormatter& numberFormatter() {
    static const RWDecimalFormatter formatter;
    return formatter;
}

// The whole number nearest to a, halves up.
double roundedPoints(double a) { return std::floor(a + 0.5 + 0.0000001); }

// One controller per entry point, made on first use, for the life of the process.
template <class Controller, int Entry>
Controller& controllerOfEntry() {
    static const std::unique_ptr<Controller> controller = [] {
        auto made = std::make_unique<Controller>();
        made->init();
        return made;
    }();
    return *controller;
}

// The panel of one entry point, opened.
template <class Controller, int Entry>
bool openEntry(const RWEvent* event, const CGRect& parentRect, double* value, bool* isDelta) {
    return controllerOfEntry<Controller, Entry>().openWithEventParentRectValueIsDelta(
        event, parentRect, value, isDelta);
}

// A point as the rectangle a panel hangs from, with no width to centre on.
CGRect pointRect(const CGPoint& p) { return CGRectMake(p.x, p.y, 0.0, 0.0); }

}  // namespace

TQTimingMoveController::~TQTimingMoveController() {
    if (_pPanel && _pPanel->delegate() == this) _pPanel->setDelegate(nullptr);
    if (_pValueField && _pValueField->target() == this) _pValueField->setTarget(nullptr);
}

void TQTimingMoveController::buildUI() {
    if (!_pView) {
        if (std::optional<TQNumberPanelOutlets> outlets =
                TQInstantiateNumberPanelView(interfaceName(), this)) {
            _pView = outlets->view;
            _pValueField = outlets->valueField;
        } else {
            std::fprintf(stderr, "%s\n", interfaceFailureMessage());
        }
    }
    if (!_pPanel) {
        _pPanel = makePanel();
        if (_pView) _pPanel->setFrame(_pView->frame());
        _pPanel->setStyleMask(0);
        _pPanel->setContentView(_pView);
        _pPanel->setFloatingPanel(true);
        _pPanel->setLevel(3);
        _pPanel->makeFirstResponder(_pValueField);
        _pPanel->makeKeyWindow();
        _pPanel->setDelegate(this);
    }
    if (_pValueField) {
        _pValueField->setTarget(this);
        _pValueField->setAction("valueFieldChanged:");
    }
}

bool TQTimingMoveController::openWithEventParentRectValueIsDelta(const RWEvent* event,
                                                                 const CGRect& parentRect,
                                                                 double* value, bool* isDelta) {
    (void)isDelta;  // the caller's, passed along
    // A missing interface leaves a panel without content: nothing can be typed into it.
    if (!_pPanel || !_pValueField || _running) return false;

    // Centred on the rectangle when it has a width, hanging below its y.
    const CGSize size = _pPanel->frame().size;
    double x = parentRect.origin.x;
    if (parentRect.size.width > 0.0)
        x = x + roundedPoints(parentRect.size.width / 2.0) - roundedPoints(size.width / 2.0);
    _pPanel->setFrameOrigin(CGPointMake(x, parentRect.origin.y - size.height));

    _pPanel->makeKeyAndOrderFront();
    _pPanel->makeFirstResponder(_pValueField);
    _pPanel->makeKeyWindow();
    _pValueField->setFormatter(&numberFormatter());
    _pValueField->selectText();
    if (event && event->isKeyEvent()) {
        // The key that opened the panel lands in the field, in place of the number.
        _pValueField->insertText(event->characters());
    } else {
        _pValueField->setDoubleValue(value ? *value : 0.0);
    }

    _running = true;
    const RWModalResponse result = RWApplicationServices().modal->runModalForWindow(*_pPanel);
    _running = false;
    _pPanel->close();

    // OK is 1 and Cancel 0. A run that was stopped or aborted from elsewhere, or that could
    // not show the panel at all, is no answer either.
    const bool accepted = result > 0;
    if (accepted && value) *value = _pValueField->doubleValue();
    _pValueField->setFormatter(nullptr);
    return accepted;
}

void TQTimingMoveController::stopModalWithCode(int64_t code) const {
    if (_running) RWApplicationServices().modal->stopModalWithCode(code);
}

bool TQTimingMoveController::performAction(const std::string& action, RWActionSender&) {
    if (action == "okNotify:")
        stopModalWithCode(RWModalResponseOK);
    else if (action == "cancelNotify:")
        stopModalWithCode(RWModalResponseCancel);
    else if (action == "valueFieldChanged:")
        valueFieldChanged();
    else
        return false;
    return true;
}

void TQTimingMoveController::windowWillClose(RWWindow&) {
    // The close that follows every run finds no run of its own to end.
    stopModalWithCode(RWModalResponseCancel);
}

void TQTimingMoveController::valueFieldChanged() { stopModalWithCode(RWModalResponseOK); }

bool TQTimingMoveController::openWithEvent(const RWEvent* event, const CGRect& parentRect,
                                           double* timeValue, bool* timeIsDelta) {
    return openEntry<TQTimingMoveController, 0>(event, parentRect, timeValue, timeIsDelta);
}

bool TQTimingMoveController::openWithLocation(const CGPoint& location, double* value) {
    return openEntry<TQTimingMoveController, 1>(nullptr, pointRect(location), value, nullptr);
}

// ---- Value panel ---------------------------------------------------------------------------

bool TQCurveEditorValueController::openWithEvent(const RWEvent* event, const CGRect& parentRect,
                                                 double* timeValue, bool* timeIsDelta) {
    return openEntry<TQCurveEditorValueController, 0>(event, parentRect, timeValue, timeIsDelta);
}

bool TQCurveEditorValueController::openWithLocation(const CGPoint& location, double* value) {
    return openEntry<TQCurveEditorValueController, 1>(nullptr, pointRect(location), value, nullptr);
}

bool TQCurveEditorValueController::openWithLocationValueInWindow(const CGPoint& location,
                                                                 double* value,
                                                                 const RWWindow* window,
                                                                 const CGRect& rect) {
    TQCurveEditorValueController& controller = controllerOfEntry<TQCurveEditorValueController, 2>();
    const CGPoint inWindow = controller.getPanelLocation(location, rect);
    const CGRect local = CGRectMake(inWindow.x, inWindow.y, 1.0, 1.0);
    const CGRect onScreen = window ? window->convertRectToScreen(local) : local;
    return controller.openWithEventParentRectValueIsDelta(nullptr, pointRect(onScreen.origin),
                                                          value, nullptr);
}

CGPoint TQCurveEditorValueController::getPanelLocation(CGPoint p, const CGRect& r) const {
    const CGSize size = _pView ? _pView->frame().size : CGSizeZero;
    if (p.x < r.origin.x) p.x = r.origin.x;
    if (p.y - size.height < r.origin.y) p.y = r.origin.y + size.height;
    if (p.x + size.width > r.origin.x + r.size.width)
        p.x -= p.x + size.width - (r.origin.x + r.size.width);
    if (p.y > r.origin.y + r.size.height) p.y = r.origin.y + r.size.height;
    return p;
}

void TQCurveEditorValueController::valueFieldChanged() {
    if (!_pValueField) return;
    const bool isNumber =
        RWDecimalFormatter::numberFromString(_pValueField->stringValue()).has_value();
    stopModalWithCode(isNumber ? RWModalResponseOK : RWModalResponseCancel);
}
