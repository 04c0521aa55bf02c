#pragma once
// Channels as text, so that a test states the whole table a user would see after an edit.
// keyText: "seconds=value" per keyframe in table order, then "/code" for an interpolation
// other than Bezier, "!" disabled, "L" locked, and with handles "(inU,inV|outU,outV)" and "b"
// broken, "s" scaled; a channel without keyframes shows its initial value, "(5)". sceneText:
// "Name: keyText" for every channel under a root, joined by "; ". Numbers have six
// significant digits unless told otherwise.

#include <sstream>
#include <string>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"

inline std::string keyText(const TQChannel& c, bool handles = false, int digits = 6) {
    std::ostringstream out;
    out.precision(digits);
    for (TQKeyframeHandle h : c.getKeyframes(false)) {
        CMTime t;
        double v = 0, iu = 0, iv = 0, ou = 0, ov = 0;
        c.getKeyframe(h, &t, &v);
        out << (out.tellp() > 0 ? " " : "") << CMTimeGetSeconds(t) << "=" << v + 0.0;
        if (c.getKeyframeInterpolation(h) != kTQInterpolationBezier)
            out << "/" << c.getKeyframeInterpolation(h);
        if (!c.getKeyframeEnabled(h)) out << "!";
        if (c.getKeyframeLocked(h)) out << "L";
        if (!handles) continue;
        c.getKeyframeInputTangents(h, &iu, &iv);
        c.getKeyframeOutputTangents(h, &ou, &ov);
        // + 0.0 turns -0 into 0.
        out << "(" << iu + 0.0 << "," << iv + 0.0 << "|" << ou + 0.0 << "," << ov + 0.0 << ")";
        if (c.getKeyframeTangentsBroken(h)) out << "b";
        if (c.getKeyframeTangentsScaled(h)) out << "s";
    }
    if (c.numberOfKeyframes() == 0) out << "(" << c.getInitialValue() + 0.0 << ")";
    return out.str();
}

inline std::string sceneText(const TQChannelBase& root, bool handles = false) {
    std::vector<TQChannelBase*> all;
    static_cast<const TQChannelFolder&>(root).getAllDescendantsFlattened(all, 0, true);
    std::string out;
    for (const TQChannelBase* node : all)
        if (const auto* c = dynamic_cast<const TQChannel*>(node))
            out += (out.empty() ? "" : "; ") + c->getName() + ": " + keyText(*c, handles);
    return out;
}

// Keyframes from keyText's form, added to the channel: "t=v" each, t in seconds (at
// `timescale`) or a rational time "31/30"; "/code" an interpolation, "!" disabled, "L"
// locked, and handles "(inU,inV|outU,outV)" with "b" broken and "s" scaled. A keyframe with
// handles and no code is Bezier.
inline void addKeys(TQChannel& c, const std::string& text, int32_t timescale) {
    std::istringstream in(text);
    for (std::string k; in >> k;) {
        const size_t slash = k.find('/'), eq = k.find('='), open = k.find('(');
        const auto h =
            c.setKeyframe(slash < eq ? CMTimeMake(std::stoi(k), std::stoi(k.substr(slash + 1)))
                                     : CMTimeMakeWithSeconds(std::stod(k), timescale),
                          std::stod(k.substr(eq + 1)));
        c.setKeyframeLocked(h, k.find('L') != k.npos);
        c.setKeyframeEnabled(h, k.find('!') == k.npos);
        if (const size_t code = k.find('/', eq); code != k.npos)
            c.setKeyframeInterpolation(h, unsigned(std::stoi(k.substr(code + 1))));
        else if (open != k.npos)
            c.setKeyframeInterpolation(h, kTQInterpolationBezier);
        if (open == k.npos) continue;
        double t[4];
        char sep = 0;
        std::istringstream(k.substr(open + 1)) >> t[0] >> sep >> t[1] >> sep >> t[2] >> sep >> t[3];
        c.setKeyframeInputTangents(h, t[0], t[1], true);
        c.setKeyframeOutputTangents(h, t[2], t[3], true);
        c.setKeyframeTangentsBroken(h, k.find(")b") != k.npos);
        c.setKeyframeTangentsScaled(h, k.back() == 's');
    }
}

// Keyframe times of the channel in seconds, in order.
inline std::vector<double> keyTimes(const TQChannel* channel) {
    std::vector<double> out;
    for (TQKeyframeHandle h : channel->getKeyframes(false)) {
        CMTime t = kCMTimeInvalid;
        channel->getKeyframe(h, &t, nullptr);
        out.push_back(CMTimeGetSeconds(t));
    }
    return out;
}
