#pragma once
// HXDText: a line of text placed at a world point, drawn at a font size in points (times the
// backing scale in drawable pixels), not scaled by the zoom.
//
// Measuring text belongs to the toolkit that paints it. HXDTextMetrics is the measuring
// service: the host installs its own (a Qt host measures with the font it paints with);
// until then an estimate from the font size stands in, so layout code runs headless.

#include <cstdint>
#include <memory>
#include <string>

#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/geometry/CGGeometry.h"

struct HXDTextAttributes {
    // Empty: the system's user-interface font.
    std::string fontFamily;
    float fontSize = 8.0f;
    HXDColor color{1.0f, 1.0f, 1.0f, 1.0f};
    friend bool operator==(const HXDTextAttributes&, const HXDTextAttributes&) = default;
};

struct HXDAttributedString {
    std::string string;
    HXDTextAttributes attributes;
};

// Which point of the text's box lies at the position. 0 is the bottom left (the box starts
// at the position and grows right and up, y being up).
enum class HXDTextLayoutAnchor : uint8_t {
    BottomLeft = 0,
    BottomCenter,
    BottomRight,
    CenterLeft,
    Center,
    CenterRight,
    TopLeft,
    TopCenter,
    TopRight,
};

class HXDTextMetrics {
public:
    virtual ~HXDTextMetrics() = default;
    // The size of the text's box in points (line height by advance width).
    virtual CGSize sizeOfText(const std::string& text,
                              const HXDTextAttributes& attributes) const = 0;

    // The installed service; the estimate when none is.
    static const HXDTextMetrics& shared();
    // Installs a service for the process (null puts the estimate back). The caller keeps it
    // alive while installed.
    static void setShared(const HXDTextMetrics* metrics);
};

// sizeWithAttributes: through the shared metrics.
CGSize HXDSizeWithAttributes(const std::string& text, const HXDTextAttributes& attributes);

class HXDText : public HXDDrawPrimitive {
public:
    // initWithAttributedString:layoutAnchor:position:. The size is measured now, with the
    // shared metrics, so that drawing and hit tests agree on the box.
    HXDText(HXDAttributedString attributedString, HXDTextLayoutAnchor layoutAnchor,
            CGPoint position);

    const std::string& string() const { return _attributedString.string; }
    const HXDTextAttributes& attributes() const { return _attributedString.attributes; }
    HXDTextLayoutAnchor layoutAnchor() const { return _layoutAnchor; }
    // World point of the anchor.
    CGPoint position() const { return _position; }
    // The box in points, as measured at creation.
    CGSize size() const { return _size; }
    // The box in drawable pixels for a frame (mapping and backing scale of its context).
    CGRect pixelRect(const HXDScreenMapping& mapping, float backingScale) const;

    void encodeWithEncoder(HXDEncoder& encoder, const HXDRenderingContext& context) const override;
    float hitDistanceAtPoint(const HXDHitTestContext& context) const override;
    bool intersectsRect(const HXDHitTestContext& context) const override;

private:
    HXDAttributedString _attributedString;
    HXDTextLayoutAnchor _layoutAnchor;
    CGPoint _position;
    CGSize _size;
};
