#pragma once
// The abstract encoder that primitives encode themselves into. A host supplies one that
// paints (a QPainter encoder, say); tests record. One frame:
//
//   HXDTexture* target = encoder.nextDrawable();      // null: no target now, skip the frame
//   encoder.beginEncoding(*target, backgroundColour);  // clears the target
//   encoder.encodePrimitives(primitives, *controller.renderingContext());
//   encoder.endEncoding();                             // finishes and presents
//
// Every encode operation receives the frame's rendering context: its projection maps the
// primitive's world coordinates to normalised device coordinates, and HXDScreenMapping
// (HXDHitTest.h) built from it and the drawable size gives drawable pixels (y up), exactly
// as the hit test maps them. Sizes in points are multiplied by the context's backing scale.
//
// Colours and texels arrive premultiplied (HXDColor); an encoder blends them with each
// primitive's blending as a GPU pipeline would, and converts them if its painter wants
// straight colours.

#include <memory>
#include <span>

#include "platform/draw/HXDDataType.h"

class HXDTexture;
class HXDRenderingContext;
class HXDMultiline;
class HXDLine;
class HXDQuadTexture;
class HXDScreenspaceQuad;
class HXDMesh;
class HXDText;
class HXDDrawPrimitive;

class HXDEncoder {
public:
    virtual ~HXDEncoder() = default;

    // The target of the next frame, owned by the encoder and valid until endEncoding; null
    // when none is available (the frame is then skipped, silently).
    virtual HXDTexture* nextDrawable() = 0;
    // Starts a frame on the target, cleared to the colour.
    virtual void beginEncoding(HXDTexture& target, const HXDColor& clearColor) = 0;
    // Ends the frame and presents it.
    virtual void endEncoding() = 0;

    // Encodes the primitives in order, nulls skipped. The default has each encode itself here;
    // an encoder may do the work on another thread while the caller waits (primitives are
    // only read, and nothing of the caller's runs meanwhile).
    virtual void encodePrimitives(std::span<const std::shared_ptr<HXDDrawPrimitive>> primitives,
                                  const HXDRenderingContext& context);

    virtual void encodeMultiline(const HXDMultiline& multiline,
                                 const HXDRenderingContext& context) = 0;
    // A line is a two-vertex multiline; encoders without a faster path keep this default.
    virtual void encodeLine(const HXDLine& line, const HXDRenderingContext& context);
    virtual void encodeQuadTexture(const HXDQuadTexture& quad,
                                   const HXDRenderingContext& context) = 0;
    virtual void encodeScreenspaceQuad(const HXDScreenspaceQuad& quad,
                                       const HXDRenderingContext& context) = 0;
    virtual void encodeMesh(const HXDMesh& mesh, const HXDRenderingContext& context) = 0;
    virtual void encodeText(const HXDText& text, const HXDRenderingContext& context) = 0;
};
