#include "src/editor/TQCurveSetPanelViews.h"

#include "platform/ui/RWButton.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/resources/TQStrings.h"

namespace {

// Points of the contents.
constexpr double kMargin = 8.0;
constexpr double kRowHeight = 24.0;
constexpr double kGap = 6.0;
constexpr double kButtonWidth = 80.0;
constexpr double kManagerWidth = 380.0;
constexpr double kManagerTableHeight = 220.0;
constexpr double kPairWidth = 56.0;
constexpr double kNameColumnWidth = 210.0;
constexpr double kRelativeColumnWidth = 70.0;
constexpr double kShortcutColumnWidth = 60.0;
constexpr double kNewWidth = 280.0;
constexpr double kLabelWidth = 50.0;

std::shared_ptr<RWButton> button(const char* titleKey, const char* action, const char* key,
                                 RWActionTarget* owner, const CGRect& frame) {
    auto b = std::make_shared<RWButton>();
    b->setTitle(TQLocalizedString(titleKey));
    b->setButtonType(RWButton::kPushButton);
    b->setTarget(owner);
    b->setAction(action);
    b->setKeyEquivalent(key);
    b->setFrame(frame);
    return b;
}

RWTableColumnPtr column(const char* identifier, const char* titleKey, double width,
                        RWCellPtr cell) {
    auto c = std::make_shared<RWTableColumn>(identifier, width);
    c->setTitle(TQLocalizedString(titleKey));
    c->setEditable(true);
    c->setDataCell(std::move(cell));
    return c;
}

std::shared_ptr<RWPanel> panel(const char* titleKey, std::shared_ptr<RWView> content) {
    auto p = std::make_shared<RWPanel>();
    p->setTitle(TQLocalizedString(titleKey));
    p->setContentView(std::move(content));
    return p;
}

void instantiateManager(RWActionTarget* owner, TQCurveEditorOutlets& outlets) {
    const double height = kMargin + kRowHeight + kGap + kManagerTableHeight + kMargin;
    auto content = std::make_shared<RWView>(CGRectMake(0.0, 0.0, kManagerWidth, height));

    auto table = std::make_shared<TQCurveSetManagerList>();
    table->setFrame(CGRectMake(kMargin, kMargin + kRowHeight + kGap, kManagerWidth - 2 * kMargin,
                               kManagerTableHeight));
    auto textCell = [] {
        auto cell = std::make_shared<RWTextFieldCell>();
        cell->setEditable(true);
        return cell;
    };
    auto box = std::make_shared<RWButtonCell>();
    box->setButtonType(RWButtonCell::kSwitchButton);
    table->addTableColumn(column(TQCurveEditorCtrl::kNameColumn,
                                 "Curve Editor Curve Set Name Column", kNameColumnWidth,
                                 textCell()));
    table->addTableColumn(column(TQCurveEditorCtrl::kRelativeColumn,
                                 "Curve Editor Curve Set Relative Column", kRelativeColumnWidth,
                                 box));
    table->addTableColumn(column(TQCurveEditorCtrl::kShortcutColumn,
                                 "Curve Editor Curve Set Shortcut Column", kShortcutColumnWidth,
                                 textCell()));
    content->addSubview(table);

    auto pair = std::make_shared<RWSegmentedControl>();
    pair->setSegmentCount(2);
    pair->setTrackingMode(RWSegmentSwitchTracking::Momentary);
    pair->setTarget(owner);
    pair->setAction("plusMinusPressed:");
    pair->setFrame(CGRectMake(kMargin, kMargin, kPairWidth, kRowHeight));
    content->addSubview(pair);

    auto duplicate =
        button("Curve Editor Curve Set Duplicate", "curveSetManagerDuplicate:", "", owner,
               CGRectMake(kMargin + kPairWidth + kGap, kMargin, kButtonWidth + 10.0, kRowHeight));
    content->addSubview(duplicate);
    double x = kManagerWidth - kMargin - kButtonWidth;
    content->addSubview(button("Curve Editor Curve Set Done",
                               "curveSetManagerDone:", RWButton::kReturnKey, owner,
                               CGRectMake(x, kMargin, kButtonWidth, kRowHeight)));
    x -= kButtonWidth + kGap;
    auto apply = button("Curve Editor Curve Set Apply", "curveSetManagerApply:", "", owner,
                        CGRectMake(x, kMargin, kButtonWidth, kRowHeight));
    content->addSubview(apply);
    x -= kButtonWidth + kGap;
    content->addSubview(button("Curve Editor Curve Set Cancel",
                               "curveSetManagerCancel:", RWButton::kEscapeKey, owner,
                               CGRectMake(x, kMargin, kButtonWidth, kRowHeight)));

    outlets.curveSetManagerList = table.get();
    outlets.curveSetManagerApply = apply;
    outlets.plusMinusSegmentedControl = pair;
    outlets.curveSetManagerDuplicate = duplicate;
    outlets.curveSetManagerPanel = panel("Curve Editor Curve Set Manager Title", content);
    outlets.curveSetManagerPanel->makeFirstResponder(table);
}

void instantiateNewSet(RWActionTarget* owner, TQCurveEditorOutlets& outlets) {
    const double height = kMargin + kRowHeight + kGap + kRowHeight + kMargin;
    auto content = std::make_shared<RWView>(CGRectMake(0.0, 0.0, kNewWidth, height));
    const double fieldY = kMargin + kRowHeight + kGap;
    auto label = std::make_shared<RWTextField>();
    label->setStringValue(TQLocalizedString("Curve Editor Curve Set New Name"));
    label->setEditable(false);
    label->setFrame(CGRectMake(kMargin, fieldY, kLabelWidth, kRowHeight));
    content->addSubview(label);
    auto name = std::make_shared<RWTextField>();
    name->setEditable(true);
    name->setFrame(CGRectMake(kMargin + kLabelWidth + kGap, fieldY,
                              kNewWidth - 2 * kMargin - kLabelWidth - kGap, kRowHeight));
    content->addSubview(name);
    const double okX = kNewWidth - kMargin - kButtonWidth;
    auto cancel =
        button("Curve Editor Curve Set Cancel", "newCurveSetCancel:", RWButton::kEscapeKey, owner,
               CGRectMake(okX - kGap - kButtonWidth, kMargin, kButtonWidth, kRowHeight));
    auto ok = button("Curve Editor Curve Set OK", "newCurveSetOk:", RWButton::kReturnKey, owner,
                     CGRectMake(okX, kMargin, kButtonWidth, kRowHeight));
    content->addSubview(cancel);
    content->addSubview(ok);

    outlets.curveSetNewName = name;
    outlets.curveSetNewOk = ok;
    outlets.curveSetNewCancel = cancel;
    outlets.curveSetNewPanel = panel("Curve Editor Curve Set New Title", content);
}

}  // namespace

void TQInstantiateCurveSetPanels(RWActionTarget* owner, TQCurveEditorOutlets& outlets) {
    instantiateManager(owner, outlets);
    instantiateNewSet(owner, outlets);
}
