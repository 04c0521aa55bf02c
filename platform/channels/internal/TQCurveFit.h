#pragma once
// Internal: the fitter behind TQChannel::simplifyCurve. It works on samples of a curve (times
// in seconds, values) and chooses where keyframes go and what joins them; the channel turns its
// answer into keyframes. Nothing here knows about channels.
//
// Model. Keyframes sit on samples marked as nodes, each with a pinned value: the sample's
// target (the curve itself, or the curve smoothed, never farther from it than half the
// tolerance), or the curve's own value where a keyframe must keep its value. A segment between two
// keyframes is one of
//   Bezier    a cubic whose handles reach a third of the segment, so that time is linear in
//             the parameter and the handles can never turn time back; its two handle slopes are
//             the least-squares fit to the targets between (a faint pull towards the chord
//             settles a segment with fewer than two samples inside);
//   Linear    the straight line between the two values;
//   Constant  the first value held;
//   whole     the curve's own segment between two of its keyframes, kept as it is.
// A segment fits when every sample strictly between its keyframes lies within the tolerance of
// the curve.
//
// Placement. Of all chains of fitting segments from the first node to the last, the fitter
// looks for one with the fewest segments. Where a segment that fits also fits when its ends
// move inwards (true of almost every curve: it fails only where the pinned value of a noisy
// sample happens to be off), breadth-first layers of the reach of each node give the optimum:
// layer d+1 ends at the farthest reach of any node in layer d. The reach of a node is found by
// galloping search from the reach of the node before it, so the fitter makes a few fits per
// node, each costing the samples it spans. The chain of the best node of each layer is then
// checked segment by segment; where one does not fit after all, the two segments around it are
// refitted through another node, or as a last resort the gap is filled greedily.
//
// Lined-up handles. After placement, Bezier handles are made to line up (one slope on both
// sides of a keyframe) by one least-squares solve over the whole chain, a tridiagonal system;
// keyframes next to a segment that no longer fits get their two slopes back as separate
// unknowns, and the solve repeats until every segment fits. A segment with both keyframes freed is exactly its
// own fit from the placement, which fitted, so this always ends; after a few rounds every
// keyframe is freed at once, so that it ends soon.

#include <cstddef>
#include <cstdint>
#include <vector>

namespace tq_internal {

enum class FitShape : uint8_t { Constant, Linear, Bezier };

enum : uint8_t {
    kFitNode = 1,   // a keyframe may go here
    kFitFixed = 2,  // a keyframe stays here (the span's ends, locked keyframes)
};

struct FitSamples {
    std::vector<double> t;       // seconds, increasing
    std::vector<double> y;       // the curve: what the tolerance binds to
    std::vector<double> target;  // what the fit follows, and the value of a keyframe placed here
    std::vector<uint8_t> flags;  // kFitNode, kFitFixed
    // For a node where one of the curve's keyframes is: the sample of the next such node when
    // the curve's own segment between them may be kept whole, else 0.
    std::vector<uint32_t> wholeTo;
};

struct FitKey {
    size_t index = 0;  // the sample
    double value = 0.0;
    double inSlope = 0.0;   // Bezier: value per second of the arriving handle
    double outSlope = 0.0;  // Bezier: of the leaving handle
    bool wholeOut = false;  // the segment leaving it is the curve's own, kept whole
};

// The keyframes of the fit, from the first sample to the last (both fixed, both kept).
// `tolerance` is the worst error allowed at a sample. alignStart and alignEnd are the slopes of
// the handles that stay on the outer sides of the two ends, for the fit to line up with where it
// can; NaN where there is none to line up with.
std::vector<FitKey> fitCurve(const FitSamples& samples, FitShape shape, double tolerance,
                             double alignStart, double alignEnd);

// The targets for a smoothness of `radius` samples: at each sample the value of the parabola
// that best fits the samples up to `radius` either side (weights falling linearly to the
// window's edge), pulled back to within `limit` of the curve. A parabola keeps the peaks and
// slopes of a curve that is smooth over the window, where a mean would flatten them, and
// irons out what wiggles faster. Radius 0 gives the curve itself. Cost: n (2 radius + 1).
void smoothedTargets(const std::vector<double>& t, const std::vector<double>& y, size_t radius,
                     double limit, std::vector<double>& target);

}  // namespace tq_internal
