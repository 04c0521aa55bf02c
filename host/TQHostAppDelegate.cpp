#include "host/TQHostAppDelegate.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/RWExtendedTimecode.h"
#include "platform/ui/RWTimecodeFormatter.h"

TQHostAppDelegate::TQHostAppDelegate(TQHostObjectFamily family)
    : _scene(family),
      _sceneRoot(&_scene.root()),
      _undo([this] { return _sceneRoot; }),
      _displayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1))) {
    _clock.setPlayRange(_displayRange);
    _scene.root().setChangeObserver(this);
}

TQHostAppDelegate::~TQHostAppDelegate() {
    // The scene dies after this body; channels destroyed with it must not call back here.
    _scene.root().setChangeObserver(nullptr);
}

// --- Scene ---

TQChannelObjectRootBase* TQHostAppDelegate::addObject(const BNString& name,
                                                      const TQHostObjectOptions& options) {
    TQChannelObjectRootBase* object = _scene.addObject(name, options);
    object->setRootCurrentTime(_clock.currentTime());
    _notifications.post(kTQNotifySceneChanged);
    return object;
}

bool TQHostAppDelegate::removeObject(const TQChannelBase* object) {
    const bool wasSelected = _scene.isObjectSelected(object);
    if (!_scene.removeObject(object)) return false;
    _notifications.post(wasSelected ? kTQNotifySceneChanged | kTQNotifyObjectSelectionChanged
                                    : kTQNotifySceneChanged);
    return true;
}

void TQHostAppDelegate::resetScene(TQHostObjectFamily family) {
    _clock.stop();
    _scene.reset(family);
    _undo.clear();
    _tracker.reset();
    _notifications.post(kTQNotifySceneReset);
}

// --- Selection ---

void TQHostAppDelegate::selectObject(const TQChannelBase* object, bool extend) {
    if (_scene.selectObject(object, extend)) _notifications.post(kTQNotifyObjectSelectionChanged);
}

void TQHostAppDelegate::deselectObject(const TQChannelBase* object) {
    if (_scene.deselectObject(object)) _notifications.post(kTQNotifyObjectSelectionChanged);
}

void TQHostAppDelegate::setSelectedObjects(const std::vector<TQChannelBase*>& objects) {
    if (_scene.setSelection(objects)) _notifications.post(kTQNotifyObjectSelectionChanged);
}

void TQHostAppDelegate::clearObjectSelection() {
    if (_scene.clearSelection()) _notifications.post(kTQNotifyObjectSelectionChanged);
}

// --- Time ---

bool TQHostAppDelegate::setFrameDuration(const CMTime& duration) {
    if (!CMTIME_IS_NUMERIC(duration) || CMTimeCompare(duration, kCMTimeZero) <= 0) return false;
    _frameDuration = duration;
    return true;
}

bool TQHostAppDelegate::setDisplayRange(const CMTimeRange& range) {
    // The clock's test of a range, without making it the play range.
    TQHostPlaybackClock probe;
    if (!probe.setPlayRange(range)) return false;
    _displayRange = range;
    _notifications.post(kTQNotifyPlayRangeChanged);
    return true;
}

bool TQHostAppDelegate::setSecondsPerTextStep(const CMTime& step) {
    if (!CMTIME_IS_NUMERIC(step) || CMTimeCompare(step, kCMTimeZero) <= 0) return false;
    _secondsPerTextStep = step;
    return true;
}

void TQHostAppDelegate::setCurrentTime(const CMTime& time) {
    if (_clock.setCurrentTime(time)) syncObjectTimes();
}

void TQHostAppDelegate::tick(const CMTime& elapsed) {
    if (!_clock.tick(elapsed)) return;
    syncObjectTimes();
    _notifications.post(kTQNotifyHostTimeChanged);
}

bool TQHostAppDelegate::movePlayhead(const CMTime& time) {
    const CMTime before = _clock.currentTime();
    if (!_clock.setCurrentTime(time)) return false;
    syncObjectTimes();
    if (CMTimeCompare(before, time) != 0) _notifications.post(kTQNotifyHostTimeChanged);
    return true;
}

int64_t TQHostAppDelegate::frameIndexOf(const CMTime& time) const {
    const double frames = CMTimeGetSeconds(time) / CMTimeGetSeconds(_frameDuration);
    if (!std::isfinite(frames)) return 0;
    // The clock's timescale cannot hold every frame start exactly (1/30 s is 8738.13 of its
    // ticks): a time within a hair of a frame's start is that frame.
    const double nearest = std::round(frames);
    return static_cast<int64_t>(std::fabs(frames - nearest) < 1e-4 ? nearest : std::floor(frames));
}

bool TQHostAppDelegate::stepFrames(int64_t frames) {
    const CMTimeRange range = _clock.playRange();
    const int64_t first = frameIndexOf(range.start);
    // The last frame that starts inside the range.
    const int64_t last = std::max(first, frameIndexOf(CMTimeRangeGetEnd(range)) - 1);
    const int64_t target = std::clamp(frameIndexOf(_clock.currentTime()) + frames, first, last);
    return movePlayhead(_frameDuration * static_cast<double>(target));
}

bool TQHostAppDelegate::goToStart() { return movePlayhead(_clock.playRange().start); }

bool TQHostAppDelegate::goToEnd() {
    const CMTimeRange range = _clock.playRange();
    const int64_t last =
        std::max(frameIndexOf(range.start), frameIndexOf(CMTimeRangeGetEnd(range)) - 1);
    return movePlayhead(_frameDuration * static_cast<double>(last));
}

std::string TQHostAppDelegate::timeText(const CMTime& time) const {
    if (!CMTIME_IS_NUMERIC(time)) return std::string();
    const int64_t frame = frameIndexOf(time);
    if (_displayTimeAsFrames)
        return std::to_string(frame + static_cast<int64_t>(_firstFrameNumber));
    RWTimecodeFormatter formatter;
    formatter.setAllowsNegative(true);
    formatter.setFrameDuration(_frameDuration);
    return formatter
        .stringForTimecode(RWExtendedTimecode::withFrameNumber(
            frame + static_cast<int64_t>(_startTimecode), _frameDuration, false))
        .value_or(std::string());
}

void TQHostAppDelegate::syncObjectTimes() {
    for (TQChannelObjectRootBase* object : _scene.objects())
        object->setRootCurrentTime(_clock.currentTime());
}

void TQHostAppDelegate::abort() {
    ++_abortCount;
    _clock.stop();
}

void TQHostAppDelegate::unsuppressEventCoalescing() {
    // An unmatched release is tolerated: a press may have begun before this host existed.
    if (_coalescingSuppressed > 0) --_coalescingSuppressed;
}

// --- Undo ---

void TQHostAppDelegate::eventLoopDidGoIdle() {
    if (_coalescingSuppressed == 0) _undo.closeOpenStep();
}

bool TQHostAppDelegate::undo() {
    if (!_undo.undo()) return false;
    _notifications.post(kTQNotifyChannelsChanged);
    return true;
}

bool TQHostAppDelegate::redo() {
    if (!_undo.redo()) return false;
    _notifications.post(kTQNotifyChannelsChanged);
    return true;
}

// --- Change observation ---

void TQHostAppDelegate::channelWillChange(TQChannelBase& channel) {
    _tracker.channelWillChange(channel, _sceneRoot);
    _undo.channelWillChange(channel);
}
