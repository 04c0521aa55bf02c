#pragma once
// Guards for the edit brackets of the host contract (see TQCurveEditorAppDelegate.h). Each
// opens its bracket when it is made and closes it when it is destroyed, so that no path (an
// early return, a gesture whose release never comes, a view torn down in mid-drag) leaves a
// bracket open. The composites declare their parts outermost first, so they close in the
// reverse order of opening, which is the order the host expects.
//
// Lifetime: a guard refers to the delegate, the controller and the list it was opened with;
// each must outlive it. Guards are neither copied nor moved: a drag that keeps its bracket
// across events holds it in a std::optional and resets it to close it.
//
// A null delegate opens and closes nothing. A host must not throw from the bracket calls:
// they run in destructors.

#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/data/TQCurveSelection.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

// One undoable step: startCaptureModifiedChannels with the localised undo key, and its end.
class TQCaptureGuard {
public:
    TQCaptureGuard(TQCurveEditorAppDelegate* delegate, const char* undoKey);
    ~TQCaptureGuard();
    TQCaptureGuard(const TQCaptureGuard&) = delete;
    TQCaptureGuard& operator=(const TQCaptureGuard&) = delete;

private:
    TQCurveEditorAppDelegate* _delegate;  // not owned
};

// One of the controller's announcement pairs over a selection list. The channels are gathered
// from the list again when the bracket closes, as the controller always does.
template <void (TQCurveEditorCtrlBase::*Open)(TQCurveSelectionList*),
          void (TQCurveEditorCtrlBase::*Close)(TQCurveSelectionList*)>
class TQListAnnouncementGuard {
public:
    TQListAnnouncementGuard(TQCurveEditorCtrlBase& controller, TQCurveSelectionList* list)
        : _controller(controller), _list(list) {
        (_controller.*Open)(_list);
    }
    ~TQListAnnouncementGuard() { (_controller.*Close)(_list); }
    TQListAnnouncementGuard(const TQListAnnouncementGuard&) = delete;
    TQListAnnouncementGuard& operator=(const TQListAnnouncementGuard&) = delete;

private:
    TQCurveEditorCtrlBase& _controller;
    TQCurveSelectionList* _list;  // not owned
};

// Announcements of one channel outside a selection list: willChangeChannel and
// willSetChannelValue when made, didSetChannelValue and didChangeChannel when destroyed.
class TQChannelEditGuard {
public:
    TQChannelEditGuard(TQCurveEditorAppDelegate* delegate, const TQChannelBase* channel);
    ~TQChannelEditGuard();
    TQChannelEditGuard(const TQChannelEditGuard&) = delete;
    TQChannelEditGuard& operator=(const TQChannelEditGuard&) = delete;

private:
    TQCurveEditorAppDelegate* _delegate;  // not owned
    const TQChannelBase* _channel;
};

// willModify / didModify: willChangeChannel and didChangeChannel for each distinct channel.
using TQModifyGuard =
    TQListAnnouncementGuard<&TQCurveEditorCtrlBase::willModify, &TQCurveEditorCtrlBase::didModify>;
// willModifyValue / didModifyValue: willSetChannelValue and didSetChannelValue, the same way.
using TQModifyValueGuard = TQListAnnouncementGuard<&TQCurveEditorCtrlBase::willModifyValue,
                                                   &TQCurveEditorCtrlBase::didModifyValue>;

// The step of a whole gesture: the capture and willModify. A drag opens it at its first step,
// runs each step inside a TQModifyValueGuard, and closes it at the release.
class TQChangeBracket {
public:
    TQChangeBracket(TQCurveEditorCtrlBase& controller, TQCurveSelectionList* list,
                    const char* undoKey)
        : _capture(controller.appDelegate(), undoKey), _modify(controller, list) {}

private:
    TQCaptureGuard _capture;
    TQModifyGuard _modify;
};

// The one-shot bracket of a command or a click: the step of a gesture with the value
// announcements inside it.
class TQEditBracket {
public:
    TQEditBracket(TQCurveEditorCtrlBase& controller, TQCurveSelectionList* list,
                  const char* undoKey)
        : _change(controller, list, undoKey), _value(controller, list) {}

private:
    TQChangeBracket _change;
    TQModifyValueGuard _value;
};
