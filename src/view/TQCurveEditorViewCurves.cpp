// One channel item as primitives of the present frame: the curve (dimmed and stippled outside
// its keypoints), the ghost, the processed curve, the keypoint images and the tangent handles.
//
// All coordinates handed to primitives are world coordinates (x seconds on the editor's axis,
// y the view's V), since the frame's projection is installed before the curves are built.
// The curves are rebuilt at every frame from the items' cached samples, so the per-sample
// loops avoid everything but arithmetic: no lookups, no casts, one allocation per multiline.

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <numbers>

#include "platform/channels/TQChannel.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// Hit ids of what this file draws: the selection kinds of the entries a pick makes.
constexpr uint32_t kCurveHitID = TQSelectionCurve;
constexpr uint32_t kKeypointHitID = TQSelectionKeypoint;
// Dimmed parts of a curve: every component of the premultiplied colour, alpha included,
// times this; over the background they show this share of the curve's colour.
constexpr float kDimFactor = 0.3f;
// Ghost and processed curve: the curve colour at this share of its opacity.
constexpr float kTranslucentFactor = 0.4f;
// Stipple of the dimmed parts: two steps on, two off, each 2 points long.
constexpr uint32_t kDimStipplePattern = 0x33333333u;
constexpr float kDimStippleScale = 2.0f;
// Offset of a value label from its keypoint, and the margin it keeps from the view's edge,
// in drawable pixels.
constexpr double kLabelOffset = 5.0;
constexpr double kLabelMargin = 2.0;
// Beyond this many entries a selection is looked up by bisection over its sorted handles.

// The six keypoint images an item can show, as drawPoints lays them out for drawKeypoint.
enum KeypointSlot : size_t {
    kSlotDisabledSelected = 0,
    kSlotDisabled = 1,
    kSlotLockedSelected = 2,
    kSlotLocked = 3,
    kSlotSelected = 4,
    kSlotNormal = 5,
    kSlotCount = 6,
};

// Seconds of a sample time; the plain case inline, as it runs for every sample of a frame.
inline double secondsOf(const CMTime& t) {
    return CMTIME_IS_NUMERIC(t) ? static_cast<double>(t.value) / static_cast<double>(t.timescale)
                                : CMTimeGetSeconds(t);
}

// secondsOf for a run of samples that share one timescale (as a channel's do): a multiply by
// the reciprocal instead of a division per sample. The difference is far below the single
// precision of vertices.
class SampleSeconds {
public:
    double operator()(const CMTime& t) {
        if (!CMTIME_IS_NUMERIC(t)) return CMTimeGetSeconds(t);
        if (t.timescale != _timescale) {
            _timescale = t.timescale;
            _reciprocal = 1.0 / static_cast<double>(t.timescale);
        }
        return static_cast<double>(t.value) * _reciprocal;
    }

private:
    CMTimeScale _timescale = 0;
    double _reciprocal = 0.0;
};

// BN_CMTimeSaferAdd(time, offset) without its wide arithmetic in the usual case, run for every
// keypoint of a frame: a zero offset on a timescale that divides the time's adds nothing, and
// the sum is the time on its own timescale.
CMTime plusOffset(const CMTime& time, const CMTime& offset) {
    if (CMTIME_IS_NUMERIC(time) && CMTIME_IS_NUMERIC(offset) && offset.value == 0 &&
        offset.epoch == 0 && offset.timescale > 0 && time.timescale % offset.timescale == 0) {
        CMTime sum = time;
        sum.flags |= offset.flags & kCMTimeFlags_HasBeenRounded;
        return sum;
    }
    return BN_CMTimeSaferAdd(time, offset);
}

// The mapping of channel values onto V (convertFromChannelCoords of the controller), with the
// item's factors read once per curve instead of once per sample.
struct WorldY {
    double conversion;
    double offset;
    double scale;
    explicit WorldY(const TQCurveEditorChannelItem& item)
        : conversion(item.conversionFactor()), offset(item.offsetY()), scale(item.scaleY()) {}
    double operator()(double value) const { return (value * conversion - offset) / scale; }
};

HXDExtraInfo curveInfo(uint32_t channelId) {
    HXDExtraInfo info;
    info.setObject("ID", HXDNumber::numberWithInteger(channelId));
    return info;
}

