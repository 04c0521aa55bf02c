#pragma once
// Test doubles for the drawing layer: a target of a given size and an encoder that records
// what a frame encodes, in order, without painting. Header-only; for tests.
//
// The recording encoder also holds every primitive to the colour convention of the drawing
// layer: a colour (or texel) whose red, green or blue exceeds its alpha is not premultiplied,
// and would paint too bright; each such colour lands in colourFaults.

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

#include "platform/draw/HXDPrimitives.h"

class HXDMemoryTarget : public HXDTexture {
public:
    HXDMemoryTarget(uint32_t width, uint32_t height) : _width(width), _height(height) {}
    uint32_t width() const override { return _width; }
    uint32_t height() const override { return _height; }

private:
    uint32_t _width;
    uint32_t _height;
};

class HXDRecordingEncoder : public HXDEncoder {
public:
    enum class Kind { Multiline, Line, QuadTexture, ScreenspaceQuad, Mesh, Text };
    struct Entry {
        Kind kind;
        const HXDDrawPrimitive* primitive;
    };
    // A colour that is not premultiplied; primitive is null for the clear colour.
    struct ColourFault {
        const HXDDrawPrimitive* primitive;
        HXDColor color;
    };

    // available = false makes nextDrawable answer null, as when no surface is free.
    explicit HXDRecordingEncoder(uint32_t width = 640, uint32_t height = 480)
        : _target(width, height) {}

    void setDrawableAvailable(bool available) { _available = available; }

    HXDTexture* nextDrawable() override { return _available ? &_target : nullptr; }
    void beginEncoding(HXDTexture&, const HXDColor& clearColor) override {
        entries.clear();
        colourFaults.clear();
        this->clearColor = clearColor;
        check(nullptr, clearColor);
    }
    void endEncoding() override {}
    void encodeMultiline(const HXDMultiline& m, const HXDRenderingContext&) override {
        add(Kind::Multiline, m);
        for (const HXDLineVertex& v : m.vertices()) check(&m, v.color);
    }
    void encodeLine(const HXDLine& l, const HXDRenderingContext&) override {
        add(Kind::Line, l);
        for (const HXDLineVertex& v : l.vertices()) check(&l, v.color);
    }
    void encodeQuadTexture(const HXDQuadTexture& q, const HXDRenderingContext&) override {
        add(Kind::QuadTexture, q);
        if (!q.texture()) return;
        const std::vector<uint8_t>& texels = q.texture()->rgba();
        for (size_t i = 0; i + 3 < texels.size(); i += 4) {
            if (std::max({texels[i], texels[i + 1], texels[i + 2]}) <= texels[i + 3]) continue;
            const auto unit = [&](size_t k) { return static_cast<float>(texels[k]) / 255.0f; };
            colourFaults.push_back({&q, HXDColor{unit(i), unit(i + 1), unit(i + 2), unit(i + 3)}});
            return;  // one fault per texture is enough to name it
        }
    }
    void encodeScreenspaceQuad(const HXDScreenspaceQuad& q, const HXDRenderingContext&) override {
        add(Kind::ScreenspaceQuad, q);
        check(&q, q.color());
    }
    void encodeMesh(const HXDMesh& m, const HXDRenderingContext&) override {
        add(Kind::Mesh, m);
        check(&m, m.brush().color);
    }
    void encodeText(const HXDText& t, const HXDRenderingContext&) override {
        add(Kind::Text, t);
        check(&t, t.attributes().color);
    }

    std::vector<Entry> entries;
    std::vector<ColourFault> colourFaults;
    HXDColor clearColor;

private:
    void add(Kind kind, const HXDDrawPrimitive& p) { entries.push_back(Entry{kind, &p}); }
    void check(const HXDDrawPrimitive* p, const HXDColor& c) {
        // Float rounding of a product may leave a component a hair above its alpha.
        constexpr float kSlack = 1e-6f;
        if (std::max({c.red, c.green, c.blue}) > c.alpha + kSlack || c.alpha > 1.0f + kSlack ||
            std::min({c.red, c.green, c.blue, c.alpha}) < 0.0f)
            colourFaults.push_back({p, c});
    }

    HXDMemoryTarget _target;
    bool _available = true;
};
