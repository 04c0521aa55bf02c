#pragma once
// Internal: the world-space index of a multiline, so that a hit test finds the few segments
// near the query without walking all of them.
//
// Curves are the common case: one run whose x never decreases (samples in time order). They
// get uniform bins along x, each with its range of segments and their y extent; a query
// reads one or two bins. Anything else (loops, several runs, x going back) gets chunks of
// consecutive segments with their bounds, tested in turn.

#include <cstdint>
#include <limits>
#include <utility>
#include <vector>

#include "platform/geometry/CGGeometry.h"

struct HXDLineVertex;

namespace hxd_internal {

struct PolylineIndex {
    static constexpr uint32_t kNone = std::numeric_limits<uint32_t>::max();
    static constexpr uint32_t kChunkSegments = 16;
    static constexpr uint32_t kSegmentsPerBin = 8;
    static constexpr uint32_t kMaxBins = 8192;

    struct Bin {
        uint32_t first = kNone;  // segments [first, end): segment i joins vertices i and i + 1
        uint32_t end = 0;
        float minY = 0.0f;
        float maxY = 0.0f;
    };
    struct Chunk {
        uint32_t first = 0;  // vertices [first, last]: segments first .. last - 1
        uint32_t last = 0;
        float minX = 0.0f, minY = 0.0f, maxX = 0.0f, maxY = 0.0f;
        bool bounded = false;  // false when no vertex of the chunk is finite
    };

    // What every test reads comes first, in one cache line with the owner's width.
    bool built = false;
    bool hasBounds = false;
    bool monotone = false;
    float minX = 0.0f, minY = 0.0f, maxX = 0.0f, maxY = 0.0f;
    double binOrigin = 0.0;
    double binInvWidth = 0.0;
    std::vector<Bin> bins;

    std::vector<Chunk> chunks;
    // The closing segments of looped runs: (last vertex, first vertex).
    std::vector<std::pair<uint32_t, uint32_t>> closers;

    // Indexes the vertices (replacing what was there).
    void build(const std::vector<HXDLineVertex>& vertices, const std::vector<uint32_t>& runStarts, bool loop);

    uint32_t binOf(double x) const;

private:
    bool buildBins(const std::vector<HXDLineVertex>& vertices);
    void buildChunks(const std::vector<HXDLineVertex>& vertices, const std::vector<uint32_t>& runStarts, bool loop);

public:

    // Calls visit(i, j) for each segment (vertex i to vertex j) that may meet the world
    // rectangle q (standardized), until visit answers true.
    template <class Visit>
    void forEachCandidate(const std::vector<HXDLineVertex>& vertices, const CGRect& q, Visit&& visit) const;
};

}  // namespace hxd_internal
