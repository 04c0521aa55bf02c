#include "qt/TQQtPainterEncoder.h"

#include <QFontDatabase>
#include <QFontMetricsF>
#include <QLinearGradient>
#include <QSemaphore>
#include <QThread>
#include <QThreadPool>

#include <algorithm>
#include <array>
#include <cmath>
#include <exception>

namespace {

// Textures are few (keypoint images, handles, icons); a cache past this many holds images
// of textures that are gone, and starts over.
constexpr size_t kMaxCachedTextures = 256;
// How far, in device pixels, a left-out vertex may lie from the line that replaces it.
constexpr double kFlatness = 0.1;
// Below this a frame is painted on the caller's thread: the hand-off would cost more.
constexpr size_t kPoolPaintPrimitives = 32;
// Rows of one band of direct painting: its pixels stay in a core's cache while every
// primitive crossing it is painted.
constexpr int kBandRows = 128;
// Points waiting in the batch past which it is painted before the frame ends.
constexpr size_t kMaxBatchPoints = size_t(1) << 20;
// Points (a sprite counts as kSpritePoints) in the batch past which it is handed to a pool
// thread while the frame goes on.
constexpr size_t kHandOffPoints = 16384;
constexpr size_t kSpritePoints = 8;

Qt::PenJoinStyle penJoin(HXDLineJoin join) {
    switch (join) {
        case HXDLineJoin::Round: return Qt::RoundJoin;
        case HXDLineJoin::Bevel: return Qt::BevelJoin;
        case HXDLineJoin::Miter: return Qt::MiterJoin;
    }
    return Qt::MiterJoin;
}

// Flat ends keep stipple steps exactly as long as the pattern says; round joins get round
// ends so that separately stroked pieces meet without notches.
Qt::PenCapStyle penCap(Qt::PenJoinStyle join) {
    return join == Qt::RoundJoin ? Qt::RoundCap : Qt::FlatCap;
}

// Lines of at most one pixel take Qt's cosmetic stroker, many times faster than the general
// one on long antialiased polylines; a thinner line is drawn one pixel wide with its colour
// weakened by its width, which is what its coverage would be.
QPen linePen(QBrush brush, double widthPixels, Qt::PenJoinStyle join) {
    if (widthPixels <= 1.0) {
        if (widthPixels < 1.0 && brush.style() == Qt::SolidPattern) {
            QColor c = brush.color();
            c.setAlphaF(c.alphaF() * std::max(widthPixels, 0.0));
            brush.setColor(c);
        }
        QPen pen(brush, 1.0, Qt::SolidLine, penCap(join), join);
        pen.setCosmetic(true);
        return pen;
    }
    return QPen(brush, widthPixels, Qt::SolidLine, penCap(join), join);
}

// A colour component as the painter takes it: 0 to 1, NaN as 0.
float clamp01(float v) { return std::isfinite(v) ? std::clamp(v, 0.0f, 1.0f) : 0.0f; }

bool nearlySame(const QPointF& a, const QPointF& b) {
    return std::abs(a.x() - b.x()) + std::abs(a.y() - b.y()) < 1e-6;
}

QPointF lerp(const QPointF& a, const QPointF& b, double t) { return a + (b - a) * t; }

HXDColor lerp(const HXDColor& a, const HXDColor& b, double t) {
    const auto mix = [t](float x, float y) { return static_cast<float>(x + (y - x) * t); };
    return HXDColor{mix(a.red, b.red), mix(a.green, b.green), mix(a.blue, b.blue),
                    mix(a.alpha, b.alpha)};
}

// Liang-Barsky: the part [u0, u1] of the segment a-b (as fractions of it) inside the
// rectangle; false when none of it is.
bool clipToRect(const QPointF& a, const QPointF& b, const QRectF& r, double& u0, double& u1) {
    const double dx = b.x() - a.x();
    const double dy = b.y() - a.y();
    const double p[4] = {-dx, dx, -dy, dy};
    const double q[4] = {a.x() - r.left(), r.right() - a.x(), a.y() - r.top(), r.bottom() - a.y()};
    u0 = 0.0;
    u1 = 1.0;
    for (int k = 0; k < 4; ++k) {
        if (p[k] == 0.0) {
            if (q[k] < 0.0) return false;
            continue;
        }
        const double u = q[k] / p[k];
        if (p[k] < 0.0)
            u0 = std::max(u0, u);
        else
            u1 = std::min(u1, u);
        if (u0 > u1) return false;
    }
    return true;
}

}  // namespace