// A keypoint's dictionary: its channel and its keyframe. A kept quad's is refilled in place,
// where both keys exist already.
void fillKeyframeInfo(HXDExtraInfo& info, uint32_t channelId, TQKeyframeHandle handle) {
    info.setObject("ID", HXDNumber::numberWithInteger(channelId));
    info.setObject("Handle",
                   HXDNumber::numberWithUnsignedLongLong(reinterpret_cast<uintptr_t>(handle)));
}

HXDExtraInfo keyframeInfo(uint32_t channelId, TQKeyframeHandle handle) {
    HXDExtraInfo info;
    info.reserve(2);  // one allocation per keypoint, not two
    fillKeyframeInfo(info, channelId, handle);
    return info;
}

// Vertices [begin, end) of the samples in one colour, appended.
void appendVertices(std::vector<HXDLineVertex>& out, const CMTime* u, const double* v, size_t begin,
                    size_t end, double offsetSeconds, const WorldY& worldY, const HXDColor& color) {
    SampleSeconds secondsOfSample;
    // V = (value * conversion - offset) / scale, with the division taken out of the loop.
    const double a = worldY.conversion / worldY.scale;
    const double b = -worldY.offset / worldY.scale;
    for (size_t i = begin; i < end; ++i) {
        const float x = static_cast<float>(secondsOfSample(u[i]) + offsetSeconds);
        const float y = static_cast<float>(v[i] * a + b);
        out.emplace_back(HXDFloat3{x, y, 0.0f}, color);
    }
}

// One cached curve of an item as the controller serves it; the arrays stay the item's.
struct Samples {
    const CMTime* u = nullptr;
    const double* v = nullptr;
    unsigned count = 0;
};

// `count` samples across the display range (which is axis time: the channel's offset is taken
// off its start), of the curve that `which` names.
Samples fetchSamples(TQCurveEditorCtrlBase& controller, TQCurveEditorChannelItem& item, char which,
                     const CMTimeRange& display, const CMTime& offset, uint32_t count) {
    const CMTime start = BN_CMTimeSaferSubtract(display.start, offset);
    const CMTime step = TQTarnTimeForChannelSeconds(CMTimeGetSeconds(display.duration) / count,
                                                    kTQCurveEditorTimescale);
    Samples out;
    out.count = count;
    controller.getSamples(&item, which, start, step, &out.u, &out.v, &out.count);
    return out;
}

}  // namespace

double TQCurveEditorViewBase::windowBackingScale() const {
    return _viewHost ? _viewHost->backingScaleFactor() : _contentsScale;
}

CGPoint TQCurveEditorViewBase::worldSizeOfPixels(double width, double height) const {
    return CGPointMake(width * _worldPerPixel.x, height * _worldPerPixel.y);
}

float TQCurveEditorViewBase::thinLineWidth() const {
    return static_cast<float>(windowBackingScale()) <= 1.0f ? 1.0f : 0.5f;
}

// ---- The curve ------------------------------------------------------------------------------

