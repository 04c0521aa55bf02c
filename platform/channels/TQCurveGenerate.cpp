// TQChannel::generateKeypoints: copies cycles of the curve beside it as its extrapolation shows
// them, and joins them into one run of keyframes.

#include <algorithm>
#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/internal/TQChannelData.h"
#include "platform/channels/internal/TQSegmentForm.h"

using namespace tq_internal;

namespace {

constexpr uint64_t kMaxKeyframes = 10'000'000;

// How long a jump of the curve takes once it is made of keyframes.
CMTime tick() { return CMTimeMake(1, 0x40000); }

// A run of keyframes in time order: one cycle, or the existing keyframe at the seam.
using Block = std::vector<TQKeyframeRecord>;

void setTime(TQKeyframeRecord& k, const CMTime& time) {
    k.time = time;
    k.seconds = CMTimeGetSeconds(time);
}

TQKeyframeRecord copyAt(const TQKeyframeRecord& k, const CMTime& time) {
    TQKeyframeRecord copy = k;
    copy.serial = nextKeyframeSerial();
    setTime(copy, time);
    return copy;
}

// The keyframe as it shows in a cycle run backwards: handles mirrored and swapped.
TQKeyframeRecord mirrorAt(const TQKeyframeRecord& k, const CMTime& time) {
    TQKeyframeRecord copy = copyAt(k, time);
    copy.inU = -k.outU;
    copy.inV = k.outV;
    copy.outU = -k.inU;
    copy.outV = k.inV;
    return copy;
}

unsigned evaluatedCode(const TQKeyframeRecord& k, bool discrete) {
    return discrete ? unsigned(kTQInterpolationConstant) : k.interpolation;
}

// Cuts the segment from a to b at `at`, strictly inside it: keepFirst keeps the part before,
// with b moved to `at`; otherwise the part after, with a moved there. The part kept is the same
// curve (for Bezier and polynomial kinds as a Bezier segment), but for Exp and Log, whose
// shape is squeezed into the shorter span. A time outside the segment cuts nothing.
void cutSegment(TQKeyframeRecord& a, TQKeyframeRecord& b, const CMTime& at, bool keepFirst,
                bool discrete) {
    if (compareTimes(a.time, at) >= 0 || compareTimes(at, b.time) >= 0) return;
    TQKeyframeRecord& moved = keepFirst ? b : a;
    const unsigned code = evaluatedCode(a, discrete);
    if (code == kTQInterpolationConstant) {
        if (keepFirst) moved.value = a.value;  // the held value, up to the cut
        setTime(moved, at);
        return;
    }
    // Catmull-Rom segments never get here: those at a cycle's ends are written out first.
    const CurveSegment segment = makeSegment(a, b, code, 0.0, 0.0);
    const double s = segmentParameter(segment, CMTimeGetSeconds(at));
    BezierControl control;
    if (code == kTQInterpolationLinear || !bezierControl(segment, control)) {
        moved.value = segmentValue(segment, s);
        setTime(moved, at);
        return;
    }
    const BezierControl part = keepFirst ? subdivide(control, 0.0, s) : subdivide(control, s, 1.0);
    setTime(moved, at);
    moved.value = keepFirst ? part.v[3] : part.v[0];
    setBezierHandles(a, b, part);
}

struct Baker {
    std::vector<const TQKeyframeRecord*> standing;
    Block cycle;  // the standing keyframes, Catmull-Rom segments that copies change written out
    unsigned mode = 0;
    bool discrete = false;
    CMTime period = kCMTimeZero;
    double rise = 0.0;  // of one cycle, for progressive

