#pragma once
// Edits as a script of steps separated by ";", each a name and its arguments, times in seconds
// (a keyframe is named by its time: the last arrival there; "in" and "out" take "abs" for
// handles given where they lie, "aligned" to turn the other handle). "=> text" expects the
// keyframe table without handles, "=>h text" with them.

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "tests/support/SceneText.h"
#include "tests/support/StepScript.h"

inline void editScript(TQChannel& c, const std::string& script) {
    // The arguments of the step being run, as numbers, words, times and keyframes.
    tests_support::StepArgs a;
    CMTime t0, t1;
    TQKeyframeHandle k0 = nullptr, k1 = nullptr;
    const auto N = [&](size_t i) { return a.number(i); };
    const auto W = [&](size_t i) { return a.word(i); };
    const auto aligned = [&] { return W(3).find("aligned") != std::string::npos; };
    const tests_support::Steps ops = {
        {"key", [&] { c.setKeyframe(t0, N(1), W(2) == "r"); }},
        {"add", [&] { c.addKeyframe(&t0); }},
        {"addaxis", [&] { c.addKeyframeAtAxisTime(&t0); }},
        {"move", [&] { c.moveKeyframe(&t0, &t1, W(2) != "replace"); }},
        {"retime", [&] { c.setKeyframeTime(k0, &t1); }},
        {"clone", [&] { c.cloneKeyframe(k0, t1); }},
        {"value", [&] { c.setKeyframeValue(k0, N(1)); }},
        {"del", [&] { c.deleteKeyframe(k0); }},
        {"delaxis", [&] { c.deleteKeyframeAtAxisTime(&t0, W(1) != "last"); }},
        {"purge", [&] { c.purgeKeyframes(); }},
        {"interp", [&] { c.setKeyframeInterpolation(k0, unsigned(N(1))); }},
        {"interpall", [&] { c.setInterpolation(unsigned(N(0))); }},
        {"extrap", [&] { c.setExtrapolation(unsigned(N(0)), W(1) == "before"); }},
        {"in", [&] { c.setKeyframeInputTangents(k0, N(1), N(2), W(3) != "abs", aligned()); }},
        {"out", [&] { c.setKeyframeOutputTangents(k0, N(1), N(2), W(3) != "abs", aligned()); }},
        {"broken", [&] { c.setKeyframeTangentsBroken(k0, N(1) != 0); }},
        {"scaled", [&] { c.setKeyframeTangentsScaled(k0, N(1) != 0); }},
        {"smooth", [&] { c.smoothKeyframe(k0, W(1) != "keep"); }},
        {"reverse", [&] { c.reverseKeyframes(k0, k1); }},
        {"segment", [&] { c.setCurveSegmentValue(t0, N(1)); }},
        {"offset", [&] { c.offsetCurve(&t0, N(1)); }},
        {"initial", [&] { c.setInitialValue(N(0)); }},
        {"shift", [&] { c.setTimeOffset(t0); }},
    };
    tests_support::runSteps(
        script, a, ops,
        [&](const std::string& name) {
            if (name == "=>" || name == "=>h")
                EXPECT_EQ(keyText(c, name == "=>h"), a.rest) << "after the steps before " << name;
            else
                ADD_FAILURE() << "no such step: " << name;
        },
        [&] {
            t0 = TQTarnTimeForChannelSeconds(N(0), 0x40000);
            t1 = TQTarnTimeForChannelSeconds(N(1), 0x40000);
            k0 = c.getKeyframe(t0);
            k1 = c.getKeyframe(t1);
        });
}
