#pragma once
// The curve strip: a one-row preview of an over-range curve with its keypoints, drawn through
// the drawing primitives. It samples the channel once for each point across the range 0 to 1,
// and only when the host reports the channel (or its parent) as modified; a redraw in between
// uses the stored samples. It takes no input.
//
// The strip's source (the row that owns it) names the channel and the mini editor whose
// delegate answers for modified channels. A pair (2D or over-range) stands for its first component.
//
// Lifetime: the source and the view host are not owned; detach them (set null) before they go.

#include <cstdint>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/media/CMTime.h"
#include "platform/ui/RWServices.h"

class TQChannelBase;
class TQChannel;
class TQMiniCurveEditor;

// What the strip asks of the row that owns it.
class TQMiniCurveEditorStripSource {
public:
    virtual ~TQMiniCurveEditorStripSource() = default;
    virtual TQChannelBase* associatedChannel() const = 0;
    virtual TQMiniCurveEditor* getMiniCurveEditor() const = 0;
};

class TQMiniCurveEditorStripView {
public:
    // Values of the keypoints closer than this draw the curve flat at mid height.
    static constexpr double kFlatTolerance = 1e-7;
    static constexpr HXDColor kCurveColor{0.05f, 0.05f, 0.05f, 1.0f};
    static constexpr HXDColor kKeypointColor{0.0f, 0.0f, 0.0f, 1.0f};
    // The background: the inspector's light alternating row.
    static constexpr HXDColor kClearColor{0.93f, 0.93f, 0.93f, 1.0f};

    TQMiniCurveEditorStripView();
    ~TQMiniCurveEditorStripView();
    TQMiniCurveEditorStripView(const TQMiniCurveEditorStripView&) = delete;
    TQMiniCurveEditorStripView& operator=(const TQMiniCurveEditorStripView&) = delete;

    // Not owned. Bounds, backing scale and redraw requests come from it.
    void setViewHost(RWViewHost* host) { _viewHost = host; }
    RWViewHost* viewHost() const { return _viewHost; }
    TQMiniCurveEditorStripSource* controller() const { return _pController; }
    // Stores; with a source, samples and asks for a redraw.
    void setController(TQMiniCurveEditorStripSource* controller);
    // Samples again when the channel or its parent was modified.
    void update();
    // Takes the channel's curve and keypoints. Without a channel the arrays are emptied and
    // the counts and the value range keep what they were.
    void sample();
    // One frame through the encoder: the background, then the curve. Answers false when the
    // encoder had no drawable (nothing drawn).
    bool drawInView(HXDEncoder& encoder);
    // The frame's primitives, in the view's points with y up.
    void drawCurve();

    uint32_t numberOfSamples() const { return _numberOfSamples; }
    uint32_t numberOfKeypoints() const { return _numberOfKeypoints; }
    CMTime resolution() const { return _resolution; }
    const std::vector<double>& samplesY() const { return _samplesY; }
    const std::vector<CMTime>& keypointsX() const { return _keypointsX; }
    const std::vector<double>& keypointsY() const { return _keypointsY; }
    double minVal() const { return _minVal; }
    double maxVal() const { return _maxVal; }
    const HXDPrimitiveArray& primitives() const { return _primitives; }
    HXDRenderController& renderController() { return _renderController; }

private:
    // The channel that is drawn: the source's, or a 2D pair's first component; null if none.
    TQChannel* sampledChannel() const;
    void addKeypointSquare(double x, double y, double side);
    CGRect bounds() const;
    double backingScale() const;

    TQMiniCurveEditorStripSource* _pController = nullptr;  // not owned
    RWViewHost* _viewHost = nullptr;                       // not owned
    uint32_t _numberOfSamples = 0;
    uint32_t _numberOfKeypoints = 0;
    CMTime _resolution = kCMTimeZero;
    // Reused between samplings: a new sampling of the same width allocates nothing.
    std::vector<double> _samplesY;
    std::vector<CMTime> _keypointsX;
    std::vector<double> _keypointsY;
    double _minVal = 0.0;
    double _maxVal = 0.0;
    HXDPrimitiveArray _primitives;
    HXDRenderController _renderController{nullptr, 1.0f};
    std::vector<HXDLineVertex> _vertexScratch;
};
