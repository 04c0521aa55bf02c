#include "tests/soak/TQSoakSession.h"

#include <algorithm>
#include <cmath>
#include <sstream>

#include "host/TQHostProjectFile.h"
#include "host/TQHostSampleScene.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "platform/ui/RWMenu.h"
#include "src/editor/TQCurveEditorPanels.h"
#include "src/editor/TQCurveSetPanelViews.h"

namespace {

// The generate panel bakes only while every channel has fewer keyframes than this.
constexpr size_t kMostKeyframesToBake = 400;
// The simplify panel runs only on channels whose keyframes span at most a minute. With ten
// minutes the long run under the sanitizers took over 25 minutes, most of it drawing.
constexpr double kLongestSpanToSimplify = 60.0;

// Past the view's 1/30 s gate on drag steps and frames.
constexpr double kStep = 0.05;
// Steps named in a failure's report.
constexpr size_t kTraceLength = 12;

// Every node from `node` down, depth first in display order.
template <class F>
void forEachNode(TQChannelBase* node, const F& f) {
    if (!node) return;
    f(*node);
    if (const std::vector<TQChannelBase*>* children = node->getChildren())
        for (TQChannelBase* child : *children) forEachNode(child, f);
}

bool sameAnimation(const TQChannelBase& a, const TQChannelBase& b);

// The path of the first channel that differs between two trees, for the report.
std::string firstDifference(const TQChannelBase& a, const TQChannelBase& b) {
    const std::vector<TQChannelBase*>* ca = a.getChildren();
    const std::vector<TQChannelBase*>* cb = b.getChildren();
    if (ca && cb && ca->size() == cb->size()) {
        for (size_t i = 0; i < ca->size(); ++i) {
            const TQChannelBase* x = (*ca)[i];
            const TQChannelBase* y = (*cb)[i];
            if (x && y && !sameAnimation(*x, *y))
                return a.getName() + "/" + firstDifference(*x, *y);
        }
    }
    return a.getName();
}

// Whether a curve is enabled in the editor is the editor's state, kept on the channel and
// not in the history: the soak compares everything else.
std::unique_ptr<TQChannelBase> withoutEditorState(const TQChannelBase& tree) {
    std::unique_ptr<TQChannelBase> copy(tree.cloneChannel());
    forEachNode(copy.get(),
                [](TQChannelBase& n) { n.resetFlag(kTQChannelFlagEnabledInCurveEditor); });
    return copy;
}

bool sameAnimation(const TQChannelBase& a, const TQChannelBase& b) {
    return *withoutEditorState(a) == *withoutEditorState(b);
}

bool finite(double a, double b) { return std::isfinite(a) && std::isfinite(b); }

}  // namespace

TQSoakSession::TQSoakSession(uint32_t seed) : _rng(seed) {
    TQHostLoadSampleScene(_host, TQHostObjectFamily::Kestrel);
    _host.undoStack().setLevelsOfUndo(0);  // the whole session must unwind
    _view.setViewHost(&_viewHost);
    _view.setClock(&_clock);
    _view.setTimer(&_timer);
    const CMTimeRange range = _host.displayRange();
    _view.setTotalRange(&range.start, &range.duration);
    _ctrl.init();
    _ctrl.setAppDelegate(&_host);
    _ctrl.setView(&_view);
    TQCurveEditorOutlets outlets;
    outlets.verticalScroller = std::make_shared<RWZoomScroller>();
    outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
    outlets.tools = std::make_shared<RWSegmentedControl>();
    TQInstantiateSimplifyPanel(outlets, &_ctrl);
    TQInstantiateGeneratePanel(outlets, &_ctrl);
    TQInstantiateCurveSetPanels(&_ctrl, outlets);
    _panels = outlets;
    RWInstallServices({.modal = &_modal});
    _ctrl.connectOutlets(outlets);
    _ctrl.setupController();
    _ctrl.viewDidLoad();
    _host.addNotificationReceiver(&_ctrl);
    _host.setSelectedObjects({_host.scene().objects().front()});
    _ctrl.showAll();
    frameAll();
    _start = sceneCopy();
}