// ---- Text metrics ---------------------------------------------------------------------------

QFont TQQtTextMetrics::fontFor(const HXDTextAttributes& attributes) {
    QFont font = attributes.fontFamily.empty()
                     ? QFontDatabase::systemFont(QFontDatabase::GeneralFont)
                     : QFont(QString::fromStdString(attributes.fontFamily));
    // A point of the views is one logical pixel, whatever the screen's dpi says.
    const float size = std::isfinite(attributes.fontSize) ? attributes.fontSize : 8.0f;
    font.setPixelSize(std::max(1, static_cast<int>(std::lround(size))));
    return font;
}

CGSize TQQtTextMetrics::sizeOfText(const std::string& text,
                                   const HXDTextAttributes& attributes) const {
    const QFontMetricsF metrics(fontFor(attributes));
    return CGSizeMake(metrics.horizontalAdvance(QString::fromStdString(text)), metrics.height());
}

// ---- Frame ----------------------------------------------------------------------------------

TQQtPainterEncoder::~TQQtPainterEncoder() {
    joinHandOff();
    if (_painter.isActive()) _painter.end();
}

HXDTexture* TQQtPainterEncoder::nextDrawable() {
    if (_drawableSize.isEmpty()) return nullptr;
    QImage& image = _target.image();
    if (image.size() != _drawableSize)
        image = QImage(_drawableSize, QImage::Format_ARGB32_Premultiplied);
    if (image.isNull()) return nullptr;  // out of memory for a huge drawable
    return &_target;
}

void TQQtPainterEncoder::beginEncoding(HXDTexture& target, const HXDColor& clearColor) {
    // Only our own drawable can be painted: anything else is not a QImage we know.
    if (&target != &_target || _target.image().isNull()) return;
    if (_painter.isActive()) _painter.end();
    _painter.begin(&_target.image());
    _painter.setCompositionMode(QPainter::CompositionMode_Source);
    _painter.fillRect(QRect(QPoint(0, 0), _target.image().size()), qColor(clearColor));
    // Taken after begin, which has detached the image: these are the pixels it paints.
    _surface = _directRaster ? tq_raster::Surface::of(_target.image()) : tq_raster::Surface();
    joinHandOff();
    _batch.clear();
    _encoding = true;
    _mapping = HXDScreenMapping();
    _mappedSize = CGSizeZero;
}

void TQQtPainterEncoder::endEncoding() {
    if (!_encoding) return;
    flushDirect();
    _painter.end();
    _encoding = false;
    _surface = tq_raster::Surface();
    ++_framesPresented;
    if (_present) _present(_target.image());
}

void TQQtPainterEncoder::encodePrimitives(
    std::span<const std::shared_ptr<HXDDrawPrimitive>> primitives,
    const HXDRenderingContext& context) {
    if (_surface.isValid()) {
        // Curves and keypoints are painted straight into the pixels, in bands on two
        // threads; what still goes through the painter is too little to hand off. The batch
        // runs on across calls (a view hands over each curve as it is built) and is painted
        // before anything goes through the painter, and at the end of the frame.
        HXDEncoder::encodePrimitives(primitives, context);
        return;
    }
    // The raster engine hands every batch of more than about a hundred spans to Qt's global
    // thread pool and waits for it, unless it runs on one of the pool's own threads. A frame
    // of many thin antialiased curves flushes thousands of such batches, and the hand-offs cost
    // more than the fills they share out (the stress scene's frame: 82 ms of the caller's time
    // against 45 ms on one pool thread, the machine busy). So a large frame is painted on a
    // pool thread while the caller waits; a small one, or one when no pool thread is free, here.
    QThreadPool* pool = QThreadPool::globalInstance();
    if (primitives.size() < kPoolPaintPrimitives || !pool ||
        pool->contains(QThread::currentThread())) {
        HXDEncoder::encodePrimitives(primitives, context);
        return;
    }
    QSemaphore done;
    std::exception_ptr failure;
    const bool started = pool->tryStart([&] {
        try {
            HXDEncoder::encodePrimitives(primitives, context);
        } catch (...) {
            failure = std::current_exception();
        }
        done.release();
    });
    if (!started) {
        HXDEncoder::encodePrimitives(primitives, context);
        return;
    }
    done.acquire();
    if (failure) std::rethrow_exception(failure);
}