void TQCurveEditorViewBase::drawOriginalCurve(TQCurveEditorItem* item) {
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!channel || !_controller) return;

    // A selected curve loses its own colour.
    const GDColor color =
        channelItem->isSelected() ? selectionColor() : getColorForIndex(channelItem->colorIndex());
    const HXDColor bright = drawingColor(color);
    const HXDColor dim = bright.scaled(kDimFactor);
    const float w = thinLineWidth();

    // One sample per point of the view's width, whatever the zoom.
    const double width = bounds().size.width;
    if (!(width >= 1.0)) return;  // a view without width shows nothing, and a step needs one
    const uint32_t n = static_cast<uint32_t>(width);
    const CMTime off = channel->timeOffset();
    const double offSeconds = CMTimeGetSeconds(off);
    const Samples fetched = fetchSamples(*_controller, *channelItem, kTQSamplesOriginalCurve,
                                         getDisplayRange(), off, n);
    const CMTime* samplesU = fetched.u;
    const double* samplesV = fetched.v;
    unsigned count = fetched.count;

    // A channel that answers with another count than asked samples off the keyframe grid: the
    // selected keypoints are merged in, so that each lies exactly on the line.
    std::vector<CMTime> mergedU;
    std::vector<double> mergedV;
    if (samplesU && samplesV && count != n && count > 1) {
        _selectedKeyScratch.clear();
        for (TQKeyframeHandle h : channel->getKeyframes(true)) {
            if (!_selection->isKeypointSelected(h)) continue;
            CMTime t{};
            double value = 0.0;
            if (channel->getKeyframe(h, &t, &value)) _selectedKeyScratch.emplace_back(t, value);
        }
        if (!_selectedKeyScratch.empty()) {
            mergedU.reserve(count + _selectedKeyScratch.size());
            mergedV.reserve(count + _selectedKeyScratch.size());
            size_t k = 0;
            for (unsigned i = 0; i < count; ++i) {
                mergedU.push_back(samplesU[i]);
                mergedV.push_back(samplesV[i]);
                if (i + 1 == count) break;
                // Keypoints at or before this sample either coincide with it or lie before
                // the whole line: neither is inserted.
                while (k < _selectedKeyScratch.size() &&
                       CMTimeCompare(_selectedKeyScratch[k].first, samplesU[i]) <= 0)
                    ++k;
                while (k < _selectedKeyScratch.size() &&
                       CMTimeCompare(_selectedKeyScratch[k].first, samplesU[i + 1]) < 0) {
                    mergedU.push_back(_selectedKeyScratch[k].first);
                    mergedV.push_back(_selectedKeyScratch[k].second);
                    ++k;
                }
            }
            samplesU = mergedU.data();
            samplesV = mergedV.data();
            count = static_cast<unsigned>(mergedU.size());
        }
    }

    if (samplesU && samplesV) {
        // The pieces before the first and after the last keypoint, in channel time (adding
        // the offset to both sides would not change the order). A channel without keyframes
        // has no middle piece: it is all extrapolation.
        CMTime first = kCMTimePositiveInfinity;
        CMTime last = kCMTimePositiveInfinity;
        if (!channel->getFirstKeyframe(&first, nullptr) ||
            !channel->getLastKeyframe(&last, nullptr)) {
            first = kCMTimePositiveInfinity;
            last = kCMTimePositiveInfinity;
        }
        // Samples ascend in time, so each piece ends where a bisection says.
        const CMTime* begin = samplesU;
        const CMTime* end = samplesU + count;
        const size_t i1 = static_cast<size_t>(
            std::partition_point(begin, end,
                                 [&](const CMTime& t) { return CMTimeCompare(t, first) < 0; }) -
            begin);
        const size_t i2 = static_cast<size_t>(
            std::partition_point(begin + i1, end,
                                 [&](const CMTime& t) { return CMTimeCompare(t, last) <= 0; }) -
            begin);
        const WorldY worldY(*channelItem);
        const uint32_t id = channelItem->channelId();

        auto emit = [&](std::vector<HXDLineVertex>&& vertices, bool dimmed) {
            auto line = std::make_shared<HXDMultiline>(std::move(vertices));
            if (dimmed) {
                line->setWidth(w);
                line->setStippled(true);
                line->setStipplePattern(kDimStipplePattern);
                line->setStippleScale(kDimStippleScale);
            }
            line->setGamma(1.0f);
            line->setAntialiased(true);
            line->setLineJoin(0);
            line->hitInfo().setHitID(kCurveHitID);
            line->hitInfo().setExtraInfo(curveInfo(id));
            _primitives.push_back(line);
            _selectionPrimitives.push_back(std::move(line));
        };
        // Each piece repeats the first vertex of the next, so that the pieces join.
        const size_t c = count;
        std::vector<HXDLineVertex> vertices;
        vertices.reserve(i1 + 1);
        appendVertices(vertices, samplesU, samplesV, 0, std::min(i1 + 1, c), offSeconds, worldY,
                       dim);
        emit(std::move(vertices), true);

        vertices = {};
        vertices.reserve(i2 - i1 + 1);
        appendVertices(vertices, samplesU, samplesV, i1, std::min(i2 + 1, c), offSeconds, worldY,
                       bright);
        emit(std::move(vertices), false);

        vertices = {};
        vertices.reserve(c - i2);
        appendVertices(vertices, samplesU, samplesV, i2, c, offSeconds, worldY, dim);
        emit(std::move(vertices), true);
    }

    // The ghost: where the curve was when the gesture began. Not pickable.
    const bool gesture = _controller->snapshotChannels() || _mouseIsDown;
    const uint32_t ghostCount = channelItem->readableSamplesSnapshot();
    if (channelItem->drawGhost() && channelItem->isSelected() && gesture && ghostCount != 0 &&
        channelItem->samplesUSnapshot() && channelItem->samplesVSnapshot()) {
        const GDColor own = getColorForIndex(channelItem->colorIndex());
        std::vector<HXDLineVertex> vertices;
        vertices.reserve(ghostCount);
        appendVertices(vertices, channelItem->samplesUSnapshot(), channelItem->samplesVSnapshot(),
                       0, ghostCount, offSeconds, WorldY(*channelItem),
                       drawingColor(own).scaled(kTranslucentFactor));
        auto ghost = std::make_shared<HXDMultiline>(std::move(vertices));
        ghost->setGamma(1.0f);
        ghost->setAntialiased(true);
        ghost->setWidth(w);
        ghost->setLineJoin(0);
        _primitives.push_back(std::move(ghost));
    }
}

