#include "platform/draw/HXDMultiline.h"

#include <algorithm>
#include <cmath>

#include "platform/draw/HXDEncoder.h"
#include "platform/draw/internal/HXDGeometry2D.h"

namespace hxd_internal {

namespace {
bool finite(const HXDLineVertex& v) { return std::isfinite(v.start.x) && std::isfinite(v.start.y); }

void grow(float& minX, float& minY, float& maxX, float& maxY, const HXDLineVertex& v) {
    minX = std::min(minX, v.start.x);
    maxX = std::max(maxX, v.start.x);
    minY = std::min(minY, v.start.y);
    maxY = std::max(maxY, v.start.y);
}
}  // namespace

void PolylineIndex::build(const std::vector<HXDLineVertex>& vertices,
                          const std::vector<uint32_t>& runStarts, bool loop, bool monotoneX) {
    *this = PolylineIndex();
    built = true;
    if (vertices.size() < 2) return;  // no segment: nothing can be hit
    if (monotoneX && runStarts.empty() && !loop) {
        buildBins(vertices);
        return;
    }
    buildChunks(vertices, runStarts, loop);
}

// The x extent is known from the ends; the y extent is left open (a pass over every vertex
// is what this avoids), so the bins' own extents do the rejecting.
void PolylineIndex::buildBins(const std::vector<HXDLineVertex>& vertices) {
    const HXDLineVertex& head = vertices.front();
    const HXDLineVertex& tail = vertices.back();
    const uint32_t segments = static_cast<uint32_t>(vertices.size() - 1);
    uint32_t count = std::clamp<uint32_t>(segments / kSegmentsPerBin, 1u, kMaxBins);
    const double span = static_cast<double>(tail.start.x) - static_cast<double>(head.start.x);
    if (!(span > 0.0)) count = 1;
    binOrigin = head.start.x;
    binInvWidth = count > 1 ? count / span : 0.0;
    bins.assign(count, Bin{});
    hasBounds = true;
    monotone = true;
    minX = head.start.x;
    maxX = tail.start.x;
    minY = -std::numeric_limits<float>::infinity();
    maxY = std::numeric_limits<float>::infinity();
}

namespace {
// The least i in [0, n) for which pred holds (n when none), pred being false and then true
// along i. Searched outward from a guess, doubling the step, then by halves: near a good
// guess it reads a few neighbouring vertices instead of a path through the whole array.
template <class Pred>
uint32_t firstTrueNear(uint32_t n, uint32_t guess, Pred&& pred) {
    if (n == 0) return 0;
    uint32_t lo = 0, hi = n;  // pred is false below lo and true at hi (or hi is n)
    guess = std::min(guess, n - 1);
    if (pred(guess)) {
        hi = guess;
        for (uint64_t step = 1; hi > 0; step *= 2) {
            const uint32_t probe = hi > step ? static_cast<uint32_t>(hi - step) : 0u;
            if (!pred(probe)) {
                lo = probe + 1;
                break;
            }
            hi = probe;
        }
    } else {
        lo = guess + 1;
        for (uint64_t step = 1; lo < n; step *= 2) {
            const uint32_t probe = static_cast<uint32_t>(std::min<uint64_t>(lo + step - 1, n - 1));
            if (pred(probe)) {
                hi = probe;
                break;
            }
            lo = probe + 1;
        }
    }
    while (lo < hi) {
        const uint32_t mid = lo + (hi - lo) / 2;
        if (pred(mid))
            hi = mid;
        else
            lo = mid + 1;
    }
    return lo;
}
}  // namespace

bool monotoneYExtentOverX(const std::vector<HXDLineVertex>& vertices, double x0, double x1,
                          double& lo, double& hi) {
    if (vertices.size() < 2 || !(x0 <= x1)) return false;
    const uint32_t segments = static_cast<uint32_t>(vertices.size() - 1);
    const double head = vertices.front().start.x;
    const double span = static_cast<double>(vertices.back().start.x) - head;
    // Where x0 and x1 would fall if the samples were evenly spaced.
    const auto guess = [&](double x) {
        const double f = span > 0.0 ? (x - head) / span : 0.0;
        if (!(f > 0.0)) return 0u;
        return static_cast<uint32_t>(std::min(f, 1.0) * segments);
    };
    // Segment i meets [x0, x1] when x[i + 1] >= x0 and x[i] <= x1.
    const uint32_t first = firstTrueNear(segments, guess(x0),
                                         [&](uint32_t i) { return vertices[i + 1].start.x >= x0; });
    const uint32_t end =
        firstTrueNear(segments, guess(x1), [&](uint32_t i) { return vertices[i].start.x > x1; });
    if (first >= end) return false;
    float minY = vertices[first].start.y, maxY = minY;
    for (uint32_t v = first + 1; v <= end; ++v) {
        minY = std::min(minY, vertices[v].start.y);
        maxY = std::max(maxY, vertices[v].start.y);
    }
    lo = minY;
    hi = maxY;
    return true;
}

void PolylineIndex::fillBin(const std::vector<HXDLineVertex>& vertices, uint32_t k) {
    const uint32_t segments = static_cast<uint32_t>(vertices.size() - 1);
    // Sampled curves are close to uniform in x, so bin k's segments start near the same
    // fraction of the array as the bin of the bins.
    const uint64_t count = bins.size();
    const auto guess = [&](uint64_t bin) { return static_cast<uint32_t>(bin * segments / count); };
    // first: the least segment whose end reaches bin k.
    const uint32_t first = firstTrueNear(
        segments, guess(k), [&](uint32_t i) { return binOf(vertices[i + 1].start.x) >= k; });
    // lo: one past the last segment whose start lies at or before bin k.
    const uint32_t lo = firstTrueNear(segments, guess(k + 1),
                                      [&](uint32_t i) { return binOf(vertices[i].start.x) > k; });
    Bin& bin = bins[k];
    if (first >= lo) {
        bin.first = kNone;
        return;
    }
    bin.first = first;
    bin.end = lo;
    bin.minY = bin.maxY = vertices[first].start.y;
    for (uint32_t v = first + 1; v <= lo; ++v) {
        bin.minY = std::min(bin.minY, vertices[v].start.y);
        bin.maxY = std::max(bin.maxY, vertices[v].start.y);
    }
}

void PolylineIndex::buildChunks(const std::vector<HXDLineVertex>& vertices,
                                const std::vector<uint32_t>& runStarts, bool loop) {
    const size_t n = vertices.size();
    const size_t runs = runStarts.size() + 1;
    for (size_t r = 0; r < runs; ++r) {
        const uint32_t first = r == 0 ? 0u : runStarts[r - 1];
        const uint32_t end = r < runStarts.size() ? runStarts[r] : static_cast<uint32_t>(n);
        if (end <= first + 1) continue;  // a run of one vertex has no segment
        for (uint32_t k = first; k + 1 < end; k += kChunkSegments) {
            Chunk chunk;
            chunk.first = k;
            chunk.last = std::min(k + kChunkSegments, end - 1);
            for (uint32_t v = chunk.first; v <= chunk.last; ++v) {
                if (!finite(vertices[v])) continue;  // a segment through it never hits
                if (!chunk.bounded) {
                    chunk.minX = chunk.maxX = vertices[v].start.x;
                    chunk.minY = chunk.maxY = vertices[v].start.y;
                    chunk.bounded = true;
                } else {
                    grow(chunk.minX, chunk.minY, chunk.maxX, chunk.maxY, vertices[v]);
                }
            }
            if (!chunk.bounded) continue;
            if (!hasBounds) {
                minX = chunk.minX, minY = chunk.minY, maxX = chunk.maxX, maxY = chunk.maxY;
                hasBounds = true;
            } else {
                minX = std::min(minX, chunk.minX), minY = std::min(minY, chunk.minY);
                maxX = std::max(maxX, chunk.maxX), maxY = std::max(maxY, chunk.maxY);
            }
            chunks.push_back(chunk);
        }
        if (loop) closers.emplace_back(end - 1, first);
    }
}

uint32_t PolylineIndex::binOf(double x) const {
    const double k = (x - binOrigin) * binInvWidth;
    const double last = static_cast<double>(bins.size()) - 1.0;
    // Clamped in double before the conversion, which would be undefined out of range; above
    // 0 the conversion's truncation is the floor.
    if (!(k > 0.0)) return 0;
    return static_cast<uint32_t>(std::min(k, last));
}

bool PolylineIndex::yExtentOverX(const std::vector<HXDLineVertex>& vertices, double x0, double x1,
                                 double& lo, double& hi) {
    if (!hasBounds || x1 < minX || x0 > maxX) return false;
    bool found = false;
    auto take = [&](float a, float b) {
        lo = found ? std::min(lo, static_cast<double>(a)) : a;
        hi = found ? std::max(hi, static_cast<double>(b)) : b;
        found = true;
    };
    if (monotone) {
        // A segment meeting [x0, x1] at some x lies in bin binOf(x), which is in this range.
        for (uint32_t k = binOf(x0), last = binOf(x1); k <= last; ++k) {
            if (bins[k].first == kUnfilled) fillBin(vertices, k);
            if (bins[k].first != kNone) take(bins[k].minY, bins[k].maxY);
        }
        return found;
    }
    for (const Chunk& chunk : chunks)
        if (!(chunk.maxX < x0 || chunk.minX > x1)) take(chunk.minY, chunk.maxY);
    // A closing segment joins two vertices that lie in chunks of their run, but the segment
    // between them may cross x0..x1 where neither chunk does.
    for (const auto& [i, j] : closers) {
        const HXDLineVertex& a = vertices[i];
        const HXDLineVertex& b = vertices[j];
        if (!(std::isfinite(a.start.x) && std::isfinite(a.start.y) && std::isfinite(b.start.x) &&
              std::isfinite(b.start.y)))
            continue;  // never hit, as in the exact test
        if (std::max(a.start.x, b.start.x) < x0 || std::min(a.start.x, b.start.x) > x1) continue;
        take(std::min(a.start.y, b.start.y), std::max(a.start.y, b.start.y));
    }
    return found;
}

template <class Visit>
void PolylineIndex::forEachCandidate(const std::vector<HXDLineVertex>& vertices, const CGRect& q,
                                     Visit&& visit) {
    const double qx0 = q.origin.x, qy0 = q.origin.y;
    const double qx1 = qx0 + q.size.width, qy1 = qy0 + q.size.height;
    if (!hasBounds || qx1 < minX || qx0 > maxX || qy1 < minY || qy0 > maxY) return;
    auto segmentMayMeet = [&](const HXDLineVertex& a, const HXDLineVertex& b) {
        return !(std::max(a.start.x, b.start.x) < qx0 || std::min(a.start.x, b.start.x) > qx1 ||
                 std::max(a.start.y, b.start.y) < qy0 || std::min(a.start.y, b.start.y) > qy1);
    };

    if (monotone) {
        uint32_t next = 0;  // adjacent bins share segments: each is visited once
        for (uint32_t k = binOf(qx0), last = binOf(qx1); k <= last; ++k) {
            if (bins[k].first == kUnfilled) fillBin(vertices, k);
            const Bin& bin = bins[k];
            if (bin.first == kNone || bin.maxY < qy0 || bin.minY > qy1) continue;
            for (uint32_t i = std::max(bin.first, next); i < bin.end; ++i) {
                const HXDLineVertex& a = vertices[i];
                if (a.start.x > qx1) break;  // x never decreases: nothing further can meet q
                if (segmentMayMeet(a, vertices[i + 1]) && visit(i, i + 1)) return;
            }
            next = std::max(next, bin.end);
        }
        return;
    }

    for (const Chunk& chunk : chunks) {
        if (chunk.maxX < qx0 || chunk.minX > qx1 || chunk.maxY < qy0 || chunk.minY > qy1) continue;
        for (uint32_t i = chunk.first; i < chunk.last; ++i)
            if (segmentMayMeet(vertices[i], vertices[i + 1]) && visit(i, i + 1)) return;
    }
    for (const auto& [i, j] : closers)
        if (segmentMayMeet(vertices[i], vertices[j]) && visit(i, j)) return;
}

}  // namespace hxd_internal

