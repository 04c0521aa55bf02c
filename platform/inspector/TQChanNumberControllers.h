#pragma once
// The number rows of an inspector: a channel's value as a number field with a slider
// (TQChanDoubleController), with a dial for an angle (TQChanAngleController), and one number
// for both components of a pair, kept in proportion (TQChan2DPropController).
//
// A row shows its channel at its current time, in display units (value times the channel's
// displayScale), and a set value becomes a keyframe there. Every edit is one undo step through
// the delegate: a drag opens it at startScrubberAction and closes it at endScrubberAction or
// endSliderAction; a typed number is a step of its own (userEnterNumber).
//
// Controls: `_pTF` (the number field) and `_pSlider` or `_pDial`. Their actions come back to
// the row ("setChannelValue:"); the toolkit adapter also reports a slider's press and release.

#include <memory>
#include <utility>
#include <vector>

#include "platform/inspector/TQInspNumberFormatter.h"
#include "platform/inspector/TQViewController.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWValueControls.h"

class TQChannel;

// How a gesture on a number started: typed in the field, or a drag of the field or the slider.
enum class TQNumberAction { Drag = 1, Typed = 2 };

class TQChanNumberController : public TQViewController, public RWActionTarget {
public:
    TQChanNumberController(TQChannelBase* channel, const JNBuildContext& context);

    RWTextField& textField() { return *_pTF; }
    const std::shared_ptr<RWTextField>& textFieldModel() const { return _pTF; }
    // The action's sender: the field, the slider or the dial.
    virtual void setChannelValue(RWActionSender& sender) = 0;
    virtual void startScrubberAction(RWActionSender& sender);
    virtual void endScrubberAction(RWActionSender& sender);
    virtual void endSliderAction(RWActionSender& sender);
    // The user typed a number: one undo step.
    void userEnterNumber(const std::string& text);
    bool performAction(const std::string& action, RWActionSender& sender) override;

    // Whether every associated channel shows the same value now.
    bool areAllChannelsEqual() const;
    // Added to what the field shows (a typed value has it taken off again).
    virtual double valueBias() const { return 0.0; }
    TQNumberAction actionType() const { return _actionType; }
    void setActionType(TQNumberAction type) { _actionType = type; }
    bool isOffsetting() const { return _isOffsetting; }

protected:
    // The channel as a TQChannel, or null.
    TQChannel* channel() const;
    // The sender's number (field, slider or dial).
    static double senderValue(RWActionSender& sender);
    // What a user reads is the value times this.
    static double displayScaleOf(const TQChannel& channel);
    // Within the channel's limits: numbers out of range are clamped, never refused.
    static double clampToCurve(const TQChannel& channel, double x);
    // To `digits` decimals (what a narrow slider can place).
    static double snapToDigits(double x, int digits);
    // Sliders narrower than this snap to the row's decimals.
    static constexpr double kSnappingSliderWidth = 200.0;
    bool isField(const RWActionSender& sender) const { return &sender == _pTF.get(); }
    // Refused while the inspector is rebuilding and a number was typed.
    bool entryCheckFails(const RWActionSender& sender) const;

    std::shared_ptr<RWTextField> _pTF;
    std::unique_ptr<TQInspNumberFormatter> _formatter;
    bool _isOffsetting = false;
    TQNumberAction _actionType = TQNumberAction::Drag;
};

class TQChanDoubleController : public TQChanNumberController {
public:
    TQChanDoubleController(TQChannelBase* channel, const JNBuildContext& context);

    RWSlider* slider() const { return _pSlider.get(); }
    const std::shared_ptr<RWSlider>& sliderModel() const { return _pSlider; }
    void update() override;
    void updateEnableState() override;
    void setChannelValue(RWActionSender& sender) override;
    void startScrubberAction(RWActionSender& sender) override;
    void endScrubberAction(RWActionSender& sender) override;
    void endSliderAction(RWActionSender& sender) override;
    int decimalDigits() const { return _decimalDigits; }
    void setSubrange(double min, double max);
    const std::string& suffix() const { return _pSuffixTF; }

protected:
    // A slider narrower than 200 points snaps to the row's decimals.
    double snapForSlider(const RWActionSender& sender, double x) const;
    // The field's formatter range and the slider's, from the channel's info.
    void updateScrubberRange(const TQChannel& channel, double scale);
    void showOnControls(double shown, const RWActionSender& sender);
    void setSliderTickMarkCount();

    std::shared_ptr<RWSlider> _pSlider;
    std::vector<double> _pMouseDownValues;
    int _decimalDigits = 2;
    bool _isIntegerController = false;
    bool _isSubrangeSet = false;
    double _subrangeMin = 0.0;
    double _subrangeMax = 0.0;
    bool _isSuppressingDisabledUpdates = false;
    int _sliderNaturalTickCount = 0;
    std::string _pSuffixTF;
};

class TQChanAngleController : public TQChanNumberController {
public:
    TQChanAngleController(TQChannelBase* channel, const JNBuildContext& context);

    RWSlider* dial() const { return _pDial.get(); }
    const std::shared_ptr<RWSlider>& dialModel() const { return _pDial; }
    // An angle in degrees put into 0 .. 360.
    static double renormalize(double degrees);
    void update() override;
    void updateEnableState() override;
    void setChannelValue(RWActionSender& sender) override;
    void startScrubberAction(RWActionSender& sender) override;

protected:
    std::shared_ptr<RWSlider> _pDial;
    std::vector<double> _pMouseDownValues;
};

class TQChan2DPropController : public TQChanNumberController {
public:
    TQChan2DPropController(TQChannelBase* channel, const JNBuildContext& context);

    RWSlider* slider() const { return _pSlider.get(); }
    const std::shared_ptr<RWSlider>& sliderModel() const { return _pSlider; }
    // The pair the row edits (the associated channel as a compound of two), or null.
    TQChannelBase* compoundChan() const { return associatedChannel(); }
    void update() override;
    void updateEnableState() override;
    void setChannelValue(RWActionSender& sender) override;
    void startScrubberAction(RWActionSender& sender) override;
    void endScrubberAction(RWActionSender& sender) override;
    void endSliderAction(RWActionSender& sender) override;
    double ratio() const { return _ratio; }
    bool isXMax() const { return _isXMax; }
    // The field shows components that differ as mixed.
    bool isMixed() const { return _isMixed; }

protected:
    // The first and second component of a pair.
    static std::pair<TQChannel*, TQChannel*> components(TQChannelBase* pair);
    double snapForSlider(const RWActionSender& sender, double x) const;

    std::shared_ptr<RWSlider> _pSlider;
    std::unique_ptr<TQInspNumberFormatter> _pEqualFormatter;
    int _decimalDigits = 2;
    std::vector<std::pair<double, double>> _pMouseDownValues;
    double _ratio = 1.0;
    bool _isXMax = true;
    bool _isSliding = false;
    bool _isMultiplying = false;
    bool _isMixed = false;
};
