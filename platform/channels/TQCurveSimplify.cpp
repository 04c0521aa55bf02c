// TQChannel::simplifyCurve: gathers the span's samples, asks the fitter (internal/TQCurveFit)
// where keyframes go, and writes them into the keyframe table.

#include <algorithm>
#include <cmath>
#include <limits>

#include "platform/channels/TQChannel.h"
#include "platform/channels/internal/TQChannelData.h"
#include "platform/channels/internal/TQCurveFit.h"
#include "platform/channels/internal/TQSegmentForm.h"

using namespace tq_internal;

namespace {

constexpr size_t kMaxFrames = 10'000'000;
constexpr int kMaxSmoothness = 100;
// At tolerance 0 the curve must stay as it is, to within this fraction of its scale (its height
// plus its largest magnitude): what a refit of the same cubic loses to rounding.
constexpr double kExactness = 1e-10;
// The fitter keeps this fraction of the scale back from the tolerance, so that the channel's
// own evaluation of a fitted segment, rounded differently, still meets it.
constexpr double kRoundingGuard = 1e-12;

// One sample of the span: a frame, or the time of a keyframe the span has.
struct SpanSample {
    CMTime time;
    long key;  // position in the keyframe table of the keyframe standing here, or -1
};

// The samples of the span from keyframe `first` to keyframe `last` of `standing`: both ends,
// the frames strictly between, and the keyframes between, in time order. False when there are
// too many frames.
bool gatherSamples(const std::vector<const TQKeyframeRecord*>& standing, size_t first, size_t last,
                   const TQKeyframeRecord* table, const CMTime& frame,
                   std::vector<SpanSample>& out) {
    const CMTime start = standing[first]->time;
    const CMTime end = standing[last]->time;
    // Frames k * frame for k from kStart + 1 while earlier than `end`.
    const CMTime below = BN_CMTimeFloorToSampleDuration(start, frame);
    const CMTime atEnd = BN_CMTimeFloorToSampleDuration(end, frame);
    // Frames far out can come back on a coarser timescale, where the count below is wrong.
    if (!CMTIME_IS_NUMERIC(below) || !CMTIME_IS_NUMERIC(atEnd) ||
        below.timescale != frame.timescale || atEnd.timescale != frame.timescale) {
        return false;
    }
    const CMTimeValue kStart = below.value / frame.value;
    CMTimeValue kEnd = atEnd.value / frame.value;
    if (compareTimes(atEnd, end) == 0) --kEnd;  // the end itself is a sample of its own
    const CMTimeValue frames = std::max<CMTimeValue>(0, kEnd - kStart);
    if (uint64_t(frames) > kMaxFrames) return false;

    out.clear();
    out.reserve(size_t(frames) + (last - first) + 1);
    auto keyAt = [&](size_t i) { return long(standing[i] - table); };
    out.push_back({start, keyAt(first)});
    size_t next = first + 1;  // the next keyframe to merge in
    for (CMTimeValue k = kStart + 1; k <= kEnd; ++k) {
        const CMTime t = CMTimeMake(k * frame.value, frame.timescale);
        while (next < last && compareTimes(standing[next]->time, t) < 0) {
            out.push_back({standing[next]->time, keyAt(next)});
            ++next;
        }
        if (next < last && compareTimes(standing[next]->time, t) == 0) {
            out.push_back({standing[next]->time, keyAt(next)});
            ++next;
        } else if (compareTimes(t, start) > 0) {
            out.push_back({t, -1});
        }
    }
    for (; next < last; ++next) out.push_back({standing[next]->time, keyAt(next)});
    out.push_back({end, keyAt(last)});
    return true;
}

// The slope of a handle that stays on the outer side of an end of the span, when the fit
// should line up with it: the key's pair is unbroken and the handle shapes a Bezier segment.
double outerSlope(const TQKeyframeRecord& k, bool input, bool shapes) {
    constexpr double kNone = std::numeric_limits<double>::quiet_NaN();
    if (!shapes || k.broken) return kNone;
    const double u = input ? k.inU : k.outU;
    const double v = input ? k.inV : k.outV;
    if (input ? !(u < 0.0) : !(u > 0.0)) return kNone;
    return v / u;
}

}  // namespace

