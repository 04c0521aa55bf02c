#pragma once
// Internal: the world-space index a render controller keeps over the last long list it
// tested, so that a pick runs the exact test of the few primitives near its point instead of
// every primitive of the frame.
//
// Shape. The list's x extent is cut into columns. Boxes (quads, meshes) are filed into the
// columns they cross when the index is built. Spans (multilines: a curve's x extent is known
// from its ends, its y extent only from its vertices) are filed lazily: the first test that
// reaches a column asks each span crossing it for its y extent there, which a curve answers
// from the dozen vertices under the column, and keeps them by their lower edge. So the first
// pick after a frame reads a few vertices per curve, not every vertex, and later picks in the
// same columns read the compact entries near their height only. Boxes across more than an
// eighth of the columns, and bands across many columns, are checked in one pass instead.
//
// Validity. Frames rebuild their lists; the index must notice any change without walking the
// primitives. It keeps the bytes of the list's shared pointers (object and control block) and
// a weak reference to each primitive: the weak references keep the control blocks from being
// reused, so equal bytes mean the same primitives, in the same order. Comparing the bytes is
// one memcmp over the list. A change to an indexed primitive's hit geometry moves
// HXDDrawPrimitive::hitGeometryRevision, which the index also compares.
//
// Lifetime: the weak references keep the storage of the last tested primitives (not what
// they own) until the index is rebuilt or dropped; the controller drops it at each new frame.
// One thread: tests fill columns as they go.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <vector>

#include "platform/draw/HXDHitTest.h"

namespace hxd_internal {

class PrimitiveIndex {
public:
    // Lists shorter than this are walked: indexing them costs more than it saves.
    static constexpr size_t kMinPrimitives = 128;

    // Whether the index was built from this list (same primitives, same order, unchanged)
    // for tests at this backing scale.
    bool describes(const HXDPrimitiveArray& primitives, float backingScale) const;
    // Indexes the list, replacing what was there.
    void build(const HXDPrimitiveArray& primitives, float backingScale);
    // Forgets the list and releases the weak references.
    void clear();

    // The positions in the list of the primitives the test may hit, ascending and without
    // repeats; every primitive the exact test would hit is among them. The list must be the
    // one the index describes, and the context a valid one whose mapping is axis-aligned
    // (world and pixel rectangles map onto each other). The span stays valid until the next
    // call.
    std::span<const uint32_t> candidates(const HXDPrimitiveArray& primitives,
                                         const HXDHitTestContext& context);

    size_t size() const { return _count; }
    size_t columnCount() const { return _columns.size(); }

private:
    enum class Kind : uint8_t { Anywhere, Box, Span };
    // Single precision, rounded outward: half the memory a frame's build writes and a test
    // reads, and never a bound tighter than the shape's.
    struct Entry {
        float minX, minY, maxX, maxY;
        float reach;  // drawable pixels
        uint32_t index;
        Kind kind;
    };
    struct Column {
        uint32_t boxBegin = 0, boxEnd = 0;    // in _columnBoxes
        uint32_t spanBegin = 0, spanEnd = 0;  // in _columnSpans by minY, once filled
        double tallestSpan = 0.0;             // the greatest maxY - minY among them
        bool spansFilled = false;
    };
    // The query of one test: its world rectangle and the world size of a pixel.
    struct Query {
        double x0, y0, x1, y1;
        double perPixelX, perPixelY;
        bool meets(const Entry& e) const;
        bool meetsAcross(const Entry& e) const;
    };

    uint32_t columnOf(double x) const;
    void fillSpans(const HXDPrimitiveArray& primitives, uint32_t column);
    std::span<const uint32_t> walkEntries(const Query& q);

    // Validity.
    size_t _count = 0;
    float _backingScale = 0.0f;
    uint64_t _revision = 0;
    std::vector<std::byte> _listBytes;
    std::vector<std::weak_ptr<HXDDrawPrimitive>> _pins;

    // Every indexed primitive in list order (Nowhere and null entries left out).
    std::vector<Entry> _entries;
    std::vector<uint32_t> _anywhere;  // positions in _entries
    std::vector<uint32_t> _spans;     // positions in _entries
    std::vector<Entry> _wideBoxes;    // boxes across too many columns to file
    double _maxReach = 0.0;

    double _originX = 0.0;
    double _columnWidth = 0.0;
    double _invColumnWidth = 0.0;
    std::vector<Column> _columns;
    std::vector<uint32_t> _columnBoxes;  // positions in _entries
    std::vector<Entry> _columnSpans;

    std::vector<uint32_t> _candidates;  // reused by every test
};

}  // namespace hxd_internal
