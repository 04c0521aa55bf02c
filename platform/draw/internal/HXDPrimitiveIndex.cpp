#include "platform/draw/internal/HXDPrimitiveIndex.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>

#include "platform/draw/HXDDrawPrimitive.h"

namespace hxd_internal {

namespace {
// Extra pixels around every test: world and pixel rounding may disagree at an edge by far
// less, and a spare candidate costs one exact test.
constexpr double kSlackPixels = 1.0;
// About this many boxed or spanned primitives per column: a pick reads two or three columns.
constexpr size_t kPrimitivesPerColumn = 32;
constexpr size_t kMaxColumns = 4096;
constexpr size_t kPrefetchAhead = 8;

// Within single precision (with room for the reach's growth): beyond it a bound would round
// to infinity, and such a primitive is left to every test instead.
bool fits(double v) { return std::fabs(v) < 1e37; }

bool finiteBox(const HXDHitBounds& b) {
    return fits(b.minX) && fits(b.maxX) && fits(b.minY) && fits(b.maxY) && b.minX <= b.maxX &&
           b.minY <= b.maxY;
}

float down(double v) {
    const float f = static_cast<float>(v);
    return static_cast<double>(f) > v ? std::nextafter(f, -std::numeric_limits<float>::infinity())
                                      : f;
}

float up(double v) {
    const float f = static_cast<float>(v);
    return static_cast<double>(f) < v ? std::nextafter(f, std::numeric_limits<float>::infinity())
                                      : f;
}
}  // namespace

bool PrimitiveIndex::Query::meets(const Entry& e) const {
    const double gx = (e.reach + kSlackPixels) * perPixelX;
    const double gy = (e.reach + kSlackPixels) * perPixelY;
    return e.minX <= x1 + gx && e.maxX >= x0 - gx && e.minY <= y1 + gy && e.maxY >= y0 - gy;
}

bool PrimitiveIndex::Query::meetsAcross(const Entry& e) const {
    const double gx = (e.reach + kSlackPixels) * perPixelX;
    return e.minX <= x1 + gx && e.maxX >= x0 - gx;
}

bool PrimitiveIndex::describes(const HXDPrimitiveArray& primitives, float backingScale) const {
    // The pins keep every indexed control block alive, so no new primitive can have the
    // bytes of an indexed one: equal bytes are the same list.
    return primitives.size() == _count && backingScale == _backingScale && _count > 0 &&
           _revision == HXDDrawPrimitive::hitGeometryRevision() &&
           std::memcmp(static_cast<const void*>(primitives.data()), _listBytes.data(),
                       _listBytes.size()) == 0;
}

void PrimitiveIndex::clear() {
    _count = 0;
    _backingScale = 0.0f;
    _listBytes.clear();
    _pins.clear();
    _entries.clear();
    _anywhere.clear();
    _spans.clear();
    _wideBoxes.clear();
    _maxReach = 0.0;
    _columns.clear();
    _columnBoxes.clear();
    _columnSpans.clear();
    _candidates.clear();
}

void PrimitiveIndex::build(const HXDPrimitiveArray& primitives, float backingScale) {
    clear();
    _count = primitives.size();
    _backingScale = backingScale;
    _listBytes.resize(_count * sizeof(std::shared_ptr<HXDDrawPrimitive>));
    std::memcpy(_listBytes.data(), static_cast<const void*>(primitives.data()), _listBytes.size());
    _pins.reserve(_count);
    _entries.reserve(_count);

    double lo = std::numeric_limits<double>::infinity();
    double hi = -lo;
    size_t placed = 0;  // boxes and spans
    for (uint32_t i = 0; i < _count; ++i) {
        // A frame's primitives are scattered and cold after the frame: ask for the ones a few
        // steps ahead while this one is read, so that the misses overlap.
        if (i + kPrefetchAhead < _count) __builtin_prefetch(primitives[i + kPrefetchAhead].get());
        _pins.emplace_back(primitives[i]);  // in the same pass: the object's line is being read
        const HXDDrawPrimitive* p = primitives[i].get();
        if (!p) continue;
        p->markHitIndexed();
        const HXDHitBounds b = p->hitBounds(backingScale);
        if (b.kind == HXDHitBounds::Kind::Nowhere) continue;
        Entry e{0.0f, 0.0f, 0.0f, 0.0f, 0.0f, i, Kind::Anywhere};
        const bool spanned =
            b.kind == HXDHitBounds::Kind::XSpan && fits(b.minX) && fits(b.maxX) && b.minX <= b.maxX;
        const bool boxed = b.kind == HXDHitBounds::Kind::Box && finiteBox(b);
        if ((spanned || boxed) && b.reach >= 0.0 && b.reach < 1e6) {
            e.kind = spanned ? Kind::Span : Kind::Box;
            e.minX = down(b.minX), e.maxX = up(b.maxX);
            if (boxed) e.minY = down(b.minY), e.maxY = up(b.maxY);
            e.reach = up(b.reach);
            lo = std::min(lo, static_cast<double>(e.minX));
            hi = std::max(hi, static_cast<double>(e.maxX));
            _maxReach = std::max(_maxReach, static_cast<double>(e.reach));
            ++placed;
            if (spanned) _spans.push_back(static_cast<uint32_t>(_entries.size()));
        } else {
            _anywhere.push_back(static_cast<uint32_t>(_entries.size()));
        }
        _entries.push_back(e);
    }
    // Read after the bounds: a change from here on is one the index has not seen.
    _revision = HXDDrawPrimitive::hitGeometryRevision();
    if (placed == 0) return;

    size_t columns = std::clamp<size_t>(placed / kPrimitivesPerColumn, 1, kMaxColumns);
    const double width = (hi - lo) / static_cast<double>(columns);
    if (!(width > 0.0 && std::isfinite(width))) columns = 1;
    _originX = lo;
    _columnWidth = columns > 1 ? width : 0.0;
    _invColumnWidth = columns > 1 ? 1.0 / width : 0.0;
    _columns.assign(columns, Column{});

    // Boxes into the columns they cross (counted, then placed); a box across more than an
    // eighth of the columns is tested by every query instead of filed many times.
    const uint32_t wide = std::max<uint32_t>(4, static_cast<uint32_t>(columns / 8));
    std::vector<uint32_t> counts(columns + 1, 0);
    for (const Entry& e : _entries) {
        if (e.kind != Kind::Box) continue;
        const uint32_t c0 = columnOf(e.minX), c1 = columnOf(e.maxX);
        if (c1 - c0 + 1 > wide) continue;
        for (uint32_t c = c0; c <= c1; ++c) ++counts[c + 1];
    }
    for (size_t c = 0; c < columns; ++c) counts[c + 1] += counts[c];
    _columnBoxes.resize(counts[columns]);
    for (size_t c = 0; c < columns; ++c) _columns[c].boxBegin = _columns[c].boxEnd = counts[c];
    for (uint32_t k = 0; k < _entries.size(); ++k) {
        const Entry& e = _entries[k];
        if (e.kind != Kind::Box) continue;
        const uint32_t c0 = columnOf(e.minX), c1 = columnOf(e.maxX);
        if (c1 - c0 + 1 > wide) {
            _wideBoxes.push_back(e);
            continue;
        }
        for (uint32_t c = c0; c <= c1; ++c) _columnBoxes[_columns[c].boxEnd++] = k;
    }
}

uint32_t PrimitiveIndex::columnOf(double x) const {
    const double k = (x - _originX) * _invColumnWidth;
    // Clamped in double before the conversion, which would be undefined out of range.
    if (!(k > 0.0)) return 0;
    return static_cast<uint32_t>(std::min(k, static_cast<double>(_columns.size() - 1)));
}

void PrimitiveIndex::fillSpans(const HXDPrimitiveArray& primitives, uint32_t column) {
    Column& col = _columns[column];
    col.spansFilled = true;
    col.spanBegin = col.spanEnd = static_cast<uint32_t>(_columnSpans.size());
    // The column's own range, a little wider: columnOf rounds, and a segment it files here
    // must be inside the range asked about. The outer columns reach to infinity, as columnOf
    // clamps (nothing indexed lies beyond them).
    const double x0 = column == 0 ? -std::numeric_limits<double>::infinity()
                                  : _originX + column * _columnWidth - 1e-6 * _columnWidth;
    const double x1 = column + 1 == _columns.size()
                          ? std::numeric_limits<double>::infinity()
                          : _originX + (column + 1) * _columnWidth + 1e-6 * _columnWidth;
    const double eps = 1e-12 * std::max(std::fabs(x0), std::fabs(x1));
    const double from = std::isfinite(eps) ? x0 - eps : x0;
    const double to = std::isfinite(eps) ? x1 + eps : x1;
    for (const uint32_t s : _spans) {
        const Entry& e = _entries[s];
        // Filed by columnOf, as tests look columns up, so that the two agree.
        if (columnOf(e.minX) > column || columnOf(e.maxX) < column) continue;
        double minY = 0.0, maxY = 0.0;
        if (!primitives[e.index]->hitYExtentOverX(from, to, minY, maxY)) continue;
        Entry part = e;
        part.minY = down(minY);
        part.maxY = up(maxY);
        _columnSpans.push_back(part);
    }
    col.spanEnd = static_cast<uint32_t>(_columnSpans.size());
    // By their lower edge, so that a test starts near its own height: curves drawn in bands
    // are hundreds to a column, and a pick is near a few.
    const auto first = _columnSpans.begin() + col.spanBegin;
    std::sort(first, _columnSpans.end(),
              [](const Entry& a, const Entry& b) { return a.minY < b.minY; });
    for (auto e = first; e != _columnSpans.end(); ++e)
        col.tallestSpan =
            std::max(col.tallestSpan, static_cast<double>(e->maxY) - static_cast<double>(e->minY));
}

std::span<const uint32_t> PrimitiveIndex::walkEntries(const Query& q) {
    // Already in list order.
    for (const Entry& e : _entries) {
        const bool near =
            e.kind == Kind::Anywhere || (e.kind == Kind::Box ? q.meets(e) : q.meetsAcross(e));
        if (near) _candidates.push_back(e.index);
    }
    return _candidates;
}

std::span<const uint32_t> PrimitiveIndex::candidates(const HXDPrimitiveArray& primitives,
                                                     const HXDHitTestContext& context) {
    _candidates.clear();
    const CGRect w = context.worldQueryRect(0.0);
    const Query q{w.origin.x,
                  w.origin.y,
                  w.origin.x + w.size.width,
                  w.origin.y + w.size.height,
                  context.worldPerPixelX(),
                  context.worldPerPixelY()};
    if (!(std::isfinite(q.x0) && std::isfinite(q.y0) && std::isfinite(q.x1) &&
          std::isfinite(q.y1) && std::isfinite(q.perPixelX) && std::isfinite(q.perPixelY))) {
        // Nothing to bound the test by: every primitive that can be hit is a candidate.
        for (const Entry& e : _entries) _candidates.push_back(e.index);
        return _candidates;
    }
    if (_columns.empty()) return walkEntries(q);

    const double g = (_maxReach + kSlackPixels) * q.perPixelX;
    const double gy = (_maxReach + kSlackPixels) * q.perPixelY;
    const uint32_t c0 = columnOf(q.x0 - g), c1 = columnOf(q.x1 + g);
    // A band across much of the list: one pass over the compact entries beats the columns.
    if (c1 - c0 >= std::max<size_t>(8, _columns.size() / 8)) return walkEntries(q);

    for (const uint32_t a : _anywhere) _candidates.push_back(_entries[a].index);
    for (const Entry& e : _wideBoxes)
        if (q.meets(e)) _candidates.push_back(e.index);
    for (uint32_t c = c0; c <= c1; ++c) {
        if (!_columns[c].spansFilled) fillSpans(primitives, c);
        const Column& col = _columns[c];
        for (uint32_t k = col.boxBegin; k < col.boxEnd; ++k) {
            const Entry& e = _entries[_columnBoxes[k]];
            if (q.meets(e)) _candidates.push_back(e.index);
        }
        // A span that meets the test reaches above y0 - gy, so its lower edge lies no lower
        // than that by the tallest span's height; and none starting above y1 + gy meets it.
        const Entry* const spans = _columnSpans.data();
        const Entry* e = std::lower_bound(spans + col.spanBegin, spans + col.spanEnd,
                                          q.y0 - gy - col.tallestSpan,
                                          [](const Entry& a, double y) { return a.minY < y; });
        for (; e != spans + col.spanEnd && e->minY <= q.y1 + gy; ++e)
            if (q.meets(*e)) _candidates.push_back(e->index);
    }
    // The exact tests run in list order, as a walk would; a primitive filed in several
    // columns is found once per column.
    std::sort(_candidates.begin(), _candidates.end());
    if (c1 > c0)
        _candidates.erase(std::unique(_candidates.begin(), _candidates.end()), _candidates.end());
    return _candidates;
}

}  // namespace hxd_internal
