#include "src/editor/TQCurveEditorPanels.h"

#include <memory>
#include <string>

#include "platform/ui/RWButton.h"
#include "platform/ui/RWNumberFormatter.h"
#include "platform/ui/RWTextField.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/resources/TQStrings.h"

namespace {

// Points of the content, origin at the bottom left: rows of a label, a slider and a scrubber
// over a row of two buttons at the right.
constexpr double kWidth = 360.0;
constexpr double kMargin = 12.0;
constexpr double kRowHeight = 24.0;
constexpr double kRowGap = 8.0;
constexpr double kLabelWidth = 84.0;
constexpr double kScrubberWidth = 56.0;
constexpr double kButtonWidth = 88.0;
constexpr double kGap = 6.0;
// Marks at every whole value of the sliders' ranges (0 to 10, 1 to 10).
constexpr int64_t kParameterTicks = 11;
constexpr int64_t kCycleTicks = 10;

// Whole numbers, as the parameters are read.
const RWFormatter* wholeNumberFormatter() {
    static const RWNumberFormatter formatter = [] {
        RWNumberFormatter f;
        f.setFormat("0");
        return f;
    }();
    return &formatter;
}

std::shared_ptr<RWPanel> panelOfHeight(const char* titleKey, double height) {
    auto panel = std::make_shared<RWPanel>();
    panel->setTitle(TQLocalizedString(titleKey));
    panel->setContentView(std::make_shared<RWView>(CGRectMake(0.0, 0.0, kWidth, height)));
    // Titled and closable, not resizable: the size is the layout's.
    constexpr uint64_t kTitledClosable = 3;
    panel->setStyleMask(kTitledClosable);
    return panel;
}

double heightFor(int rows) {
    return kMargin + kRowHeight + kMargin + rows * (kRowHeight + kRowGap);
}

// The bottom of a parameter row, counted from the buttons' row.
double rowBottom(int row) { return kMargin + (row + 1) * (kRowHeight + kRowGap) + kGap; }

struct ParameterRow {
    std::shared_ptr<RWSlider> slider;
    std::shared_ptr<RWScrubber> scrubber;
};

// A label, a slider with a mark at each whole value and a scrubber of whole numbers, at a row.
ParameterRow addParameterRow(RWView& content, int row, const char* labelKey,
                             const char* sliderAction, const char* scrubberAction, int64_t ticks,
                             RWActionTarget* owner) {
    const double y = rowBottom(row);
    auto label = std::make_shared<RWTextField>();
    label->setEditable(false);
    label->setStringValue(TQLocalizedString(labelKey));
    label->setFrame(CGRectMake(kMargin, y, kLabelWidth, kRowHeight));
    content.addSubview(label);

    const double sliderX = kMargin + kLabelWidth + kGap;
    const double scrubberX = kWidth - kMargin - kScrubberWidth;
    ParameterRow out{std::make_shared<RWSlider>(), std::make_shared<RWScrubber>()};
    out.slider->setNumberOfTickMarks(ticks);
    out.slider->setAllowsTickMarkValuesOnly(true);
    out.slider->setTarget(owner);
    out.slider->setAction(sliderAction);
    out.slider->setFrame(CGRectMake(sliderX, y, scrubberX - kGap - sliderX, kRowHeight));
    content.addSubview(out.slider);

    out.scrubber->setFormatter(wholeNumberFormatter());
    out.scrubber->setFineIncrement(1.0);
    out.scrubber->setNormalIncrement(1.0);
    out.scrubber->setCoarseIncrement(5.0);
    out.scrubber->setTarget(owner);
    out.scrubber->setAction(scrubberAction);
    out.scrubber->setFrame(CGRectMake(scrubberX, y, kScrubberWidth, kRowHeight));
    content.addSubview(out.scrubber);
    return out;
}

// Cancel and OK at the bottom right.
void addButtons(RWView& content, const char* cancelKey, const char* cancelAction, const char* okKey,
                const char* okAction, RWActionTarget* owner) {
    auto button = [&](const char* key, const char* action, const char* equivalent, double x) {
        auto b = std::make_shared<RWButton>();
        b->setTitle(TQLocalizedString(key));
        b->setButtonType(RWButton::kPushButton);
        b->setTarget(owner);
        b->setAction(action);
        b->setKeyEquivalent(equivalent);
        b->setFrame(CGRectMake(x, kMargin, kButtonWidth, kRowHeight));
        content.addSubview(b);
    };
    const double okX = kWidth - kMargin - kButtonWidth;
    button(cancelKey, cancelAction, RWButton::kEscapeKey, okX - kGap - kButtonWidth);
    button(okKey, okAction, RWButton::kReturnKey, okX);
}

}  // namespace

void TQInstantiateSimplifyPanel(TQCurveEditorOutlets& outlets, RWActionTarget* owner) {
    std::shared_ptr<RWPanel> panel = panelOfHeight("Simplify Panel Title", heightFor(2));
    RWView& content = *panel->contentView();
    const ParameterRow tolerance = addParameterRow(
        content, 1, "Simplify Panel Tolerance",
        "setToleranceWithSlider:", "setToleranceWithScrubber:", kParameterTicks, owner);
    const ParameterRow smoothness = addParameterRow(
        content, 0, "Simplify Panel Smoothness",
        "setSmoothnessWithSlider:", "setSmoothnessWithScrubber:", kParameterTicks, owner);
    addButtons(content, "Simplify Panel Cancel", "reduceCancel:", "Simplify Panel OK",
               "reduceOk:", owner);
    outlets.reducePanel = std::move(panel);
    outlets.toleranceSlider = tolerance.slider;
    outlets.tolerance = tolerance.scrubber;
    outlets.smoothnessSlider = smoothness.slider;
    outlets.smoothness = smoothness.scrubber;
}

void TQInstantiateGeneratePanel(TQCurveEditorOutlets& outlets, RWActionTarget* owner) {
    std::shared_ptr<RWPanel> panel = panelOfHeight("Generate Panel Title", heightFor(1));
    RWView& content = *panel->contentView();
    const ParameterRow cycles = addParameterRow(
        content, 0, "Generate Panel Cycles",
        "setNumberOfCylesWithSlider:", "setNumberOfCylesWithScrubber:", kCycleTicks, owner);
    addButtons(content, "Generate Panel Cancel", "generateCancel:", "Generate Panel OK",
               "generateOk:", owner);
    // It floats beside the editor while the user goes on working.
    panel->setFloatingPanel(true);
    outlets.generatePanel = std::move(panel);
    outlets.numberOfCyclesSlider = cycles.slider;
    outlets.numberOfCycles = cycles.scrubber;
}
