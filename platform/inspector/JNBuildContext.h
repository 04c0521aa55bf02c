#pragma once
// What an inspector's rows are built with: the form (an inspector panel or a heads-up panel),
// what the rows show beside their controls, the inspector's look, and the delegate through
// which every row reads time and reports its edits.
//
// JNInspectorDelegate is the host's side of the rows. An edit of a row is one undo step:
// beginChannelChange opens it (at the start of a drag, or before a typed value is set), each
// step sets the channel and reports channelChanged, and endChannelChange closes it. A begin
// while a step is open joins that step.

#include <cstdint>
#include <string>

#include "platform/media/CMTime.h"

class TQChannelBase;
class TQViewController;

class JNInspectorDelegate {
public:
    virtual ~JNInspectorDelegate() = default;
    // True while the host rebuilds its inspectors: rows then ignore their controls' actions.
    virtual bool isAnyInspectorRebuilding() = 0;
    // Stops playback and any other change under way before a row changes a channel.
    virtual void abort() = 0;
    // The time at which a row shows and sets its channel.
    virtual CMTime currentTimeForChannel(const TQChannelBase* channel) = 0;
    // A row is about to change the channel: the undo step opens (once per edit).
    virtual void beginChannelChange(TQViewController* controller, TQChannelBase* channel) = 0;
    // A row changed the channel at a time (one step of an edit).
    virtual void channelChanged(TQChannelBase* channel, CMTime time, uint32_t qualifiers) = 0;
    // The edit that began is over: the undo step closes.
    virtual void endChannelChange(TQViewController* controller) = 0;
    // A manipulator of the object in the viewer, if one is active; null otherwise.
    virtual void* getObjectManipulator() { return nullptr; }
};

class JNBuildContext {
public:
    // Not owned; must outlive every row built with this context.
    explicit JNBuildContext(JNInspectorDelegate* delegate = nullptr, bool isHUD = false)
        : _delegate(delegate), _isHUD(isHUD) {}

    JNInspectorDelegate* delegate() const { return _delegate; }
    bool isHUD() const { return _isHUD; }
    void setIsHUD(bool hud) { _isHUD = hud; }
    // An animation indicator (the key button) beside each row.
    bool shouldDisplayAnimIndicator() const { return _shouldDisplayAnimIndicator; }
    void setShouldDisplayAnimIndicator(bool show) { _shouldDisplayAnimIndicator = show; }
    // A parameter menu beside each row.
    bool shouldDisplayParameterMenu() const { return _shouldDisplayParameterMenu; }
    void setShouldDisplayParameterMenu(bool show) { _shouldDisplayParameterMenu = show; }

    // The look of an inspector's labels, by name.
    static const char* inspectorFont11Light() { return "inspectorFont11Light"; }
    static const char* inspectorTextColorGrey83() { return "inspectorTextColorGrey83"; }

private:
    JNInspectorDelegate* _delegate = nullptr;  // not owned
    bool _isHUD = false;
    bool _shouldDisplayAnimIndicator = true;
    bool _shouldDisplayParameterMenu = true;
};
