#include "platform/channels/internal/TQCurveFit.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace tq_internal {

namespace {

// The pull of a Bezier segment's slopes towards its chord, relative to the weight of one sample
// inside it (about 0.02 d^2): far too faint to move a fit that has samples to follow, and enough
// to settle the slopes of a segment that has none.
constexpr double kChordPull = 1e-9;

// Rounds of the handle alignment before every keyframe is let go (see alignSlopes). A round
// costs the samples of the span; a failing segment frees only its two keyframes, so without a
// bound a long chain could take a round per keyframe.
constexpr size_t kMaxAlignRounds = 8;

// Nodes of a layer of the placement tried as the start of the next segment, at most.
constexpr size_t kLayerCandidates = 64;

// Hermite basis on s in [0, 1]: value = ya h00 + yb h01 + d (mOut h10 + mIn h11).
struct Hermite {
    double h00, h01, h10, h11;
};

inline Hermite hermite(double s) {
    const double u = 1.0 - s;
    return {(1.0 + 2.0 * s) * u * u, s * s * (3.0 - 2.0 * s), s * u * u, -s * s * u};
}

// The normal equations of one Bezier segment in its two slopes (out of a, into b), chord pull
// included.
struct SegmentSums {
    double a11 = 0.0, a12 = 0.0, a22 = 0.0, b1 = 0.0, b2 = 0.0;
};

struct Slopes {
    double out = 0.0;  // leaving the segment's first keyframe
    double in = 0.0;   // arriving at its last
};

Slopes solve(const SegmentSums& m) {
    const double det = m.a11 * m.a22 - m.a12 * m.a12;
    return {(m.b1 * m.a22 - m.b2 * m.a12) / det, (m.a11 * m.b2 - m.a12 * m.b1) / det};
}

// A chain of keyframes (sample indices) and, for each segment, whether it is kept whole.
struct Chain {
    std::vector<size_t> keys;
    std::vector<uint8_t> whole;
};

class Fitter {
public:
    Fitter(const FitSamples& s, FitShape shape, double tolerance)
        : _s(s), _shape(shape), _tol(tolerance) {}

    // The keyframes from fixed sample lo to fixed sample hi, both included.
    void place(size_t lo, size_t hi, std::vector<size_t>& out);

    bool isWhole(size_t a, size_t b) const { return _s.wholeTo[a] == b; }
    SegmentSums sums(size_t a, size_t b) const;
    bool bezierFits(size_t a, size_t b, Slopes m) const;

private:
    bool feasible(size_t a, size_t b) const { return isWhole(a, b) || fits(a, b); }
    bool fits(size_t a, size_t b) const;
    bool feasibleNodes(size_t i, size_t j) const { return feasible(_nodes[i], _nodes[j]); }
    size_t reachOf(size_t i, size_t& hint) const;
    void fillGreedily(size_t from, size_t to, std::vector<size_t>& path) const;

