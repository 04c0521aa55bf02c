#pragma once
// Everything a view needs to build, encode and hit-test a frame.

#include "platform/draw/HXDDataType.h"
#include "platform/draw/HXDDrawPrimitive.h"
#include "platform/draw/HXDEncoder.h"
#include "platform/draw/HXDHitInfo.h"
#include "platform/draw/HXDHitTest.h"
#include "platform/draw/HXDMesh.h"
#include "platform/draw/HXDMultiline.h"
#include "platform/draw/HXDPixelTexture.h"
#include "platform/draw/HXDQuad.h"
#include "platform/draw/HXDRenderController.h"
#include "platform/draw/HXDText.h"
