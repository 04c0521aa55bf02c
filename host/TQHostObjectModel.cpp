#include "host/TQHostObjectModel.h"

#include "platform/channels/TQChannelTypes.h"

namespace {

// --- Ids of the kestrel family ---
constexpr TQChannelId kKestrelProperties = 1;
constexpr TQChannelId kKestrelTransform = 100;
constexpr TQChannelId kKestrelPosition = 101;
constexpr TQChannelId kKestrelScale = 105;
constexpr TQChannelId kKestrelShear = 106;
constexpr TQChannelId kKestrelPivot = 107;
constexpr TQChannelId kKestrelRotation = 109;
constexpr TQChannelId kKestrelBlending = 200;
constexpr TQChannelId kKestrelVisible = 201;
constexpr TQChannelId kKestrelOpacity = 202;
constexpr TQChannelId kKestrelRetime = 304;
constexpr TQChannelId kKestrelAudio = 400;
constexpr TQChannelId kKestrelStyle = 500;

// --- Ids of the other family ---
constexpr TQChannelId kOtherProperties = 43;
constexpr TQChannelId kOtherTransform = 3795058304u;
constexpr TQChannelId kOtherPosition = 1;
constexpr TQChannelId kOtherRotation = 2;
constexpr TQChannelId kOtherScale = 3;
constexpr TQChannelId kOtherAnchor = 4;
constexpr TQChannelId kOtherCompositing = 44;
constexpr TQChannelId kOtherVisible = 1;
constexpr TQChannelId kOtherOpacity = 2;
constexpr TQChannelId kOtherTiming = 817009658u;
constexpr TQChannelId kOtherRetime = 1002;
constexpr TQChannelId kOtherSpeed = 1004;
constexpr TQChannelId kOtherAudio = 45;
constexpr TQChannelId kOtherStyle = 46;

// --- Ids inside the audio and style folders, shared by both families ---
constexpr TQChannelId kVolume = 1;
constexpr TQChannelId kOffset = 1;
constexpr TQChannelId kGradient = 2;
constexpr TQChannelId kTaper = 3;
constexpr TQChannelId kSoftness = 4;
constexpr TQChannelId kFontIndex = 5;
constexpr TQChannelId kOrientation = 6;

TQChannelFolder* addFolder(TQChannelFolder& parent, const BNString& name, TQChannelId id) {
    return static_cast<TQChannelFolder*>(
        parent.addChild(std::make_unique<TQChannelFolder>(name, id)));
}

template <class Channel, class... Args>
Channel* add(TQChannelFolder& parent, Args&&... args) {
    return static_cast<Channel*>(
        parent.addChild(std::make_unique<Channel>(std::forward<Args>(args)...)));
}

// A compound of three plain axes X, Y, Z (ids 1 to 3), unlinked: each axis animates alone.
TQCompoundChannel* addXYZ(TQChannelFolder& parent, const BNString& name, TQChannelId id,
                          double defaultValue) {
    auto* compound = add<TQCompoundChannel>(parent, name, id);
    add<TQChannel>(*compound, "X", kTQComponentX, defaultValue);
    add<TQChannel>(*compound, "Y", kTQComponentY, defaultValue);
    add<TQChannel>(*compound, "Z", kTQComponentZ, defaultValue);
    return compound;
}

TQChannel* addOpacity(TQChannelFolder& parent, TQChannelId id) {
    auto* opacity = add<TQChannel>(parent, "Opacity", id, 1.0);
    opacity->getImpl()->range().setRange(0.0, 1.0);
    opacity->getInfo()->valueStep = 0.01;
    opacity->getInfo()->displayScale = 100.0;  // read as a percentage
    return opacity;
}

void addAudioFolder(TQChannelFolder& parent, TQChannelId id) {
    TQChannelFolder* audio = addFolder(parent, "Audio", id);
    auto* volume = add<TQChannelDecibel>(*audio, "Volume", kVolume);
    volume->getImpl()->range().setRange(0.0, 4.0);
}

void addStyleFolder(TQChannelFolder& parent, TQChannelId id) {
    TQChannelFolder* style = addFolder(parent, "Style", id);
    add<TQChannel2D>(*style, "Drop Shadow Offset", kOffset, 4.0, -4.0);
    add<TQChannel2DOverRange>(*style, "Gradient", kGradient, 0.0, 1.0);
    add<TQChannelScaleOverRange>(*style, "Taper", kTaper);
    add<TQChannelCurve>(*style, "Softness", kSoftness, 0.5);
    add<TQChannelBlindData>(*style, "Font Index", kFontIndex);
    auto* orientation = add<TQChannelRotation3D>(*style, "Orientation", kOrientation);
    orientation->setQuaternionMode(true, false);
}

void buildKestrel(TQChannelObjectRootBase& root, const TQHostObjectOptions& options) {
    TQChannelFolder* properties = addFolder(root, "Properties", kKestrelProperties);

    TQChannelFolder* transform = addFolder(*properties, "Transform", kKestrelTransform);
    addXYZ(*transform, "Position", kKestrelPosition, 0.0);
    auto* rotation = add<TQChannelRotation3D>(*transform, "Rotation", kKestrelRotation);
    rotation->setQuaternionMode(options.quaternionRotation, false);
    addXYZ(*transform, "Scale", kKestrelScale, 1.0);
    add<TQChannel2D>(*transform, "Shear", kKestrelShear);
    addXYZ(*transform, "Pivot", kKestrelPivot, 0.0);

    TQChannelFolder* blending = addFolder(*properties, "Blending", kKestrelBlending);
    add<TQChannelBool>(*blending, "Visible", kKestrelVisible, true);
    addOpacity(*blending, kKestrelOpacity);

    // Retiming maps object time to source time: the identity at the default of 0 offset.
    add<TQChannel>(*properties, "Retime Value", kKestrelRetime, 0.0);

    addAudioFolder(*properties, kKestrelAudio);
    addStyleFolder(*properties, kKestrelStyle);
}

void buildOther(TQChannelObjectRootBase& root) {
    TQChannelFolder* properties = addFolder(root, "Properties", kOtherProperties);

    TQChannelFolder* transform = addFolder(*properties, "Transform", kOtherTransform);
    add<TQChannel2D>(*transform, "Position", kOtherPosition);
    add<TQChannelAngle>(*transform, "Rotation", kOtherRotation);
    add<TQChannel2D>(*transform, "Scale", kOtherScale, 1.0, 1.0);
    add<TQChannel2D>(*transform, "Anchor Point", kOtherAnchor);

    TQChannelFolder* compositing = addFolder(*properties, "Compositing", kOtherCompositing);
    add<TQChannelBool>(*compositing, "Visible", kOtherVisible, true);
    addOpacity(*compositing, kOtherOpacity);

    TQChannelFolder* timing = addFolder(*properties, "Timing", kOtherTiming);
    add<TQChannel>(*timing, "Retime Value", kOtherRetime, 0.0);
    auto* speed = add<TQChannel>(*timing, "Speed", kOtherSpeed, 1.0);
    speed->getInfo()->displayScale = 100.0;  // read as a percentage

    addAudioFolder(*properties, kOtherAudio);
    addStyleFolder(*properties, kOtherStyle);
}

BNString path(std::initializer_list<TQChannelId> ids) {
    BNString text = ".";
    for (TQChannelId id : ids) {
        // Appended piece by piece: '"/" + to_string' trips a false -Wrestrict of GCC 12 at -O3.
        text += '/';
        text += std::to_string(id);
    }
    return text;
}

}  // namespace

