#pragma once
// Keyframe edits as a script of steps separated by ";", each a name and its arguments, times in
// seconds. A keyframe is named by its time (the last arrival there) or by its letter: each
// keyframe gets the next letter the first time it shows, so one that lives through an edit
// keeps its letter and a new one takes the next. "in" and "out" take "abs" for handles given
// where they lie, "aligned" to turn the other handle; "set -" sets the value without a time.
// The record has a line a step: the step, then the keyframe table with handles, each keyframe
// led by its letter ("same" when the step changed nothing), or for a step ending in "?" what
// it read.

#include <gtest/gtest.h>

#include <cctype>
#include <map>
#include <sstream>
#include <string>

#include "platform/channels/TQChannel.h"
#include "tests/support/SceneText.h"
#include "tests/support/StepScript.h"

class KeyframeScript {
public:
    explicit KeyframeScript(TQChannel& channel) : c(channel) {}

    std::string run(const std::string& script) {
        tests_support::StepArgs a;
        CMTime t0, t1;
        TQKeyframeHandle k0 = nullptr, k1 = nullptr;
        std::ostringstream read;  // what a reading step answers
        const auto N = [&](size_t i) { return a.number(i); };
        const auto W = [&](size_t i) { return a.word(i); };
        const auto aligned = [&] { return W(3).find("aligned") != std::string::npos; };
        const auto S = [](const CMTime& t) { return CMTimeGetSeconds(t); };
        const auto tangents = [&](const char* in, bool relative) {
            double u = 0, v = 0, ou = 0, ov = 0;
            c.getKeyframeInputTangents(k0, &u, &v, relative);
            c.getKeyframeOutputTangents(k0, &ou, &ov, relative);
            read << in << " (" << u << "," << v << ") out (" << ou << "," << ov << ")";
        };
        const tests_support::Steps steps = {
            {"key", [&] { c.setKeyframe(t0, N(1), W(2) == "r"); }},
            {"add", [&] { c.addKeyframe(&t0); }},
            {"addaxis", [&] { c.addKeyframeAtAxisTime(&t0); }},
            {"move", [&] { c.moveKeyframe(&t0, &t1, W(2) != "replace"); }},
            {"retime",
             [&] {
                 const double value = N(2);
                 bool collided = false;
                 c.setKeyframeTime(k0, &t1, a.words.size() > 2 ? &value : nullptr, &collided);
                 read << (collided ? "collided" : "");
             }},
            {"clone", [&] { c.cloneKeyframe(k0, t1); }},
            {"value", [&] { c.setKeyframeValue(k0, N(1)); }},
            {"enable", [&] { c.setKeyframeEnabled(k0, N(1) != 0); }},
            {"del", [&] { c.deleteKeyframe(k0); }},
            {"delat", [&] { c.deleteKeyframeAtTime(&t0); }},
            {"delaxis", [&] { c.deleteKeyframeAtAxisTime(&t0, W(1) != "last"); }},
            {"delall", [&] { c.deleteAllKeyframes(t0); }},
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
            {"anim", [&] { c.setAnimationEnabled(N(0) != 0); }},
            {"set", [&] { c.setValue(W(0) == "-" ? nullptr : &t0, N(1)); }},
            {"now", [&] { c.setRootCurrentTime(t0); }},
            {"at?", [&] { read << label(c.getKeyframe(t0)); }},
            {"curve?", [&] { read << c.getCurveValue(t0); }},
            {"shown?", [&] { read << c.getValueAsDouble(t0, N(1)); }},
            {"initial?", [&] { read << c.getInitialValue(); }},
            {"animated?", [&] { read << c.canKeyframe() << c.isAnimated(); }},
            {"extremes?",
             [&] {
                 read << c.getKeyframeMinValue(false) << " " << c.getKeyframeMaxValue(false)
                      << ", enabled " << c.getKeyframeMinValue() << " " << c.getKeyframeMaxValue();
             }},
            {"handles?", [&] { tangents("where they lie: in", false); }},
            {"time?",
             [&] {
                 read << "channel " << S(c.toChannelTime(&t0)) << ", now "
                      << S(c.getRootCurrentTime()) << " on the axis "
                      << S(c.getRootCurrentTime(false));
             }},
            // The neighbours before and after (of any keyframe, then of enabled ones), the one
            // within 0.45 s, and the enabled keyframe before the one there.
            {"near?",
             [&] {
                 const auto found = [&](bool ok, const CMTime& t) {
                     if (ok)
                         read << " " << S(t);
                     else
                         read << " -";
                 };
                 CMTime p = t0, pe = t0, n = t0, ne = t0, h = t0, same = t0;
                 read << "before";
                 found(c.previousKeyframeTime(&p), p);
                 found(c.previousKeyframeTime(&pe, true), pe);
                 found(c.getPreviousKeyframe(same, &same, nullptr), same);  // may alias
                 read << ", after";
                 found(c.nextKeyframeTime(&n), n);
                 found(c.nextKeyframeTime(&ne, true), ne);
                 read << ", near";
                 found(c.hasKeyframeAtTime(&h, 0.45), h);
                 read << ", enabled before " << label(c.getPreviousEnabledKeyframe(k0));
             }},
        };
        const auto each = [&] {
            const auto keyframe = [&](size_t i, CMTime& t) {
                t = TQTarnTimeForChannelSeconds(N(i), 0x40000);
                const std::string w = W(i);
                if (w.size() != 1 || !std::islower(static_cast<unsigned char>(w[0])))
                    return c.getKeyframe(t);
                for (const auto& [handle, letter] : letters)
                    if (letter == w[0]) return handle;
                return TQKeyframeHandle(nullptr);
            };
            k0 = keyframe(0, t0);
            k1 = keyframe(1, t1);
        };
        std::string record, before = table();
        const auto note = [&](const std::string& step) {
            const std::string after = table();
            if (step.substr(0, step.find(' ')).back() == '?')
                record += step + ": " + read.str() + "\n";
            else
                record += step + ": " + (after == before ? "same" : after) +
                          (read.str().empty() ? "" : "; " + read.str()) + "\n";
            before = after;
            read.str("");
        };
        tests_support::runSteps(script, a, steps, {}, each, note);
        return record;
    }

private:
    std::string label(TQKeyframeHandle h) {
        if (!h) return "-";
        return std::string(1, letters.try_emplace(h, char('a' + letters.size())).first->second);
    }
    // keyText with handles, each keyframe led by its letter.
    std::string table() {
        std::istringstream keys(keyText(c, true));
        std::string out;
        const auto handles = c.getKeyframes(false);
        size_t i = 0;
        for (std::string k; keys >> k; ++i) {
            if (!out.empty()) out += ' ';
            if (i < handles.size()) out += label(handles[i]);
            out += k;
        }
        return out;
    }

    TQChannel& c;
    std::map<TQKeyframeHandle, char> letters;
};