    // Cycle k (k = 0 being the keyframes themselves), in time order.
    Block copy(int32_t k) const;
    // Joins two neighbouring blocks where they meet; leftOriginal tells that the left block is
    // the existing keyframe at the seam. An existing keyframe on the right needs no word: the
    // right side's keyframe is the one kept there anyway.
    void join(Block& left, Block& right, bool leftOriginal) const;
    // Repeated cycles whose ends differ in value: the curve jumps at every seam.
    bool jumps() const;
};

Block Baker::copy(int32_t k) const {
    const size_t n = cycle.size();
    const CMTime shift = CMTimeMultiply(period, k);
    Block out;
    out.reserve(2 * n);
    if (mode != kTQExtrapolationPingPong || k % 2 == 0) {
        for (const TQKeyframeRecord& key : cycle) {
            out.push_back(copyAt(key, CMTimeAdd(key.time, shift)));
            if (mode == kTQExtrapolationProgressive) out.back().value += double(k) * rise;
        }
        return out;
    }
    // Mirrored: the keyframe at time t of the cycle comes at pivot - t, and each segment's code
    // goes, mirrored, to the keyframe that now starts it.
    const CMTime pivot = CMTimeAdd(CMTimeAdd(cycle.front().time, cycle.back().time), shift);
    for (size_t i = n; i-- > 0;) {
        out.push_back(mirrorAt(cycle[i], CMTimeSubtract(pivot, cycle[i].time)));
        if (i == 0) break;
        const TQKeyframeRecord& earlier = cycle[i - 1];
        out.back().interpolation = mirroredInterpolation(earlier.interpolation);
        if (evaluatedCode(earlier, discrete) != kTQInterpolationConstant) continue;
        // A step run backwards: the value of the keyframe before comes at once, which takes a
        // keyframe a tick later holding it.
        const CMTime at = CMTimeAdd(out.back().time, tick());
        if (compareTimes(at, CMTimeSubtract(pivot, earlier.time)) >= 0) continue;
        out.back().interpolation = kTQInterpolationConstant;
        out.push_back(mirrorAt(earlier, at));
        out.back().interpolation = kTQInterpolationConstant;
    }
    return out;
}

bool Baker::jumps() const {
    if (mode != kTQExtrapolationRepeat) return false;
    const double a = cycle.front().value, b = cycle.back().value;
    return std::fabs(a - b) > 1e-12 * (std::fabs(a) + std::fabs(b));
}

void Baker::join(Block& left, Block& right, bool leftOriginal) const {
    TQKeyframeRecord& l = left.back();
    TQKeyframeRecord& r = right.front();
    if (!jumps()) {
        // One keyframe: the arriving side of the left, the leaving side of the right, kept on
        // the existing keyframe if one of them is.
        TQKeyframeRecord merged = leftOriginal ? l : r;
        merged.inU = l.inU;
        merged.inV = l.inV;
        merged.outU = r.outU;
        merged.outV = r.outV;
        merged.interpolation = r.interpolation;
        merged.locked = l.locked || r.locked;
        merged.broken = l.broken || r.broken || !handlesAligned(merged);
        if (leftOriginal) {
            l = merged;
            right.erase(right.begin());
        } else {
            r = merged;
            left.pop_back();
        }
        return;
    }
    if (leftOriginal) {
        // The existing last keyframe keeps its value: the next cycle starts a tick after it.
        cutSegment(right[0], right[1], CMTimeAdd(l.time, tick()), false, discrete);
        l.interpolation = kTQInterpolationLinear;
        return;
    }
    // Elsewhere the seam's time belongs to the cycle that starts there: the cycle before ends a
    // tick earlier.
    cutSegment(left[left.size() - 2], l, CMTimeSubtract(r.time, tick()), true, discrete);
    l.interpolation = kTQInterpolationLinear;
}

// Merges `added` (in time order) into the table; at equal times the existing keyframes come
// first, so that the added one stands.
void mergeInto(std::vector<TQKeyframeRecord>& table, const Block& added) {
    std::vector<TQKeyframeRecord> merged;
    merged.reserve(table.size() + added.size());
    size_t j = 0;
    for (const TQKeyframeRecord& k : table) {
        while (j < added.size() && compareTimes(added[j].time, k.time) < 0)
            merged.push_back(added[j++]);
        merged.push_back(k);
    }
    merged.insert(merged.end(), added.begin() + long(j), added.end());
    table.swap(merged);
}

}  // namespace

