#include "src/resources/BNImage.h"
#include "src/resources/GDColor.h"
#include "src/resources/TQKeyframeImages.h"
#include "src/resources/internal/TQEmbeddedImages.h"

#include <gtest/gtest.h>

#include <cmath>
#include <set>
#include <string_view>

namespace {

using namespace TQKeyframeImages;

TEST(ImageResources, everyImage__decodesAtBothScalesToOneSizeInPoints) {
    std::set<std::string_view> files;
    for (const TQEmbeddedImageFile& file : TQEmbeddedImageFiles()) files.insert(file.fileName);
    const std::vector<BNString> names = BNImageResourceNames();
    EXPECT_EQ(files.size(), names.size() * 2) << "a plain and a 2x file of each image";
    for (const BNString& name : names) {
        const auto plain = BNImageForResource(name, 1.0), retina = BNImageForResource(name, 2.0);
        ASSERT_TRUE(plain && retina) << name;
        // Twice the pixels in the 2x file, one size in points, a whole buffer.
        EXPECT_EQ(plain->scale() + retina->scale(), 3.0) << name;
        EXPECT_EQ(retina->pixelsWide() * 10 + retina->pixelsHigh(),
                  2 * (plain->pixelsWide() * 10 + plain->pixelsHigh()));
        EXPECT_TRUE(retina->size() == plain->size() &&
                    plain->pixels().size() == plain->bytesPerRow() * plain->pixelsHigh());
    }
    EXPECT_EQ(imageName(8, kNormal, false) + imageName(0, 4, false), "")
        << "no colour 8, no state 4";
    EXPECT_EQ(BNImageForResource(tangentHandleImageName(), 1.5)->scale(), 2.0)
        << "any scale above 1 takes the 2x file";
    EXPECT_EQ(BNImageForResource(tangentHandleImageName(), 0.0)->scale(), 1.0);
    for (const BNString& unknown :
         {BNString("K_KeyframeEditor_NoSuchImage"), BNString(""), tangentHandleImageName() + "@2x"})
        EXPECT_EQ(BNImageForResource(unknown, 1.0), nullptr) << unknown;
}

TEST(ImageResources, keypointImages__transparentCornersOpaqueCentreInTheirCurveColour) {
    // The hit test of keypoints reads the image's alpha: a click at a corner of the square must
    // fall through to what lies under it.
    for (size_t c = 0; c < kColorCount; ++c) {
        for (size_t s = 0; s < kStateCount; ++s) {
            for (const double scale : {1.0, 2.0}) {
                const auto image = BNImageForResource(imageName(c, s, s == kPressed), scale);
                const int w = image->pixelsWide() - 1, h = image->pixelsHigh() - 1, in = int(scale);
                for (const auto& [x, y] :
                     {std::pair{0, 0}, {w, 0}, {0, h}, {w, h}, {in, in}, {w - in, h - in}})
                    EXPECT_EQ(image->alphaAt(x, y), 0)
                        << imageName(c, s, false) << " at " << x << ", " << y;
                EXPECT_EQ(image->alphaAt(w / 2, h / 2), 255) << imageName(c, s, false);
            }
        }
        // A swapped file would put a green point on a red curve: below the highlight the fill
        // of each normal image is nearest to its own curve colour.
        const auto image = BNImageForResource(imageName(c, kNormal, false), 2.0);
        const auto px = image->pixelAt(image->pixelsWide() / 2, image->pixelsHigh() / 2 + 2);
        ASSERT_TRUE(GDColor::curveColorAtIndex(c) && !GDColor::curveColorAtIndex(c + 8));
        std::vector<double> distances;
        for (size_t k = 0; k < kColorCount; ++k) {
            const GDColor curve = *GDColor::curveColorAtIndex(k);
            distances.push_back(std::hypot(px.red / 255.0 - curve.red,
                                           px.green / 255.0 - curve.green,
                                           px.blue / 255.0 - curve.blue));
        }
        EXPECT_EQ(std::min_element(distances.begin(), distances.end()) - distances.begin(), c)
            << imageName(c, kNormal, false);
    }
}

TEST(ImageResources, decoding__damagedDataAndPixelsOutsideTheImage) {
    const auto files = TQEmbeddedImageFiles();
    const std::span<const std::uint8_t> whole{files[0].bytes, files[0].size};
    std::vector<std::uint8_t> damaged(whole.begin(), whole.end());
    for (size_t i = damaged.size() / 2; i < damaged.size() - 16; i += 7) damaged[i] ^= 0x5a;
    // Not a PNG, cut short after its header, its pixels damaged: an error that says why.
    for (const std::span<const std::uint8_t> bytes :
         {whole.first(5), whole.first(60), std::span<const std::uint8_t>(damaged)}) {
        BNString error;
        EXPECT_TRUE(BNImageFromPNGData(bytes, 1.0, &error) == nullptr && !error.empty())
            << bytes.size();
    }
    EXPECT_NE(BNImageFromPNGData(whole, 1.0), nullptr);
    const BNImage image(2, 1, 1.0, {1, 2, 3, 4, 5, 6, 7, 8});
    EXPECT_EQ(image.pixelAt(1, 0), (BNImage::RGBA8{5, 6, 7, 8}));
    for (const auto& [x, y] : {std::pair{2, 0}, {-1, 0}, {0, 1}, {0, -1}})
        EXPECT_EQ(image.pixelAt(x, y), BNImage::RGBA8{});
    const BNImage padded(3, 3, 0.0, {255, 255, 255, 255});
    EXPECT_EQ(padded.size(), CGSizeMake(3, 3)) << "a scale of 0 would divide the size by zero";
    EXPECT_EQ(padded.pixelAt(2, 2), BNImage::RGBA8{}) << "a short buffer is padded, not read past";
}

}  // namespace
