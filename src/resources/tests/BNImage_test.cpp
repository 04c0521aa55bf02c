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

// Every name the view loads into its asset tables.
std::vector<BNString> keypointImageNames() {
    std::set<BNString> names;
    for (std::size_t c = 0; c < kColorCount; ++c)
        for (std::size_t s = 0; s < kStateCount; ++s)
            for (const bool selected : {false, true}) names.insert(imageName(c, s, selected));
    names.insert(tangentHandleImageName());
    return {names.begin(), names.end()};
}

constexpr double kSizeTolerance = 1e-9;

TEST(TQKeyframeImages, imageName__followsTheAssetTable) {
    EXPECT_EQ(imageName(0, kNormal, false), "K_KeyframeEditor_Keyframe-Green_Normal");
    EXPECT_EQ(imageName(1, kPressed, false), "K_KeyframeEditor_Keyframe-Purple_Pressed");
    EXPECT_EQ(imageName(7, kDisabled, false), "K_KeyframeEditor_Keyframe-Cyan_Disabled");
    EXPECT_EQ(imageName(5, kInactive, true), "K_KeyframeEditor_Keyframe_Selected_Inactive");
    for (std::size_t c = 0; c < kColorCount; ++c) {
        EXPECT_EQ(imageName(c, kInactive, false), "K_KeyframeEditor_Keyframe_Inactive")
            << "the inactive image is one image for every colour (row " << c << ")";
        EXPECT_EQ(imageName(c, kPressed, true), "K_KeyframeEditor_Keyframe_Selected_Pressed")
            << "selected images are the same in every row (row " << c << ")";
    }
    EXPECT_EQ(imageName(8, kNormal, false), "") << "colour index above 7";
    EXPECT_EQ(imageName(0, 4, false), "") << "state above 3";
}

class BNImageResources : public ::testing::Test {};

TEST_F(BNImageResources, BNImageForResource__everyKeypointImageAtBothScales) {
    for (const BNString& name : keypointImageNames()) {
        SCOPED_TRACE(name);
        const auto plain = BNImageForResource(name, 1.0);
        const auto retina = BNImageForResource(name, 2.0);
        ASSERT_TRUE(plain && retina) << "missing resource";
        EXPECT_EQ(plain->scale(), 1.0);
        EXPECT_EQ(retina->scale(), 2.0);
        EXPECT_EQ(retina->pixelsWide(), plain->pixelsWide() * 2)
            << "the 2x file has twice the pixels";
        EXPECT_EQ(retina->pixelsHigh(), plain->pixelsHigh() * 2);
        EXPECT_NEAR(retina->size().width, plain->size().width, kSizeTolerance)
            << "both files answer one size in points";
        EXPECT_EQ(plain->pixels().size(), plain->bytesPerRow() * plain->pixelsHigh());
    }
}

TEST_F(BNImageResources, BNImageForResource__everyOtherImageInUse) {
    // Tool segments of both editors, the curve set add/remove control, the channel row menu
    // button, and the mini editor strip's reset button and border.
    for (const char* name : {"K_KeyframeEditor_EditKeyframes", "K_KeyframeEditor_SketchKeyframes",
                             "K_KeyframeEditor_TransformKeyframes", "K_General_Add",
                             "K_General_Remove", "S_Inspector_ParameterMenu_Normal",
                             "Shared_Inspector_Reset", "K_Inspector_Gradient-Border"}) {
        EXPECT_NE(BNImageForResource(name, 1.0), nullptr) << name << " is missing";
        EXPECT_NE(BNImageForResource(name, 2.0), nullptr) << name << "@2x is missing";
    }
}

TEST_F(BNImageResources, keypointImages__transparentCornersAndOpaqueCentre) {
    // The hit test of keypoints reads the image's alpha: a click at a corner of the square
    // must fall through to what lies under it.
    for (const BNString& name : keypointImageNames()) {
        for (const double scale : {1.0, 2.0}) {
            SCOPED_TRACE(name + (scale > 1.0 ? "@2x" : ""));
            const auto image = BNImageForResource(name, scale);
            ASSERT_TRUE(image);
            const int w = image->pixelsWide(), h = image->pixelsHigh();
            const int inset = static_cast<int>(scale);  // one point in from each corner
            for (const auto& [x, y] : {std::pair{0, 0},
                                       {w - 1, 0},
                                       {0, h - 1},
                                       {w - 1, h - 1},
                                       {inset, inset},
                                       {w - 1 - inset, h - 1 - inset}}) {
                EXPECT_EQ(image->alphaAt(x, y), 0)
                    << "corner pixel (" << x << ", " << y << ") is not transparent";
            }
            EXPECT_EQ(image->alphaAt(w / 2, h / 2), 255) << "centre pixel is not opaque";
        }
    }
}

