#include "qt/internal/TQQtDirectRaster.h"

#include <QSemaphore>
#include <QThreadPool>

#include <algorithm>
#include <atomic>
#include <cmath>
#include <limits>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace tq_raster {

namespace {

// Coordinates beyond this many pixels are not drawn: callers clip far-off segments to the
// drawable grown by a margin, and fixed point stays far from overflow.
constexpr double kMaxCoordinate = 1e6;
// A pixel takes coverage from a line up to this far from its edges (a half pixel of width,
// a half pixel of antialiasing, with room to spare).
constexpr double kReach = 2.0;
// Segments per run whose vertical extent is kept (see Batch).
constexpr uint32_t kChunkSegments = 32;

int64_t floorToInt(double v) {
    const auto i = static_cast<int64_t>(v);
    return i - (v < static_cast<double>(i) ? 1 : 0);
}

// A colour at each coverage: one lookup per pixel instead of a multiply.
void fillShades(uint32_t color, uint32_t* shades) {
    for (uint32_t c = 0; c < 256; ++c) shades[c] = byteMul(color, c);
}

// The shade over the pixel.
inline void blendShade(uint32_t& pixel, uint32_t shade) {
    pixel = shade + byteMul(pixel, 255u - (shade >> 24));
}

#if defined(__SSE2__)
// Two shades over two pixels, each channel in a 16-bit lane; the same arithmetic as
// blendShade, so that either gives the same picture.
inline __m128i blendShades(__m128i pixels, __m128i shades) {
    const __m128i zero = _mm_setzero_si128();
    const __m128i d = _mm_unpacklo_epi8(pixels, zero);
    const __m128i s = _mm_unpacklo_epi8(shades, zero);
    __m128i alpha = _mm_shufflelo_epi16(s, _MM_SHUFFLE(3, 3, 3, 3));
    alpha = _mm_shufflehi_epi16(alpha, _MM_SHUFFLE(3, 3, 3, 3));
    __m128i t = _mm_mullo_epi16(d, _mm_sub_epi16(_mm_set1_epi16(255), alpha));
    t = _mm_add_epi16(_mm_add_epi16(t, _mm_srli_epi16(t, 8)), _mm_set1_epi16(128));
    t = _mm_add_epi16(_mm_srli_epi16(t, 8), s);
    return _mm_packus_epi16(t, t);
}

inline __m128i loadPair(const uint32_t* p0, const uint32_t* p1) {
    return _mm_unpacklo_epi32(_mm_cvtsi32_si128(static_cast<int>(*p0)),
                              _mm_cvtsi32_si128(static_cast<int>(*p1)));
}
#endif

// Two shades over the pixels at p0 and p1; `adjacent`: p1 is the pixel after p0.
template <bool Adjacent>
inline void blendPair(uint32_t* p0, uint32_t* p1, uint32_t s0, uint32_t s1) {
#if defined(__SSE2__)
    if constexpr (Adjacent) {
        __m128i d = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(p0));
        d = blendShades(d, loadPair(&s0, &s1));
        _mm_storel_epi64(reinterpret_cast<__m128i*>(p0), d);
    } else {
        const __m128i d = blendShades(loadPair(p0, p1), loadPair(&s0, &s1));
        *p0 = static_cast<uint32_t>(_mm_cvtsi128_si32(d));
        *p1 = static_cast<uint32_t>(_mm_cvtsi128_si32(_mm_srli_si128(d, 4)));
    }
#else
    blendShade(*p0, s0);
    blendShade(*p1, s1);
#endif
}

