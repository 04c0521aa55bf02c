#pragma once
// The demo's transport and time ruler, on the host's clock.
//
// The transport: go to start, a frame back, play or pause, a frame forward, go to end, and
// the current time as the host shows times (frames or timecode). The ruler over the curves
// shows the host's display range and puts the playhead where it is pressed and dragged
// (playback pauses while it is held). Playback is a Qt timer at the host's frame rate that
// ticks the host with the time that really passed, so the host's time words reach the
// editor's notify as they would from a real host's clock.
//
// The transport hears the host's words (kTQNotifyHostTimeChanged, kTQNotifyTimeChanged, a
// changed range or scene) and shows their result. It is the controls' target and owns their
// models; Qt owns the widgets (made by makeToolBarWidgets and makeRuler). The host outlives it.

#include <QElapsedTimer>
#include <QObject>
#include <QTimer>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "platform/ui/RWSegmentedControl.h"
#include "platform/ui/RWTextField.h"
#include "platform/ui/RWTimeRuler.h"

class QToolBar;
class TQQtTimeRuler;

// Seconds (as a number) shown as the host shows times.
class TQDemoTimeFormatter final : public RWFormatter {
public:
    explicit TQDemoTimeFormatter(const TQHostAppDelegate& host) : _host(host) {}
    std::optional<std::string> stringForObjectValue(const RWObjectValue& value) const override;
    // Read only: typed text is refused.
    bool getObjectValue(RWObjectValue* value, const std::string& string,
                        std::string* errorDescription) const override;

private:
    const TQHostAppDelegate& _host;
};

class TQDemoTransport final : public QObject, public RWActionTarget, public TQNotificationReceiver {
public:
    // The transport's segments, in order.
    enum Segment : int64_t { kGoToStart, kPreviousFrame, kPlay, kNextFrame, kGoToEnd };

    explicit TQDemoTransport(TQHostAppDelegate& host, QObject* parent = nullptr);
    ~TQDemoTransport() override;

    // The transport's widgets, appended to the bar; the ruler, for the caller's layout.
    void makeToolBarWidgets(QToolBar* bar);
    TQQtTimeRuler* makeRuler(QWidget* parent);

    void play();
    void pause();
    // Stops hearing the host: the window calls it before its host goes, since Qt deletes this
    // child only after the window's members.
    void detachFromHost();
    void togglePlayback();
    bool isPlaying() const { return _host.isPlaying(); }
    void stepFrames(int64_t frames);
    void goToStart();
    void goToEnd();

    const std::shared_ptr<RWSegmentedControl>& buttons() const { return _buttons; }
    const std::shared_ptr<RWTextField>& timeField() const { return _timeField; }
    const std::shared_ptr<RWTimeRuler>& ruler() const { return _ruler; }
    const QTimer& playbackTimer() const { return _timer; }
    // Ticks of the playback timer since the transport was made.
    int64_t ticks() const { return _ticks; }

    bool performAction(const std::string& action, RWActionSender& sender) override;
    void notify(TQNotificationWord word) override;

private:
    // The controls from the host's time, range and settings.
    void refresh();
    void tick();

    TQHostAppDelegate& _host;
    bool _attached = true;
    TQDemoTimeFormatter _formatter{_host};
    std::shared_ptr<RWSegmentedControl> _buttons;
    std::shared_ptr<RWTextField> _timeField;
    std::shared_ptr<RWTimeRuler> _ruler;
    QTimer _timer;
    QElapsedTimer _sinceTick;
    int64_t _ticks = 0;
};
