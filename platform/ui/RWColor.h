#pragma once
// A colour as controls and cells take it: sRGB components from 0 to 1 and a straight (not
// premultiplied) alpha. A plain value.

struct RWColor {
    float red = 0.0f;
    float green = 0.0f;
    float blue = 0.0f;
    float alpha = 1.0f;

    friend bool operator==(const RWColor&, const RWColor&) = default;

    static RWColor colorWithCalibratedRed(float red, float green, float blue, float alpha) {
        return {red, green, blue, alpha};
    }
};