void TQChannel::simplifyCurve(const CMTime& start, const CMTime& end, const CMTime& frameDuration,
                              int shape, int smoothness, double tolerance, int placement) {
    if (!CMTIME_IS_NUMERIC(start) || !CMTIME_IS_NUMERIC(end) || !CMTIME_IS_NUMERIC(frameDuration) ||
        frameDuration.value <= 0) {
        return;
    }
    if (shape < kTQSimplifyConstant || shape > kTQSimplifyBezier) return;
    if (placement != kTQSimplifyOnFrames && placement != kTQSimplifyOnExistingKeyframes) return;
    if (!(tolerance >= 0.0) || !std::isfinite(tolerance) || smoothness < 0) return;

    std::vector<TQKeyframeRecord>& table = _d->keys;
    std::vector<const TQKeyframeRecord*> standing;
    collectStanding(table, standing);
    const auto firstIt = std::lower_bound(
        standing.begin(), standing.end(), start,
        [](const TQKeyframeRecord* k, const CMTime& t) { return compareTimes(k->time, t) < 0; });
    const auto endIt = std::upper_bound(
        standing.begin(), standing.end(), end,
        [](const CMTime& t, const TQKeyframeRecord* k) { return compareTimes(t, k->time) < 0; });
    if (endIt - firstIt < 2) return;
    const size_t first = size_t(firstIt - standing.begin());
    const size_t last = size_t(endIt - standing.begin()) - 1;

    std::vector<SpanSample> span;
    if (!gatherSamples(standing, first, last, table.data(), frameDuration, span)) return;
    const size_t n = span.size();

    // The curve at every sample, in one sorted walk.
    FitSamples fs;
    fs.t.resize(n);
    fs.y.resize(n);
    const CurveCache& curve = _d->curve();
    CurveCursor cursor;
    double lowest = std::numeric_limits<double>::infinity();
    double highest = -lowest;
    double magnitude = 0.0;
    for (size_t i = 0; i < n; ++i) {
        fs.t[i] = CMTimeGetSeconds(span[i].time);
        fs.y[i] = span[i].key >= 0 ? table[size_t(span[i].key)].value
                                   : curve.evaluate(fs.t[i], cursor, true);
        lowest = std::min(lowest, fs.y[i]);
        highest = std::max(highest, fs.y[i]);
        magnitude = std::max(magnitude, std::fabs(fs.y[i]));
    }
    const double height = highest - lowest;
    const double scale = height + magnitude;
    if (!std::isfinite(scale)) return;
    const double allowed = std::max(tolerance / 100.0 * height, kExactness * scale);
    const double fitTolerance = allowed - kRoundingGuard * scale;

    // Keyframes may go on every sample, or only where keyframes are; the ends and locked
    // keyframes stay. A keyframe that stays keeps its value, and so does every keyframe of the
    // curve while its segments may be kept whole: without smoothing, or with existing
    // placement.
    // A stepped channel is not smoothed: its values are levels (a boolean's off and on), and
    // its keyframes keep to them.
    const bool discrete = _d->discrete;
    const size_t radius = discrete ? 0 : size_t(std::min(smoothness, kMaxSmoothness));
    const bool onKeys = placement == kTQSimplifyOnExistingKeyframes;
    const bool keepWhole = radius == 0 || onKeys;
    // The smoothed curve keeps half the tolerance to itself, so that a fit of it has the other
    // half to spare.
    smoothedTargets(fs.t, fs.y, radius, 0.5 * fitTolerance, fs.target);
    fs.flags.assign(n, 0);
    fs.wholeTo.assign(n, 0);
    long previousKeySample = -1;
    for (size_t i = 0; i < n; ++i) {
        const bool isKey = span[i].key >= 0;
        const bool fixed = i == 0 || i + 1 == n || (isKey && table[size_t(span[i].key)].locked);
        if (!onKeys || isKey) fs.flags[i] |= kFitNode;
        if (fixed) fs.flags[i] |= kFitNode | kFitFixed;
        if (fixed || (isKey && keepWhole)) fs.target[i] = fs.y[i];
        if (isKey) {
            if (keepWhole && previousKeySample >= 0)
                fs.wholeTo[size_t(previousKeySample)] = uint32_t(i);
            previousKeySample = long(i);
        }
    }

    const TQKeyframeRecord& startKey = *standing[first];
    const TQKeyframeRecord& endKey = *standing[last];
    const FitShape fitShape =
        discrete || shape == kTQSimplifyConstant
            ? FitShape::Constant
            : (shape == kTQSimplifyLinear ? FitShape::Linear : FitShape::Bezier);
    // Catmull-Rom slopes at the keyframes of the old curve.
    auto oldSlope = [&](size_t i) {
        return catmullRomSlope(*standing[i == 0 ? 0 : i - 1],
                               *standing[i + 1 < standing.size() ? i + 1 : i]);
    };
    // A Catmull-Rom segment just outside the span takes its shape from the keyframe next to
    // it inside, which the fit replaces: it is written out as the Bezier segment it is, so
    // that the curve outside stays as it was. `outerBefore` and `outerAfter` are the outer
    // keyframes so written, stored after the announcement.
    auto writtenOut = [&](size_t i, TQKeyframeRecord& a, TQKeyframeRecord& b) {
        if (discrete || standing[i]->interpolation != kTQInterpolationCatmullRom) return false;
        BezierControl c;
        const CurveSegment segment =
            makeSegment(*standing[i], *standing[i + 1], kTQInterpolationCatmullRom, oldSlope(i),
                        oldSlope(i + 1));
        if (!bezierControl(segment, c)) return false;
        setBezierHandles(a, b, c);
        return true;
    };
    TQKeyframeRecord startView = startKey;
    TQKeyframeRecord endView = endKey;
    TQKeyframeRecord outerBefore = *standing[first > 0 ? first - 1 : first];
    TQKeyframeRecord outerAfter = *standing[last + 1 < standing.size() ? last + 1 : last];
    const bool writeBefore = first > 0 && writtenOut(first - 1, outerBefore, startView);
    const bool writeAfter = last + 1 < standing.size() && writtenOut(last, endView, outerAfter);

    auto bezierArrives = [&](size_t i) {
        return !discrete && standing[i]->interpolation == kTQInterpolationBezier;
    };
    const double alignStart =
        outerSlope(startView, true, first > 0 && (writeBefore || bezierArrives(first - 1)));
    const double alignEnd = outerSlope(
        endView, false, last + 1 < standing.size() && (writeAfter || bezierArrives(last)));
    const std::vector<FitKey> fit = fitCurve(fs, fitShape, fitTolerance, alignStart, alignEnd);
    auto standingIndexOf = [&](long key) {
        return size_t(std::lower_bound(standing.begin(), standing.end(), &table[size_t(key)]) -
                      standing.begin());
    };

    // The new keyframes of the span, ends included, in time order.
    std::vector<TQKeyframeRecord> fitted(fit.size());
    std::vector<uint8_t> isNew(fit.size(), 0);
    const unsigned code = fitShape == FitShape::Bezier
                              ? unsigned(kTQInterpolationBezier)
                              : (fitShape == FitShape::Linear ? unsigned(kTQInterpolationLinear)
                                                              : unsigned(kTQInterpolationConstant));
    for (size_t j = 0; j < fit.size(); ++j) {
        const SpanSample& at = span[fit[j].index];
        TQKeyframeRecord& k = fitted[j];
        if (at.key >= 0) {
            k = table[size_t(at.key)];
        } else {
            k.serial = nextKeyframeSerial();
            k.time = at.time;
            k.seconds = fs.t[fit[j].index];
            isNew[j] = 1;
        }
        k.value = fit[j].value;
    }
    if (writeBefore) {
        fitted.front().inU = startView.inU;
        fitted.front().inV = startView.inV;
    }
    if (writeAfter) {
        fitted.back().outU = endView.outU;
        fitted.back().outV = endView.outV;
        fitted.back().interpolation = endView.interpolation;
    }
    for (size_t j = 0; j + 1 < fit.size(); ++j) {
        TQKeyframeRecord& a = fitted[j];
        TQKeyframeRecord& b = fitted[j + 1];
        if (fit[j].wholeOut) {
            // The old segment as it was: its handles are on the copied records already. A
            // Catmull-Rom segment is written out, unless both its neighbours stay.
            const size_t ia = standingIndexOf(span[fit[j].index].key);
            const size_t ib = ia + 1;
            if (!discrete && a.interpolation == kTQInterpolationCatmullRom) {
                const bool sameBefore = ia == first
                                            ? true
                                            : (j > 0 && span[fit[j - 1].index].key ==
                                                            long(standing[ia - 1] - table.data()));
                const bool sameAfter =
                    ib == last ? true
                               : (j + 2 < fit.size() && span[fit[j + 2].index].key ==
                                                            long(standing[ib + 1] - table.data()));
                if (!sameBefore || !sameAfter) {
                    BezierControl c;
                    if (bezierControl(
                            makeSegment(a, b, a.interpolation, oldSlope(ia), oldSlope(ib)), c)) {
                        setBezierHandles(a, b, c);
                    }
                }
            }
            continue;
        }
        a.interpolation = code;
        if (fitShape != FitShape::Bezier) continue;
        const double d = b.seconds - a.seconds;
        a.outU = d / 3.0;
        a.outV = fit[j].outSlope * d / 3.0;
        b.inU = -d / 3.0;
        b.inV = -fit[j + 1].inSlope * d / 3.0;
    }

    noteWillChange(true);
    if (writeBefore) table[size_t(standing[first - 1] - table.data())] = outerBefore;
    if (writeAfter) table[size_t(standing[last + 1] - table.data())] = outerAfter;
    // The table: keyframes before the span's end keyframes, then the span's, then the rest. Of
    // the keyframes inside, locked ones that don't shape the curve stay where they were,
    // ahead of a fitted keyframe at the same time.
    const size_t firstPos = size_t(standing[first] - table.data());
    const size_t lastPos = size_t(standing[last] - table.data());
    std::vector<TQKeyframeRecord> rebuilt;
    rebuilt.reserve(firstPos + fitted.size() + (table.size() - lastPos));
    rebuilt.insert(rebuilt.end(), table.begin(), table.begin() + long(firstPos));
    size_t j = 0;
    for (size_t pos = firstPos; pos <= lastPos; ++pos) {
        const TQKeyframeRecord& old = table[pos];
        const bool isStanding = &old == standing[standingIndexOf(long(pos))];
        while (j < fitted.size() && compareTimes(fitted[j].time, old.time) < 0) {
            rebuilt.push_back(fitted[j++]);
        }
        if (isStanding && (pos == firstPos || pos == lastPos || old.locked)) {
            rebuilt.push_back(fitted[j++]);  // a keyframe that stays comes as fitted
            continue;
        }
        const bool atEnd =
            compareTimes(old.time, startKey.time) == 0 || compareTimes(old.time, endKey.time) == 0;
        if (atEnd || (old.locked && !isStanding)) rebuilt.push_back(old);
    }
    while (j < fitted.size()) rebuilt.push_back(fitted[j++]);
    rebuilt.insert(rebuilt.end(), table.begin() + long(lastPos) + 1, table.end());

    table.swap(rebuilt);
    _d->orderChanged();

    // Handles: automatic on new keyframes of the other shapes; broken where a pair does not
    // line up.
    for (size_t pos = 0, f = 0; pos < table.size() && f < fitted.size(); ++pos) {
        if (table[pos].serial != fitted[f].serial) continue;
        TQKeyframeRecord& k = table[pos];
        if (isNew[f] && fitShape != FitShape::Bezier) autoTangents(table, pos);
        k.broken = (isNew[f] ? false : k.broken) || !handlesAligned(k);
        ++f;
    }
}
