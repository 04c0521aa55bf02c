#pragma once
// Lines: HXDMultiline, a polyline with a colour per vertex, and HXDLine, one segment.
//
// Vertices are world coordinates in single precision. A multiline is one or more runs of
// joined segments: made from vertices it is one run; made from segments, a segment that does
// not start where the previous one ended starts a new run. With loop set, each run is closed
// from its last vertex back to its first.
//
// Drawn size: width in points (times the backing scale: width 0.5 on a backing scale of 2 is
// one drawable pixel). Stipple: bit i of the 32-bit pattern (lowest first) says whether the
// i-th step along the line is drawn, each step stippleScale points long, the pattern
// repeating; it runs on along the whole polyline. Gamma shapes the antialiased edge: coverage
// is raised to 1/gamma (1 is linear). The colour between two vertices goes from one
// vertex's colour to the next.
//
// Hit test: a multiline is hit within half its width of a segment (at least half a pixel),
// plus the line tolerance. Its world-space index (bounds, and bins along x for the usual
// curve whose x never decreases, filled bin by bin as tests reach them) is built at the first
// hit test, so a pick over hundreds of long curves touches a few segments of each, and a
// frame that is never picked pays nothing for it.

#include <cstdint>
#include <memory>
#include <span>
#include <vector>

#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/draw/internal/HXDPolylineIndex.h"

struct HXDLineVertex {
    HXDFloat3 start;
    HXDColor color;

    HXDLineVertex() = default;
    HXDLineVertex(HXDFloat3 position, HXDColor vertexColor) : start(position), color(vertexColor) {}
    static HXDLineVertex initWithStart(HXDFloat3 position, HXDColor vertexColor) {
        return {position, vertexColor};
    }
};

struct HXDLineSegment {
    HXDFloat3 start;
    HXDFloat3 end;
    HXDColor color;

    HXDLineSegment() = default;
    HXDLineSegment(HXDFloat3 from, HXDFloat3 to, HXDColor segmentColor)
        : start(from), end(to), color(segmentColor) {}
    static HXDLineSegment initWithStart(HXDFloat3 from, HXDFloat3 to, HXDColor segmentColor) {
        return {from, to, segmentColor};
    }
};

class HXDMultiline : public HXDDrawPrimitive {
public:
    // initWithLines: one run through the vertices (copied).
    explicit HXDMultiline(std::span<const HXDLineVertex> lines);
    explicit HXDMultiline(std::vector<HXDLineVertex>&& lines);
    // Segments: chained ones share their vertices, a gap starts a new run. A segment's
    // colour is given to its ends; a shared vertex takes the colour of the segment leaving it.
    explicit HXDMultiline(std::span<const HXDLineSegment> segments);
    ~HXDMultiline() override;

    const std::vector<HXDLineVertex>& vertices() const { return _vertices; }
    // First vertex of each run after the first, ascending; empty for a single run.
    const std::vector<uint32_t>& runStarts() const { return _runStarts; }
    size_t numberOfRuns() const { return _vertices.empty() ? 0 : _runStarts.size() + 1; }
    // Vertex range [first, end) of run r (r < numberOfRuns()).
    std::pair<uint32_t, uint32_t> runRange(size_t run) const;

    float width() const { return _width; }
    void setWidth(float width);
    float gamma() const { return _gamma; }
    void setGamma(float gamma) { _gamma = gamma; }
    bool antialiased() const { return _antialiased; }
    void setAntialiased(bool antialiased) { _antialiased = antialiased; }
    bool stippled() const { return _stippled; }
    void setStippled(bool stippled) { _stippled = stippled; }
    uint32_t stipplePattern() const { return _stipplePattern; }
    void setStipplePattern(uint32_t pattern) { _stipplePattern = pattern; }
    float stippleScale() const { return _stippleScale; }
    void setStippleScale(float scale) { _stippleScale = scale; }
    HXDLineJoin lineJoin() const { return _lineJoin; }
    void setLineJoin(HXDLineJoin join) { _lineJoin = join; }
    // The numeric form callers pass (0 mitre, 1 round, 2 bevel); other values give a mitre.
    void setLineJoin(int join);
    bool loop() const { return _loop; }
    void setLoop(bool loop);

    // Sets the hit-test index up now rather than at the first test (a curve's bins still
    // fill as tests reach them).
    void prepareForHitTesting() const;

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
    float hitDistanceAtPoint(const HXDHitTestContext& context) const override;
    bool intersectsRect(const HXDHitTestContext& context) const override;
    int hitPriority() const override { return 0; }
    // XSpan over the vertices' x extent, reaching half the width plus the line tolerance.
    HXDHitBounds hitBounds(float backingScale) const override;
    bool hitYExtentOverX(double x0, double x1, double& minY, double& maxY) const override;

    // Half the drawn width in drawable pixels, never below half a pixel.
    double halfWidthInPixels(float backingScale) const;

private:
    hxd_internal::PolylineIndex& index() const;

    // Declared first: a hit test reads the width and the index's head together, and with
    // hundreds of curves per test the cache lines touched per curve are what it costs.
    float _width = 1.0f;
    // Built at the first hit test; the vertices never change after construction. Views use
    // primitives on one thread, so the lazy build needs no lock.
    mutable hxd_internal::PolylineIndex _index;
    std::vector<HXDLineVertex> _vertices;
    std::vector<uint32_t> _runStarts;
    float _gamma = 1.0f;
    float _stippleScale = 1.0f;
    uint32_t _stipplePattern = 0x0F0F0F0Fu;
    HXDLineJoin _lineJoin = HXDLineJoin::Miter;
    bool _antialiased = false;
    bool _stippled = false;
    bool _loop = false;
    bool _monotoneX = false;
};

// One segment of one colour.
class HXDLine : public HXDMultiline {
public:
    HXDLine(HXDFloat3 start, HXDFloat3 end, float width, HXDColor color, bool antialiased);
    static std::shared_ptr<HXDLine> lineFromStart(HXDFloat3 start, HXDFloat3 end, float width,
                                                  HXDColor color, bool antialiased);

    HXDFloat3 start() const { return vertices()[0].start; }
    HXDFloat3 end() const { return vertices()[1].start; }
    HXDColor color() const { return vertices()[0].color; }

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
};
