// The drawing pipeline of the curve view: the frame with its 1/30 s gate, the one-time set-up,
// the image assets, the order in which a frame is built, the overlays, the colours and the
// screen text. Curves, keypoints and handles themselves are in TQCurveEditorViewCurves.cpp.

#include <algorithm>
#include <cinttypes>
#include <cmath>
#include <cstdio>
#include <span>
#include <string_view>
#include <unordered_map>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/geometry/BNViewProjection.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/resources/BNImage.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/resources/TQStrings.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// Resets the per-frame encoder state on every way out of a frame.
class FrameScope {
public:
    FrameScope(HXDEncoder*& encoder, HXDTexture*& texture) : _encoder(encoder), _texture(texture) {}
    ~FrameScope() {
        _encoder = nullptr;
        _texture = nullptr;
    }
    FrameScope(const FrameScope&) = delete;
    FrameScope& operator=(const FrameScope&) = delete;

private:
    HXDEncoder*& _encoder;
    HXDTexture*& _texture;
};

// The conversions of a printf format, in order ("%.3f s" gives "f", "(%s, %.3f)" gives
// "sf"); "%%" is not a conversion.
std::string conversionsOf(std::string_view format) {
    std::string out;
    for (size_t i = 0; i < format.size(); ++i) {
        if (format[i] != '%') continue;
        ++i;
        while (i < format.size() && std::string_view("-+ #0123456789.*lhLqjzt").find(format[i]) !=
                                        std::string_view::npos)
            ++i;
        if (i < format.size() && format[i] != '%') out += format[i];
    }
    return out;
}

// A localised format applied to arguments of known types. The table is ours, but a text that
// asks for other arguments than the call passes would read garbage: such a text is replaced
// by the built-in form.
template <class... Args>
BNString formatLocalized(const char* key, const char* expectedConversions, const char* builtIn,
                         Args... args) {
    const BNString localized = TQLocalizedString(key);
    const char* format =
        conversionsOf(localized) == expectedConversions ? localized.c_str() : builtIn;
    char buffer[256];
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
    const int n = std::snprintf(buffer, sizeof buffer, format, args...);
#pragma GCC diagnostic pop
    return n < 0 ? BNString() : BNString(buffer);
}

}  // namespace

// ---- Frame ---------------------------------------------------------------------------------

bool TQCurveEditorViewBase::displayLayer(HXDEncoder* encoder) {
    const double now = clock().now();
    if (now - _lastDrawTime < kFrameInterval) {
        // Inside the gap the request is put off, not lost; one delayed redraw is enough.
        if (!_firedFutureDisplayEvent) {
            std::weak_ptr<char> alive = _lifeToken;
            timer().dispatchAfter(kDelayedDisplayNanoseconds, [this, alive] {
                if (!alive.expired()) setNeedsDisplay(1);
            });
            _firedFutureDisplayEvent = 1;
        }
        return false;
    }
    _firedFutureDisplayEvent = 0;
    _lastDrawTime = now;

    const GDColor background = backgroundColor();
    HXDTexture* drawable = encoder ? encoder->nextDrawable() : nullptr;
    if (!drawable) return false;  // no target now: the frame is skipped silently

    FrameScope scope(_encoder, _currentTexture);
    _currentTexture = drawable;
    setupMetalRender();
    _encoder = encoder;
    encoder->beginEncoding(*drawable, drawingColor(background));

    // Background primitives are drawn before this frame's projection is installed: they get
    // the last frame's projection (identity before the first) on this frame's target.
    const float scale = static_cast<float>(_contentsScale);
    // A subclass's set-up may leave the controller to us.
    if (!_renderController)
        _renderController = std::make_unique<HXDRenderController>(nullptr, scale);
    {
        const HXDRenderingContext* last = _renderController->renderingContext();
        const BNMatrix44f projection = last ? last->projection() : BNMatrix44f::identity();
        const HXDFloat2 pixelScale = last ? last->pixelScale() : HXDFloat2{1.0f, 1.0f};
        _renderController->updateTexture(drawable, scale, projection, pixelScale, _drawableSize);
    }
    _backgroundPrimitives.clear();
    drawBackground();
    encoder->encodePrimitives(_backgroundPrimitives, *_renderController->renderingContext());

    _primitives.clear();
    _primitivesEncoded = 0;
    beginKeypointLists();
    _selectionPrimitives.clear();
    drawProjection();
    drawCurveEditor();
    endKeypointLists();
    encodeBuiltPrimitives();

    encoder->endEncoding();
    // The target belongs to the frame; the projection stays for conversions and picks.
    _renderController->releaseTexture();
    return true;
}

void TQCurveEditorViewBase::setupMetalRender() {
    if (_metalRenderReady) return;
    if (!_renderController)
        _renderController =
            std::make_unique<HXDRenderController>(nullptr, static_cast<float>(_contentsScale));
    loadAssets();
    _primitives.clear();
    _backgroundPrimitives.clear();
    beginKeypointLists();
    endKeypointLists();
    _selectionPrimitives.clear();
    _metalRenderReady = 1;
}

