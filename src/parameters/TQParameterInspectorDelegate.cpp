#include "src/parameters/TQParameterInspectorDelegate.h"

#include <algorithm>

#include "src/resources/TQStrings.h"

TQParameterInspectorDelegate::~TQParameterInspectorDelegate() {
    if (_open) endChannelChange(_open);
}

void TQParameterInspectorDelegate::abort() {
    if (_host) _host->abort();
}

CMTime TQParameterInspectorDelegate::currentTimeForChannel(const TQChannelBase*) {
    return _host ? _host->currentTime() : kCMTimeZero;
}

void TQParameterInspectorDelegate::beginChannelChange(TQViewController* controller,
                                                      TQChannelBase* channel) {
    if (!_host || !channel) return;
    if (!_open) {
        _open = controller;
        _announced.clear();
        _host->startCaptureModifiedChannels(TQLocalizedString("Undo Set Value"));
    }
    if (std::find(_announced.begin(), _announced.end(), channel) != _announced.end()) return;
    _announced.push_back(channel);
    _host->willChangeChannel(channel);
}

void TQParameterInspectorDelegate::channelChanged(TQChannelBase*, CMTime, uint32_t) {
    if (_host) _host->postNotification(kTQNotifyChannelsChanging);
}

void TQParameterInspectorDelegate::endChannelChange(TQViewController* controller) {
    if (!_host || !_open || controller != _open) return;
    for (auto c = _announced.rbegin(); c != _announced.rend(); ++c) _host->didChangeChannel(*c);
    _announced.clear();
    _open = nullptr;
    _host->endCaptureModifiedChannels();
    _host->postNotification(kTQNotifyChannelsChanged);
}