QColor TQQtPainterEncoder::qColor(const HXDColor& c) {
    const float alpha = clamp01(c.alpha);
    if (alpha <= 0.0f) return QColor::fromRgbF(0.0f, 0.0f, 0.0f, 0.0f);
    // QColor is straight: divide the alpha out. A component above alpha (not a premultiplied
    // colour) clamps to full.
    return QColor::fromRgbF(clamp01(c.red / alpha), clamp01(c.green / alpha),
                            clamp01(c.blue / alpha), alpha);
}

QColor TQQtPainterEncoder::paintColor(const HXDColor& c) const {
    if (!_straightSource) return qColor(c);
    // The blending multiplies the components by alpha once more: hand them over as straight,
    // and the painter's own multiply does it.
    return QColor::fromRgbF(clamp01(c.red), clamp01(c.green), clamp01(c.blue), clamp01(c.alpha));
}

QPainter::CompositionMode TQQtPainterEncoder::compositionModeFor(const HXDBlendingInfo& b) {
    using F = HXDBlendFactor;
    if (!b.enabled) return QPainter::CompositionMode_Source;
    switch (b.rgbOperation) {
        case HXDBlendOperation::Min: return QPainter::CompositionMode_Darken;
        case HXDBlendOperation::Max: return QPainter::CompositionMode_Lighten;
        case HXDBlendOperation::Subtract:
        case HXDBlendOperation::ReverseSubtract: return QPainter::CompositionMode_Difference;
        case HXDBlendOperation::Add: break;
    }
    // A source factor of One (the colour as it is) and SourceAlpha (the colour multiplied by its
    // alpha once more) are the same mode here: paintColor and textureImage hand the painter
    // what either factor asks for.
    const bool srcOver = b.sourceRGB == F::SourceAlpha || b.sourceRGB == F::One;
    if (srcOver && b.destinationRGB == F::OneMinusSourceAlpha)
        return QPainter::CompositionMode_SourceOver;
    if (srcOver && b.destinationRGB == F::One) return QPainter::CompositionMode_Plus;
    if (srcOver && b.destinationRGB == F::Zero) return QPainter::CompositionMode_Source;
    if ((b.sourceRGB == F::DestinationColor && b.destinationRGB == F::Zero) ||
        (b.sourceRGB == F::Zero && b.destinationRGB == F::SourceColor))
        return QPainter::CompositionMode_Multiply;
    if (b.sourceRGB == F::One && b.destinationRGB == F::OneMinusSourceColor)
        return QPainter::CompositionMode_Screen;
    if (b.sourceRGB == F::Zero && b.destinationRGB == F::OneMinusSourceAlpha)
        return QPainter::CompositionMode_DestinationOut;
    if (b.sourceRGB == F::Zero && b.destinationRGB == F::One)
        return QPainter::CompositionMode_Destination;
    if (b.sourceRGB == F::OneMinusDestinationAlpha && b.destinationRGB == F::One)
        return QPainter::CompositionMode_DestinationOver;
    if (b.sourceRGB == F::DestinationAlpha && b.destinationRGB == F::OneMinusSourceAlpha)
        return QPainter::CompositionMode_SourceAtop;
    return QPainter::CompositionMode_SourceOver;
}

const HXDScreenMapping& TQQtPainterEncoder::mappingFor(const HXDRenderingContext& context) {
    const CGSize size = context.drawableSize();
    if (!(_mappedSize == size) || !(_mappedProjection == context.projection())) {
        _mapping = HXDScreenMapping(context.projection(), size);
        _mappedProjection = context.projection();
        _mappedSize = size;
    }
    _deviceHeight = size.height > 0.0 ? size.height : _target.image().height();
    return _mapping;
}