void TQCurveEditorViewBase::drawProjection() {
    if (!_renderController)
        _renderController =
            std::make_unique<HXDRenderController>(nullptr, static_cast<float>(_contentsScale));
    const CGRect& v = _currentViewVolume;
    const CGSize b = bounds().size;
    const HXDFloat2 pixelScale{static_cast<float>(v.size.width / b.width),
                               static_cast<float>(v.size.height / b.height)};
    // The drawable size stands in for a target outside a frame, so that conversions and hit
    // tests work on the pixel grid the view reports.
    _renderController->updateTexture(_currentTexture, static_cast<float>(_contentsScale),
                                     BNViewVolumeProjection(v), pixelScale, _drawableSize);
    // The projection is affine: one pixel's world size serves every image of the frame.
    _worldPerPixel = getSizeWorld(CGPointMake(1.0, 1.0));
}

void TQCurveEditorViewBase::encodeBuiltPrimitives() {
    const HXDRenderingContext* context =
        _renderController ? _renderController->renderingContext() : nullptr;
    if (!_encoder || !context || _primitivesEncoded >= _primitives.size()) return;
    const std::span<const std::shared_ptr<HXDDrawPrimitive>> all(_primitives);
    _encoder->encodePrimitives(all.subspan(_primitivesEncoded), *context);
    _primitivesEncoded = _primitives.size();
}

// ---- Assets --------------------------------------------------------------------------------

void TQCurveEditorViewBase::loadAssets() {
    // The selected and inactive images are the same in every row: one texture each.
    std::unordered_map<BNString, KeyframeAsset> loaded;
    auto load = [&](const BNString& name) {
        auto [it, fresh] = loaded.try_emplace(name);
        if (fresh) it->second = keyframeAssetWithImageName(name);
        return it->second;
    };
    for (uint32_t c = 0; c < TQKeyframeImages::kColorCount; ++c)
        for (uint32_t state = 0; state < TQKeyframeImages::kStateCount; ++state)
            for (uint32_t selected = 0; selected < 2; ++selected)
                _keyframeAssets[c][state][selected] =
                    load(TQKeyframeImages::imageName(c, state, selected != 0));
    _tangentAsset = load(TQKeyframeImages::tangentHandleImageName());
}

KeyframeAsset TQCurveEditorViewBase::keyframeAssetWithImageName(const BNString& name) const {
    const double scale = _viewHost ? _viewHost->backingScaleFactor() : _contentsScale;
    std::shared_ptr<const BNImage> image = BNImageForResource(name, scale);
    if (!image) return {};
    KeyframeAsset asset;
    asset.size = image->size();
    // The image's pixels are straight, as the file holds them; the texture premultiplies them.
    asset.texture = HXDPixelTexture::textureWithRGBA(
        static_cast<uint32_t>(image->pixelsWide()), static_cast<uint32_t>(image->pixelsHigh()),
        static_cast<float>(image->scale()), image->pixels(), false);
    return asset;
}

const KeyframeAsset& TQCurveEditorViewBase::keyframeAsset(uint32_t colorIndex, uint32_t state,
                                                          uint32_t selected) const {
    static const KeyframeAsset kNone;
    if (colorIndex >= TQKeyframeImages::kColorCount || state >= TQKeyframeImages::kStateCount ||
        selected >= 2)
        return kNone;
    return _keyframeAssets[colorIndex][state][selected];
}

// ---- Building the frame ----------------------------------------------------------------------

void TQCurveEditorViewBase::drawCurveEditor() {
    if (_autoZoom) performAutoZoom(false);
    computeVerticalTickMarks();
    drawGrid();

    if (_controller) {
        // The selected handles, sorted once per frame: each keypoint of every item is looked
        // up in them by bisection.
        _selectedHandleScratch.clear();
        for (const TQCurveSelectionPtr& e : _selection->getSelectionArray())
            if (e) _selectedHandleScratch.push_back(e->getHandle());
        std::sort(_selectedHandleScratch.begin(), _selectedHandleScratch.end());
        auto drawItem = [this](TQCurveEditorItem* item) {
            drawOriginalCurve(item);
            drawPoints(item, 1);
            auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
            if (channelItem && channelItem->drawProcessedCurve()) drawProcessedCurve(item);
            // Painting the item (on the encoder's threads) overlaps building the next.
            encodeBuiltPrimitives();
        };
        // The primary channel is drawn last, on top of the others, even when disabled.
        const TQCurveEditorItemPtr first = _controller->getFirstChannel();
        if (const TQCurveSetPtr& set = _controller->selectedCurveSet()) {
            const std::vector<TQCurveEditorItemPtr> items = set->allItems();
            for (auto it = items.rbegin(); it != items.rend(); ++it) {
                TQCurveEditorItem* item = it->get();
                if (!item || !dynamic_cast<TQCurveEditorChannelItem*>(item)) continue;
                if (item->isEnabledItem() && item != first.get()) drawItem(item);
            }
        }
        if (first) drawItem(first.get());
    }

    drawOverlays(bounds());
    drawCurveUnits();
}