// One segment along its major axis `a` (one pixel per step) with `b` the minor axis, in
// coordinates where pixel centres are whole numbers; a0 < a1. Steep: a is y.
//
// Pixel c of the major axis spans [c - 0.5, c + 0.5); the line's minor position at its
// centre splits the coverage between the two pixels either side, weighted at the ends by
// the part of the pixel the segment covers.
template <bool Steep>
void strokeSpan(const Surface& s, double a0, double b0, double a1, double b1,
                const uint32_t* shades) noexcept {
    const int majorLo = Steep ? s.clip.top() : s.clip.left();
    const int majorHi = Steep ? s.clip.bottom() : s.clip.right();  // inclusive
    const int minorLo = Steep ? s.clip.left() : s.clip.top();
    const auto minorSpan = static_cast<unsigned>(Steep ? s.clip.width() : s.clip.height());
    const auto first = static_cast<int>(floorToInt(a0 + 0.5));
    const auto last = static_cast<int>(floorToInt(a1 + 0.5));
    const int from = std::max(first, majorLo);
    const int to = std::min(last, majorHi);
    if (from > to) return;
    const double slope = (b1 - b0) / (a1 - a0);
    // The minor position in 16.16 fixed point: one add per step.
    int64_t b = floorToInt((b0 + (from - a0) * slope) * 65536.0 + 0.5);
    const int64_t step = floorToInt(slope * 65536.0 + 0.5);
    const ptrdiff_t majorStride = Steep ? s.stride : 1;
    const ptrdiff_t minorStride = Steep ? 1 : s.stride;
    uint32_t* line = s.bits + static_cast<ptrdiff_t>(from) * majorStride;
    for (int c = from; c <= to; ++c, b += step, line += majorStride) {
        const auto minor = static_cast<int>(b >> 16);
        const auto fraction = static_cast<uint32_t>((b >> 8) & 0xff);
        uint32_t near = 255u - fraction;
        uint32_t far = fraction;
        if (c == first || c == last) {
            const double covered = std::min(c + 0.5, a1) - std::max(c - 0.5, a0);
            const auto weight = static_cast<uint32_t>(std::max(covered, 0.0) * 256.0 + 0.5);
            near = (near * weight) >> 8;
            far = (far * weight) >> 8;
        }
        const ptrdiff_t at = static_cast<ptrdiff_t>(minor) * minorStride;
        if (static_cast<unsigned>(minor - minorLo) < minorSpan - 1) {
            blendPair<Steep>(line + at, line + at + minorStride, shades[near], shades[far]);
            continue;
        }
        // At the clip's edge one of the two may lie outside.
        if (static_cast<unsigned>(minor - minorLo) < minorSpan) blendShade(line[at], shades[near]);
        if (static_cast<unsigned>(minor + 1 - minorLo) < minorSpan)
            blendShade(line[at + minorStride], shades[far]);
    }
}

void strokeSegment(const Surface& s, QPointF from, QPointF to, const uint32_t* shades) noexcept {
    const auto near = [](double v) { return std::abs(v) < kMaxCoordinate; };  // false for NaN
    if (!near(from.x()) || !near(from.y()) || !near(to.x()) || !near(to.y())) return;
    // On the raster engine's grid of 1/64 pixel, with pixel centres at whole numbers.
    const auto grid = [](double v) { return double(floorToInt(v * 64.0 + 0.5)) / 64.0 - 0.5; };
    double x0 = grid(from.x()), y0 = grid(from.y()), x1 = grid(to.x()), y1 = grid(to.y());
    const double dx = x1 - x0;
    const double dy = y1 - y0;
    if (std::abs(dy) > std::abs(dx)) {
        if (y0 > y1) {
            std::swap(x0, x1);
            std::swap(y0, y1);
        }
        strokeSpan<true>(s, y0, x0, y1, x1, shades);
    } else if (std::abs(dx) > 1e-9) {
        if (x0 > x1) {
            std::swap(x0, x1);
            std::swap(y0, y1);
        }
        strokeSpan<false>(s, x0, y0, x1, y1, shades);
    }
}

}  // namespace

Surface Surface::of(QImage& image) {
    Surface s;
    if (image.format() != QImage::Format_ARGB32_Premultiplied || image.isNull()) return s;
    s.bits = reinterpret_cast<uint32_t*>(image.bits());
    s.stride = image.bytesPerLine() / 4;
    s.clip = image.rect();
    return s;
}

Sprite::Sprite(QImage image) {
    if (image.format() != QImage::Format_ARGB32_Premultiplied) return;
    _image = std::move(image);
    for (int y = 0; y < _image.height(); ++y) {
        const auto* row = reinterpret_cast<const uint32_t*>(_image.constScanLine(y));
        for (int x = 0; x < _image.width();) {
            if (row[x] == 0) {
                ++x;
                continue;
            }
            const int start = x;
            while (x < _image.width() && row[x] != 0) ++x;
            _runs.push_back({y, start, x});
        }
    }
}

void blendSprite(const Surface& surface, const Sprite& sprite, QPoint topLeft, uint32_t opacity) {
    if (!surface.isValid() || sprite.isNull() || opacity == 0) return;
    const QRect& clip = surface.clip;
    // Most sprites of a frame miss a given band.
    if (topLeft.y() > clip.bottom() || topLeft.y() + sprite.image().height() <= clip.top()) return;
    const QRect area = clip.intersected(QRect(topLeft, sprite.image().size()));
    if (area.isEmpty()) return;
    for (const Sprite::Run& run : sprite.runs()) {
        const int y = topLeft.y() + run.y;
        if (y < area.top()) continue;
        if (y > area.bottom()) break;
        const int x0 = std::max(topLeft.x() + run.x0, area.left());
        const int x1 = std::min(topLeft.x() + run.x1, area.right() + 1);
        const auto* src = reinterpret_cast<const uint32_t*>(sprite.image().constScanLine(run.y)) +
                          (x0 - topLeft.x());
        uint32_t* dst = surface.bits + static_cast<ptrdiff_t>(y) * surface.stride + x0;
        const int n = x1 - x0;
        int i = 0;
        if (opacity == 255)
            for (; i + 1 < n; i += 2) blendPair<true>(dst + i, dst + i + 1, src[i], src[i + 1]);
        for (; i < n; ++i) blendShade(dst[i], opacity < 255 ? byteMul(src[i], opacity) : src[i]);
    }
}

