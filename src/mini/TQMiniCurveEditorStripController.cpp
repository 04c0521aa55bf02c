#include "src/mini/TQMiniCurveEditorStripController.h"

#include "src/engine/TQEditBrackets.h"
#include "src/mini/TQMiniCurveEditor.h"

TQMiniCurveEditorStripController::TQMiniCurveEditorStripController(TQChannelBase* channel,
                                                                   const JNBuildContext& context)
    : TQViewController(channel, context),
      _pMiniCurveEditorImage(std::make_unique<TQMiniCurveEditorStripView>()),
      _borderFrame(CGRectMake(2.0, 4.0, 183.0, 22.0)),
      _pResetButton(std::make_shared<RWButton>()) {
    setFrameSize(CGSizeMake(224.0, 31.0));
    encloseViewInBox();
    setMinWidth(100.0);
    _pResetButton->setFrame(CGRectMake(197.0, 4.0, 17.0, 19.0));
    _pResetButton->setButtonType(0);
    _pResetButton->setAutoresizingMask(1);
    _pResetButton->setTarget(this);
    _pResetButton->setAction("resetChannel:");
    _pResetButton->setImageName("Shared_Inspector_Reset");
    _pMiniCurveEditorImage->setController(this);
    update();
}

TQMiniCurveEditorStripController::~TQMiniCurveEditorStripController() {
    _pMiniCurveEditorImage->setController(nullptr);
}

void TQMiniCurveEditorStripController::didTwiddle(bool closed) { _borderHidden = !closed; }

void TQMiniCurveEditorStripController::update() {
    if (associatedChannel()) _pMiniCurveEditorImage->update();
}

void TQMiniCurveEditorStripController::resetChannel() {
    TQCurveEditorAppDelegate* delegate =
        _pMiniCurveEditor ? _pMiniCurveEditor->appDelegate() : nullptr;
    if (!delegate) return;
    delegate->abort();
    TQCaptureGuard capture(delegate, "Undo Folder Reset");
    auto reset = [](TQChannelBase* channel) {
        if (!channel) return;
        // Announced, so that the host's undo keeps what the reset takes away.
        channel->noteWillChange(true);
        channel->reset(false);
    };
    reset(associatedChannel());
    for (TQChannelBase* other : associatedChannelList()) reset(other);
    delegate->postNotification(kTQNotifyFolderResetWord);
}

bool TQMiniCurveEditorStripController::performAction(const std::string& action, RWActionSender&) {
    if (action != "resetChannel:") return false;
    resetChannel();
    return true;
}