QRectF TQQtPainterEncoder::toDevice(const CGRect& r) const {
    const CGRect s = CGRectStandardize(r);
    return QRectF(s.origin.x, _deviceHeight - (s.origin.y + s.size.height), s.size.width,
                  s.size.height);
}

bool TQQtPainterEncoder::prepare(const HXDDrawPrimitive& primitive) {
    if (!_encoding) return false;
    const QPainter::CompositionMode mode = compositionModeFor(primitive.blendingInfo());
    _painter.setCompositionMode(mode);
    _painter.setOpacity(1.0);
    _directSourceOver = _surface.isValid() && mode == QPainter::CompositionMode_SourceOver;
    _straightSource = primitive.blendingInfo().enabled &&
                      primitive.blendingInfo().sourceRGB == HXDBlendFactor::SourceAlpha;
    return true;
}

void TQQtPainterEncoder::joinHandOff() { _handOff.finish(); }

void TQQtPainterEncoder::maybeHandOff() {
    if (_batch.pointCount() + kSpritePoints * _batch.spriteCount() < kHandOffPoints) return;
    if (_handOff.active()) {
        if (!_handOff.done()) return;  // still painting: this batch grows meanwhile
        _handOff.finish();
    }
    std::swap(_batch, _handedOff);
    if (_handOff.start(_handedOff, _surface, kBandRows, true))
        _batch.clear();
    else
        std::swap(_batch, _handedOff);  // no pool thread free: it waits for the flush
}

void TQQtPainterEncoder::flushDirect() {
    joinHandOff();
    if (_batch.empty()) return;
    const bool helped = _surface.clip.height() > kBandRows;
    tq_raster::BandedPaint paint;
    if (!paint.start(_batch, _surface, kBandRows, helped))
        paint.start(_batch, _surface, kBandRows, false);
    paint.finish();
    _batch.clear();
}

// ---- Multilines -----------------------------------------------------------------------------

void TQQtPainterEncoder::encodeMultiline(const HXDMultiline& multiline,
                                         const HXDRenderingContext& context) {
    if (!prepare(multiline) || !mappingFor(context).isValid()) return;
    const double widthPixels = static_cast<double>(multiline.width()) * context.backingScale();
    if (!(widthPixels >= 0.0) || multiline.vertices().size() < 2) return;
    double step = 0.0;
    if (multiline.stippled()) {
        step = static_cast<double>(multiline.stippleScale()) * context.backingScale();
        if (multiline.stipplePattern() == 0) return;  // every step off
        if (!(step > 0.0) || multiline.stipplePattern() == 0xFFFFFFFFu) step = 0.0;
    }
    const float gamma = multiline.gamma();
    if (multiline.antialiased() && std::isfinite(gamma) && gamma > 0.0f && gamma != 1.0f) {
        strokeWithGamma(multiline, widthPixels, step, gamma);
        return;
    }
    _painter.setRenderHint(QPainter::Antialiasing, multiline.antialiased());
    _directLines = _directSourceOver && multiline.antialiased() && widthPixels <= 1.0;
    strokeMultiline(_painter, multiline, widthPixels, step);
    _directLines = false;
}

void TQQtPainterEncoder::strokeMultiline(QPainter& painter, const HXDMultiline& multiline,
                                         double widthPixels, double step) {
    const Qt::PenJoinStyle join = penJoin(multiline.lineJoin());
    const auto& vertices = multiline.vertices();
    StipplePhase phase{0, step};
    for (size_t r = 0; r < multiline.numberOfRuns(); ++r) {
        const auto [first, end] = multiline.runRange(r);
        if (end <= first || end > vertices.size()) continue;
        _points.clear();
        _colors.clear();
        for (uint32_t i = first; i < end; ++i) {
            _points.push_back(toDevice(vertices[i].start.x, vertices[i].start.y));
            _colors.push_back(vertices[i].color);
        }
        if (multiline.loop() && end - first > 2) {
            _points.push_back(_points.front());
            _colors.push_back(_colors.front());
        }
        strokeRun(painter, widthPixels, step, multiline.stipplePattern(), join, phase);
    }
}

