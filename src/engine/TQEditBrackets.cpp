#include "src/engine/TQEditBrackets.h"

#include "src/resources/TQStrings.h"

TQCaptureGuard::TQCaptureGuard(TQCurveEditorAppDelegate* delegate, const char* undoKey)
    : _delegate(delegate) {
    if (_delegate) _delegate->startCaptureModifiedChannels(TQLocalizedString(undoKey));
}

TQCaptureGuard::~TQCaptureGuard() {
    if (_delegate) _delegate->endCaptureModifiedChannels();
}

TQChannelEditGuard::TQChannelEditGuard(TQCurveEditorAppDelegate* delegate,
                                       const TQChannelBase* channel)
    : _delegate(delegate), _channel(channel) {
    if (!_delegate) return;
    _delegate->willChangeChannel(_channel);
    _delegate->willSetChannelValue(_channel);
}

TQChannelEditGuard::~TQChannelEditGuard() {
    if (!_delegate) return;
    _delegate->didSetChannelValue(_channel);
    _delegate->didChangeChannel(_channel);
}
