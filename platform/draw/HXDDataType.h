#pragma once
// Small value types shared by every primitive: colours, blending, line joins.

#include <cstdint>

struct HXDFloat2 {
    float x = 0.0f;
    float y = 0.0f;
    friend bool operator==(const HXDFloat2&, const HXDFloat2&) = default;
};

struct HXDFloat3 {
    float x = 0.0f;
    float y = 0.0f;
    float z = 0.0f;
    friend bool operator==(const HXDFloat3&, const HXDFloat3&) = default;
};

// A colour as four floats in sRGB, each 0 to 1, PREMULTIPLIED: red, green and blue are
// already multiplied by alpha, as a GPU pipeline blends them. An opaque colour reads the same
// either way; white at a quarter opacity is {0.25, 0.25, 0.25, 0.25}, and a component above
// alpha is not a colour (it would brighten what lies under it). Every colour handed to a
// primitive, the clear colour and the texels of textures follow this convention.
struct HXDColor {
    float red = 0.0f;
    float green = 0.0f;
    float blue = 0.0f;
    float alpha = 1.0f;
    friend bool operator==(const HXDColor&, const HXDColor&) = default;

    // The colour of straight components (as a colour picker or a colour table gives them).
    static constexpr HXDColor fromStraight(float red, float green, float blue, float alpha) {
        return HXDColor{red * alpha, green * alpha, blue * alpha, alpha};
    }
    // The same colour at `factor` times its opacity: all four components scaled.
    constexpr HXDColor scaled(float factor) const {
        return HXDColor{red * factor, green * factor, blue * factor, alpha * factor};
    }
};

// The four components as they are, already premultiplied.
inline constexpr HXDColor HXD_sRGBA(float red, float green, float blue, float alpha) {
    return HXDColor{red, green, blue, alpha};
}

// Blend factors and operations of a fixed-function blender: the result is
//   rgb = op(src.rgb * sourceRGB, dst.rgb * destinationRGB), alpha likewise,
// with the source colour premultiplied, as the primitives carry it: "over" is One and
// OneMinusSourceAlpha. A source factor of SourceAlpha multiplies by alpha once more, which
// treats the components as straight.
enum class HXDBlendFactor : uint8_t {
    Zero,
    One,
    SourceColor,
    OneMinusSourceColor,
    SourceAlpha,
    OneMinusSourceAlpha,
    DestinationColor,
    OneMinusDestinationColor,
    DestinationAlpha,
    OneMinusDestinationAlpha,
};

enum class HXDBlendOperation : uint8_t { Add, Subtract, ReverseSubtract, Min, Max };

struct HXDBlendingInfo {
    // Off: the source replaces the target, alpha included.
    bool enabled = true;
    HXDBlendOperation rgbOperation = HXDBlendOperation::Add;
    HXDBlendOperation alphaOperation = HXDBlendOperation::Add;
    HXDBlendFactor sourceRGB = HXDBlendFactor::One;
    HXDBlendFactor destinationRGB = HXDBlendFactor::OneMinusSourceAlpha;
    HXDBlendFactor sourceAlpha = HXDBlendFactor::One;
    HXDBlendFactor destinationAlpha = HXDBlendFactor::OneMinusSourceAlpha;
    friend bool operator==(const HXDBlendingInfo&, const HXDBlendingInfo&) = default;
};

// Named blendings. A primitive starts with sourceOneMinusSourceBlendingInfo (ordinary "over"
// compositing), so that antialiased edges and translucent colours look right by default.
class HXDDataType {
public:
    // src + dst * (1 - srcAlpha), alpha likewise: a premultiplied source over the target.
    static HXDBlendingInfo sourceOneMinusSourceBlendingInfo();
    // No blending: the source is written as it is.
    static HXDBlendingInfo opaqueBlendingInfo();
    // src + dst: glows and highlights.
    static HXDBlendingInfo additiveBlendingInfo();
};

// How the segments of a polyline meet. The numbers are the ones callers pass (join 0 is a
// mitre, as with the usual 2D graphics libraries).
enum class HXDLineJoin : uint8_t { Miter = 0, Round = 1, Bevel = 2 };
