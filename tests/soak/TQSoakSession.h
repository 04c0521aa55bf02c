#pragma once
// A seeded random session of a user in the full editor on the sample project, through the
// reference host: gestures of the three tools, keys, menu and channel commands, the clipboard,
// the simplify, generate and new-set panels, curve sets, object selection, undo and redo, save
// and reopen. After every step the scene must hold together (keyframe times
// strictly increasing, no value or handle that is not a number, every selected keypoint
// resolving); at the end, undo to the start must give the scene it started from and redo to
// the end the scene it ended with.

#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

class TQSoakSession {
public:
    explicit TQSoakSession(uint32_t seed);
    ~TQSoakSession();
    TQSoakSession(const TQSoakSession&) = delete;
    TQSoakSession& operator=(const TQSoakSession&) = delete;

    // One random action, then the invariants: empty when they hold, otherwise what broke.
    std::string step();
    // Undo to the start and redo to the end: empty when both scenes come back exactly.
    std::string unwind();

    // How often each action ran, and how many presses landed on a keypoint.
    const std::map<std::string, size_t>& actionCounts() const { return _counts; }
    size_t keypointPresses() const { return _keypointPresses; }

private:
    using Action = void (TQSoakSession::*)();
    struct Entry {
        const char* name;
        int weight;
        Action run;
    };

    void chooseObjects();
    void chooseCurveSet();
    void click();
    void drag();
    void band();
    void doubleClick();
    void menuCommand();
    void boxGesture();
    void undoOrRedo();
    void saveAndReopen();
    void frameAll();
    void sketch();
    void key();
    void clipboard();
    void channelCommand();
    void simplify();
    void generate();
    void newCurveSet();

    std::string invariants();
    std::string undoesExactly(const TQChannelBase& before, size_t steps);
    std::unique_ptr<TQChannelBase> sceneCopy();
    // The scene holds the animation of `expected` (editor state aside).
    bool sceneIs(const TQChannelBase& expected);

    // Screen points of every keypoint the view shows, found as the user's Select All would.
    std::vector<CGPoint> keypointPoints();
    CGPoint anyPoint();
    CGPoint pressPoint();
    void frame();
    void mouse(RWEventType type, const CGPoint& at, uint64_t modifiers, int64_t clicks = 1);
    void clickAt(const CGPoint& at, uint64_t modifiers, int64_t clicks = 1);
    void dragPath(const CGPoint& from, const CGPoint& to, uint64_t modifiers, int steps);
    double uniform(double low, double high);
    size_t below(size_t count);

    std::mt19937 _rng;
    TQHostAppDelegate _host;
    RWManualClock _clock;
    RWManualTimer _timer{_clock};
    RWStubViewHost _viewHost{900.0, 500.0, 1.0};
    HXDRecordingEncoder _encoder{900, 500};
    TQCurveEditorView _view;
    TQCurveEditorCtrl _ctrl;
    TQCurveEditorOutlets _panels;
    // The panels' modal runs, each answered by the script the action pushes.
    RWScriptedModal _modal;
    std::unique_ptr<TQChannelBase> _start;
    std::map<std::string, size_t> _counts;
    size_t _keypointPresses = 0;
    std::string _failure;
    // Which command or modifier the last action used.
    std::string _lastDetail;
    // The last steps, for a failure's report.
    std::deque<std::string> _trace;
};
