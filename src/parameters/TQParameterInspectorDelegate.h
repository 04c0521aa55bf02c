#pragma once
// The inspector rows' delegate on top of the host contract: what a host that already answers
// for the curve editor hands its inspector. An edit of a row is one undo step of the host,
// "Undo Set Value", over the channels the row announced; the step closes with a post of
// kTQNotifyChannelsChanged, each step inside it posts kTQNotifyChannelsChanging.
//
// The host delegate is not owned and must outlive this object. An edit still open when this
// object goes is closed.

#include <vector>

#include "platform/inspector/JNBuildContext.h"
#include "src/contract/TQCurveEditorAppDelegate.h"

class TQParameterInspectorDelegate : public JNInspectorDelegate {
public:
    explicit TQParameterInspectorDelegate(TQCurveEditorAppDelegate* host) : _host(host) {}
    ~TQParameterInspectorDelegate() override;
    TQParameterInspectorDelegate(const TQParameterInspectorDelegate&) = delete;
    TQParameterInspectorDelegate& operator=(const TQParameterInspectorDelegate&) = delete;

    // Set by the host while it rebuilds its inspector.
    void setRebuilding(bool rebuilding) { _rebuilding = rebuilding; }
    bool isAnyInspectorRebuilding() override { return _rebuilding; }
    void abort() override;
    CMTime currentTimeForChannel(const TQChannelBase* channel) override;
    void beginChannelChange(TQViewController* controller, TQChannelBase* channel) override;
    void channelChanged(TQChannelBase* channel, CMTime time, uint32_t qualifiers) override;
    void endChannelChange(TQViewController* controller) override;
    bool isChanging() const { return _open != nullptr; }

private:
    TQCurveEditorAppDelegate* _host = nullptr;  // not owned
    TQViewController* _open = nullptr;          // the row whose edit is open
    std::vector<TQChannelBase*> _announced;     // in order of announcement
    bool _rebuilding = false;
};
