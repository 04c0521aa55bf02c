#pragma once
// Test doubles for the drawing layer: a target of a given size and an encoder that records
// what a frame encodes, in order, without painting. Header-only; for tests.

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

    // available = false makes nextDrawable answer null, as when no surface is free.
    explicit HXDRecordingEncoder(uint32_t width = 640, uint32_t height = 480)
        : _target(width, height) {}

    void setDrawableAvailable(bool available) { _available = available; }

    HXDTexture* nextDrawable() override { return _available ? &_target : nullptr; }
    void beginEncoding(HXDTexture&, const HXDColor& clearColor) override {
        entries.clear();
        this->clearColor = clearColor;
        ++framesBegun;
        encoding = true;
    }
    void endEncoding() override {
        encoding = false;
        ++framesEnded;
    }
    void encodeMultiline(const HXDMultiline& m, const HXDRenderingContext&) override {
        add(Kind::Multiline, m);
    }
    void encodeLine(const HXDLine& l, const HXDRenderingContext&) override { add(Kind::Line, l); }
    void encodeQuadTexture(const HXDQuadTexture& q, const HXDRenderingContext&) override {
        add(Kind::QuadTexture, q);
    }
    void encodeScreenspaceQuad(const HXDScreenspaceQuad& q, const HXDRenderingContext&) override {
        add(Kind::ScreenspaceQuad, q);
    }
    void encodeMesh(const HXDMesh& m, const HXDRenderingContext&) override { add(Kind::Mesh, m); }
    void encodeText(const HXDText& t, const HXDRenderingContext&) override { add(Kind::Text, t); }

    size_t count(Kind kind) const {
        size_t n = 0;
        for (const Entry& e : entries) n += e.kind == kind ? 1 : 0;
        return n;
    }

    std::vector<Entry> entries;
    HXDColor clearColor;
    int framesBegun = 0;
    int framesEnded = 0;
    bool encoding = false;

private:
    void add(Kind kind, const HXDDrawPrimitive& p) { entries.push_back(Entry{kind, &p}); }

    HXDMemoryTarget _target;
    bool _available = true;
};
