#include "platform/draw/HXDText.h"

#include <cmath>

#include "platform/draw/HXDEncoder.h"
#include "platform/draw/internal/HXDGeometry2D.h"

namespace {
// Without a toolkit: an average advance of 0.55 em per character (UTF-8 continuation bytes
// do not advance) and a line of 1.2 em, close to the usual sans-serif user-interface fonts.
class EstimatedTextMetrics : public HXDTextMetrics {
public:
    CGSize sizeOfText(const std::string& text, const HXDTextAttributes& attributes) const override {
        size_t characters = 0;
        for (unsigned char c : text) characters += (c & 0xC0u) != 0x80u ? 1 : 0;
        const double em = attributes.fontSize > 0.0f ? attributes.fontSize : 0.0;
        return CGSizeMake(std::ceil(0.55 * em * static_cast<double>(characters)),
                          std::ceil(1.2 * em));
    }
};

const EstimatedTextMetrics gEstimatedMetrics;
const HXDTextMetrics* gInstalledMetrics = nullptr;
}  // namespace

const HXDTextMetrics& HXDTextMetrics::shared() {
    return gInstalledMetrics ? *gInstalledMetrics : gEstimatedMetrics;
}

void HXDTextMetrics::setShared(const HXDTextMetrics* metrics) { gInstalledMetrics = metrics; }

CGSize HXDSizeWithAttributes(const std::string& text, const HXDTextAttributes& attributes) {
    return HXDTextMetrics::shared().sizeOfText(text, attributes);
}

HXDText::HXDText(HXDAttributedString attributedString, HXDTextLayoutAnchor layoutAnchor,
                 CGPoint position)
    : HXDDrawPrimitive(0),
      _attributedString(std::move(attributedString)),
      _layoutAnchor(layoutAnchor),
      _position(position),
      _size(HXDSizeWithAttributes(_attributedString.string, _attributedString.attributes)) {}

CGRect HXDText::pixelRect(const HXDScreenMapping& mapping, float backingScale) const {
    const CGPoint anchor = mapping.worldToPixel(_position.x, _position.y);
    const double w = _size.width * backingScale;
    const double h = _size.height * backingScale;
    const auto a = static_cast<unsigned>(_layoutAnchor);
    // Anchors run left, centre, right within bottom, centre and top rows.
    const double fx = (a % 3) * 0.5;
    const double fy = (a / 3) * 0.5;
    return CGRectMake(anchor.x - fx * w, anchor.y - fy * h, w, h);
}

void HXDText::encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const {
    encoder.encodeText(*this, context);
}

float HXDText::hitDistanceAtPoint(const HXDHitTestContext& context) const {
    const CGPoint p = context.point();
    return hxd_internal::rectContains(pixelRect(context.mapping(), context.backingScale()), p.x,
                                      p.y)
               ? 0.0f
               : -1.0f;
}

bool HXDText::intersectsRect(const HXDHitTestContext& context) const {
    return hxd_internal::rectsMeet(pixelRect(context.mapping(), context.backingScale()),
                                   context.rect());
}