    const FitSamples& _s;
    FitShape _shape;
    double _tol;
    // Buffers of place, kept across the runs between fixed samples.
    std::vector<size_t> _nodes;  // sample indices of the nodes of the run being placed
    std::vector<size_t> _chain;  // node indices: the best node of each layer
    std::vector<size_t> _path;   // node indices of the chain as checked
};

SegmentSums Fitter::sums(size_t a, size_t b) const {
    const double ta = _s.t[a];
    const double d = _s.t[b] - ta;
    const double inv = 1.0 / d;
    const double ya = _s.target[a], yb = _s.target[b];
    SegmentSums m;
    for (size_t k = a + 1; k < b; ++k) {
        const Hermite h = hermite((_s.t[k] - ta) * inv);
        const double r = _s.target[k] - ya * h.h00 - yb * h.h01;
        const double c1 = d * h.h10, c2 = d * h.h11;
        m.a11 += c1 * c1;
        m.a12 += c1 * c2;
        m.a22 += c2 * c2;
        m.b1 += r * c1;
        m.b2 += r * c2;
    }
    const double pull = kChordPull * d * d;
    const double chord = (yb - ya) * inv;
    m.a11 += pull;
    m.a22 += pull;
    m.b1 += pull * chord;
    m.b2 += pull * chord;
    return m;
}

bool Fitter::bezierFits(size_t a, size_t b, Slopes m) const {
    const double ta = _s.t[a];
    const double d = _s.t[b] - ta;
    const double inv = 1.0 / d;
    const double ya = _s.target[a], yb = _s.target[b];
    const double wOut = d * m.out, wIn = d * m.in;
    for (size_t k = a + 1; k < b; ++k) {
        const Hermite h = hermite((_s.t[k] - ta) * inv);
        const double v = ya * h.h00 + yb * h.h01 + wOut * h.h10 + wIn * h.h11;
        if (!(std::fabs(v - _s.y[k]) <= _tol)) return false;
    }
    return true;
}

bool Fitter::fits(size_t a, size_t b) const {
    switch (_shape) {
        case FitShape::Bezier: return bezierFits(a, b, solve(sums(a, b)));
        case FitShape::Linear: {
            const double ta = _s.t[a];
            const double inv = 1.0 / (_s.t[b] - ta);
            const double ya = _s.target[a], rise = _s.target[b] - ya;
            for (size_t k = a + 1; k < b; ++k) {
                const double v = ya + rise * ((_s.t[k] - ta) * inv);
                if (!(std::fabs(v - _s.y[k]) <= _tol)) return false;
            }
            return true;
        }
        case FitShape::Constant: {
            const double v = _s.target[a];
            for (size_t k = a + 1; k < b; ++k) {
                if (!(std::fabs(v - _s.y[k]) <= _tol)) return false;
            }
            return true;
        }
    }
    return false;
}

// The farthest node that node i reaches with one fitting segment, by galloping search from
// `hint` (the reach of the node before, where the answer mostly lies), taken as if reaching
// a node meant reaching every node before it.
size_t Fitter::reachOf(size_t i, size_t& hint) const {
    const size_t last = _nodes.size() - 1;
    size_t good = i + 1;  // neighbouring nodes always fit: no sample lies between them
    size_t start = std::clamp(hint, i + 1, last);
    if (start > good) {
        if (feasibleNodes(i, start)) {
            good = start;
        } else {
            // Gallop down to a node that fits, then halve the gap to the one that failed.
            size_t bad = start;
            size_t step = 1;
            while (bad - good > 1) {
                const size_t probe = bad - std::min(step, bad - good - 1);
                if (feasibleNodes(i, probe)) {
                    good = probe;
                    break;
                }
                bad = probe;
                step *= 2;
            }
            while (bad - good > 1) {
                const size_t mid = good + (bad - good) / 2;
                (feasibleNodes(i, mid) ? good : bad) = mid;
            }
            hint = good;
            return good;
        }
    }
    // Gallop up, then halve the gap.
    size_t step = 1;
    while (good < last) {
        const size_t probe = std::min(last, good + step);
        if (feasibleNodes(i, probe)) {
            good = probe;
            step *= 2;
            continue;
        }
        size_t bad = probe;
        while (bad - good > 1) {
            const size_t mid = good + (bad - good) / 2;
            (feasibleNodes(i, mid) ? good : bad) = mid;
        }
        break;
    }
    hint = good;
    return good;
}

// Appends to `path` (which ends at node `from`) nodes up to and including `to`, each the
// farthest that fits from the one before. Only for the rare gap where the layered placement's
// chain did not fit.
void Fitter::fillGreedily(size_t from, size_t to, std::vector<size_t>& path) const {
    size_t at = from;
    while (at != to) {
        // Gallop down from `to` to a node that fits, then halve the gap to the one that failed:
        // a walk down one node at a time costs a check of the whole gap per node.
        size_t good = at + 1, bad = to + 1;
        for (size_t step = 1; bad - good > 1; step *= 2) {
            const size_t probe = bad - std::min(step, bad - good - 1);
            if (feasibleNodes(at, probe)) {
                good = probe;
                break;
            }
            bad = probe;
        }
        while (bad - good > 1) {
            const size_t mid = good + (bad - good) / 2;
            (feasibleNodes(at, mid) ? good : bad) = mid;
        }
        path.push_back(good);
        at = good;
    }
}

void Fitter::place(size_t lo, size_t hi, std::vector<size_t>& out) {
    _nodes.clear();
    for (size_t i = lo; i <= hi; ++i) {
        if (_s.flags[i] & kFitNode) _nodes.push_back(i);
    }
    const size_t last = _nodes.size() - 1;
    std::vector<size_t>& chain = _chain;
    chain.assign(1, 0);
    if (last > 1) {
        size_t hint = 1;
        size_t layerEnd = 0;
        size_t far = reachOf(0, hint);
        while (far < last) {
            size_t best = layerEnd + 1;
            size_t bestReach = 0;
            // Each candidate costs checks as long as its reach. A layer of more than
            // kLayerCandidates nodes (a long smooth stretch, thousands of frames) is sampled
            // evenly, its last node always among them: a keyframe more at worst, where trying
            // them all would take seconds.
            const size_t stride = std::max<size_t>(1, (far - layerEnd) / kLayerCandidates);
            for (size_t i = layerEnd + 1; i <= far;
                 i = (i < far && i + stride > far) ? far : i + stride) {
                const size_t r = reachOf(i, hint);
                if (r > bestReach) {
                    bestReach = r;
                    best = i;
                }
            }
            chain.push_back(best);
            layerEnd = far;
            far = bestReach;
        }
    }
    chain.push_back(last);

    // Check the chain: each segment fits when reaching is monotone, as it nearly always is.
    std::vector<size_t>& path = _path;
    path.assign(1, 0);
    for (size_t d = 1; d < chain.size(); ++d) {
        const size_t from = path.back();
        const size_t to = chain[d];
        if (to == from) continue;
        if (feasibleNodes(from, to)) {
            path.push_back(to);
            continue;
        }
        // Another node between, fitting on both sides, keeps the count.
        bool replaced = false;
        if (d + 1 < chain.size()) {
            const size_t next = chain[d + 1];
            for (size_t x = next - 1; x > from && !replaced; --x) {
                if (feasibleNodes(from, x) && feasibleNodes(x, next)) {
                    path.push_back(x);
                    replaced = true;
                }
            }
        }
        if (!replaced) fillGreedily(from, to, path);
    }
    out.clear();
    for (size_t n : path) out.push_back(_nodes[n]);
}

// Solves the symmetric tridiagonal system (diag, off between v and v + 1) in place; the answer
// is left in rhs. The system is positive definite: a sum of the segments' normal equations.
void solveTridiagonal(std::vector<double>& diag, std::vector<double>& off,
                      std::vector<double>& rhs) {
    const size_t n = diag.size();
    for (size_t v = 1; v < n; ++v) {
        const double f = off[v - 1] / diag[v - 1];
        diag[v] -= f * off[v - 1];
        rhs[v] -= f * rhs[v - 1];
    }
    for (size_t v = n; v-- > 0;) {
        if (v + 1 < n) rhs[v] -= off[v] * rhs[v + 1];
        rhs[v] /= diag[v];
    }
}

// Lines up the Bezier handles of the chain where the tolerance allows (see the header).
void alignSlopes(const Fitter& fitter, const Chain& chain, double alignStart, double alignEnd,
                 std::vector<FitKey>& keys) {
    const size_t count = chain.keys.size();
    const size_t segments = count - 1;
    std::vector<SegmentSums> sums(segments);
    for (size_t j = 0; j < segments; ++j) {
        if (!chain.whole[j]) sums[j] = fitter.sums(chain.keys[j], chain.keys[j + 1]);
    }
    constexpr double kNone = std::numeric_limits<double>::quiet_NaN();
    std::vector<uint8_t> freed(count, 0);  // the keyframe's two slopes are separate unknowns
    std::vector<long> inVar(count), outVar(count);
    std::vector<double> fixedIn(count), fixedOut(count);
    std::vector<double> diag, off, rhs;
    std::vector<Slopes> slopes(segments);

    for (size_t round = 0;; ++round) {
        // Each round frees the keyframes of the segments that failed. Should that go on, the
        // last round frees all: every segment is then its own placement fit, which fits.
        if (round == kMaxAlignRounds) freed.assign(count, 1);
        // Unknowns in chain order, so that each segment couples two neighbours.
        long unknowns = 0;
        for (size_t j = 0; j < count; ++j) {
            const bool inSide = j > 0 && !chain.whole[j - 1];
            const bool outSide = j < segments && !chain.whole[j];
            inVar[j] = outVar[j] = -1;
            fixedIn[j] = fixedOut[j] = kNone;
            if (j == 0 && outSide && !freed[j] && std::isfinite(alignStart))
                fixedOut[j] = alignStart;
            if (j == segments && inSide && !freed[j] && std::isfinite(alignEnd))
                fixedIn[j] = alignEnd;
            if (inSide && std::isnan(fixedIn[j])) inVar[j] = unknowns++;
            if (outSide && std::isnan(fixedOut[j])) {
                outVar[j] = (inSide && !freed[j] && inVar[j] >= 0) ? inVar[j] : unknowns++;
            }
        }
        diag.assign(size_t(unknowns), 0.0);
        off.assign(size_t(unknowns), 0.0);
        rhs.assign(size_t(unknowns), 0.0);
        for (size_t j = 0; j < segments; ++j) {
            if (chain.whole[j]) continue;
            const SegmentSums& m = sums[j];
            const long p = outVar[j], q = inVar[j + 1];
            if (p >= 0) {
                diag[size_t(p)] += m.a11;
                rhs[size_t(p)] += q >= 0 ? m.b1 : m.b1 - m.a12 * fixedIn[j + 1];
            }
            if (q >= 0) {
                diag[size_t(q)] += m.a22;
                rhs[size_t(q)] += p >= 0 ? m.b2 : m.b2 - m.a12 * fixedOut[j];
            }
            if (p >= 0 && q >= 0) off[size_t(p)] += m.a12;  // q is p + 1
        }
        solveTridiagonal(diag, off, rhs);

        bool allFit = true;
        for (size_t j = 0; j < segments; ++j) {
            if (chain.whole[j]) continue;
            const long p = outVar[j], q = inVar[j + 1];
            const bool ownOut = p >= 0 && inVar[j] != p;
            const bool ownIn = q >= 0 && outVar[j + 1] != q;
            if (ownOut && ownIn) {
                // Alone with its two unknowns: the very fit that placement found to fit.
                slopes[j] = solve(sums[j]);
                continue;
            }
            slopes[j] = {p >= 0 ? rhs[size_t(p)] : fixedOut[j],
                         q >= 0 ? rhs[size_t(q)] : fixedIn[j + 1]};
            if (!fitter.bezierFits(chain.keys[j], chain.keys[j + 1], slopes[j])) {
                freed[j] = freed[j + 1] = 1;
                allFit = false;
            }
        }
        if (allFit || round == kMaxAlignRounds) break;
    }
    for (size_t j = 0; j < segments; ++j) {
        if (chain.whole[j]) continue;
        keys[j].outSlope = slopes[j].out;
        keys[j + 1].inSlope = slopes[j].in;
    }
}

}  // namespace