// ---- HXDMultiline ----------------------------------------------------------------------------

namespace {
// One run of finite vertices whose x never decreases: the shape of a sampled curve, which the
// index serves with bins. Checked as the vertices arrive, while they are in cache.
bool isMonotoneInX(const std::vector<HXDLineVertex>& vertices) {
    float previous = -std::numeric_limits<float>::infinity();
    for (const HXDLineVertex& v : vertices) {
        if (!(std::isfinite(v.start.y) && v.start.x >= previous && std::isfinite(v.start.x)))
            return false;
        previous = v.start.x;
    }
    return true;
}
}  // namespace

HXDMultiline::HXDMultiline(std::span<const HXDLineVertex> lines)
    : HXDDrawPrimitive(0),
      _vertices(lines.begin(), lines.end()),
      _monotoneX(isMonotoneInX(_vertices)) {}

HXDMultiline::HXDMultiline(std::vector<HXDLineVertex>&& lines)
    : HXDDrawPrimitive(0), _vertices(std::move(lines)), _monotoneX(isMonotoneInX(_vertices)) {}

HXDMultiline::HXDMultiline(std::span<const HXDLineSegment> segments) : HXDDrawPrimitive(0) {
    _vertices.reserve(segments.size() + 1);
    for (size_t s = 0; s < segments.size(); ++s) {
        const HXDLineSegment& seg = segments[s];
        const bool chained = s > 0 && segments[s - 1].end == seg.start;
        if (!chained) {
            if (s > 0) _runStarts.push_back(static_cast<uint32_t>(_vertices.size()));
            _vertices.emplace_back(seg.start, seg.color);
        } else {
            // The shared vertex takes the colour of the segment that leaves it.
            _vertices.back().color = seg.color;
        }
        _vertices.emplace_back(seg.end, seg.color);
    }
    _monotoneX = _runStarts.empty() && isMonotoneInX(_vertices);
}

