#include "apps/demo/TQDemoTransport.h"

#include <QLabel>
#include <QToolBar>

#include <cmath>

#include "qt/TQQtSegmentedControl.h"
#include "qt/TQQtTextField.h"
#include "qt/TQQtTimeRuler.h"

namespace {

constexpr int64_t kNanosecondsPerSecond = 1000000000;

struct SegmentText {
    const char* label;
    const char* description;
};
constexpr SegmentText kSegments[] = {
    {"|<", "Go to the start"},  {"<", "One frame back"}, {"Play", "Play"},
    {">", "One frame forward"}, {">|", "Go to the end"},
};

}  // namespace

std::optional<std::string> TQDemoTimeFormatter::stringForObjectValue(
    const RWObjectValue& value) const {
    const std::optional<double> seconds = value.number();
    if (!seconds || !std::isfinite(*seconds)) return std::nullopt;
    return _host.timeText(CMTimeMakeWithSeconds(*seconds, TQHostPlaybackClock::kTimescale));
}

bool TQDemoTimeFormatter::getObjectValue(RWObjectValue*, const std::string&,
                                         std::string* errorDescription) const {
    if (errorDescription) *errorDescription = "The time is shown, not typed";
    return false;
}

TQDemoTransport::TQDemoTransport(TQHostAppDelegate& host, QObject* parent)
    : QObject(parent),
      _host(host),
      _buttons(std::make_shared<RWSegmentedControl>()),
      _timeField(std::make_shared<RWTextField>()),
      _ruler(std::make_shared<RWTimeRuler>()) {
    _buttons->setTrackingMode(RWSegmentSwitchTracking::Momentary);
    _buttons->setSegmentCount(std::size(kSegments));
    for (int64_t i = 0; i < _buttons->segmentCount(); ++i) {
        _buttons->setLabel(kSegments[i].label, i);
        _buttons->setAccessibilityDescription(kSegments[i].description, i);
    }
    _buttons->setTarget(this);
    _buttons->setAction("transport:");
    _timeField->setFormatter(&_formatter);
    _timeField->setEditable(false);
    _ruler->setLabelFormatter(&_formatter);
    _ruler->setTarget(this);
    _ruler->setAction("rulerMoved:");

    _timer.setTimerType(Qt::PreciseTimer);
    connect(&_timer, &QTimer::timeout, this, [this] { tick(); });
    _host.addNotificationReceiver(this);
    refresh();
}

TQDemoTransport::~TQDemoTransport() {
    detachFromHost();
    _buttons->setTarget(nullptr);
    _ruler->setTarget(nullptr);
}

void TQDemoTransport::detachFromHost() {
    if (!_attached) return;
    _timer.stop();
    _host.removeNotificationReceiver(this);
    _attached = false;
}

void TQDemoTransport::makeToolBarWidgets(QToolBar* bar) {
    auto* buttons = new TQQtSegmentedControl(bar);
    buttons->setModel(_buttons);
    bar->addWidget(buttons);
    auto* time = new TQQtTextField(bar);
    time->setModel(_timeField);
    time->setFixedWidth(time->fontMetrics().horizontalAdvance(QStringLiteral("-00:00:00:00")) + 16);
    time->setAlignment(Qt::AlignCenter);
    time->setFocusPolicy(Qt::NoFocus);
    bar->addWidget(time);
}

TQQtTimeRuler* TQDemoTransport::makeRuler(QWidget* parent) {
    auto* ruler = new TQQtTimeRuler(parent);
    ruler->setModel(_ruler);
    return ruler;
}

void TQDemoTransport::play() {
    if (_host.isPlaying()) return;
    _host.play();
    // A tick a frame, rounded up to whole milliseconds so that each tick's redraw passes the
    // view's gate of one frame in 1/30 s (a tick early would have every other one held back).
    const double frame = CMTimeGetSeconds(_host.getFrameDuration());
    _timer.start(static_cast<int>(std::ceil(1000.0 * (frame > 0.0 ? frame : 1.0 / 30.0))));
    _sinceTick.start();
    refresh();
}

void TQDemoTransport::pause() {
    _timer.stop();
    _host.stop();
    refresh();
}

void TQDemoTransport::togglePlayback() {
    if (_host.isPlaying())
        pause();
    else
        play();
}

void TQDemoTransport::stepFrames(int64_t frames) {
    pause();
    _host.stepFrames(frames);
}

void TQDemoTransport::goToStart() {
    pause();
    _host.goToStart();
}

void TQDemoTransport::goToEnd() {
    pause();
    _host.goToEnd();
}

void TQDemoTransport::tick() {
    ++_ticks;
    // The time that really passed, so that a late tick does not slow the piece down.
    const qint64 elapsed = _sinceTick.nsecsElapsed();
    _sinceTick.restart();
    _host.tick(CMTimeMake(elapsed, static_cast<CMTimeScale>(kNanosecondsPerSecond)));
    // Playback that came to rest on the range's end stops its timer.
    if (!_host.isPlaying()) pause();
}

bool TQDemoTransport::performAction(const std::string& action, RWActionSender& sender) {
    if (action == "transport:") {
        switch (_buttons->selectedSegment()) {
            case kGoToStart: goToStart(); break;
            case kPreviousFrame: stepFrames(-1); break;
            case kPlay: togglePlayback(); break;
            case kNextFrame: stepFrames(1); break;
            case kGoToEnd: goToEnd(); break;
            default: break;
        }
        return true;
    }
    if (action == "rulerMoved:" && &sender == _ruler.get()) {
        // Scrubbing pauses playback; the ruler's time is the new playhead.
        if (_host.isPlaying()) pause();
        _host.movePlayhead(_ruler->currentTime());
        return true;
    }
    return false;
}

void TQDemoTransport::notify(TQNotificationWord word) {
    if (word & (kTQNotifyHostTimeChanged | kTQNotifyTimeChanged | kTQNotifyPlayRangeChanged |
                kTQNotifySceneChanged | kTQNotifySceneReset))
        refresh();
}

void TQDemoTransport::refresh() {
    const CMTime now = _host.currentTime();
    _timeField->setDoubleValue(CMTimeGetSeconds(now));
    _buttons->setLabel(_host.isPlaying() ? "Pause" : "Play", kPlay);
    _buttons->setAccessibilityDescription(_host.isPlaying() ? "Pause" : "Play", kPlay);
    _ruler->setDisplayRange(_host.displayRange());
    _ruler->setFrameDuration(_host.getFrameDuration());
    _ruler->setLabelStep(_host.secondsPerTextStep());
    _ruler->setCurrentTime(now);
}
