#pragma once
// Images of the framework's resources as Qt shows them: an icon holds the plain file and the
// "@2x" file, so that it is sharp at either device pixel ratio; Qt draws its disabled look.

#include <QIcon>
#include <QImage>

#include <string>

class BNImage;

// A copy of the image's pixels (straight alpha, as the resources hold them).
QImage TQQtImage(const BNImage& image);
// Null icon for a name the resources do not hold.
QIcon TQQtIconForResource(const std::string& name);