TEST_F(BNImageResources, normalKeypoints__drawnInTheirCurveColour) {
    // A swapped file name would put a green point on a red curve; the centre of each normal
    // image must be nearest to its own curve colour.
    for (std::size_t c = 0; c < kColorCount; ++c) {
        const auto image = BNImageForResource(imageName(c, kNormal, false), 2.0);
        ASSERT_TRUE(image);
        // Below the highlight, where the fill shows its own colour.
        const auto px = image->pixelAt(image->pixelsWide() / 2, image->pixelsHigh() / 2 + 2);
        std::size_t nearest = kColorCount;
        double best = 1e9;
        for (std::size_t k = 0; k < kColorCount; ++k) {
            const GDColor curve = *GDColor::curveColorAtIndex(k);
            const double d = std::hypot(px.red / 255.0 - curve.red, px.green / 255.0 - curve.green,
                                        px.blue / 255.0 - curve.blue);
            if (d < best) best = d, nearest = k;
        }
        EXPECT_EQ(nearest, c) << imageName(c, kNormal, false) << " looks like curve colour "
                              << nearest;
    }
}

TEST_F(BNImageResources, BNImageForResource__scaleChoiceCacheAndUnknownNames) {
    const BNString name = tangentHandleImageName();
    EXPECT_EQ(BNImageForResource(name, 1.5)->scale(), 2.0) << "any scale above 1 takes the 2x file";
    EXPECT_EQ(BNImageForResource(name, 0.0)->scale(), 1.0) << "a zero scale takes the plain file";
    EXPECT_EQ(BNImageForResource(name, 2.0), BNImageForResource(name, 2.0))
        << "a file is decoded once and shared";
    EXPECT_EQ(BNImageForResource("K_KeyframeEditor_NoSuchImage", 1.0), nullptr);
    EXPECT_EQ(BNImageForResource("", 2.0), nullptr);
    EXPECT_EQ(BNImageForResource(name + "@2x", 1.0), nullptr) << "names carry no scale suffix";
}

TEST_F(BNImageResources, embeddedFiles__everyPlainFileHasItsTwin) {
    std::set<std::string_view> files;
    for (const TQEmbeddedImageFile& file : TQEmbeddedImageFiles()) files.insert(file.fileName);
    const std::vector<BNString> names = BNImageResourceNames();
    EXPECT_EQ(files.size(), names.size() * 2);
    for (const BNString& name : names) {
        EXPECT_TRUE(files.count(name + ".png")) << name << " has no 1x file";
        EXPECT_TRUE(files.count(name + "@2x.png")) << name << " has no 2x file";
    }
}

TEST(BNImage, BNImageFromPNGData__rejectsWhatIsNotAPNG) {
    BNString error;
    const std::vector<std::uint8_t> garbage = {'n', 'o', 't', ' ', 'a', ' ', 'p', 'n', 'g'};
    EXPECT_EQ(BNImageFromPNGData(garbage, 1.0, &error), nullptr);
    EXPECT_FALSE(error.empty()) << "a failure says why";
    EXPECT_EQ(BNImageFromPNGData({}, 1.0), nullptr);

    // A real file cut short after its header.
    const auto files = TQEmbeddedImageFiles();
    ASSERT_FALSE(files.empty());
    const std::span<const std::uint8_t> whole{files[0].bytes, files[0].size};
    error.clear();
    EXPECT_EQ(BNImageFromPNGData(whole.first(std::min<std::size_t>(60, whole.size())), 1.0, &error),
              nullptr);
    EXPECT_FALSE(error.empty());

    // The same file with its compressed pixels damaged: an error, not a crash or a half image.
    std::vector<std::uint8_t> damaged(whole.begin(), whole.end());
    for (std::size_t i = damaged.size() / 2; i < damaged.size() - 16; i += 7) damaged[i] ^= 0x5a;
    error.clear();
    EXPECT_EQ(BNImageFromPNGData(damaged, 1.0, &error), nullptr);
    EXPECT_FALSE(error.empty());
}

TEST(BNImage, pixelAt__outsideIsTransparentAndBadBuffersAreSized) {
    const BNImage image(2, 1, 1.0, {1, 2, 3, 4, 5, 6, 7, 8});
    EXPECT_EQ(image.pixelAt(1, 0), (BNImage::RGBA8{5, 6, 7, 8}));
    EXPECT_EQ(image.pixelAt(2, 0), BNImage::RGBA8{});
    EXPECT_EQ(image.pixelAt(-1, 0), BNImage::RGBA8{});
    EXPECT_EQ(image.pixelAt(0, 1), BNImage::RGBA8{});

    const BNImage short_(3, 3, 0.0, {255, 255, 255, 255});
    EXPECT_EQ(short_.scale(), 1.0) << "a scale of 0 would divide the size by zero";
    EXPECT_EQ(short_.pixelAt(2, 2), BNImage::RGBA8{}) << "a short buffer is padded, not read past";
}

}  // namespace
