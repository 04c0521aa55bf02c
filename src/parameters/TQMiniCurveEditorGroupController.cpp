#include "src/parameters/TQMiniCurveEditorGroupController.h"

#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelTypes.h"
#include "src/parameters/TQOverRangeScrubbers.h"

namespace {

// A label and a parameter in one row, added to the group; answers the row.
TQViewController* addLabeled(TQViewControllerGroup& group, std::unique_ptr<TQViewController> label,
                             std::unique_ptr<TQViewController> param,
                             const JNBuildContext& context) {
    return group.addController(
        std::make_unique<TQLabeledParamController>(std::move(label), std::move(param), context),
        true);
}

bool wasModified(TQCurveEditorAppDelegate* host, const TQChannelBase* channel) {
    return host && channel && host->wasChannelModified(channel);
}

}  // namespace

// ---- The editor's row ----------------------------------------------------------------------

TQChanMiniCurveEditorController::TQChanMiniCurveEditorController(TQChannelBase* channel,
                                                                 TQCurveEditorAppDelegate* host,
                                                                 const JNBuildContext& context,
                                                                 uint32_t controlFlags)
    : TQViewControllerGroup(channel, context),
      _pMiniCurveEditor(std::make_unique<TQMiniCurveEditorInspector>(host, controlFlags)) {
    setFrameSize(CGSizeMake(253.0, 191.0));
    encloseViewInBox();
    // A heads-up row keeps the inspector form, in a smaller frame.
    _pMiniCurveEditor->setChannel(channel);
    if (isHUD()) _pMiniCurveEditor->curveEditorView().setIsHUD(true);
    setMinWidth(150.0);
    update();
}

void TQChanMiniCurveEditorController::setTotalRange(const CMTime* start, const CMTime* duration) {
    _pMiniCurveEditor->setTotalRange(start, duration);
}

void TQChanMiniCurveEditorController::setDisplayRange(const CMTime* start, const CMTime* duration) {
    _pMiniCurveEditor->setDisplayRange(start, duration);
}

bool TQChanMiniCurveEditorController::addOrResetAssociatedChannel(TQChannelBase* channel,
                                                                  bool isAdd, bool force) {
    return TQViewControllerGroup::addOrResetAssociatedChannel(channel, isAdd, force || isAdd);
}

void TQChanMiniCurveEditorController::updateEnableState() {
    TQViewControllerGroup::updateEnableState();
    _pMiniCurveEditor->setEnabled(isEnabled());
}

void TQChanMiniCurveEditorController::resizeColumnsLabelWidth(float labelWidth, float paramWidth) {
    TQViewController::resizeColumnsLabelWidth(labelWidth, paramWidth);
    _pMiniCurveEditor->curveEditorView().setNeedsDisplay(1);
}

bool TQChanMiniCurveEditorController::needsRefresh() const {
    TQCurveEditorAppDelegate* host = _pMiniCurveEditor->appDelegate();
    TQChannelBase* channel = associatedChannel();
    if (wasModified(host, channel)) return true;
    const auto* folder = dynamic_cast<const TQChannelFolder*>(channel);
    if (!folder) return false;
    for (size_t i = 0; i < folder->numberOfChildren(); ++i)
        if (wasModified(host, folder->getChild(i))) return true;
    return false;
}

void TQChanMiniCurveEditorController::notify(uint32_t word) {
    if (word & kTQNotifySceneReset)
        update();
    else if ((word & (kTQNotifyChannelsChanging | kTQNotifyChannelsChanged)) && needsRefresh())
        _pMiniCurveEditor->update();
}

void TQChanMiniCurveEditorController::update() { _pMiniCurveEditor->update(); }

// ---- The group -----------------------------------------------------------------------------

TQMiniCurveEditorGroupController::TQMiniCurveEditorGroupController(TQChannelBase* channel,
                                                                   TQCurveEditorAppDelegate* host,
                                                                   const JNBuildContext& context)
    : TQViewControllerGroup(channel, context), _host(host) {}

void TQMiniCurveEditorGroupController::init() {
    TQChannelBase* channel = associatedChannel();
    const JNBuildContext& ctx = context();
    if (!ctx.isHUD()) {
        auto strip = std::make_unique<TQMiniCurveEditorStripController>(channel, ctx);
        _pEditorStripController = strip.get();
        auto heading = std::make_unique<TQLabeledParamController>(
            std::make_unique<TQFolderLabelController>(channel, ctx), std::move(strip), ctx);
        _pHeadingController =
            static_cast<TQLabeledParamController*>(addController(std::move(heading), true));
    }
    auto editorGroup = std::make_unique<TQViewControllerGroup>(channel, ctx);
    _pEditorController = static_cast<TQChanMiniCurveEditorController*>(editorGroup->addController(
        std::make_unique<TQChanMiniCurveEditorController>(channel, _host, ctx), true));
    editorGroup->indent();
    TQMiniCurveEditor* editor = _pEditorController->getMiniCurveEditor();
    _pYController = createYController(*editorGroup, channel, editor, ctx);
    _pXController = createXController(*editorGroup, channel, editor, ctx);
    _pEditorGroup =
        static_cast<TQViewControllerGroup*>(addController(std::move(editorGroup), true));
    if (_pEditorStripController) {
        _pEditorStripController->setMiniCurveEditor(editor);
        // The parameter starts closed, with the strip showing.
        _pEditorGroup->collapse();
        _pHeadingController->didTwiddle(true);
    }
    update();
}

