#pragma once
// The inspector row of a closed over-range parameter: the curve strip in a bordered box and a
// reset button. The strip samples the row's channel; the row's mini editor (set by the group
// that holds both) answers for the host's delegate, through which the reset is one undo step.

#include <memory>

#include "platform/inspector/TQViewController.h"
#include "platform/ui/RWButton.h"
#include "src/mini/TQMiniCurveEditorStripView.h"

class TQMiniCurveEditorStripController : public TQViewController,
                                         public TQMiniCurveEditorStripSource,
                                         public RWActionTarget {
public:
    TQMiniCurveEditorStripController(TQChannelBase* channel, const JNBuildContext& context);
    ~TQMiniCurveEditorStripController() override;

    void setMiniCurveEditor(TQMiniCurveEditor* editor) { _pMiniCurveEditor = editor; }
    TQMiniCurveEditor* getMiniCurveEditor() const override { return _pMiniCurveEditor; }
    TQChannelBase* associatedChannel() const override {
        return TQViewController::associatedChannel();
    }

    // The border (and the strip in it) shows while the parameter is closed.
    void didTwiddle(bool closed) override;
    bool isBorderHidden() const { return _borderHidden; }
    void update() override;
    void updateEnableState() override { _pResetButton->setEnabled(isEnabled()); }
    // Every channel of the row back to its default, as one undo step. Nothing without a
    // mini editor's delegate.
    void resetChannel();
    bool performAction(const std::string& action, RWActionSender& sender) override;

    TQMiniCurveEditorStripView& stripView() { return *_pMiniCurveEditorImage; }
    RWButton& resetButton() { return *_pResetButton; }
    const std::shared_ptr<RWButton>& resetButtonModel() const { return _pResetButton; }
    const CGRect& borderFrame() const { return _borderFrame; }

private:
    std::unique_ptr<TQMiniCurveEditorStripView> _pMiniCurveEditorImage;
    CGRect _borderFrame = CGRectZero;
    bool _borderHidden = false;
    std::shared_ptr<RWButton> _pResetButton;
    TQMiniCurveEditor* _pMiniCurveEditor = nullptr;  // not owned
};
