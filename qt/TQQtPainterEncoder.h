#pragma once
// The encoder that paints a frame's primitives with QPainter into an image.
//
// The image is the drawable: its size is in drawable pixels (points times the backing scale)
// and it keeps the last frame until the next one, so that a widget can show it in every
// paint event, including those where the view's 1/30 s gate skipped a frame. Offscreen
// renders read it directly.
//
// Coordinates. Primitives give world coordinates; the frame's projection and the drawable
// size map them to drawable pixels with y up (HXDScreenMapping, exactly as the hit test maps
// them), and the encoder flips y for QPainter. Widths, stipple lengths and font sizes are in
// points and are multiplied by the context's backing scale.
//
// Colours. Primitives carry premultiplied colours and texels (HXDColor); QColor is straight,
// so qColor divides the alpha out, and textures are read as premultiplied pixels: a colour
// at 0.3 of everything over the background paints 30 % of that colour, as a GPU pipeline
// blends it, and the antialiased edges of images keep no dark fringe.
//
// What QPainter cannot do as a fixed-function blender does: blendings map onto the nearest
// composition mode (see compositionModeFor); gamma other than 1 reshapes coverage exactly only
// for opaque colours, since the layer it is applied to holds colour and coverage multiplied.

#include <QFont>
#include <QImage>
#include <QPainter>
#include <QPolygonF>

#include <cstdint>
#include <functional>
#include <unordered_map>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "qt/internal/TQQtDirectRaster.h"

// A QImage as the target of a frame.
class TQQtImageTarget final : public HXDTexture {
public:
    uint32_t width() const override { return static_cast<uint32_t>(_image.width()); }
    uint32_t height() const override { return static_cast<uint32_t>(_image.height()); }
    QImage& image() { return _image; }
    const QImage& image() const { return _image; }

private:
    QImage _image;
};

// Text is measured with the font it is painted with: install one (HXDTextMetrics::setShared)
// while a Qt host draws, so that layout code and the painter agree on text boxes.
class TQQtTextMetrics final : public HXDTextMetrics {
public:
    CGSize sizeOfText(const std::string& text, const HXDTextAttributes& attributes) const override;
    // The font of a text at one point per pixel; the painter scales it by the backing scale.
    static QFont fontFor(const HXDTextAttributes& attributes);
};

class TQQtPainterEncoder final : public HXDEncoder {
public:
    TQQtPainterEncoder() = default;
    explicit TQQtPainterEncoder(const QSize& drawablePixels) { setDrawableSize(drawablePixels); }
    ~TQQtPainterEncoder() override;
    TQQtPainterEncoder(const TQQtPainterEncoder&) = delete;
    TQQtPainterEncoder& operator=(const TQQtPainterEncoder&) = delete;

    // The size of the next frame's drawable in pixels. The current image is kept until a
    // frame of the new size begins. An empty size makes nextDrawable answer null.
    void setDrawableSize(const QSize& pixels) { _drawableSize = pixels; }
    QSize drawableSize() const { return _drawableSize; }

    // The last frame presented (a null image before the first).
    const QImage& image() const { return _target.image(); }
    int framesPresented() const { return _framesPresented; }
    // Called at endEncoding with the finished frame: a widget asks for a repaint here.
    void setPresentHandler(std::function<void(const QImage&)> handler) {
        _present = std::move(handler);
    }

    HXDTexture* nextDrawable() override;
    void beginEncoding(HXDTexture& target, const HXDColor& clearColor) override;
    void endEncoding() override;
    void encodePrimitives(std::span<const std::shared_ptr<HXDDrawPrimitive>> primitives,
                          const HXDRenderingContext& context) override;

    void encodeMultiline(const HXDMultiline& multiline,
                         const HXDRenderingContext& context) override;
    void encodeQuadTexture(const HXDQuadTexture& quad, const HXDRenderingContext& context) override;
    void encodeScreenspaceQuad(const HXDScreenspaceQuad& quad,
                               const HXDRenderingContext& context) override;
    void encodeMesh(const HXDMesh& mesh, const HXDRenderingContext& context) override;
    void encodeText(const HXDText& text, const HXDRenderingContext& context) override;

    // The composition mode that stands for a blending.
    static QPainter::CompositionMode compositionModeFor(const HXDBlendingInfo& blending);
    // The straight QColor of a premultiplied colour.
    static QColor qColor(const HXDColor& color);

    // Textures converted for painting, kept by textureID (and blending source) across frames.
    size_t cachedTextureCount() const { return _textures.size(); }

