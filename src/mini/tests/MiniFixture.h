#pragma once
// Shared set-up of the mini editor tests: one object in the reference host's scene (behind a
// recording delegate) with a plain channel "Gain" and an over-range pair "Gradient", and a mini
// editor in its inspector form on a stub view host of the curve view's size. Positions are in
// the range 0 to 1, carried as seconds in the channels' timescale.

#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <utility>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/mini/TQMiniCurveEditorInspector.h"
#include "tests/support/TQRecordingAppDelegate.h"

namespace mini_test {

inline CMTime position(double p) { return TQTarnTimeForChannelSeconds(p, 0x40000); }

inline void setKeys(TQChannel& channel, std::initializer_list<std::pair<double, double>> keys) {
    for (const auto& [p, v] : keys) channel.setKeyframe(position(p), v);
}

inline double keyValue(const TQChannel& channel, double p) {
    double v = 0.0;
    channel.getKeyframe(channel.getKeyframe(position(p)), nullptr, &v);
    return v;
}

// Selects the keypoints of `channel` at the positions in `editor`, the first one primary, as a
// click and Shift-clicks would, and tells its controller.
inline void selectKeys(TQMiniCurveEditorInspector& editor, TQChannel* channel,
                       std::initializer_list<double> positions) {
    TQCurveSelectionList* list = editor.curveEditorView().getSelection();
    list->reset();
    const auto item = editor.controller()->selectedCurveSet()->itemWithChannel(channel);
    for (double p : positions) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item ? item->channelId() : 0);
        entry->setHandle(channel->getKeyframe(position(p)));
        entry->setFlags(TQSelectionKeypoint);
        entry->setKeypointUV(position(p), keyValue(*channel, p));
        list->addSelection(entry);
    }
    editor.controller()->selectionChangedTo(list);
}

class MiniFixture : public ::testing::Test {
protected:
    void SetUp() override {
        recorder.forwardTo(&host);
        auto root = std::make_unique<TQChannelObjectRootBase>("Object", 1);
        object = host.scene().adoptObject(std::move(root));
        gain = static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannel>("Gain", 10)));
        gradient = static_cast<TQChannel2DOverRange*>(
            object->addChild(std::make_unique<TQChannel2DOverRange>("Gradient", 11, 0.0, 1.0)));
        setKeys(*gain, {{0.0, 10.0}, {0.5, 30.0}, {1.0, 20.0}});
        setKeys(*gradient->getXChannel(), {{0.0, 0.0}, {1.0, 4.0}});
        setKeys(*gradient->getYChannel(), {{0.0, 1.0}, {1.0, 2.0}});
        editor.curveEditorView().setViewHost(&viewHost);
        editor.curveEditorView().setClock(&clock);
        editor.curveEditorView().setTimer(&timer);
    }

    void TearDown() override { editor.curveEditorView().setViewHost(nullptr); }

    TQMiniCurveEditorCtrl& ctrl() { return *editor.controller(); }
    TQMiniCurveEditorView& view() { return editor.curveEditorView(); }

    std::unique_ptr<TQChannelBase> snapshot() const {
        return std::unique_ptr<TQChannelBase>(object->cloneChannel());
    }

    TQHostAppDelegate host;
    TQRecordingAppDelegate recorder;
    RWManualClock clock;
    RWManualTimer timer{clock};
    RWStubViewHost viewHost{219.0, 145.0, 1.0};
    TQMiniCurveEditorInspector editor{&recorder};
    TQChannelObjectRootBase* object = nullptr;
    TQChannel* gain = nullptr;
    TQChannel2DOverRange* gradient = nullptr;
};

}  // namespace mini_test