void TQQtPainterEncoder::strokeRun(QPainter& painter, double widthPixels, double step,
                                   uint32_t pattern, Qt::PenJoinStyle join, StipplePhase& phase) {
    // Segments are clipped to the drawable grown by a margin: a curve zoomed far out of
    // view keeps its direction where it enters, and the rasteriser never sees huge numbers.
    const double margin = 16.0 + widthPixels;
    const QRectF guard = QRectF(QPointF(0, 0), QSizeF(_target.image().size()))
                             .adjusted(-margin, -margin, margin, margin);
    _polyline.clear();
    if (step <= 0.0 && drawWholeRun(painter, guard, widthPixels, join)) return;
    for (size_t i = 0; i + 1 < _points.size(); ++i) {
        const QPointF& a = _points[i];
        const QPointF& b = _points[i + 1];
        const HXDColor& ca = _colors[i];
        const HXDColor& cb = _colors[i + 1];
        if (!std::isfinite(a.x()) || !std::isfinite(a.y()) || !std::isfinite(b.x()) ||
            !std::isfinite(b.y())) {
            flushPolyline(painter, widthPixels, join);
            continue;
        }
        const double length = std::hypot(b.x() - a.x(), b.y() - a.y());
        double u0 = 0.0;
        double u1 = 1.0;
        if (!clipToRect(a, b, guard, u0, u1)) {
            flushPolyline(painter, widthPixels, join);
            if (step > 0.0) advancePhase(phase, length, step);
            continue;
        }
        if (step <= 0.0) {
            const QPointF pa = u0 > 0.0 ? lerp(a, b, u0) : a;
            const QPointF pb = u1 < 1.0 ? lerp(a, b, u1) : b;
            if (ca == cb) {
                appendToPolyline(painter, pa, pb, ca, widthPixels, join);
            } else {
                flushPolyline(painter, widthPixels, join);
                drawSegment(painter, pa, pb, lerp(ca, cb, u0), lerp(ca, cb, u1), widthPixels, join);
            }
            continue;
        }
        // Stipple: walk the visible part step by step; the phase runs on into the next
        // segment, and over the clipped parts without walking them.
        advancePhase(phase, u0 * length, step);
        double t = u0 * length;
        const double visibleEnd = u1 * length;
        while (t < visibleEnd) {
            const double piece = std::min(phase.remaining, visibleEnd - t);
            const bool on = ((pattern >> phase.bit) & 1u) != 0;
            if (on) {
                const double t0 = t / length;
                const double t1 = (t + piece) / length;
                const QPointF pa = lerp(a, b, t0);
                const QPointF pb = lerp(a, b, t1);
                if (ca == cb) {
                    appendToPolyline(painter, pa, pb, ca, widthPixels, join);
                } else {
                    flushPolyline(painter, widthPixels, join);
                    drawSegment(painter, pa, pb, lerp(ca, cb, t0), lerp(ca, cb, t1), widthPixels,
                                join);
                }
            } else {
                flushPolyline(painter, widthPixels, join);
            }
            t += piece;
            phase.remaining -= piece;
            if (phase.remaining <= step * 1e-9) {
                phase.bit = (phase.bit + 1) % 32;
                phase.remaining = step;
            }
        }
        if (u1 < 1.0) {
            flushPolyline(painter, widthPixels, join);
            advancePhase(phase, (1.0 - u1) * length, step);
        }
    }
    flushPolyline(painter, widthPixels, join);
}

bool TQQtPainterEncoder::drawWholeRun(QPainter& painter, const QRectF& guard, double widthPixels,
                                      Qt::PenJoinStyle join) {
    // The usual curve: one colour, on screen. It goes to the painter as one polyline, without
    // the per-segment walk.
    const HXDColor& color = _colors.front();
    for (size_t i = 0; i < _points.size(); ++i) {
        if (!(_colors[i] == color)) return false;
        const QPointF& p = _points[i];
        if (!(p.x() >= guard.left() && p.x() <= guard.right() && p.y() >= guard.top() &&
              p.y() <= guard.bottom()))
            return false;  // NaN included
    }
    _polyline.reserve(static_cast<qsizetype>(_points.size()));
    appendFlattened(_points, _polyline);
    _polylineColor = color;
    flushPolyline(painter, widthPixels, join);
    return true;
}