const std::vector<BNString>& TQHostPropertyPaths(TQHostObjectFamily family,
                                                 TQHostProperty property) {
    using P = TQHostProperty;
    auto axes = [](TQChannelId folder, TQChannelId parent, TQChannelId property_, int count) {
        std::vector<BNString> out;
        for (int axis = 1; axis <= count; ++axis)
            out.push_back(path({folder, parent, property_, static_cast<TQChannelId>(axis)}));
        return out;
    };
    static const std::vector<BNString> kestrel[] = {
        axes(kKestrelProperties, kKestrelTransform, kKestrelPosition, 3),
        axes(kKestrelProperties, kKestrelTransform, kKestrelScale, 3),
        axes(kKestrelProperties, kKestrelTransform, kKestrelRotation, 3),
        axes(kKestrelProperties, kKestrelTransform, kKestrelShear, 2),
        axes(kKestrelProperties, kKestrelTransform, kKestrelPivot, 3),
        {path({kKestrelProperties, kKestrelBlending, kKestrelOpacity})},
        {path({kKestrelProperties, kKestrelRetime})},
    };
    static const std::vector<BNString> other[] = {
        axes(kOtherProperties, kOtherTransform, kOtherPosition, 2),
        axes(kOtherProperties, kOtherTransform, kOtherScale, 2),
        {path({kOtherProperties, kOtherTransform, kOtherRotation})},
        {},
        axes(kOtherProperties, kOtherTransform, kOtherAnchor, 2),
        {path({kOtherProperties, kOtherCompositing, kOtherOpacity})},
        {path({kOtherProperties, kOtherTiming, kOtherRetime}),
         path({kOtherProperties, kOtherTiming, kOtherSpeed})},
    };
    static_assert(static_cast<int>(P::Retiming) == 6, "one table row per property");
    const auto index = static_cast<size_t>(property);
    return family == TQHostObjectFamily::Kestrel ? kestrel[index] : other[index];
}

const TQHostTypedChannelPaths& TQHostTypedPaths(TQHostObjectFamily family) {
    auto make = [](TQChannelId properties, TQChannelId blending, TQChannelId visible,
                   TQChannelId audio, TQChannelId style) {
        return TQHostTypedChannelPaths{
            path({properties, blending, visible}), path({properties, audio, kVolume}),
            path({properties, style, kOffset}),    path({properties, style, kGradient}),
            path({properties, style, kTaper}),     path({properties, style, kSoftness}),
            path({properties, style, kFontIndex}), path({properties, style, kOrientation}),
        };
    };
    static const TQHostTypedChannelPaths kestrel =
        make(kKestrelProperties, kKestrelBlending, kKestrelVisible, kKestrelAudio, kKestrelStyle);
    static const TQHostTypedChannelPaths other =
        make(kOtherProperties, kOtherCompositing, kOtherVisible, kOtherAudio, kOtherStyle);
    return family == TQHostObjectFamily::Kestrel ? kestrel : other;
}

std::unique_ptr<TQChannelObjectRootBase> TQHostMakeObject(const BNString& name,
                                                          TQChannelId objectId,
                                                          TQHostObjectFamily family,
                                                          const TQHostObjectOptions& options) {
    auto root = std::make_unique<TQChannelObjectRootBase>(name, objectId);
    if (family == TQHostObjectFamily::Kestrel)
        buildKestrel(*root, options);
    else
        buildOther(*root);
    return root;
}