void TQChannel::generateKeypoints(unsigned direction, unsigned cycles) {
    if (cycles == 0) return;
    if (direction != kTQExtrapolationBefore && direction != kTQExtrapolationAfter) return;
    std::vector<TQKeyframeRecord>& table = _d->keys;
    Baker baker;
    collectStanding(table, baker.standing);
    const std::vector<const TQKeyframeRecord*>& standing = baker.standing;
    const size_t n = standing.size();
    if (n < 2) return;
    const bool before = direction == kTQExtrapolationBefore;
    baker.mode = before ? _d->extrapolationBefore : _d->extrapolationAfter;
    baker.discrete = _d->discrete;
    const bool cyclic = baker.mode == kTQExtrapolationPingPong ||
                        baker.mode == kTQExtrapolationRepeat ||
                        baker.mode == kTQExtrapolationProgressive;
    const TQKeyframeRecord& firstKey = *standing.front();
    const TQKeyframeRecord& lastKey = *standing.back();
    baker.period = CMTimeSubtract(lastKey.time, firstKey.time);
    baker.rise = lastKey.value - firstKey.value;
    if (!CMTIME_IS_NUMERIC(baker.period) || baker.period.value <= 0) return;
    // At most two keyframes per segment of a cycle (a mirrored step) and two at each seam.
    const uint64_t perCycle = cyclic ? 2 * uint64_t(n) + 2 : 1;
    if (table.size() + uint64_t(cycles) * perCycle > kMaxKeyframes) return;
    const int32_t count = int32_t(cycles);
    // Time arithmetic that overflows rounds (or saturates); keyframe times may carry the
    // rounding flag of their making, which is wiped here so that it tells of overflow only.
    auto exact = [](CMTime t) {
        t.flags &= ~kCMTimeFlags_HasBeenRounded;
        return t;
    };
    const CMTime reach = CMTimeMultiply(exact(baker.period), count);
    const CMTime far = before ? CMTimeSubtract(exact(firstKey.time), reach)
                              : CMTimeAdd(exact(lastKey.time), reach);
    if (!CMTIME_IS_NUMERIC(far) || (far.flags & kCMTimeFlags_HasBeenRounded)) return;

    const size_t seamPos = size_t((before ? standing.front() : standing.back()) - table.data());
    // A Catmull-Rom segment takes its shape from the keyframes on either side of it. Those
    // whose neighbours change are written out as the Bezier segments they are: the existing one
    // beside the seam, and in the copies the two at each end (a seam brings new neighbours, and
    // a cut at a jump moves the end keyframe) and, in mirrored copies, those beside a step
    // (whose reversal adds a keyframe).
    auto oldSlope = [&](size_t i) {
        return catmullRomSlope(*standing[i == 0 ? 0 : i - 1], *standing[i + 1 < n ? i + 1 : i]);
    };
    auto writeOut = [&](TQKeyframeRecord& a, TQKeyframeRecord& b, size_t i) {
        if (evaluatedCode(*standing[i], baker.discrete) != kTQInterpolationCatmullRom) return;
        BezierControl c;
        const CurveSegment s =
            makeSegment(*standing[i], *standing[i + 1], kTQInterpolationCatmullRom, oldSlope(i),
                        oldSlope(i + 1));
        if (bezierControl(s, c)) setBezierHandles(a, b, c);
    };
    auto atTable = [&](size_t i) -> TQKeyframeRecord& {
        return table[size_t(standing[i] - table.data())];
    };

    noteWillChange(true);
    const size_t side = before ? 0 : n - 2;
    writeOut(atTable(side), atTable(side + 1), side);
    Block added;
    if (!cyclic) {
        // The held value or the line, one keyframe per cycle length, valued by the curve.
        const CurveCache& curve = _d->curve();
        CurveCursor cursor;
        const unsigned code = baker.mode == kTQExtrapolationLinear
                                  ? unsigned(kTQInterpolationLinear)
                                  : unsigned(kTQInterpolationConstant);
        const TQKeyframeRecord& end = before ? firstKey : lastKey;
        for (int32_t k = count; k >= 1; --k) {
            const CMTime shift = CMTimeMultiply(baker.period, before ? -k : count + 1 - k);
            added.push_back(copyAt(end, CMTimeAdd(end.time, shift)));
            added.back().value = curve.evaluate(added.back().seconds, cursor, true);
            added.back().interpolation = code;
        }
        if (!before) table[seamPos].interpolation = code;
    } else {
        for (const TQKeyframeRecord* k : standing) baker.cycle.push_back(*k);
        auto steps = [&](size_t i) {
            return i + 1 < n &&
                   evaluatedCode(*standing[i], baker.discrete) == kTQInterpolationConstant;
        };
        const bool mirrored = baker.mode == kTQExtrapolationPingPong;
        for (size_t i = 0; i + 1 < n; ++i) {
            const bool nearEnd = i < 2 || i + 3 >= n;
            const bool besideStep = mirrored && ((i > 0 && steps(i - 1)) || steps(i + 1));
            if (nearEnd || besideStep) writeOut(baker.cycle[i], baker.cycle[i + 1], i);
        }

        // The blocks in time order, the existing keyframe at the seam among them.
        std::vector<Block> blocks;
        blocks.reserve(size_t(count) + 2);
        if (!before) blocks.push_back({table[seamPos]});
        for (int32_t k = 1; k <= count; ++k)
            blocks.push_back(baker.copy(before ? k - 1 - count : k));
        if (before) blocks.push_back({table[seamPos]});
        const size_t original = before ? blocks.size() - 1 : 0;
        for (size_t b = 0; b + 1 < blocks.size(); ++b) {
            baker.join(blocks[b], blocks[b + 1], b == original);
        }
        if (!before && baker.jumps()) {
            // The time where the baked cycles end belongs to the cycle after them.
            Block start{copyAt(baker.cycle.front(), far)};
            baker.join(blocks.back(), start, false);
            blocks.push_back(start);
        }
        table[seamPos] = blocks[original].front();
        for (size_t b = 0; b < blocks.size(); ++b) {
            if (b != original) added.insert(added.end(), blocks[b].begin(), blocks[b].end());
        }
    }
    mergeInto(table, added);
    _d->orderChanged();
    if (cyclic) return;
    // Baked lines get automatic handles, which lie along them.
    for (size_t pos = 0, j = 0; pos < table.size() && j < added.size(); ++pos) {
        if (table[pos].serial == added[j].serial) {
            autoTangents(table, pos);
            ++j;
        }
    }
}
