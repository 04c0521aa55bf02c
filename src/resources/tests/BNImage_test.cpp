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
    // The names the views load, by colour, state and selection.
    for (size_t c = 0; c < kColorCount; ++c)
        for (size_t s = 0; s < kStateCount; ++s)
            for (const bool selected : {false, true})
                EXPECT_NE(BNImageForResource(imageName(c, s, selected), 2.0), nullptr);
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
        size_t nearest = kColorCount;
        double best = 1e9;
        for (size_t k = 0; k < kColorCount; ++k) {
            const GDColor curve = *GDColor::curveColorAtIndex(k);
            const double d = std::hypot(px.red / 255.0 - curve.red, px.green / 255.0 - curve.green,
                                        px.blue / 255.0 - curve.blue);
            if (d < best) best = d, nearest = k;
        }
        EXPECT_EQ(nearest, c) << imageName(c, kNormal, false) << " looks like curve colour "
                              << nearest;
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

// WCAG relative luminance of an sRGB colour, and the contrast ratio of two of them.
double luminance(const GDColor& c) {
    auto linear = [](double v) {
        return v <= 0.04045 ? v / 12.92 : std::pow((v + 0.055) / 1.055, 2.4);
    };
    return 0.2126 * linear(c.red) + 0.7152 * linear(c.green) + 0.0722 * linear(c.blue);
}
double contrast(const GDColor& a, const GDColor& b) {
    return (std::max(luminance(a), luminance(b)) + 0.05) /
           (std::min(luminance(a), luminance(b)) + 0.05);
}

TEST(GDColor, colours__readableOnTheBackgroundAndTellingCurvesApart) {
    const GDColor background = GDColor::curveEditorBackgroundColor0();
    for (size_t i = 0; i < GDColor::kCurveColorCount; ++i) {
        const GDColor c = GDColor::curveColorAtIndex(i).value_or(GDColor{0, 0, 0, 0});
        // The extrapolated ends are drawn at 0.3 opacity: they must still read as the curve.
        const GDColor dim{0.3f * c.red + 0.7f * background.red,
                          0.3f * c.green + 0.7f * background.green,
                          0.3f * c.blue + 0.7f * background.blue, 1.0f};
        EXPECT_TRUE(c.alpha == 1.0f && contrast(c, background) > 4.5 &&
                    contrast(dim, background) > 1.4)
            << i;
        for (size_t k = 0; k < i; ++k) {
            const GDColor o = *GDColor::curveColorAtIndex(k);
            EXPECT_GT(std::hypot(c.red - o.red, c.green - o.green, c.blue - o.blue), 0.2)
                << "curves " << k << " and " << i;
        }
    }
    EXPECT_FALSE(GDColor::curveColorAtIndex(8) || GDColor::curveColorAtIndex(size_t(-1)));
    EXPECT_EQ(GDColor::curveColorAtIndex(5), GDColor::curveColor5());
    EXPECT_LT(luminance(background), luminance(GDColor::gridColor())) << "the grid shows as lines";
    EXPECT_TRUE(contrast(GDColor::curveEditorTextColor0(), background) > 7.0 &&
                contrast(GDColor::lockedCurveColor0(), background) > 3.0);
    // Tangent lines are drawn in the selection colour with its blue value as their alpha.
    EXPECT_GT(GDColor::selectedCurveColor0().blue, 0.8f) << "tangent lines would be faint";
}

}  // namespace
