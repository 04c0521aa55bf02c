#pragma once
// Screen points of platform/ui (origin at the bottom left of the primary screen, y up; see
// RWWindow.h) and Qt's global coordinates (origin at the top left of the primary screen, y
// down). Qt's logical pixels are our points, so only y is flipped, about the primary
// screen's height.

#include <QRect>

#include "platform/geometry/CGGeometry.h"

// The global rectangle of a screen rectangle.
QRect TQQtGlobalRectOfScreenRect(const CGRect& rect);
// The screen rectangle of a global one.
CGRect TQQtScreenRectOfGlobalRect(const QRect& rect);
