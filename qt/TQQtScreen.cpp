#include "qt/TQQtScreen.h"

#include <QGuiApplication>
#include <QScreen>

#include <cmath>

namespace {

// The height about which y flips: the primary screen's bottom edge in global coordinates.
double flipHeight() {
    const QScreen* screen = QGuiApplication::primaryScreen();
    if (!screen) return 0.0;
    const QRect g = screen->geometry();
    return static_cast<double>(g.y()) + g.height();
}

int whole(double v) { return static_cast<int>(std::lround(v)); }

}  // namespace

QRect TQQtGlobalRectOfScreenRect(const CGRect& rect) {
    const double top = flipHeight() - (rect.origin.y + rect.size.height);
    return QRect(whole(rect.origin.x), whole(top), whole(rect.size.width), whole(rect.size.height));
}

CGRect TQQtScreenRectOfGlobalRect(const QRect& rect) {
    const double bottom = flipHeight() - (static_cast<double>(rect.y()) + rect.height());
    return CGRectMake(rect.x(), bottom, rect.width(), rect.height());
}