HXDMultiline::~HXDMultiline() = default;

std::pair<uint32_t, uint32_t> HXDMultiline::runRange(size_t run) const {
    const size_t runs = numberOfRuns();
    if (run >= runs) return {0, 0};
    const uint32_t first = run == 0 ? 0u : _runStarts[run - 1];
    const uint32_t end = run + 1 < runs ? _runStarts[run] : static_cast<uint32_t>(_vertices.size());
    return {first, end};
}

void HXDMultiline::setLoop(bool loop) {
    if (loop == _loop) return;
    _loop = loop;
    _index.built = false;  // the closing segments are part of the index
    hitGeometryChanged();
}

void HXDMultiline::setWidth(float width) {
    if (width == _width) return;
    _width = width;
    hitGeometryChanged();  // the reach follows the width
}

void HXDMultiline::setLineJoin(int join) {
    _lineJoin = join == 1   ? HXDLineJoin::Round
                : join == 2 ? HXDLineJoin::Bevel
                            : HXDLineJoin::Miter;
}

hxd_internal::PolylineIndex& HXDMultiline::index() const {
    if (!_index.built) _index.build(_vertices, _runStarts, _loop, _monotoneX);
    return _index;
}

void HXDMultiline::prepareForHitTesting() const { (void)index(); }