TQViewController* TQMiniCurveEditorGroupController::createYController(TQViewControllerGroup&,
                                                                      TQChannelBase*,
                                                                      TQMiniCurveEditor*,
                                                                      const JNBuildContext&) {
    return nullptr;
}

TQViewController* TQMiniCurveEditorGroupController::createXController(
    TQViewControllerGroup& group, TQChannelBase* channel, TQMiniCurveEditor* editor,
    const JNBuildContext& context) {
    auto label = std::make_unique<TQChanLabelController>(channel, context);
    if (channel) label->setCustomLabelString(channel->getXAxisLabel());
    return addLabeled(group, std::move(label),
                      std::make_unique<TQChanRangeScrubberController>(channel, editor, context),
                      context);
}

void TQMiniCurveEditorGroupController::setTotalRange(const CMTime* start, const CMTime* duration) {
    if (_pEditorController) _pEditorController->setTotalRange(start, duration);
}

void TQMiniCurveEditorGroupController::setDisplayRange(const CMTime* start,
                                                       const CMTime* duration) {
    if (_pEditorController) _pEditorController->setDisplayRange(start, duration);
}

void TQMiniCurveEditorGroupController::notify(uint32_t word) {
    if (word & kTQNotifySceneReset) update();
    TQChannelBase* channel = associatedChannel();
    if (!(word & (kTQNotifyChannelsChanging | kTQNotifyChannelsChanged)) || !channel) return;
    TQCurveEditorAppDelegate* host =
        _pEditorController ? _pEditorController->getMiniCurveEditor()->appDelegate() : nullptr;
    if (wasModified(host, channel) || wasModified(host, channel->getParent())) update();
}

void TQMiniCurveEditorGroupController::update() {
    for (TQViewController* row :
         {static_cast<TQViewController*>(_pHeadingController),
          static_cast<TQViewController*>(_pEditorController), _pYController, _pXController})
        if (row) row->update();
}

void TQMiniCurveEditorGroupController::twiddle(bool open) {
    if (!_pEditorGroup) return;
    if (open)
        _pEditorGroup->expand();
    else
        _pEditorGroup->collapse();
    if (_pHeadingController) _pHeadingController->didTwiddle(!open);
}

// ---- Value rows by class -------------------------------------------------------------------

TQViewController* TQChannelDoubleOverRangeController::createYController(
    TQViewControllerGroup& group, TQChannelBase* channel, TQMiniCurveEditor* editor,
    const JNBuildContext& context) {
    return addLabeled(
        group, std::make_unique<TQChanLabelController>(channel, context),
        std::make_unique<TQChanDoubleOverRangeScrubberController>(channel, editor, context),
        context);
}

TQViewController* TQChannelAngleOverRangeController::createYController(
    TQViewControllerGroup& group, TQChannelBase* channel, TQMiniCurveEditor* editor,
    const JNBuildContext& context) {
    return addLabeled(
        group, std::make_unique<TQChanLabelController>(channel, context),
        std::make_unique<TQChanAngleOverRangeScrubberController>(channel, editor, context),
        context);
}

namespace {

// The proportional heading and the two components' rows in a closed group below it.
TQViewController* addPairRows(TQViewControllerGroup& group, TQChannelPair& pair,
                              TQMiniCurveEditor* editor, const JNBuildContext& context) {
    auto heading = std::make_unique<TQLabeledParamController>(
        std::make_unique<TQFolderLabelController>(&pair, context),
        std::make_unique<TQChan2DPropOverRangeScrubberController>(&pair, editor, context), context);
    auto components = std::make_unique<TQViewControllerOverRangeGroup>(&pair, context);
    components->setIsCollapsed(true);
    for (TQChannel* component : {pair.getXChannel(), pair.getYChannel()})
        if (component)
            addLabeled(*components, std::make_unique<TQChanLabelController>(component, context),
                       std::make_unique<TQChanDoubleOverRangeScrubberController>(component, editor,
                                                                                 context),
                       context);
    return group.addController(std::make_unique<TQFolderGroupController>(
                                   std::move(heading), std::move(components), context),
                               true);
}

}  // namespace

TQViewController* TQChannelScaleOverRangeController::createYController(
    TQViewControllerGroup& group, TQChannelBase* channel, TQMiniCurveEditor* editor,
    const JNBuildContext& context) {
    auto* pair = dynamic_cast<TQChannelScaleOverRange*>(channel);
    return pair ? addPairRows(group, *pair, editor, context) : nullptr;
}

TQViewController* TQChannel2DOverRangeController::createYController(TQViewControllerGroup& group,
                                                                    TQChannelBase* channel,
                                                                    TQMiniCurveEditor* editor,
                                                                    const JNBuildContext& context) {
    auto* pair = dynamic_cast<TQChannel2DOverRange*>(channel);
    return pair ? addPairRows(group, *pair, editor, context) : nullptr;
}
