#pragma once
// The projection of the curve views and the two conversions that go through it.
//
// A curve view draws with an orthographic projection of its view volume (world x in
// seconds, world y in the view's own units) onto the drawable, and converts between world
// points and drawable pixels (origin at the bottom left, y up) through the matrix of the
// frame it last drew, not through its current view volume. The matrix is kept in single
// precision, so conversions carry float rounding: about one float ulp of the larger of the
// volume's edge and extent, in world units.

#include "platform/geometry/BNMatrix44Tmpl.h"
#include "platform/geometry/CGGeometry.h"

// The matrix for a view volume, row-major (see BNMatrix44Tmpl.h):
//   x row: 2/width, 0, 0, -(L+R)/(R-L)
//   y row: 0, 2/height, 0, -(B+T)/(T-B)
//   z row: 0, 0, -0.5, 0.5
//   w row: 0, 0, 0, 1
// with L = x, R = x + width, B = y, T = y + height. The scales are taken from the double
// extents; the translations are computed in single precision, as the drawn frame has them.
// A volume of zero (or NaN) width or height gives the zero matrix.
BNMatrix44f BNViewVolumeProjection(const CGRect& viewVolume);

// World point of a drawable pixel: the pixel in normalised device coordinates
// (2x/W - 1, 2y/H - 1, -1, 1), in double, through the inverse of the projection, divided by
// w. A singular projection (the zero matrix of a view that has not drawn yet) or an empty
// drawable answers NaN coordinates.
CGPoint BNProjectionScreenToWorld(const BNMatrix44f& projection, const CGSize& drawableSize,
                                  const CGPoint& screen);

// Drawable pixel of a world point: (x, y, 0, 1) through the projection, divided by w, then
// ((x' * 0.5 + 0.5) * W, (y' * 0.5 + 0.5) * H). The zero matrix answers NaN coordinates.
CGPoint BNProjectionWorldToScreen(const BNMatrix44f& projection, const CGSize& drawableSize,
                                  const CGPoint& world);