TQSoakSession::~TQSoakSession() {
    RWResetServices();
    _host.removeNotificationReceiver(&_ctrl);
    _ctrl.setView(nullptr);
    _view.setViewHost(nullptr);
}

std::string TQSoakSession::step() {
    static const Entry kActions[] = {
        {"objects", 2, &TQSoakSession::chooseObjects},
        {"curve set", 2, &TQSoakSession::chooseCurveSet},
        {"click", 6, &TQSoakSession::click},
        {"drag", 10, &TQSoakSession::drag},
        {"band", 3, &TQSoakSession::band},
        {"double-click", 3, &TQSoakSession::doubleClick},
        {"menu", 5, &TQSoakSession::menuCommand},
        {"box", 3, &TQSoakSession::boxGesture},
        {"undo or redo", 4, &TQSoakSession::undoOrRedo},
        {"save and reopen", 1, &TQSoakSession::saveAndReopen},
        {"frame all", 1, &TQSoakSession::frameAll},
        {"sketch", 2, &TQSoakSession::sketch},
        {"key", 3, &TQSoakSession::key},
        {"clipboard", 2, &TQSoakSession::clipboard},
        {"channel command", 2, &TQSoakSession::channelCommand},
        {"simplify", 1, &TQSoakSession::simplify},
        {"generate", 1, &TQSoakSession::generate},
        {"new curve set", 1, &TQSoakSession::newCurveSet},
    };
    int total = 0;
    for (const Entry& e : kActions) total += e.weight;
    int pick = static_cast<int>(below(static_cast<size_t>(total)));
    for (const Entry& e : kActions) {
        if ((pick -= e.weight) >= 0) continue;
        ++_counts[e.name];
        _lastDetail.clear();
        const bool history = e.run == &TQSoakSession::undoOrRedo;
        const std::unique_ptr<TQChannelBase> before = history ? nullptr : sceneCopy();
        const size_t stepsBefore = _host.undoStack().undoCount();
        (this->*e.run)();
        frame();
        if (!_failure.empty()) return std::string(e.name) + ": " + _failure;
        const std::string done =
            std::string(e.name) + (_lastDetail.empty() ? "" : " " + _lastDetail);
        _trace.push_back(done);
        if (_trace.size() > kTraceLength) _trace.pop_front();
        std::string broken = invariants();
        if (broken.empty() && before) {
            const size_t stepsAfter = _host.undoStack().undoCount();
            broken =
                undoesExactly(*before, stepsAfter > stepsBefore ? stepsAfter - stepsBefore : 0);
        }
        if (broken.empty()) return broken;
        std::string report = "after " + done + ": " + broken + "\n  the steps up to it:";
        for (const std::string& t : _trace) report += " " + t + ";";
        return report;
    }
    return {};
}

std::string TQSoakSession::unwind() {
    const std::unique_ptr<TQChannelBase> end = sceneCopy();
    size_t undone = 0;
    while (_host.canUndo() && _host.undo()) ++undone;
    if (!sceneIs(*_start))
        return "after " + std::to_string(undone) +
               " undos the scene is not the one it started from";
    for (size_t i = 0; i < undone; ++i)
        if (!_host.redo())
            return "redo " + std::to_string(i + 1) + " of " + std::to_string(undone) + " refused";
    if (!sceneIs(*end)) return "redo to the end gives another scene";
    return {};
}

// --- Actions ----------------------------------------------------------------------------------

void TQSoakSession::chooseObjects() {
    const std::vector<TQChannelObjectRootBase*> objects = _host.scene().objects();
    std::vector<TQChannelBase*> chosen;
    for (TQChannelObjectRootBase* object : objects)
        if (below(3) == 0) chosen.push_back(object);
    _host.setSelectedObjects(chosen);
}

void TQSoakSession::chooseCurveSet() {
    const std::vector<TQCurveSetPtr>& sets = _ctrl.curveSets();
    if (sets.empty()) return;
    _ctrl.setSelectedCurveSet(sets[below(sets.size())]);
    _ctrl.showAll();
}