double HXDMultiline::halfWidthInPixels(float backingScale) const {
    const double w = static_cast<double>(_width) * backingScale * 0.5;
    return w > 0.5 ? w : 0.5;  // NaN and hairlines alike cover half a pixel on each side
}

void HXDMultiline::encodeWithEncoder(HXDEncoder& encoder,
                                     const HXDRenderingContext& context) const {
    encoder.encodeMultiline(*this, context);
}

HXDHitBounds HXDMultiline::hitBounds(float backingScale) const {
    HXDHitBounds b;
    b.kind = HXDHitBounds::Kind::XSpan;
    b.reach = halfWidthInPixels(backingScale) +
              static_cast<double>(kHXDLineHitTolerancePoints) * backingScale;
    if (_monotoneX && !_loop && _vertices.size() >= 2) {
        // A curve's x extent is its ends': no need to build its index before a test comes near.
        b.minX = _vertices.front().start.x;
        b.maxX = _vertices.back().start.x;
        return b;
    }
    const hxd_internal::PolylineIndex& i = index();
    if (!i.hasBounds) return HXDHitBounds::nowhere();
    b.minX = i.minX;
    b.maxX = i.maxX;
    return b;
}

bool HXDMultiline::hitYExtentOverX(double x0, double x1, double& minY, double& maxY) const {
    // A curve answers from its vertices, without building its bins: a frame's index asks
    // every curve crossing the columns a pick reaches, and only the few near the point are
    // then tested (and indexed) themselves.
    if (_monotoneX && !_loop)
        return hxd_internal::monotoneYExtentOverX(_vertices, x0, x1, minY, maxY);
    return index().yExtentOverX(_vertices, x0, x1, minY, maxY);
}

