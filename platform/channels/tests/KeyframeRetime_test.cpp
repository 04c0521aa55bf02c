#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "platform/channels/testing/CurveCatalogue.h"

using namespace curve_catalogue;

namespace {

// The order a channel must keep, written the slow and obvious way: a moved keyframe is taken
// out and put back after every keyframe at an equal or earlier time.
struct ReferenceOrder {
    struct Entry {
        TQKeyframeHandle handle;
        CMTime time;
    };
    std::vector<Entry> entries;

    void retime(TQKeyframeHandle handle, CMTime time) {
        const auto it = std::find_if(entries.begin(), entries.end(),
                                     [&](const Entry& e) { return e.handle == handle; });
        if (it == entries.end()) return;
        entries.erase(it);
        const auto at = std::find_if(entries.begin(), entries.end(), [&](const Entry& e) {
            return CMTimeCompare(e.time, time) > 0;
        });
        entries.insert(at, Entry{handle, time});
    }
};

// Every handle in the channel's order, each resolving to its own time: the table and the
// handle index agree.
void expectOrder(const TQChannel& c, const ReferenceOrder& ref, int step) {
    const std::vector<TQKeyframeHandle> handles = c.getKeyframes(false);
    ASSERT_EQ(handles.size(), ref.entries.size()) << "step " << step;
    for (size_t i = 0; i < handles.size(); ++i) {
        ASSERT_EQ(handles[i], ref.entries[i].handle) << "step " << step << ", position " << i;
        CMTime t = kCMTimeInvalid;
        ASSERT_TRUE(c.getKeyframe(handles[i], &t, nullptr)) << "step " << step;
        ASSERT_EQ(CMTimeCompare(t, ref.entries[i].time), 0)
            << "step " << step << ", position " << i;
    }
}

class KeyframeRetime : public ::testing::Test {
protected:
    void SetUp() override {
        channel = makeChannel("retime");
        for (int k = 0; k < 12; ++k) {
            const CMTime t = seconds(k * 0.5);
            ref.entries.push_back({channel->setKeyframe(t, k), t});
        }
    }
    std::unique_ptr<TQChannel> channel;
    ReferenceOrder ref;
};

TEST_F(KeyframeRetime, setKeyframeTime__keeps_order_and_handles_through_random_moves) {
    Lcg rng{42};
    for (int step = 0; step < 400; ++step) {
        const size_t pick = size_t(rng.next() * double(ref.entries.size()));
        const TQKeyframeHandle h = ref.entries[pick].handle;
        CMTime now = kCMTimeInvalid;
        ASSERT_TRUE(channel->getKeyframe(h, &now, nullptr));
        CMTime to;
        const double r = rng.next();
        if (r < 0.4) {
            // A small step, usually staying between the neighbours.
            to = CMTimeAdd(now, CMTimeMake(int64_t(rng.next() * 200.0) - 100, 0x40000));
        } else if (r < 0.7) {
            // Onto another keyframe's time: the mover arrives last in that run.
            to = ref.entries[size_t(rng.next() * double(ref.entries.size()))].time;
        } else if (r < 0.85) {
            to = seconds(rng.next() * 7.0 - 0.5);  // anywhere, past both ends too
        } else {
            // Another timescale, same instant as a grid time or not.
            to = CMTimeMake(int64_t(rng.next() * 14.0), 2);
        }
        channel->setKeyframeTime(h, &to);
        // Setting the time a keyframe already has leaves it where it is.
        if (CMTimeCompare(now, to) != 0) ref.retime(h, to);
        expectOrder(*channel, ref, step);
    }
}

}  // namespace