void TQSoakSession::click() {
    const CGPoint at = pressPoint();
    clickAt(at, below(4) == 0 ? uint64_t{RWEventModifierFlagShift} : 0);
}

void TQSoakSession::drag() {
    static const std::pair<const char*, uint64_t> kModifiers[] = {
        {"", 0},
        {"", 0},
        {"", 0},
        {"shift", RWEventModifierFlagShift},
        {"control", RWEventModifierFlagControl},
        {"option-command", RWEventModifierFlagOption | RWEventModifierFlagCommand}};
    const CGPoint from = pressPoint();
    const CGPoint to = CGPointMake(from.x + uniform(-120.0, 120.0), from.y + uniform(-90.0, 90.0));
    const auto& [name, modifiers] = kModifiers[below(std::size(kModifiers))];
    _lastDetail = name;
    dragPath(from, to, modifiers, 2 + static_cast<int>(below(6)));
}

void TQSoakSession::band() {
    dragPath(anyPoint(), anyPoint(), below(3) == 0 ? uint64_t{RWEventModifierFlagShift} : 0, 3);
}

void TQSoakSession::doubleClick() {
    const CGPoint at = below(2) == 0 ? pressPoint() : anyPoint();
    clickAt(at, 0, 1);
    clickAt(at, 0, 2);
    // A double-click on a keypoint asks for its value: the modal service is not installed,
    // so the question goes unanswered and nothing changes.
}

void TQSoakSession::menuCommand() {
    using C = TQCurveEditorCtrlBase;
    static const struct {
        const char* name;
        void (C::*run)(void*);
    } kCommands[] = {{"delete", &C::menuDelete},           {"duplicate", &C::menuDuplicate},
                     {"reverse", &C::menuReverse},         {"ease in", &C::menuEaseIn},
                     {"ease out", &C::menuEaseOut},        {"ease both", &C::menuEaseBoth},
                     {"lock", &C::menuLockSelected},       {"disable", &C::menuDisableSelected},
                     {"add keyframe", &C::menuAddKeyframe}};
    const auto& command = kCommands[below(std::size(kCommands))];
    ++_counts[std::string("menu ") + command.name];
    _lastDetail = command.name;
    (_ctrl.*command.run)(nullptr);
}

void TQSoakSession::boxGesture() {
    _ctrl.setCurrentTool(TQTool::kBox);
    frame();
    dragPath(anyPoint(), anyPoint(), 0, 3);
    frame();
    const CGPoint from = pressPoint();
    dragPath(from, CGPointMake(from.x + uniform(-80.0, 80.0), from.y + uniform(-60.0, 60.0)),
             below(3) == 0 ? uint64_t{RWEventModifierFlagShift} : 0, 4);
    _ctrl.setCurrentTool(TQTool::kEdit);
}

void TQSoakSession::undoOrRedo() {
    // Undo and redo restore channels wholesale: every cached curve is stale after them.
    const bool undo = below(3) != 0;
    _lastDetail = undo ? "undo" : "redo";
    const bool done = undo ? _host.undo() : _host.redo();
    if (!done) return;
    _ctrl.validateSelection(_view.getSelection());
    _host.postNotification(kTQNotifyCurvesInvalidated);
}

void TQSoakSession::saveAndReopen() {
    // The project read into a second host must hold the scene as it is; the session goes on
    // in the first, so that its history stays whole.
    std::string document;
    BNStringSink sink(document);
    TQHostProject saving(_host);
    if (saving.write(sink)) {
        _failure = "the project could not be written";
        return;
    }
    TQHostAppDelegate other;
    TQHostProject opening(other);
    if (auto error = opening.read(document)) {
        _failure = "the saved project does not open again: " + error->message;
        return;
    }
    if (!sameAnimation(*other.sceneChannelRoot(), *_host.sceneChannelRoot()))
        _failure = "the reopened project differs at " +
                   firstDifference(*_host.sceneChannelRoot(), *other.sceneChannelRoot());
}