void TQCurveEditorViewBase::drawOverlays(const CGRect&) {
    if (_selecting) drawSelectionRect();
    const TQTool tool = _controller ? _controller->getCurrentTool() : TQTool::kEdit;
    if (tool == TQTool::kBox && !_selecting && _fourCornerBoxInitialized) drawFourCornerBox();
}

void TQCurveEditorViewBase::drawSelectionRect() {
    const GDColor c = selectionColor();
    const CGRect& r = _selectionViewVolume;
    const HXDBlendingInfo blending = HXDDataType::sourceOneMinusSourceBlendingInfo();

    auto fill = std::make_shared<HXDScreenspaceQuad>(r, 0);
    fill->setBlendingInfo(blending);
    fill->setColor(drawingColor(c.withAlpha(0.25f)));
    _primitives.push_back(fill);

    const float x = static_cast<float>(r.origin.x);
    const float y = static_cast<float>(r.origin.y);
    const float w = static_cast<float>(r.size.width);
    const float h = static_cast<float>(r.size.height);
    const HXDColor edge = drawingColor(c);
    const HXDLineSegment segments[4] = {
        {{x, y, 0.0f}, {x, y + h, 0.0f}, edge},
        {{x, y + h, 0.0f}, {x + w, y + h, 0.0f}, edge},
        {{x + w, y + h, 0.0f}, {x + w, y, 0.0f}, edge},
        {{x + w, y, 0.0f}, {x, y, 0.0f}, edge},
    };
    auto outline = std::make_shared<HXDMultiline>(std::span<const HXDLineSegment>(segments));
    outline->setBlendingInfo(blending);
    outline->setAntialiased(false);
    outline->setLoop(true);
    outline->setLineJoin(0);
    _primitives.push_back(outline);
}

// ---- Colours -------------------------------------------------------------------------------
// Colours are sRGB throughout, which is what every target here is: no conversion is needed.
// The named colours are straight; primitives take them premultiplied (drawingColor), so that
// every variant (dimmed, translucent) is made on the premultiplied form.

HXDColor TQCurveEditorViewBase::drawingColor(const GDColor& c) {
    return HXDColor::fromStraight(c.red, c.green, c.blue, c.alpha);
}

GDColor TQCurveEditorViewBase::gridColor() const { return GDColor::gridColor(); }
GDColor TQCurveEditorViewBase::endpointsColor() const { return GDColor::endpointsColor(); }
GDColor TQCurveEditorViewBase::textColor() const { return GDColor::curveEditorTextColor0(); }
GDColor TQCurveEditorViewBase::selectionColor() const { return GDColor::selectedCurveColor0(); }
GDColor TQCurveEditorViewBase::backgroundColor() const {
    return GDColor::curveEditorBackgroundColor0();
}
GDColor TQCurveEditorViewBase::lockedColor() const { return GDColor::lockedCurveColor0(); }

std::optional<GDColor> TQCurveEditorViewBase::curveColor(uint32_t index) const {
    return GDColor::curveColorAtIndex(index);
}

GDColor TQCurveEditorViewBase::getColorForIndex(uint32_t index) {
    static const GDColor table[8] = {GDColor::curveColor0(), GDColor::curveColor1(),
                                     GDColor::curveColor2(), GDColor::curveColor3(),
                                     GDColor::curveColor4(), GDColor::curveColor5(),
                                     GDColor::curveColor6(), GDColor::curveColor7()};
    return table[index & 7u];
}

// ---- Text ----------------------------------------------------------------------------------

std::optional<BNString> TQCurveEditorViewBase::getScale(const TQCurveEditorItem* item,
                                                        double value) const {
    TQChannel* channel = item ? item->channel() : nullptr;
    if (!channel) return std::nullopt;
    char buffer[64];
    if (dynamic_cast<TQChannelDecibel*>(channel))
        std::snprintf(buffer, sizeof buffer, "%.f", BN_UIAmplitudeToDecibels(value));
    else
        std::snprintf(buffer, sizeof buffer, "%4.2f", value);
    return BNString(buffer);
}

BNString TQCurveEditorViewBase::getCoordinates(const TQCurveEditorItem*, const CMTime& time,
                                               double value) const {
    const BNString timeText =
        formatLocalized("Curve Editor Time Format", "f", "%.3f s", CMTimeGetSeconds(time));
    return formatLocalized("Curve Editor Coordinates Format", "sf", "(%s, %.3f)", timeText.c_str(),
                           value);
}

void TQCurveEditorViewBase::metalPrint(const BNString& text, const CGPoint& worldPosition) {
    const CGPoint q =
        worldPosition + CGPointMake(_minDeltaU / _zoomFactorX, _minDeltaU / _zoomFactorY);
    const CGPoint s = adjustWorldPointToScreen(q);
    auto primitive = std::make_shared<HXDText>(HXDAttributedString{text, _textAttribs},
                                               HXDTextLayoutAnchor::BottomLeft, s);
    _primitives.push_back(std::move(primitive));
}

HXDTextAttributes TQCurveEditorViewBase::defaultTextAttributes() {
    HXDTextAttributes attributes;
    attributes.fontSize = 8.0f;
    attributes.color = drawingColor(GDColor::curveEditorTextColor0());
    return attributes;
}
