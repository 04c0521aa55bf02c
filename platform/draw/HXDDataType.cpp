#include "platform/draw/HXDDataType.h"

HXDBlendingInfo HXDDataType::sourceOneMinusSourceBlendingInfo() { return HXDBlendingInfo{}; }

HXDBlendingInfo HXDDataType::opaqueBlendingInfo() {
    HXDBlendingInfo info;
    info.enabled = false;
    info.sourceRGB = HXDBlendFactor::One;
    info.destinationRGB = HXDBlendFactor::Zero;
    info.sourceAlpha = HXDBlendFactor::One;
    info.destinationAlpha = HXDBlendFactor::Zero;
    return info;
}

HXDBlendingInfo HXDDataType::additiveBlendingInfo() {
    HXDBlendingInfo info;
    info.sourceRGB = HXDBlendFactor::One;
    info.destinationRGB = HXDBlendFactor::One;
    info.sourceAlpha = HXDBlendFactor::One;
    info.destinationAlpha = HXDBlendFactor::One;
    return info;
}