void TQSoakSession::frameAll() {
    frame();
    _view.frameAll(1);
    _ctrl.updateUI();
}

void TQSoakSession::sketch() {
    _ctrl.setCurrentTool(TQTool::kSketch);
    frame();
    const CGPoint from = anyPoint();
    dragPath(from, CGPointMake(from.x + uniform(20.0, 200.0), from.y + uniform(-60.0, 60.0)), 0,
             3 + static_cast<int>(below(8)));
    _ctrl.setCurrentTool(TQTool::kEdit);
}

void TQSoakSession::key() {
    // A key held for a few repeats, then released, as the key map sends it (each repeat is an
    // undo step of its own).
    static const char* const kKeys[] = {
        "nudgeUp:", "nudgeDown:", "nudgeLeft:", "nudgeRight:", "delete:"};
    const std::string action = kKeys[below(std::size(kKeys))];
    _lastDetail = action;
    RWMenuItem sender("", "", "");
    if (action == "delete:") {
        _view.performAction(action, sender);
        return;
    }
    for (size_t i = 0, n = 1 + below(4); i < n; ++i) _view.performAction(action, sender);
    _view.performAction(action.substr(0, action.size() - 1) + "Finished:", sender);
}

void TQSoakSession::clipboard() {
    static const char* const kNames[] = {"copy", "cut", "paste", "paste"};
    const size_t which = below(std::size(kNames));
    _lastDetail = kNames[which];
    if (which == 0) _ctrl.copy();
    if (which == 1) _ctrl.cut();
    if (which >= 2) {
        // At a playhead somewhere in the piece.
        const CMTimeRange range = _host.displayRange();
        _host.setCurrentTime(CMTimeMultiplyByFloat64(range.duration, uniform(0.0, 1.0)));
        _ctrl.paste();
    }
}

void TQSoakSession::channelCommand() {
    // The selected channels' interpolation or extrapolation by the menu's tags (tag 100, the
    // one that leaves its bracket open, is the host's to close between events: not here).
    static const int64_t kInterpolations[] = {0, 1, 4, 6, 13, 14, 15, 16, 17};
    using C = TQCurveEditorCtrl;
    static const struct {
        const char* name;
        void (C::*run)(RWActionSender*);
    } kCommands[] = {{"interpolation", &C::animMenuSetCurveInterpolation},
                     {"pre-extrapolation", &C::animMenuSetCurvePreExtrapolation},
                     {"post-extrapolation", &C::animMenuSetCurvePostExtrapolation}};
    RWMenuItem sender("", "", "");
    const size_t which = below(4);
    if (which == 3) {
        _lastDetail = "add keyframe";
        _ctrl.animMenuAddKeyframe();
        return;
    }
    sender.setTag(which == 0 ? kInterpolations[below(std::size(kInterpolations))]
                             : static_cast<int64_t>(below(5)));
    _lastDetail =
        std::string(kCommands[which].name).append(" ").append(std::to_string(sender.tag()));
    (_ctrl.*kCommands[which].run)(&sender);
}

void TQSoakSession::simplify() {
    // Keypoints dragged far out stretch a channel over thousands of seconds, where one fit
    // takes seconds: the soak simplifies channels of a usual length.
    for (const TQCurveEditorItemPtr& item : _ctrl.selectedChannels()) {
        auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
        const TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
        // Without keyframes the span is no number, and no longer than any.
        if (channel && CMTimeGetSeconds(channel->getKeyframeMaxTime()) -
                               CMTimeGetSeconds(channel->getKeyframeMinTime()) >
                           kLongestSpanToSimplify) {
            _lastDetail = "skipped";
            return;
        }
    }
    // The panel's controls moved a few times, then OK or Cancel.
    const bool ok = below(2) == 0;
    _lastDetail = ok ? "ok" : "cancel";
    const double tolerance = uniform(0.0, 10.0), smoothness = uniform(0.0, 10.0);
    _modal.pushScript([this, ok, tolerance, smoothness](RWWindow&, RWModalService&) {
        _panels.toleranceSlider->userSetSliderValue(tolerance);
        _panels.smoothnessSlider->userSetSliderValue(smoothness);
        if (ok)
            _ctrl.reduceOk();
        else
            _ctrl.reduceCancel();
    });
    _ctrl.animMenuSimplifyCurve();
    // No channel selected: no run took the script.
    if (_modal.scriptsLeft() != 0) _modal = RWScriptedModal();
}

