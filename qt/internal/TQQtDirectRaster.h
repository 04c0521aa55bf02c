#pragma once
// Straight-to-pixels painting of the two primitives a curve frame is made of: thin
// antialiased polylines of one colour and images blitted texel for pixel, both blended
// source-over into premultiplied ARGB32 pixels.
//
// QPainter's raster engine fills such a line one span at a time through a function pointer
// per span; a frame of wiggly curves is hundreds of thousands of two-pixel spans, and those
// calls are most of its cost. Here each pixel is one inlined blend. The picture follows the
// raster engine's (pixel centres at half-integers, coverage split between the two pixels
// nearest the line along its minor axis, end pixels weighted by how much of them the line
// covers), so the two paths can be mixed in one frame.

#include <QImage>
#include <QPointF>
#include <QRect>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

namespace tq_raster {

// Pixels of a Format_ARGB32_Premultiplied image and the rectangle painting may change.
struct Surface {
    uint32_t* bits = nullptr;
    ptrdiff_t stride = 0;  // pixels from one row to the next
    QRect clip;            // within the image

    bool isValid() const { return bits != nullptr && !clip.isEmpty(); }
    // The whole of an image; invalid unless it is premultiplied ARGB32.
    static Surface of(QImage& image);
};

// x * a / 255 for each 8-bit channel of x, rounded.
inline uint32_t byteMul(uint32_t x, uint32_t a) {
    uint64_t t = ((uint64_t(x) | (uint64_t(x) << 24)) & 0x00ff00ff00ff00ffULL) * a;
    t = (t + ((t >> 8) & 0x00ff00ff00ff00ffULL) + 0x0080008000800080ULL) >> 8;
    t &= 0x00ff00ff00ff00ffULL;
    return uint32_t(t) | uint32_t(t >> 24);
}

// An image prepared for blitting: its pixels, and per row the runs of pixels that are not
// transparent, so that the clear corners of a round keypoint image cost nothing.
class Sprite {
public:
    Sprite() = default;
    // Invalid unless the image is premultiplied ARGB32.
    explicit Sprite(QImage image);
    const QImage& image() const { return _image; }
    bool isNull() const { return _image.isNull(); }

    struct Run {
        int y, x0, x1;  // row, and columns [x0, x1)
    };
    const std::vector<Run>& runs() const { return _runs; }

private:
    QImage _image;
    std::vector<Run> _runs;
};

// A sprite with its top left at a pixel, at opacity 0 to 255.
void blendSprite(const Surface& surface, const Sprite& sprite, QPoint topLeft, uint32_t opacity);

// Polylines and sprites recorded in paint order and painted later, band of rows by band:
// a band's pixels stay in the cache while every primitive crossing it is painted, and bands
// can be painted on several threads at once. Sprites are held by address and must outlive
// the next paintBand.
class Batch {
public:
    // A one-pixel antialiased polyline through device pixels (y down) in a premultiplied
    // colour (0xAARRGGBB). Segments with a point further than a million pixels out are left
    // out: callers clip far-off segments to the drawable grown by a margin first.
    void addPolyline(const QPointF* points, size_t count, uint32_t color);
    void addSprite(const Sprite& sprite, QPoint topLeft, uint32_t opacity);
    bool empty() const { return _ops.empty(); }
    size_t pointCount() const { return _points.size(); }
    size_t spriteCount() const { return _ops.size() - _shades.size() / 256; }
    void clear();

    // Paints everything recorded into the surface's clip (a band of a larger surface):
    // pixels outside it are left alone, so that bands can be painted concurrently.
    void paintBand(const Surface& band) const noexcept;

private:
    struct Op {
        const Sprite* sprite;  // null for a polyline
        uint32_t color;        // a sprite's opacity, a polyline's first of 256 shades
        uint32_t first;        // a polyline's points [first, first + count)
        uint32_t count;
        QPoint topLeft;
        uint32_t firstChunk;  // a polyline's first entry in _chunkLow and _chunkHigh
    };
    std::vector<QPointF> _points;
    // The least and greatest y of each run of kChunkSegments segments of a polyline: a band
    // passes over whole runs it cannot touch instead of testing each of their segments.
    std::vector<double> _chunkLow;
    std::vector<double> _chunkHigh;
    std::vector<uint32_t> _shades;  // per polyline, its colour at each coverage
    std::vector<Op> _ops;
};

// A batch painted band by band by whichever thread takes each band first: the caller and,
// when one is free, a pool thread. The caller never waits for a pool thread that has not
// started, which on a busy machine may be a whole time slice away; it takes the bands left.
class BandedPaint {
public:
    BandedPaint() = default;
    ~BandedPaint() { finish(); }
    BandedPaint(const BandedPaint&) = delete;
    BandedPaint& operator=(const BandedPaint&) = delete;

    // Starts painting the batch into the surface in bands of `bandRows`, asking the pool for a
    // thread when `helped`. The batch and the pixels must stay until finish(). False (and
    // nothing started) when a helper was asked for and none is free.
    bool start(const Batch& batch, const Surface& surface, int bandRows, bool helped);
    bool active() const { return _state != nullptr; }
    // Every band painted (false while none is started).
    bool done() const;
    // Paints the bands nobody has taken, then waits for those a pool thread is painting.
    void finish() noexcept;

private:
    struct State;
    std::shared_ptr<State> _state;
};

}  // namespace tq_raster
