#include "src/panels/TQNumberPanelViews.h"

#include "platform/ui/RWButton.h"

namespace {

struct Layout {
    const char* name;
    const char* placeholder;  // what the number is, shown while the field is empty
};
constexpr Layout kLayouts[] = {
    {"TQTimingMoveView", "Frames"},
    {"TQCurveEditorValueView", "Value"},
};

// Points of the content: a margin around a field over a row of two buttons.
constexpr double kWidth = 200.0;
constexpr double kMargin = 8.0;
constexpr double kRowHeight = 24.0;
constexpr double kGap = 6.0;

std::shared_ptr<RWButton> button(const char* title, const char* action, const char* key,
                                 RWActionTarget* owner, const CGRect& frame) {
    auto b = std::make_shared<RWButton>();
    b->setTitle(title);
    b->setButtonType(RWButton::kPushButton);
    b->setTarget(owner);
    b->setAction(action);
    b->setKeyEquivalent(key);
    b->setFrame(frame);
    return b;
}

}  // namespace

std::optional<TQNumberPanelOutlets> TQInstantiateNumberPanelView(const std::string& name,
                                                                 RWActionTarget* owner) {
    const Layout* layout = nullptr;
    for (const Layout& l : kLayouts)
        if (name == l.name) layout = &l;
    if (!layout) return std::nullopt;

    const double height = kMargin + kRowHeight + kGap + kRowHeight + kMargin;
    auto view = std::make_shared<RWView>(CGRectMake(0.0, 0.0, kWidth, height));
    auto field = std::make_shared<RWTextField>();
    field->setEditable(true);
    field->setPlaceholderString(layout->placeholder);
    field->setFrame(
        CGRectMake(kMargin, kMargin + kRowHeight + kGap, kWidth - 2.0 * kMargin, kRowHeight));
    view->addSubview(field);
    const double buttonWidth = (kWidth - 2.0 * kMargin - kGap) / 2.0;
    view->addSubview(button("Cancel", "cancelNotify:", RWButton::kEscapeKey, owner,
                            CGRectMake(kMargin, kMargin, buttonWidth, kRowHeight)));
    view->addSubview(
        button("OK", "okNotify:", RWButton::kReturnKey, owner,
               CGRectMake(kMargin + buttonWidth + kGap, kMargin, buttonWidth, kRowHeight)));
    return TQNumberPanelOutlets{std::move(view), std::move(field)};
}