void TQQtPainterEncoder::appendFlattened(const std::vector<QPointF>& points, QPolygonF& out) {
    // A curve sampled more densely than its pixels spends the stroker's time on vertices that
    // move it by a fraction of a pixel. A point is left out when it lies within kFlatness of
    // the line through the last kept point and the one after it, and no nearer along that line
    // than the point before: turns and reversals stay, and the drawn line is within twice
    // kFlatness of every sample.
    const size_t n = points.size();
    if (n == 0) return;
    out.append(points[0]);
    size_t kept = 0;
    while (kept + 1 < n) {
        const QPointF a = points[kept];
        const QPointF d = points[kept + 1] - a;
        // Device points are finite and near the drawable: no need for hypot's care. Distances
        // are compared times the length, which saves a division per point.
        const double length = std::sqrt(d.x() * d.x() + d.y() * d.y());
        size_t last = kept + 1;
        if (length > 1e-9) {
            const double offLimit = kFlatness * length;
            double along = length * length;
            while (last + 1 < n) {
                const QPointF p = points[last + 1] - a;
                const double off = std::abs(d.x() * p.y() - d.y() * p.x());
                const double next = d.x() * p.x() + d.y() * p.y();
                if (off > offLimit || next < along) break;
                along = next;
                ++last;
            }
        }
        out.append(points[last]);
        kept = last;
    }
}

void TQQtPainterEncoder::advancePhase(StipplePhase& phase, double distance, double step) {
    if (!(distance > 0.0)) return;
    // The position within one period of the pattern (32 steps), moved on by the distance.
    const double period = 32.0 * step;
    double position = std::fmod(phase.bit * step + (step - phase.remaining) + distance, period);
    if (position < 0.0) position += period;
    phase.bit = std::min<uint32_t>(31, static_cast<uint32_t>(position / step));
    phase.remaining = step - (position - phase.bit * step);
    if (phase.remaining <= step * 1e-9) {
        phase.bit = (phase.bit + 1) % 32;
        phase.remaining = step;
    }
}

void TQQtPainterEncoder::appendToPolyline(QPainter& painter, const QPointF& a, const QPointF& b,
                                          const HXDColor& color, double widthPixels,
                                          Qt::PenJoinStyle join) {
    if (!_polyline.isEmpty() && color == _polylineColor && nearlySame(_polyline.back(), a)) {
        _polyline.append(b);
        return;
    }
    flushPolyline(painter, widthPixels, join);
    _polyline.append(a);
    _polyline.append(b);
    _polylineColor = color;
}

void TQQtPainterEncoder::flushPolyline(QPainter& painter, double widthPixels,
                                       Qt::PenJoinStyle join) {
    if (_polyline.size() >= 2 && _directLines && &painter == &_painter) {
        // What linePen hands the cosmetic stroker: the colour weakened by a width under one.
        QColor color = paintColor(_polylineColor);
        if (widthPixels < 1.0) color.setAlphaF(color.alphaF() * std::max(widthPixels, 0.0));
        _batch.addPolyline(_polyline.constData(), size_t(_polyline.size()),
                           qPremultiply(color.rgba()));
        if (_batch.pointCount() > kMaxBatchPoints) flushDirect();
        maybeHandOff();
    } else if (_polyline.size() >= 2) {
        if (&painter == &_painter) flushDirect();
        painter.setPen(linePen(QBrush(paintColor(_polylineColor)), widthPixels, join));
        painter.drawPolyline(_polyline);
    }
    _polyline.clear();
}

void TQQtPainterEncoder::drawSegment(QPainter& painter, const QPointF& a, const QPointF& b,
                                     const HXDColor& ca, const HXDColor& cb, double widthPixels,
                                     Qt::PenJoinStyle join) {
    if (nearlySame(a, b)) return;
    if (&painter == &_painter) flushDirect();
    QLinearGradient gradient(a, b);
    gradient.setColorAt(0.0, paintColor(ca));
    gradient.setColorAt(1.0, paintColor(cb));
    painter.setPen(linePen(QBrush(gradient), widthPixels, join));
    painter.drawLine(a, b);
}