std::vector<FitKey> fitCurve(const FitSamples& samples, FitShape shape, double tolerance,
                             double alignStart, double alignEnd) {
    Fitter fitter(samples, shape, tolerance);
    const size_t n = samples.t.size();
    Chain chain;
    std::vector<size_t> run;
    size_t lo = 0;
    chain.keys.push_back(0);
    for (size_t hi = 1; hi < n; ++hi) {
        if (!(samples.flags[hi] & kFitFixed)) continue;
        fitter.place(lo, hi, run);
        chain.keys.insert(chain.keys.end(), run.begin() + 1, run.end());
        lo = hi;
    }
    std::vector<FitKey> keys(chain.keys.size());
    for (size_t j = 0; j < keys.size(); ++j) {
        keys[j].index = chain.keys[j];
        keys[j].value = samples.target[chain.keys[j]];
    }
    chain.whole.assign(keys.size() - 1, 0);
    for (size_t j = 0; j + 1 < keys.size(); ++j) {
        chain.whole[j] = fitter.isWhole(chain.keys[j], chain.keys[j + 1]) ? 1 : 0;
        keys[j].wholeOut = chain.whole[j] != 0;
    }
    if (shape == FitShape::Bezier && keys.size() > 1) {
        alignSlopes(fitter, chain, alignStart, alignEnd, keys);
    }
    return keys;
}

