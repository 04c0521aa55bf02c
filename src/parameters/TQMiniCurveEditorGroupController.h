#pragma once
// An over-range parameter as inspector rows. In an inspector: a heading with the label and the
// curve strip; opened, the mini editor with a value row (Y) and a position row (X) for the
// keypoint selected in it. In a heads-up panel: the mini editor and the two rows, no heading.
//
// The class of the group decides the value row: Double and Percent a number with a slider,
// Angle a number with a dial, Scale and 2D a proportional row over both components with the
// two components' own rows in a closed group below it. The host picks the class by its
// channel-to-controller mapping.
//
// The group owns its rows and the mini editor (through the editor's row). The channel is the
// host's; the context's delegate must outlive the group.

#include <memory>

#include "platform/inspector/TQInspectorRows.h"
#include "src/mini/TQMiniCurveEditorInspector.h"
#include "src/mini/TQMiniCurveEditorStripController.h"

// The row that holds the mini editor.
class TQChanMiniCurveEditorController : public TQViewControllerGroup {
public:
    TQChanMiniCurveEditorController(
        TQChannelBase* channel, TQCurveEditorAppDelegate* host, const JNBuildContext& context,
        uint32_t controlFlags = TQMiniCurveEditorInspector::kAllControlFlags);
    TQMiniCurveEditorInspector* getMiniCurveEditor() const { return _pMiniCurveEditor.get(); }

    void setTotalRange(const CMTime* start, const CMTime* duration);
    void setDisplayRange(const CMTime* start, const CMTime* duration);
    bool addOrResetAssociatedChannel(TQChannelBase* channel, bool isAdd, bool force) override;
    void updateEnableState() override;
    void resizeColumnsLabelWidth(float labelWidth, float paramWidth) override;
    // 0x20 updates; 0x4 or 0x8 update the editor when the channel (or a child of a folder)
    // was modified.
    void notify(uint32_t word) override;
    void update() override;
    bool needsRefresh() const;

private:
    std::unique_ptr<TQMiniCurveEditorInspector> _pMiniCurveEditor;
};

// A group whose collapsed state is its own, not its channel's.
class TQViewControllerOverRangeGroup : public TQViewControllerGroup {
public:
    using TQViewControllerGroup::TQViewControllerGroup;
    bool isCollapsed() const override { return _myIsCollapsed; }
    void setIsCollapsed(bool collapsed) override { _myIsCollapsed = collapsed; }

private:
    bool _myIsCollapsed = false;
};

class TQMiniCurveEditorGroupController : public TQViewControllerGroup {
public:
    TQMiniCurveEditorGroupController(TQChannelBase* channel, TQCurveEditorAppDelegate* host,
                                     const JNBuildContext& context);
    // Two-phase: builds the rows (through the overridable create...Controller).
    void init();

    // The value row: none here; subclasses add theirs to the group and answer it.
    virtual TQViewController* createYController(TQViewControllerGroup& group,
                                                TQChannelBase* channel, TQMiniCurveEditor* editor,
                                                const JNBuildContext& context);
    // The position row, labelled with the channel's X axis name.
    virtual TQViewController* createXController(TQViewControllerGroup& group,
                                                TQChannelBase* channel, TQMiniCurveEditor* editor,
                                                const JNBuildContext& context);

    void setTotalRange(const CMTime* start, const CMTime* duration);
    void setDisplayRange(const CMTime* start, const CMTime* duration);
    void notify(uint32_t word) override;
    // Heading, editor, value row, position row, in this order (absent ones skipped).
    void update() override;
    // The user opened or closed the parameter.
    void twiddle(bool open);

    TQLabeledParamController* headingController() const { return _pHeadingController; }
    TQChanMiniCurveEditorController* editorController() const { return _pEditorController; }
    TQMiniCurveEditorStripController* stripController() const { return _pEditorStripController; }
    TQViewControllerGroup* editorGroup() const { return _pEditorGroup; }
    TQViewController* yController() const { return _pYController; }
    TQViewController* xController() const { return _pXController; }

private:
    TQCurveEditorAppDelegate* _host = nullptr;  // not owned
    // All owned through the group's rows.
    TQLabeledParamController* _pHeadingController = nullptr;
    TQChanMiniCurveEditorController* _pEditorController = nullptr;
    TQMiniCurveEditorStripController* _pEditorStripController = nullptr;
    TQViewControllerGroup* _pEditorGroup = nullptr;
    TQViewController* _pYController = nullptr;
    TQViewController* _pXController = nullptr;
};

class TQChannelDoubleOverRangeController : public TQMiniCurveEditorGroupController {
public:
    using TQMiniCurveEditorGroupController::TQMiniCurveEditorGroupController;
    TQViewController* createYController(TQViewControllerGroup& group, TQChannelBase* channel,
                                        TQMiniCurveEditor* editor,
                                        const JNBuildContext& context) override;
};

// The same rows as Double.
class TQChannelPercentOverRangeController : public TQChannelDoubleOverRangeController {
public:
    using TQChannelDoubleOverRangeController::TQChannelDoubleOverRangeController;
};

class TQChannelAngleOverRangeController : public TQMiniCurveEditorGroupController {
public:
    using TQMiniCurveEditorGroupController::TQMiniCurveEditorGroupController;
    TQViewController* createYController(TQViewControllerGroup& group, TQChannelBase* channel,
                                        TQMiniCurveEditor* editor,
                                        const JNBuildContext& context) override;
};

// Scale and 2D: the proportional row, with the components' rows closed below it. Another class
// of channel gets no value row.
class TQChannelScaleOverRangeController : public TQMiniCurveEditorGroupController {
public:
    using TQMiniCurveEditorGroupController::TQMiniCurveEditorGroupController;
    TQViewController* createYController(TQViewControllerGroup& group, TQChannelBase* channel,
                                        TQMiniCurveEditor* editor,
                                        const JNBuildContext& context) override;
};

class TQChannel2DOverRangeController : public TQMiniCurveEditorGroupController {
public:
    using TQMiniCurveEditorGroupController::TQMiniCurveEditorGroupController;
    TQViewController* createYController(TQViewControllerGroup& group, TQChannelBase* channel,
                                        TQMiniCurveEditor* editor,
                                        const JNBuildContext& context) override;
};

// Makes a group of the class for the channel, built.
template <class Group>
std::unique_ptr<Group> TQMakeOverRangeGroup(TQChannelBase* channel, TQCurveEditorAppDelegate* host,
                                            const JNBuildContext& context) {
    auto group = std::make_unique<Group>(channel, host, context);
    group->init();
    return group;
}
