#include "src/resources/BNImage.h"

#include "src/resources/internal/TQEmbeddedImages.h"

#include <png.h>

#include <algorithm>
#include <mutex>
#include <string_view>
#include <unordered_map>

BNImage::BNImage(int pixelsWide, int pixelsHigh, double scale, std::vector<std::uint8_t> pixels)
    : _pixelsWide(std::max(pixelsWide, 0)),
      _pixelsHigh(std::max(pixelsHigh, 0)),
      _scale(scale > 0.0 ? scale : 1.0),
      _pixels(std::move(pixels)) {
    // A buffer that does not match the dimensions is a caller's mistake; pad or cut it so that
    // every pixelAt inside the bounds reads memory of the image.
    _pixels.resize(bytesPerRow() * static_cast<std::size_t>(_pixelsHigh), 0);
}

CGSize BNImage::size() const { return {_pixelsWide / _scale, _pixelsHigh / _scale}; }

BNImage::RGBA8 BNImage::pixelAt(int x, int y) const {
    if (x < 0 || y < 0 || x >= _pixelsWide || y >= _pixelsHigh) return {};
    const std::uint8_t* p = _pixels.data() + static_cast<std::size_t>(y) * bytesPerRow() +
                            static_cast<std::size_t>(x) * 4;
    return {p[0], p[1], p[2], p[3]};
}

std::shared_ptr<const BNImage> BNImageFromPNGData(std::span<const std::uint8_t> bytes, double scale,
                                                  BNString* error) {
    auto fail = [error](const char* what) -> std::shared_ptr<const BNImage> {
        if (error) *error = what;
        return nullptr;
    };
    if (bytes.empty()) return fail("no data");

    // The simplified libpng API converts any colour type and bit depth to 8-bit RGBA and
    // reports errors through the struct instead of longjmp.
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_memory(&image, bytes.data(), bytes.size())) {
        if (error) *error = image.message;
        png_image_free(&image);
        return nullptr;
    }
    image.format = PNG_FORMAT_RGBA;
    // Images of the editor are small; refuse anything that could only be a corrupt header.
    constexpr png_uint_32 kMaxSide = 16384;
    if (image.width == 0 || image.height == 0 || image.width > kMaxSide ||
        image.height > kMaxSide) {
        png_image_free(&image);
        return fail("unreasonable image size");
    }
    std::vector<std::uint8_t> pixels(PNG_IMAGE_SIZE(image));
    if (!png_image_finish_read(&image, nullptr, pixels.data(), 0, nullptr)) {
        if (error) *error = image.message;
        png_image_free(&image);
        return nullptr;
    }
    const int width = static_cast<int>(image.width);
    const int height = static_cast<int>(image.height);
    png_image_free(&image);
    return std::make_shared<const BNImage>(width, height, scale, std::move(pixels));
}

namespace {

constexpr std::string_view kRetinaSuffix = "@2x";
constexpr std::string_view kExtension = ".png";

// The resource name and scale of an embedded file name; empty name for a file that does not
// follow "Name.png" / "Name@2x.png".
std::pair<std::string_view, double> splitFileName(std::string_view fileName) {
    if (!fileName.ends_with(kExtension)) return {{}, 0.0};
    fileName.remove_suffix(kExtension.size());
    if (fileName.ends_with(kRetinaSuffix)) {
        fileName.remove_suffix(kRetinaSuffix.size());
        return {fileName, 2.0};
    }
    return {fileName, 1.0};
}

struct ResourceFiles {
    const TQEmbeddedImageFile* file1x = nullptr;
    const TQEmbeddedImageFile* file2x = nullptr;
};

class ImageCache {
public:
    static ImageCache& shared() {
        static ImageCache cache;
        return cache;
    }

    std::shared_ptr<const BNImage> image(const BNString& name, double scale) {
        const auto it = _files.find(name);
        if (it == _files.end()) return nullptr;
        const bool wantsRetina = scale > 1.0;
        const TQEmbeddedImageFile* file =
            wantsRetina && it->second.file2x ? it->second.file2x : it->second.file1x;
        if (!file) file = it->second.file2x;  // only a 2x file: better than nothing
        const double fileScale = file == it->second.file2x ? 2.0 : 1.0;

        std::lock_guard lock(_mutex);
        auto& slot = _decoded[file];
        if (!slot) {
            slot = BNImageFromPNGData(
                {reinterpret_cast<const std::uint8_t*>(file->bytes), file->size}, fileScale);
        }
        return slot;
    }

    std::vector<BNString> names() const {
        std::vector<BNString> result;
        result.reserve(_files.size());
        for (const auto& [name, files] : _files) result.push_back(name);
        std::sort(result.begin(), result.end());
        return result;
    }

private:
    ImageCache() {
        for (const TQEmbeddedImageFile& file : TQEmbeddedImageFiles()) {
            const auto [name, scale] = splitFileName(file.fileName);
            if (name.empty()) continue;
            ResourceFiles& entry = _files[BNString(name)];
            (scale > 1.0 ? entry.file2x : entry.file1x) = &file;
        }
    }

    // Built once in the constructor and read-only afterwards: lookups need no lock.
    std::unordered_map<BNString, ResourceFiles> _files;
    std::mutex _mutex;  // guards _decoded
    std::unordered_map<const TQEmbeddedImageFile*, std::shared_ptr<const BNImage>> _decoded;
};

}  // namespace

std::shared_ptr<const BNImage> BNImageForResource(const BNString& name, double scale) {
    return ImageCache::shared().image(name, scale);
}

std::vector<BNString> BNImageResourceNames() { return ImageCache::shared().names(); }