void TQQtPainterEncoder::strokeWithGamma(const HXDMultiline& multiline, double widthPixels,
                                         double step, float gamma) {
    // Bounds of the line in device pixels, grown by its width and the antialiased fringe.
    double x0 = INFINITY, y0 = INFINITY, x1 = -INFINITY, y1 = -INFINITY;
    for (const HXDLineVertex& v : multiline.vertices()) {
        const QPointF p = toDevice(v.start.x, v.start.y);
        if (!std::isfinite(p.x()) || !std::isfinite(p.y())) continue;
        x0 = std::min(x0, p.x());
        y0 = std::min(y0, p.y());
        x1 = std::max(x1, p.x());
        y1 = std::max(y1, p.y());
    }
    if (x0 > x1) return;
    const double grow = widthPixels + 2.0;
    const QRect area = QRectF(QPointF(x0 - grow, y0 - grow), QPointF(x1 + grow, y1 + grow))
                           .toAlignedRect()
                           .intersected(QRect(QPoint(0, 0), _target.image().size()));
    if (area.isEmpty()) return;

    QImage layer(area.size(), QImage::Format_ARGB32_Premultiplied);
    layer.fill(Qt::transparent);
    {
        QPainter lp(&layer);
        lp.setRenderHint(QPainter::Antialiasing, true);
        lp.translate(-area.topLeft());
        strokeMultiline(lp, multiline, widthPixels, step);
    }
    // Coverage raised to 1/gamma; colour components follow, to stay premultiplied.
    std::array<uint8_t, 256> lut{};
    for (int a = 0; a < 256; ++a)
        lut[a] = static_cast<uint8_t>(std::lround(255.0 * std::pow(a / 255.0, 1.0 / gamma)));
    for (int y = 0; y < layer.height(); ++y) {
        auto* row = reinterpret_cast<QRgb*>(layer.scanLine(y));
        for (int x = 0; x < layer.width(); ++x) {
            const int a = qAlpha(row[x]);
            if (a == 0) continue;
            const int na = lut[a];
            const auto scale = [a, na](int c) { return std::min(na, c * na / a); };
            row[x] = qRgba(scale(qRed(row[x])), scale(qGreen(row[x])), scale(qBlue(row[x])), na);
        }
    }
    flushDirect();
    _painter.drawImage(area.topLeft(), layer);
}

// ---- Quads, meshes, text ----------------------------------------------------------------------

const tq_raster::Sprite* TQQtPainterEncoder::textureImage(const HXDPixelTexture& texture) {
    if (texture.width() == 0 || texture.height() == 0) return nullptr;
    // Texels are premultiplied and go to the painter as they are. Under a SourceAlpha blending
    // they are read as straight, so that the conversion multiplies them by alpha once more.
    const uint64_t key = texture.textureID() * 2 + (_straightSource ? 1 : 0);
    const auto found = _textures.find(key);
    if (found != _textures.end()) return &found->second;
    if (_textures.size() >= kMaxCachedTextures) {
        flushDirect();  // the batch holds sprites of the cache
        _textures.clear();
    }
    const QImage texels(
        texture.rgba().data(), static_cast<int>(texture.width()),
        static_cast<int>(texture.height()), static_cast<qsizetype>(texture.width()) * 4,
        _straightSource ? QImage::Format_RGBA8888 : QImage::Format_RGBA8888_Premultiplied);
    // The conversion copies: the cached image owns its texels.
    tq_raster::Sprite converted(texels.convertToFormat(QImage::Format_ARGB32_Premultiplied));
    if (converted.isNull()) return nullptr;
    return &_textures.emplace(key, std::move(converted)).first->second;
}

