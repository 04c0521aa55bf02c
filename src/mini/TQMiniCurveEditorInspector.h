#pragma once
// The mini editor of a parameter inspector: the curve view with a tool switch (edit, sketch,
// box), an auto fit switch and two zoom scrollers. Auto fit starts on, the scrollers hidden;
// turning it off shrinks the view to make room for them and shows them.
//
// Vertical scroller: page clicks pan by the maximum view volume's slack, arrows by a fifth of
// it, the knob sets zoom and position. Horizontal scroller: pans and zooms the view volume
// within the original one (the range 0 to 1 with its margin).

#include <cstdint>
#include <memory>

#include "platform/ui/RWButton.h"
#include "platform/ui/RWSegmentedControl.h"
#include "platform/ui/RWZoomScroller.h"
#include "src/mini/TQMiniCurveEditor.h"

class TQMiniCurveEditorInspector : public TQMiniCurveEditor {
public:
    // Bit 0: the tool switch is live.
    static constexpr uint32_t kModesLive = 0x1;
    static constexpr uint32_t kAllControlFlags = 0xFFFFFFFFu;

    explicit TQMiniCurveEditorInspector(TQCurveEditorAppDelegate* hostDelegate = nullptr,
                                        uint32_t controlFlags = kAllControlFlags);

    void update() override;
    void setEnabled(bool enabled) override;
    void windowWasPanned(double delta) override;
    void windowWasZoomed() override { update(); }

    // Actions of the controls.
    void setMode(RWActionSender& sender);
    void autoFit(RWActionSender& sender);
    void verticalScroller(RWActionSender& sender);
    void horizontalZoomScroller(RWActionSender& sender);
    bool performAction(const std::string& action, RWActionSender& sender) override;

    // The scrollers from the view volume.
    void updateVerticalZoomScroller();
    void updateHorizontalZoomScroller();

    // The models, shared with the widgets that show them.
    const std::shared_ptr<RWSegmentedControl>& modesModel() const { return _modes; }
    const std::shared_ptr<RWButton>& autoFitModel() const { return _autoFit; }
    const std::shared_ptr<RWZoomScroller>& verticalScrollerModel() const {
        return _verticalScroller;
    }
    const std::shared_ptr<RWZoomScroller>& horizontalScrollerModel() const {
        return _horizontalZoomScroller;
    }
    RWSegmentedControl& modes() { return *_modes; }
    RWButton& autoFitButton() { return *_autoFit; }
    RWZoomScroller& verticalZoomScroller() { return *_verticalScroller; }
    RWZoomScroller& horizontalZoomScrollerControl() { return *_horizontalZoomScroller; }
    uint32_t controlFlags() const { return _controlFlags; }

private:
    std::shared_ptr<RWSegmentedControl> _modes;
    std::shared_ptr<RWButton> _autoFit;
    std::shared_ptr<RWZoomScroller> _verticalScroller;
    std::shared_ptr<RWZoomScroller> _horizontalZoomScroller;
    double _oldKnobProportionY = 0.5;
    float _oldKnobValueY = 0.5f;
    uint32_t _controlFlags = kAllControlFlags;
};