void TQSoakSession::generate() {
    // Each bake multiplies a channel's keyframes by up to the cycles plus one: past a few
    // hundred, the session would spend itself on one channel.
    std::vector<TQChannelBase*> channels;
    if (auto* root = dynamic_cast<TQChannelFolder*>(_host.sceneChannelRoot()))
        root->getAllDescendantsFlattened(channels, 0, true);
    for (TQChannelBase* c : channels)
        if (auto* channel = dynamic_cast<TQChannel*>(c);
            channel && channel->numberOfKeyframes() > kMostKeyframesToBake) {
            _lastDetail = "skipped";
            return;
        }
    const bool after = below(2) == 0;
    _lastDetail = after ? "after" : "before";
    if (after)
        _ctrl.animMenuGeneratePostKeypoints();
    else
        _ctrl.animMenuGeneratePreKeypoints();
    _panels.numberOfCyclesSlider->userSetSliderValue(static_cast<double>(1 + below(4)));
    if (below(4) == 0)
        _ctrl.generateCancel();
    else
        _ctrl.generateOk();
}

void TQSoakSession::newCurveSet() {
    _modal.pushScript([this](RWWindow&, RWModalService&) {
        _panels.curveSetNewName->setStringValue("Soak " + std::to_string(below(1000)));
        _ctrl.newCurveSetOk();
    });
    _ctrl.showNewCurveSet();
    if (_modal.scriptsLeft() != 0) _modal = RWScriptedModal();
}

// --- Invariants --------------------------------------------------------------------------------

std::string TQSoakSession::invariants() {
    std::vector<TQChannel*> channels;
    forEachNode(_host.sceneChannelRoot(), [&](TQChannelBase& n) {
        if (auto* channel = dynamic_cast<TQChannel*>(&n)) channels.push_back(channel);
    });
    for (TQChannel* channel : channels) {
        CMTime previous = kCMTimeInvalid;
        for (TQKeyframeHandle handle : channel->getKeyframes(false)) {
            CMTime time;
            double value = 0.0, inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
            channel->getKeyframe(handle, &time, &value);
            channel->getKeyframeInputTangents(handle, &inU, &inV);
            channel->getKeyframeOutputTangents(handle, &outU, &outV);
            std::ostringstream where;
            where << channel->getName() << " at " << CMTimeGetSeconds(time) << " s";
            if (!CMTIME_IS_NUMERIC(time)) return "a keyframe of " + where.str() + " has no time";
            // A move that ends without a purge (a nudge) may leave two keyframes at one time
            // until a gesture on that channel purges it: ties may wait, the order may not break.
            if (CMTIME_IS_NUMERIC(previous) && CMTimeCompare(previous, time) > 0)
                return "keyframe times of " + where.str() + " go back";
            if (!std::isfinite(value) || !finite(inU, inV) || !finite(outU, outV))
                return "a value or handle of " + where.str() + " is not a number";
            previous = time;
        }
    }
    // Every item of the shown set resolves to its channel or to nothing, never to another.
    if (const TQCurveSetPtr& set = _ctrl.selectedCurveSet()) {
        for (const TQCurveEditorItemPtr& item : set->allItems()) {
            TQChannel* channel = item ? item->channel() : nullptr;
            if (channel && std::find(channels.begin(), channels.end(), channel) == channels.end())
                return "an item of the shown set leads outside the scene";
        }
    }
    return {};
}

