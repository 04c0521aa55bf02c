#include "platform/draw/HXDEncoder.h"

#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/draw/HXDMultiline.h"

void HXDEncoder::encodeLine(const HXDLine& line, const HXDRenderingContext& context) {
    encodeMultiline(line, context);
}

void HXDEncoder::encodePrimitives(std::span<const std::shared_ptr<HXDDrawPrimitive>> primitives,
                                  const HXDRenderingContext& context) {
    for (const auto& primitive : primitives)
        if (primitive) primitive->encodeWithEncoder(*this, context);
}
