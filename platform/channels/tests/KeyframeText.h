#pragma once
// A channel's keyframes as one line of text, so that a test states the whole table a user
// would see after an edit: "seconds=value" per keyframe in table order, then "/code" for an
// interpolation other than Bezier, "!" disabled, "L" locked, and with handles
// "(inU,inV|outU,outV)" and "b" broken, "s" scaled. Numbers have six significant digits.

#include <sstream>
#include <string>

#include "platform/channels/TQChannel.h"

inline std::string keyText(const TQChannel& c, bool handles = false) {
    std::ostringstream out;
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
    return out.str();
}