// A step that changed the scene is one undo step: undo gives the scene before it, redo the
// scene after it.
std::string TQSoakSession::undoesExactly(const TQChannelBase& before, size_t steps) {
    if (sceneIs(before)) return {};
    const std::unique_ptr<TQChannelBase> after = sceneCopy();
    // Some gestures are two steps (Option on a tangent breaks it with the press, then the drag
    // moves it): the action's steps are undone together.
    if (steps == 0) return "a change that cannot be undone";
    for (size_t i = 0; i < steps; ++i)
        if (!_host.undo()) return "a change that cannot be undone";
    const bool restored = sceneIs(before);
    for (size_t i = 0; i < steps; ++i)
        if (!_host.redo()) return "its undo cannot be redone";
    _ctrl.validateSelection(_view.getSelection());
    _host.postNotification(kTQNotifyCurvesInvalidated);
    if (!restored) return "undo does not restore " + firstDifference(before, *after);
    if (!sceneIs(*after)) return "redo does not give the change back";
    return {};
}

std::unique_ptr<TQChannelBase> TQSoakSession::sceneCopy() {
    return std::unique_ptr<TQChannelBase>(_host.sceneChannelRoot()->cloneChannel());
}

bool TQSoakSession::sceneIs(const TQChannelBase& expected) {
    return sameAnimation(*_host.sceneChannelRoot(), expected);
}

// --- Input --------------------------------------------------------------------------------------

std::vector<CGPoint> TQSoakSession::keypointPoints() {
    std::vector<CGPoint> points;
    TQCurveSelectionList* selection = _view.getSelection();
    if (!selection) return points;
    // Select All and back: what the user would see, and no trace in the history.
    const std::vector<TQCurveSelectionPtr> before = selection->getSelectionArray();
    _view.selectAll();
    for (uint32_t i = 0; i < selection->size(); ++i) {
        const TQCurveSelectionPtr entry = selection->selectionAtIndex(i);
        double u = NAN, y = NAN;
        _ctrl.getSelectedVertex(entry.get(), &u, &y);
        if (finite(u, y)) points.push_back(_view.getPointScreen(CGPointMake(u, y)));
    }
    _view.selectNone();
    selection->getSelectionArray() = before;
    return points;
}

CGPoint TQSoakSession::anyPoint() { return CGPointMake(uniform(0.0, 900.0), uniform(0.0, 500.0)); }

CGPoint TQSoakSession::pressPoint() {
    if (below(4) == 0) return anyPoint();
    const std::vector<CGPoint> points = keypointPoints();
    if (points.empty()) return anyPoint();
    ++_keypointPresses;
    return points[below(points.size())];
}

void TQSoakSession::frame() {
    _timer.advance(1.0);
    _view.displayLayer(&_encoder);
}

void TQSoakSession::mouse(RWEventType type, const CGPoint& at, uint64_t modifiers, int64_t clicks) {
    const RWEvent event = RWEvent::mouseEvent(type, at, modifiers, clicks);
    switch (type) {
        case RWEventType::LeftMouseDown: _view.mouseDown(event); break;
        case RWEventType::LeftMouseDragged: _view.mouseDragged(event); break;
        default: _view.mouseUp(event); break;
    }
}

void TQSoakSession::dragPath(const CGPoint& from, const CGPoint& to, uint64_t modifiers,
                             int steps) {
    mouse(RWEventType::LeftMouseDown, from, modifiers);
    for (int i = 1; i <= steps; ++i) {
        _timer.advance(kStep);
        const double f = static_cast<double>(i) / steps;
        mouse(RWEventType::LeftMouseDragged,
              CGPointMake(from.x + (to.x - from.x) * f, from.y + (to.y - from.y) * f), modifiers);
    }
    mouse(RWEventType::LeftMouseUp, to, modifiers);
}

void TQSoakSession::clickAt(const CGPoint& at, uint64_t modifiers, int64_t clicks) {
    mouse(RWEventType::LeftMouseDown, at, modifiers, clicks);
    mouse(RWEventType::LeftMouseUp, at, modifiers, clicks);
}

double TQSoakSession::uniform(double low, double high) {
    return std::uniform_real_distribution<double>(low, high)(_rng);
}

size_t TQSoakSession::below(size_t count) {
    return count == 0 ? 0 : std::uniform_int_distribution<size_t>(0, count - 1)(_rng);
}