    // Thin antialiased lines of one colour and images shown texel for pixel, blended
    // source-over, are written straight into the image's pixels rather than through the
    // painter (many times faster on a frame of curves; the same picture within rounding).
    // Off: everything goes through the painter, as a reference to compare with.
    void setDirectRaster(bool direct) { _directRaster = direct; }
    bool directRaster() const { return _directRaster; }

private:
    // Maps world to QPainter device pixels for one context; rebuilt when the projection or
    // the drawable changes, not per primitive.
    const HXDScreenMapping& mappingFor(const HXDRenderingContext& context);
    QPointF toDevice(double x, double y) const {
        const CGPoint p = _mapping.worldToPixel(x, y);
        return QPointF(p.x, _deviceHeight - p.y);
    }
    QRectF toDevice(const CGRect& pixelsYUp) const;
    // Paints with the primitive's blending; false when no frame is open.
    bool prepare(const HXDDrawPrimitive& primitive);
    // The colour to hand the painter under the present primitive's blending.
    QColor paintColor(const HXDColor& color) const;
    const tq_raster::Sprite* textureImage(const HXDPixelTexture& texture);
    // Paints what went to the batch (after what was handed off), band by band on this thread
    // and a pool thread. Called before anything goes through the painter, so that the order
    // of painting stays.
    void flushDirect();
    // Once the batch holds enough, a pool thread paints it while the frame goes on, if it is
    // done with the last one.
    void maybeHandOff();
    void joinHandOff();

    // Multilines: one run of vertices [first, end) stroked with `painter`; stipple phase
    // carries over from run to run.
    void strokeMultiline(QPainter& painter, const HXDMultiline& multiline, double widthPixels,
                         double step);
    struct StipplePhase {
        uint32_t bit = 0;        // the pattern's bit of the present step
        double remaining = 0.0;  // pixels left of that step
    };
    void strokeRun(QPainter& painter, double widthPixels, double step, uint32_t pattern,
                   Qt::PenJoinStyle join, StipplePhase& phase);
    // One colour, every point near the drawable: the run is drawn as one polyline. False
    // (nothing drawn) otherwise.
    bool drawWholeRun(QPainter& painter, const QRectF& guard, double widthPixels,
                      Qt::PenJoinStyle join);
    // Appends the points, less those a stroke would not show (within kFlatness of the line).
    static void appendFlattened(const std::vector<QPointF>& points, QPolygonF& out);
    // Moves the phase on by a distance in pixels without drawing.
    static void advancePhase(StipplePhase& phase, double distance, double step);
    void drawSegment(QPainter& painter, const QPointF& a, const QPointF& b, const HXDColor& ca,
                     const HXDColor& cb, double widthPixels, Qt::PenJoinStyle join);
    void appendToPolyline(QPainter& painter, const QPointF& a, const QPointF& b,
                          const HXDColor& color, double widthPixels, Qt::PenJoinStyle join);
    void flushPolyline(QPainter& painter, double widthPixels, Qt::PenJoinStyle join);
    // Gamma other than 1: the multiline goes through a layer whose coverage is reshaped.
    void strokeWithGamma(const HXDMultiline& multiline, double widthPixels, double step,
                         float gamma);

    TQQtImageTarget _target;
    QSize _drawableSize;
    QPainter _painter;
    bool _encoding = false;
    // The present primitive's blending multiplies the source by its alpha (SourceAlpha).
    bool _straightSource = false;
    // The present primitive blends source-over, and may go straight to the pixels.
    bool _directSourceOver = false;
    // The present multiline's polylines go straight to the pixels.
    bool _directLines = false;
    bool _directRaster = true;
    // The frame's pixels, valid while encoding, and what waits to be painted into them.
    tq_raster::Surface _surface;
    tq_raster::Batch _batch;
    tq_raster::Batch _handedOff;      // being painted while _handOff is active
    tq_raster::BandedPaint _handOff;  // declared after the batches it paints: finished first
    int _framesPresented = 0;
    std::function<void(const QImage&)> _present;

    HXDScreenMapping _mapping;
    BNMatrix44f _mappedProjection;
    CGSize _mappedSize = CGSizeZero;
    double _deviceHeight = 0.0;

    // Reused per multiline: the run's points in device pixels, with their colours, and the
    // pending polyline of one colour.
    std::vector<QPointF> _points;
    std::vector<HXDColor> _colors;
    QPolygonF _polyline;
    HXDColor _polylineColor;

    std::unordered_map<uint64_t, tq_raster::Sprite> _textures;
};
