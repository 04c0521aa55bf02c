#pragma once
// The value rows of an over-range parameter. An ordinary row shows and sets its channel at the
// current time; these show and set it at the keypoint selected in the row's mini editor:
//
//   TQChanDoubleOverRangeScrubberController  the value of one channel, number and slider
//   TQChanAngleOverRangeScrubberController   the value of an angle, number and dial
//   TQChan2DPropOverRangeScrubberController  both components of a pair, in proportion
//   TQChanRangeScrubberController            the selected keypoint's position, 0 to 100 %
//
// The rows are disabled while no keypoint is selected. They have neither animation indicator
// nor parameter menu. The mini editor is not owned; it lives as long as the group that holds
// the rows.

#include "platform/inspector/TQChanNumberControllers.h"
#include "src/mini/TQMiniCurveEditor.h"

// The part the four share: the editor, the time it gives, and the context without indicator
// and menu.
class TQOverRangeRow {
public:
    explicit TQOverRangeRow(TQMiniCurveEditor* editor) : _pMiniCurveEditor(editor) {}
    TQMiniCurveEditor* miniCurveEditor() const { return _pMiniCurveEditor; }
    static JNBuildContext rowContext(const JNBuildContext& context);

protected:
    CMTime selectedPosition() const {
        return _pMiniCurveEditor ? _pMiniCurveEditor->currentTime() : kCMTimeZero;
    }
    bool editorHasSelection() const {
        return _pMiniCurveEditor && _pMiniCurveEditor->hasSelection();
    }
    // Posted to the editor's host delegate before a row moves the selection.
    void postChanging() const;

    TQMiniCurveEditor* _pMiniCurveEditor = nullptr;  // not owned
};

class TQChanDoubleOverRangeScrubberController : public TQChanDoubleController,
                                                public TQOverRangeRow {
public:
    TQChanDoubleOverRangeScrubberController(TQChannelBase* channel, TQMiniCurveEditor* editor,
                                            const JNBuildContext& context);
    CMTime currentTime() const override { return selectedPosition(); }
    bool isEnabled() const override;
    void startScrubberAction(RWActionSender& sender) override;
    void update() override;
    void setChannelValue(RWActionSender& sender) override;
};

class TQChanRangeScrubberController : public TQChanDoubleController, public TQOverRangeRow {
public:
    TQChanRangeScrubberController(TQChannelBase* channel, TQMiniCurveEditor* editor,
                                  const JNBuildContext& context);
    CMTime currentTime() const override { return selectedPosition(); }
    bool isEnabled() const override;
    void update() override;
    void setChannelValue(RWActionSender& sender) override;
    // The keypoints get sorted and purged when a drag ends, not during it.
    void endScrubberAction(RWActionSender& sender) override;
    void endSliderAction(RWActionSender& sender) override;

protected:
    // A position moves every component of a compound together: the compound is announced.
    void aboutToChangeChannel() override;
};

class TQChanAngleOverRangeScrubberController : public TQChanAngleController, public TQOverRangeRow {
public:
    TQChanAngleOverRangeScrubberController(TQChannelBase* channel, TQMiniCurveEditor* editor,
                                           const JNBuildContext& context);
    CMTime currentTime() const override { return selectedPosition(); }
    bool isEnabled() const override { return editorHasSelection(); }
    void update() override;
    void setChannelValue(RWActionSender& sender) override;
};

class TQChan2DPropOverRangeScrubberController : public TQChan2DPropController,
                                                public TQOverRangeRow {
public:
    TQChan2DPropOverRangeScrubberController(TQChannelBase* channel, TQMiniCurveEditor* editor,
                                            const JNBuildContext& context);
    CMTime currentTime() const override { return selectedPosition(); }
    bool isEnabled() const override;
    // The ratio of the smaller component to the larger at the selected position.
    void calcRatio();
    void startScrubberAction(RWActionSender& sender) override;
    void update() override;
    void setChannelValue(RWActionSender& sender) override;
};