void TQCurveEditorViewBase::drawProcessedCurve(TQCurveEditorItem* item) {
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!channel || !_controller) return;
    const uint32_t n = channelItem->numberOfProcessedSamples();
    if (n == 0) return;  // no step can be made from zero samples

    const CMTime off = channel->timeOffset();
    const Samples fetched = fetchSamples(*_controller, *channelItem, kTQSamplesProcessedCurve,
                                         getDisplayRange(), off, n);
    if (!fetched.u || !fetched.v) return;
    const CMTime* samplesU = fetched.u;
    const double* samplesV = fetched.v;
    const unsigned count = fetched.count;

    const GDColor own = getColorForIndex(channelItem->colorIndex());
    const HXDColor color = drawingColor(own).scaled(kTranslucentFactor);
    const double offSeconds = CMTimeGetSeconds(off);
    const WorldY worldY(*channelItem);
    // Every second sample: the processed curve is a guide, half the density is enough.
    std::vector<HXDLineVertex> vertices;
    vertices.reserve(count / 2 + 1);
    for (unsigned i = 0; i < count; i += 2)
        vertices.emplace_back(HXDFloat3{static_cast<float>(secondsOf(samplesU[i]) + offSeconds),
                                        static_cast<float>(worldY(samplesV[i])), 0.0f},
                              color);
    auto line = std::make_shared<HXDMultiline>(std::move(vertices));
    line->setGamma(1.0f);
    line->setAntialiased(true);
    line->setWidth(thinLineWidth());
    line->setLineJoin(0);
    _primitives.push_back(std::move(line));
}

// ---- Keypoints and handles ------------------------------------------------------------------

void TQCurveEditorViewBase::drawPoints(TQCurveEditorItem* item, char drawTangents) {
    _pointSize = worldSizeOfPixels(3.0, 3.0);
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
    TQChannel* channel = channelItem ? channelItem->channel() : nullptr;
    if (!channel || !channel->canKeyframe()) return;

    // Nothing below reads the item's keypoints again: the list is taken as it stands.
    const std::vector<TQKeyframeHandle>& keypoints = *channelItem->keypoints();
    // The six images this item can show, by slot. The selected images are the same in every
    // colour; the selected normal and the unselected pressed image are loaded but never shown:
    // a selected keypoint that can be edited shows as pressed.
    using namespace TQKeyframeImages;
    const auto& row = _keyframeAssets[channelItem->colorIndex() & 7u];
    const KeyframeAsset assets[kSlotCount] = {row[kDisabled][1], row[kDisabled][0],
                                              row[kInactive][1], row[kInactive][0],
                                              row[kPressed][1],  row[kNormal][0]};

    auto isSelected = [&](TQKeyframeHandle h) {
        return std::binary_search(_selectedHandleScratch.begin(), _selectedHandleScratch.end(), h);
    };

    const bool chanLocked = channel->isLocked(true);
    const CMTime off = channel->timeOffset();
    const WorldY worldY(*channelItem);
    bool prevUsesTangents = false;
    const size_t n = keypoints.size();
    for (size_t k = 0; k < n; ++k) {
        const TQKeyframeHandle h = keypoints[k];
        CMTime time{};
        double value = 0.0;
        if (!channel->getKeyframe(h, &time, &value)) continue;
        const CMTime u = plusOffset(time, off);
        const double v = worldY(value);
        const bool selected = isSelected(h);
        const bool enabled = channel->getKeyframeEnabled(h);
        const bool locked = chanLocked || channel->getKeyframeLocked(h);
        CGPoint rasterSize = CGPointZero;
        drawKeypoint(h, &u, v, selected, enabled, locked, channelItem, assets, &rasterSize);

        // Handles only on selected, enabled, unlocked keypoints: the input one when the
        // segment arriving here is shaped by tangents, the output one when the leaving one is.
        const bool editable = drawTangents && selected && enabled && !locked;
        if (editable && k != 0 && prevUsesTangents) {
            double iu = 0.0;
            double iv = 0.0;
            channel->getKeyframeInputTangents(h, &iu, &iv, true);
            if (std::fabs(iu) >= kTQZeroTolerance || std::fabs(iv) >= kTQZeroTolerance)
                drawTangent(h, iu, iv, &u, v, TQSelectionInTangent, channelItem, rasterSize);
        }
        prevUsesTangents = channel->getKeyframeInterpolationUsesTangents(h);
        // No zero-length test here: an output handle on its keypoint is dropped by drawTangent.
        if (editable && k + 1 != n && prevUsesTangents) {
            double ou = 0.0;
            double ov = 0.0;
            channel->getKeyframeOutputTangents(h, &ou, &ov, true);
            drawTangent(h, ou, ov, &u, v, TQSelectionOutTangent, channelItem, rasterSize);
        }
    }
}

