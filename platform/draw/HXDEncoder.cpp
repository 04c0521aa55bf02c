#include "platform/draw/HXDEncoder.h"

#include "platform/draw/HXDMultiline.h"

void HXDEncoder::encodeLine(const HXDLine& line, const HXDRenderingContext& context) {
    encodeMultiline(line, context);
}
