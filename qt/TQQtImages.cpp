#include "qt/TQQtImages.h"

#include "src/resources/BNImage.h"

QImage TQQtImage(const BNImage& image) {
    const QImage view(image.pixels().data(), image.pixelsWide(), image.pixelsHigh(),
                      static_cast<qsizetype>(image.bytesPerRow()), QImage::Format_RGBA8888);
    QImage copy = view.copy();
    copy.setDevicePixelRatio(image.scale());
    return copy;
}

QIcon TQQtIconForResource(const std::string& name) {
    QIcon icon;
    for (double scale : {1.0, 2.0})
        if (const auto image = BNImageForResource(name, scale))
            icon.addPixmap(QPixmap::fromImage(TQQtImage(*image)));
    return icon;
}