void TQCurveEditorViewBase::drawKeypoint(TQKeyframeHandle handle, const CMTime* u, double v,
                                         bool selected, bool enabled, bool locked,
                                         TQCurveEditorItem* item, const KeyframeAsset assets[6],
                                         CGPoint* rasterSize) {
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
    if (!u || !assets || !channelItem) return;
    // Selected, enabled, unlocked keypoints always show the pressed selected image.
    const KeypointSlot slot = !enabled  ? (selected ? kSlotDisabledSelected : kSlotDisabled)
                              : !locked ? (selected ? kSlotSelected : kSlotNormal)
                                        : (selected ? kSlotLockedSelected : kSlotLocked);
    const double x = CMTimeGetSeconds(*u);

    // The value label of the primary keypoint while it is being edited.
    const TQCurveSelectionPtr primary =
        slot == kSlotSelected && _printText ? _selection->selectionAtIndex(0) : nullptr;
    if (primary && primary->getHandle() == handle) {
        const CGPoint p = getPointScreen(CGPointMake(x, v));
        const double value = channelItem->scaleY() * v + channelItem->offsetY();
        const BNString text = getCoordinates(item, *u, value);
        const CGSize size = HXDSizeWithAttributes(text, _textAttribs);
        const double scale = windowBackingScale();
        const CGRect b = bounds();
        const CGRect backing =
            CGRectMake(b.origin.x, b.origin.y, b.size.width * scale, b.size.height * scale);
        CGRect r = CGRectMake(p.x + kLabelOffset, p.y + kLabelOffset, size.width, size.height);
        if (!CGRectContainsRect(backing, r)) {
            if (CGRectGetMaxX(r) > CGRectGetMaxX(backing))
                r.origin.x -= CGRectGetMaxX(r) - CGRectGetMaxX(backing) + kLabelMargin;
            else if (r.origin.x < backing.origin.x)
                r.origin.x += backing.origin.x - r.origin.x + kLabelMargin;
            if (CGRectGetMaxY(r) > CGRectGetMaxY(backing))
                r.origin.y -= CGRectGetMaxY(r) - CGRectGetMaxY(backing) + kLabelMargin;
            else if (r.origin.y < backing.origin.y)
                // Deliberately the horizontal figures (with x as adjusted above): this is how
                // labels below the view have always been moved.
                r.origin.y += backing.origin.x - r.origin.x + kLabelMargin;
        }
        metalPrint(text, getPointWorld(r.origin));
    }

    // The image covers the same drawable pixels at every zoom: its points times the scale.
    const KeyframeAsset& asset = assets[slot];
    const double s = static_cast<float>(windowBackingScale());
    const CGPoint size = worldSizeOfPixels(asset.size.width * s, asset.size.height * s);
    if (rasterSize) *rasterSize = size;
    const CGRect destination = CGRectMake(x - size.x * 0.5, v - size.y * 0.5, size.x, size.y);
    const uint32_t id = channelItem->channelId();
    std::shared_ptr<HXDQuadTexture> quad = keypointQuad(asset, destination, id, handle);
    _primitives.push_back(quad);
    _selectionPrimitives.push_back(quad);
    if (!_keypointList || _keypointListChannel != id) {
        _keypointList = &_keypointsPrimitives[id];
        _keypointListChannel = id;
    }
    _keypointList->push_back(std::move(quad));
}

void TQCurveEditorViewBase::beginKeypointLists() {
    for (auto& [id, quads] : _keypointsPrimitives) quads.clear();
    _keypointList = nullptr;
    _keypointQuadsUsed = 0;
}

void TQCurveEditorViewBase::endKeypointLists() {
    std::erase_if(_keypointsPrimitives, [](const auto& entry) { return entry.second.empty(); });
    _keypointList = nullptr;
    _keypointQuads.resize(_keypointQuadsUsed);
}