float HXDMultiline::hitDistanceAtPoint(const HXDHitTestContext& context) const {
    const double half = halfWidthInPixels(context.backingScale());
    const double reach = half + context.lineTolerance();
    const CGPoint p = context.point();
    const HXDScreenMapping& m = context.mapping();
    double best = std::numeric_limits<double>::infinity();
    index().forEachCandidate(_vertices, context.worldQueryRect(reach), [&](uint32_t i, uint32_t j) {
        const CGPoint a = m.worldToPixel(_vertices[i].start.x, _vertices[i].start.y);
        const CGPoint b = m.worldToPixel(_vertices[j].start.x, _vertices[j].start.y);
        const double d = hxd_internal::distanceToSegment(p.x, p.y, a.x, a.y, b.x, b.y);
        if (d < best) best = d;
        return best <= half;  // on the line: nothing can be closer
    });
    if (!(best <= reach)) return -1.0f;
    return static_cast<float>(std::max(0.0, best - half));
}

bool HXDMultiline::intersectsRect(const HXDHitTestContext& context) const {
    const double half = halfWidthInPixels(context.backingScale());
    const CGRect& r = context.rect();
    const double x0 = r.origin.x - half, y0 = r.origin.y - half;
    const double x1 = r.origin.x + r.size.width + half, y1 = r.origin.y + r.size.height + half;
    const HXDScreenMapping& m = context.mapping();
    bool hit = false;
    index().forEachCandidate(_vertices, context.worldQueryRect(half), [&](uint32_t i, uint32_t j) {
        const CGPoint a = m.worldToPixel(_vertices[i].start.x, _vertices[i].start.y);
        const CGPoint b = m.worldToPixel(_vertices[j].start.x, _vertices[j].start.y);
        hit = hxd_internal::segmentMeetsRect(a.x, a.y, b.x, b.y, x0, y0, x1, y1);
        return hit;
    });
    return hit;
}

// ---- HXDLine ---------------------------------------------------------------------------------

namespace {
std::vector<HXDLineVertex> twoVertices(HXDFloat3 start, HXDFloat3 end, HXDColor color) {
    return {HXDLineVertex(start, color), HXDLineVertex(end, color)};
}
}  // namespace

HXDLine::HXDLine(HXDFloat3 start, HXDFloat3 end, float width, HXDColor color, bool antialiased)
    : HXDMultiline(twoVertices(start, end, color)) {
    setWidth(width);
    setAntialiased(antialiased);
}

std::shared_ptr<HXDLine> HXDLine::lineFromStart(HXDFloat3 start, HXDFloat3 end, float width,
                                                HXDColor color, bool antialiased) {
    return std::make_shared<HXDLine>(start, end, width, color, antialiased);
}

void HXDLine::encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const {
    encoder.encodeLine(*this, context);
}
