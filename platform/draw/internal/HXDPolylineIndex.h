#pragma once
// Internal: the world-space index of a multiline, so that a hit test finds the few segments
// near the query without walking all of them.
//
// Curves are the common case: one run whose x never decreases (samples in time order; the
// multiline checks this once, as it copies its vertices). They get uniform bins along x; a
// bin's range of segments (two binary searches) and their y extent are found the first time
// a query reads that bin, so the first pick after a frame costs a few bins per curve rather
// than a pass over every vertex. Anything else (loops, several runs, x going back) gets
// chunks of consecutive segments with their bounds, built in one pass and tested in turn.

#include <cstdint>
#include <limits>
#include <utility>
#include <vector>

#include "platform/geometry/CGGeometry.h"

struct HXDLineVertex;

namespace hxd_internal {

// For one run of finite vertices whose x never decreases: the y extent of the segments that
// meet world x in [x0, x1] (exact); false when none does. Reads the vertices near the range
// only, found by a search from where even spacing would put them.
bool monotoneYExtentOverX(const std::vector<HXDLineVertex>& vertices, double x0, double x1,
                          double& lo, double& hi);

struct PolylineIndex {
    static constexpr uint32_t kNone = std::numeric_limits<uint32_t>::max();
    static constexpr uint32_t kUnfilled = kNone - 1;
    static constexpr uint32_t kChunkSegments = 16;
    static constexpr uint32_t kSegmentsPerBin = 8;
    static constexpr uint32_t kMaxBins = 8192;

    struct Bin {
        // Segments [first, end): segment i joins vertices i and i + 1. kUnfilled until a
        // query reads the bin, kNone when no segment reaches it.
        uint32_t first = kUnfilled;
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

    // Indexes the vertices (replacing what was there). monotoneX: one run, every vertex
    // finite, x never decreasing, no loop.
    void build(const std::vector<HXDLineVertex>& vertices, const std::vector<uint32_t>& runStarts,
               bool loop, bool monotoneX);

    uint32_t binOf(double x) const;

    // The y extent of the segments that reach into world x in [x0, x1] (bins or chunks over
    // the range, so a bound, not the exact extent); false when no segment does.
    bool yExtentOverX(const std::vector<HXDLineVertex>& vertices, double x0, double x1, double& lo,
                      double& hi);

private:
    void buildBins(const std::vector<HXDLineVertex>& vertices);
    void buildChunks(const std::vector<HXDLineVertex>& vertices,
                     const std::vector<uint32_t>& runStarts, bool loop);
    // Finds the segments and y extent of bin k; a segment i lies in the bins from
    // binOf(x[i]) to binOf(x[i + 1]), which is how the searches decide.
    void fillBin(const std::vector<HXDLineVertex>& vertices, uint32_t k);

public:
    // Calls visit(i, j) for each segment (vertex i to vertex j) that may meet the world
    // rectangle q (standardized), until visit answers true.
    // Bins are filled here, on first use: the index is the multiline's lazily built cache.
    template <class Visit>
    void forEachCandidate(const std::vector<HXDLineVertex>& vertices, const CGRect& q,
                          Visit&& visit);
};

}  // namespace hxd_internal