void smoothedTargets(const std::vector<double>& t, const std::vector<double>& y, size_t radius,
                     double limit, std::vector<double>& target) {
    target = y;
    const size_t n = y.size();
    if (radius == 0 || n < 3) return;
    for (size_t i = 0; i < n; ++i) {
        const size_t lo = i >= radius ? i - radius : 0;
        const size_t hi = std::min(n - 1, i + radius);
        // Weighted least squares of a + b x + c x^2 over the window, x the time from sample i
        // in units of the window's length (so that the sums stay well scaled); the answer is a.
        const double unit = 1.0 / (t[hi] - t[lo]);
        double m0 = 0.0, m1 = 0.0, m2 = 0.0, m3 = 0.0, m4 = 0.0, r0 = 0.0, r1 = 0.0, r2 = 0.0;
        for (size_t k = lo; k <= hi; ++k) {
            const double distance = double(k > i ? k - i : i - k);
            const double w = 1.0 - distance / double(radius + 1);
            const double x = (t[k] - t[i]) * unit;
            const double wx = w * x, wx2 = wx * x;
            m0 += w;
            m1 += wx;
            m2 += wx2;
            m3 += wx2 * x;
            m4 += wx2 * x * x;
            r0 += w * y[k];
            r1 += wx * y[k];
            r2 += wx2 * y[k];
        }
        // Cramer's rule for a; a window too short for a parabola takes the weighted mean.
        const double det =
            m0 * (m2 * m4 - m3 * m3) - m1 * (m1 * m4 - m2 * m3) + m2 * (m1 * m3 - m2 * m2);
        double value = r0 / m0;
        if (std::fabs(det) > 1e-12 * m0 * m0 * m0) {
            value =
                (r0 * (m2 * m4 - m3 * m3) - m1 * (r1 * m4 - r2 * m3) + m2 * (r1 * m3 - r2 * m2)) /
                det;
        }
        target[i] = std::clamp(value, y[i] - limit, y[i] + limit);
    }
}

}  // namespace tq_internal