std::shared_ptr<HXDQuadTexture> TQCurveEditorViewBase::keypointQuad(const KeyframeAsset& asset,
                                                                    const CGRect& destination,
                                                                    uint32_t channelId,
                                                                    TQKeyframeHandle handle) {
    if (_keypointQuadsUsed == _keypointQuads.size()) _keypointQuads.emplace_back();
    std::shared_ptr<HXDQuadTexture>& quad = _keypointQuads[_keypointQuadsUsed++];
    if (quad && quad.use_count() == 1) {
        quad->setTexture(asset.texture);
        quad->setDestinationRect(destination);
        fillKeyframeInfo(quad->hitInfo().extraInfo(), channelId, handle);
        return quad;
    }
    quad = std::make_shared<HXDQuadTexture>(0, asset.texture, destination, 1.0f);
    quad->setUseTextureAlphaForHitTest(true);
    quad->hitInfo().setHitID(kKeypointHitID);
    quad->hitInfo().setExtraInfo(keyframeInfo(channelId, handle));
    return quad;
}

void TQCurveEditorViewBase::calculateDrawTangentU(double* tangentU, double* tangentV,
                                                  double* deltaU, double* deltaV, const CMTime* u,
                                                  double v, const CGPoint& rasterSize,
                                                  const TQCurveEditorItem* item) const {
    const auto* channelItem = dynamic_cast<const TQCurveEditorChannelItem*>(item);
    if (!tangentU || !tangentV || !deltaU || !deltaV || !u || !channelItem) return;
    // A difference of values: the scale applies, the offset does not.
    const double tv = channelItem->conversionFactor() * *tangentV / channelItem->scaleY();
    *tangentV = tv;
    double angle = 0.0;
    if (std::fabs(*tangentU) >= kTQZeroTolerance)
        angle = std::atan2(tv, *tangentU);
    else
        angle = tv < 0.0 ? -std::numbers::pi / 2.0 : std::numbers::pi / 2.0;
    // Where the direction leaves the ellipse inscribed in half the keypoint image.
    const double a = rasterSize.x * 0.25;
    const double b = rasterSize.y * 0.25;
    const double c = std::cos(angle);
    const double sn = std::sin(angle);
    const double denominator = b * b * c * c + a * a * sn * sn;
    const double r = denominator > 0.0 ? std::sqrt(a * a * b * b / denominator) : 0.0;
    *deltaU = c * r;
    *deltaV = sn * r;
    *tangentU = CMTimeGetSeconds(*u) + *tangentU;
    *tangentV = v + tv;
}

void TQCurveEditorViewBase::drawTangent(TQKeyframeHandle handle, double tangentU, double tangentV,
                                        const CMTime* u, double v, uint32_t whichTangent,
                                        TQCurveEditorItem* item, const CGPoint& rasterSize) {
    auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item);
    if (!u || !channelItem) return;
    double du = 0.0;
    double dv = 0.0;
    calculateDrawTangentU(&tangentU, &tangentV, &du, &dv, u, v, rasterSize, item);

    const double s = static_cast<float>(windowBackingScale());
    const CGPoint size =
        worldSizeOfPixels(_tangentAsset.size.width * s, _tangentAsset.size.height * s);
    const double hw = size.x * 0.5;
    const double hh = size.y * 0.5;
    const double x = CMTimeGetSeconds(*u);
    // A handle lying on its keypoint is not drawn.
    if (std::fabs(tangentU - x) < hw && std::fabs(tangentV - v) < hh) return;

    // The line stops at the ellipse around the keypoint. Its alpha is the blue of the
    // selection colour, not its alpha; kept so, as the handles have always looked.
    const GDColor c = selectionColor();
    _primitives.push_back(HXDLine::lineFromStart(
        HXDFloat3{static_cast<float>(tangentU), static_cast<float>(tangentV), 0.0f},
        HXDFloat3{static_cast<float>(x + du), static_cast<float>(v + dv), 0.0f}, 1.0f,
        drawingColor(c.withAlpha(c.blue)), true));

    auto quad = std::make_shared<HXDQuadTexture>(
        0, _tangentAsset.texture, CGRectMake(tangentU - hw, tangentV - hh, size.x, size.y), 1.0f);
    quad->hitInfo().setHitID(whichTangent);
    quad->hitInfo().setExtraInfo(keyframeInfo(channelItem->channelId(), handle));
    _primitives.push_back(quad);
    _selectionPrimitives.push_back(std::move(quad));
}