void TQQtPainterEncoder::encodeQuadTexture(const HXDQuadTexture& quad,
                                           const HXDRenderingContext& context) {
    if (!prepare(quad) || !mappingFor(context).isValid() || !quad.texture()) return;
    const tq_raster::Sprite* sprite = textureImage(*quad.texture());
    if (!sprite) return;
    const QImage* image = &sprite->image();
    const float attenuation = quad.attenuation();
    if (!(attenuation > 0.0f)) return;
    const QRectF target = toDevice(_mapping.worldRectToPixels(quad.destinationRect()));
    if (!target.isValid()) return;
    const bool faded = attenuation < 1.0f;
    // An image shown texel for pixel (keypoints, handles) lands on whole pixels: it stays
    // crisp, and is blitted instead of resampled (the shift is under half a pixel). A frame
    // draws thousands of them, so no painter state changes for them either.
    const bool texelForPixel = std::abs(target.width() - image->width()) < 0.01 &&
                               std::abs(target.height() - image->height()) < 0.01;
    const QPoint topLeft(int(std::lround(target.left())), int(std::lround(target.top())));
    if (texelForPixel && _directSourceOver) {
        // The painter's opacity in its own steps (1/256), then to 0..255 as its blend does.
        const auto opacity =
            static_cast<uint32_t>((std::lround(std::min(attenuation, 1.0f) * 256.0f) * 255) >> 8);
        _batch.addSprite(*sprite, topLeft, opacity);
        maybeHandOff();
        return;
    }
    flushDirect();
    if (faded) _painter.setOpacity(attenuation);
    if (texelForPixel) {
        _painter.drawImage(topLeft, *image);
    } else {
        _painter.setRenderHint(QPainter::SmoothPixmapTransform, true);
        _painter.drawImage(target, *image, QRectF(image->rect()));
    }
    if (faded) _painter.setOpacity(1.0);
}

void TQQtPainterEncoder::encodeScreenspaceQuad(const HXDScreenspaceQuad& quad,
                                               const HXDRenderingContext& context) {
    if (!prepare(quad) || !mappingFor(context).isValid()) return;
    const QRectF target = toDevice(_mapping.worldRectToPixels(quad.frame()));
    if (!target.isValid()) return;
    flushDirect();
    // Flat fills keep crisp edges: a band or handle is an exact pixel rectangle.
    _painter.setRenderHint(QPainter::Antialiasing, false);
    _painter.fillRect(target, paintColor(quad.color()));
}

void TQQtPainterEncoder::encodeMesh(const HXDMesh& mesh, const HXDRenderingContext& context) {
    if (!prepare(mesh) || !mappingFor(context).isValid()) return;
    const QColor color = paintColor(mesh.brush().color);
    flushDirect();
    _painter.setRenderHint(QPainter::Antialiasing, true);
    if (mesh.wireframe()) {
        _painter.setPen(
            QPen(QBrush(color), context.backingScale(), Qt::SolidLine, Qt::FlatCap, Qt::MiterJoin));
        _painter.setBrush(Qt::NoBrush);
    } else {
        _painter.setPen(Qt::NoPen);
        _painter.setBrush(color);
    }
    for (const HXDSubmesh& submesh : mesh.submeshes()) {
        const size_t needed = mesh.wireframe() ? 2 : 3;
        if (submesh.vertices.size() < needed) continue;
        _polyline.clear();
        for (const HXDFloat2& v : submesh.vertices) _polyline.append(toDevice(v.x, v.y));
        _painter.drawPolygon(_polyline, Qt::OddEvenFill);
    }
    _polyline.clear();
    _painter.setBrush(Qt::NoBrush);
}

void TQQtPainterEncoder::encodeText(const HXDText& text, const HXDRenderingContext& context) {
    if (!prepare(text) || !mappingFor(context).isValid() || text.string().empty()) return;
    const float scale = context.backingScale() > 0.0f ? context.backingScale() : 1.0f;
    const QRectF box = toDevice(text.pixelRect(_mapping, scale));
    if (!box.isValid()) return;
    flushDirect();
    _painter.save();
    _painter.setRenderHint(QPainter::TextAntialiasing, true);
    _painter.translate(box.topLeft());
    _painter.scale(scale, scale);
    _painter.setFont(TQQtTextMetrics::fontFor(text.attributes()));
    _painter.setPen(paintColor(text.attributes().color));
    // The box was measured with the shared metrics at creation; the baseline sits at its
    // bottom less the descent, as the measuring font lays it out.
    _painter.drawText(QRectF(0.0, 0.0, box.width() / scale, box.height() / scale),
                      Qt::AlignLeft | Qt::AlignBottom | Qt::TextDontClip | Qt::TextSingleLine,
                      QString::fromStdString(text.string()));
    _painter.restore();
}