void Batch::addPolyline(const QPointF* points, size_t count, uint32_t color) {
    if (count < 2 || (color >> 24) == 0) return;
    const auto first = static_cast<uint32_t>(_points.size());
    _points.insert(_points.end(), points, points + count);
    const auto shades = static_cast<uint32_t>(_shades.size());
    _shades.resize(_shades.size() + 256);
    fillShades(color, _shades.data() + shades);
    const auto chunks = static_cast<uint32_t>(_chunkLow.size());
    for (size_t s = 0; s + 1 < count; s += kChunkSegments) {
        const size_t end = std::min(s + kChunkSegments, count - 1);
        // A coordinate that is not a number stays out: its segments are never stroked.
        double low = std::numeric_limits<double>::infinity(), high = -low;
        for (size_t i = s; i <= end; ++i) {
            low = std::min(low, points[i].y());
            high = std::max(high, points[i].y());
        }
        _chunkLow.push_back(low);
        _chunkHigh.push_back(high);
    }
    _ops.push_back(Op{nullptr, shades, first, static_cast<uint32_t>(count), QPoint(), chunks});
}

void Batch::addSprite(const Sprite& sprite, QPoint topLeft, uint32_t opacity) {
    if (sprite.isNull() || opacity == 0) return;
    _ops.push_back(Op{&sprite, opacity, 0, 0, topLeft, 0});
}

void Batch::clear() {
    _points.clear();
    _shades.clear();
    _ops.clear();
    _chunkLow.clear();
    _chunkHigh.clear();
}

void Batch::paintBand(const Surface& band) const noexcept {
    if (!band.isValid()) return;
    const double top = band.clip.top() - kReach;
    const double bottom = band.clip.bottom() + 1 + kReach;
    const double left = band.clip.left() - kReach;
    const double right = band.clip.right() + 1 + kReach;
    for (const Op& op : _ops) {
        if (op.sprite) {
            blendSprite(band, *op.sprite, op.topLeft, op.color);
            continue;
        }
        const QPointF* p = _points.data() + op.first;
        const uint32_t* shades = _shades.data() + op.color;
        const double* low = _chunkLow.data() + op.firstChunk;
        const double* high = _chunkHigh.data() + op.firstChunk;
        for (uint32_t s = 0, c = 0; s + 1 < op.count; s += kChunkSegments, ++c) {
            // Most runs of a frame miss a given band.
            if (low[c] > bottom || high[c] < top) continue;
            const uint32_t end = std::min<uint32_t>(s + kChunkSegments, op.count - 1);
            for (uint32_t i = s; i < end; ++i) {
                const QPointF& a = p[i];
                const QPointF& b = p[i + 1];
                if ((a.y() < top && b.y() < top) || (a.y() > bottom && b.y() > bottom) ||
                    (a.x() < left && b.x() < left) || (a.x() > right && b.x() > right))
                    continue;
                strokeSegment(band, a, b, shades);
            }
        }
    }
}

struct BandedPaint::State {
    const Batch* batch = nullptr;
    Surface surface;
    int bandRows = 1;
    int bands = 0;
    std::atomic<int> next{0};
    std::atomic<int> painted{0};
    QSemaphore helperDone;  // released once by a helper that painted any band

    // Paints bands until none is left to take; how many it painted.
    int paint() noexcept {
        const QRect clip = surface.clip;
        int mine = 0;
        for (int b = next++; b < bands; b = next++) {
            Surface band = surface;
            band.clip = QRect(clip.left(), clip.top() + b * bandRows, clip.width(), bandRows)
                            .intersected(clip);
            batch->paintBand(band);
            painted.fetch_add(1, std::memory_order_release);
            ++mine;
        }
        return mine;
    }
};

bool BandedPaint::start(const Batch& batch, const Surface& surface, int bandRows, bool helped) {
    finish();
    auto state = std::make_shared<State>();
    state->batch = &batch;
    state->surface = surface;
    state->bandRows = std::max(1, bandRows);
    state->bands = (surface.clip.height() + state->bandRows - 1) / state->bandRows;
    if (helped) {
        // The helper holds the state: one that starts after the caller has finished finds no
        // band to take and touches nothing else.
        QThreadPool* pool = QThreadPool::globalInstance();
        const bool started = pool && pool->tryStart([state] {
            if (state->paint() > 0) state->helperDone.release();
        });
        if (!started) return false;
    }
    _state = std::move(state);
    return true;
}

bool BandedPaint::done() const {
    return _state && _state->painted.load(std::memory_order_acquire) == _state->bands;
}

void BandedPaint::finish() noexcept {
    if (!_state) return;
    // Once the caller's loop ends every band is taken: those it did not paint, a helper did
    // or is painting, and the helper signals when it is through.
    if (_state->paint() < _state->bands) _state->helperDone.acquire();
    _state.reset();
}

}  // namespace tq_raster
