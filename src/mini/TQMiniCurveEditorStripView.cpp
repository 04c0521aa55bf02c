#include "src/mini/TQMiniCurveEditorStripView.h"

#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/geometry/BNViewProjection.h"
#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/mini/TQMiniCurveEditor.h"

TQMiniCurveEditorStripView::TQMiniCurveEditorStripView() = default;
TQMiniCurveEditorStripView::~TQMiniCurveEditorStripView() = default;

CGRect TQMiniCurveEditorStripView::bounds() const {
    return _viewHost ? _viewHost->bounds() : CGRectZero;
}

double TQMiniCurveEditorStripView::backingScale() const {
    return _viewHost ? _viewHost->backingScaleFactor() : 1.0;
}

void TQMiniCurveEditorStripView::setController(TQMiniCurveEditorStripSource* controller) {
    _pController = controller;
    if (!_pController) return;
    sample();
    if (_viewHost) _viewHost->setNeedsDisplay();
}

void TQMiniCurveEditorStripView::update() {
    TQChannelBase* channel = _pController ? _pController->associatedChannel() : nullptr;
    if (!channel) return;
    TQMiniCurveEditor* editor = _pController->getMiniCurveEditor();
    TQCurveEditorAppDelegate* delegate = editor ? editor->appDelegate() : nullptr;
    if (!delegate) return;
    if (delegate->wasChannelModified(channel) ||
        (channel->getParent() && delegate->wasChannelModified(channel->getParent()))) {
        sample();
        if (_viewHost) _viewHost->setNeedsDisplay();
    }
}

TQChannel* TQMiniCurveEditorStripView::sampledChannel() const {
    TQChannelBase* channel = _pController ? _pController->associatedChannel() : nullptr;
    // Every pair stands for its first component: the over-range pairs are pairs beside 2D.
    if (auto* pair = dynamic_cast<TQChannelPair*>(channel)) return pair->getXChannel();
    return dynamic_cast<TQChannel*>(channel);
}

void TQMiniCurveEditorStripView::sample() {
    _samplesY.clear();
    _keypointsX.clear();
    _keypointsY.clear();
    TQChannel* channel = sampledChannel();
    if (!channel) return;

    _numberOfSamples = static_cast<uint32_t>(bounds().size.width);
    // A width of 0 gives an invalid step (one over zero) and no samples.
    _resolution = _numberOfSamples == 0
                      ? kCMTimeInvalid
                      : TQTarnTimeForChannelSeconds(1.0 / _numberOfSamples, 0x40000);
    const std::vector<TQKeyframeHandle> keys = channel->getKeyframes(true);
    _numberOfKeypoints = static_cast<uint32_t>(keys.size());

    _samplesY.resize(_numberOfSamples);
    for (uint32_t i = 0; i < _numberOfSamples; ++i)
        _samplesY[i] =
            channel->getValueAsDouble(CMTimeMultiply(_resolution, static_cast<int32_t>(i)));
    _keypointsX.resize(_numberOfKeypoints, kCMTimeZero);
    _keypointsY.resize(_numberOfKeypoints, 0.0);
    for (uint32_t i = 0; i < _numberOfKeypoints; ++i)
        channel->getKeyframe(keys[i], &_keypointsX[i], &_keypointsY[i]);
    _minVal = channel->getKeyframeMinValue(true);
    _maxVal = channel->getKeyframeMaxValue(true);
}

bool TQMiniCurveEditorStripView::drawInView(HXDEncoder& encoder) {
    HXDTexture* target = encoder.nextDrawable();
    if (!target) return false;
    encoder.beginEncoding(*target, kClearColor);
    const CGRect b = bounds();
    _renderController.updateTexture(
        target, 1.0f, BNViewVolumeProjection(CGRectMake(0.0, 0.0, b.size.width, b.size.height)),
        HXDFloat2{1.0f, 1.0f});
    drawCurve();
    const HXDRenderingContext& context = *_renderController.renderingContext();
    for (const auto& primitive : _primitives)
        if (primitive) primitive->encodeWithEncoder(encoder, context);
    encoder.endEncoding();
    _renderController.releaseTexture();
    return true;
}

void TQMiniCurveEditorStripView::addKeypointSquare(double x, double y, double side) {
    auto square = std::make_shared<HXDScreenspaceQuad>(
        CGRectMake(x - side / 2.0, y - side / 2.0, side, side), 0);
    square->setColor(kKeypointColor);
    square->setBlendingInfo(HXDDataType::sourceOneMinusSourceBlendingInfo());
    _primitives.push_back(std::move(square));
}

void TQMiniCurveEditorStripView::drawCurve() {
    _primitives.clear();
    const CGRect b = bounds();
    const double w = b.size.width;
    const double h = b.size.height;
    const double s = 2.0 * backingScale();
    // A sampling that stopped for want of a channel left the counts: draw what is stored.
    const size_t keypoints = std::min<size_t>(_numberOfKeypoints, _keypointsX.size());
    const size_t samples = std::min<size_t>(_numberOfSamples, _samplesY.size());

    if (std::fabs(_maxVal - _minVal) < kFlatTolerance) {
        _primitives.push_back(HXDLine::lineFromStart(
            {0.0f, static_cast<float>(h / 2.0), 0.0f},
            {static_cast<float>(w), static_cast<float>(h / 2.0), 0.0f}, 1.0f, kCurveColor, false));
        for (size_t i = 0; i < keypoints; ++i)
            addKeypointSquare(w * CMTimeGetSeconds(_keypointsX[i]), h / 2.0, s);
        return;
    }

    const double k = (h - s) / (_maxVal - _minVal);
    const double step = CMTimeGetSeconds(_resolution);
    _vertexScratch.clear();
    for (size_t i = 0; i < samples; i += 2)
        _vertexScratch.emplace_back(
            HXDFloat3{static_cast<float>(step * static_cast<double>(i) * w),
                      static_cast<float>(s / 2.0 + k * (_samplesY[i] - _minVal)), 0.0f},
            kCurveColor);
    auto curve = std::make_shared<HXDMultiline>(std::span<const HXDLineVertex>(_vertexScratch));
    curve->setAntialiased(true);
    curve->setLineJoin(0);
    _primitives.push_back(std::move(curve));
    for (size_t i = 0; i < keypoints; ++i)
        addKeypointSquare(w * CMTimeGetSeconds(_keypointsX[i]),
                          s / 2.0 + k * (_keypointsY[i] - _minVal), s);
}
