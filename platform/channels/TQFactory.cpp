#include "platform/channels/TQFactory.h"

#include <array>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"

namespace {
template <class Channel>
TQChannelBase* createChannel(const BNString& name, TQChannelId channelId) {
    return new Channel(name, channelId);
}

constexpr TQFactory kChannelFactory{kTQChannelFactoryId, "TQChannel", createChannel<TQChannel>};
constexpr TQFactory kFolderFactory{kTQChannelFolderFactoryId, "TQChannelFolder",
                                   createChannel<TQChannelFolder>};
constexpr TQFactory kObjectRootFactory{kTQChannelObjectRootFactoryId, "TQChannelObjectRootBase",
                                       createChannel<TQChannelObjectRootBase>};
constexpr TQFactory kCompoundFactory{kTQCompoundChannelFactoryId, "TQCompoundChannel",
                                     createChannel<TQCompoundChannel>};
constexpr TQFactory kBoolFactory{kTQChannelBoolFactoryId, "TQChannelBool",
                                 createChannel<TQChannelBool>};
constexpr TQFactory kCurveFactory{kTQChannelCurveFactoryId, "TQChannelCurve",
                                  createChannel<TQChannelCurve>};
constexpr TQFactory kBlindDataFactory{kTQChannelBlindDataFactoryId, "TQChannelBlindData",
                                      createChannel<TQChannelBlindData>};
constexpr TQFactory kAngleFactory{kTQChannelAngleFactoryId, "TQChannelAngle",
                                  createChannel<TQChannelAngle>};
constexpr TQFactory kDecibelFactory{kTQChannelDecibelFactoryId, "TQChannelDecibel",
                                    createChannel<TQChannelDecibel>};
constexpr TQFactory k2DFactory{kTQChannel2DFactoryId, "TQChannel2D", createChannel<TQChannel2D>};
constexpr TQFactory k2DOverRangeFactory{kTQChannel2DOverRangeFactoryId, "TQChannel2DOverRange",
                                        createChannel<TQChannel2DOverRange>};
constexpr TQFactory kScaleOverRangeFactory{kTQChannelScaleOverRangeFactoryId,
                                           "TQChannelScaleOverRange",
                                           createChannel<TQChannelScaleOverRange>};
constexpr TQFactory kRotation3DFactory{kTQChannelRotation3DFactoryId, "TQChannelRotation3D",
                                       createChannel<TQChannelRotation3D>};

constexpr std::array<const TQFactory*, 13> kFactories{
    &kChannelFactory,   &kFolderFactory, &kObjectRootFactory,  &kCompoundFactory,
    &kBoolFactory,      &kCurveFactory,  &kBlindDataFactory,   &kAngleFactory,
    &kDecibelFactory,   &k2DFactory,     &k2DOverRangeFactory, &kScaleOverRangeFactory,
    &kRotation3DFactory};
}  // namespace

const TQFactory* TQFactory::find(const TQFactoryId& identifier) {
    for (const TQFactory* factory : kFactories) {
        if (factory->getIdentifier() == identifier) return factory;
    }
    return nullptr;
}

TQFactoryId TQChannelFactoryIdOf(const TQChannelBase* channel) {
    const TQFactory* factory = channel ? channel->getFactory() : nullptr;
    return factory ? factory->getIdentifier() : TQFactoryId{};
}

// TQChannel's own class declares no factory; the base answers for it.
const TQFactory* TQChannelBase::getFactory() const {
    return dynamic_cast<const TQChannel*>(this) ? &kChannelFactory : nullptr;
}

const TQFactory* TQChannelFolder::getFactory() const { return &kFolderFactory; }
const TQFactory* TQChannelObjectRootBase::getFactory() const { return &kObjectRootFactory; }
const TQFactory* TQCompoundChannel::getFactory() const { return &kCompoundFactory; }
const TQFactory* TQChannelBool::getFactory() const { return &kBoolFactory; }
const TQFactory* TQChannelCurve::getFactory() const { return &kCurveFactory; }
const TQFactory* TQChannelBlindData::getFactory() const { return &kBlindDataFactory; }
const TQFactory* TQChannelAngle::getFactory() const { return &kAngleFactory; }
const TQFactory* TQChannelDecibel::getFactory() const { return &kDecibelFactory; }
const TQFactory* TQChannel2D::getFactory() const { return &k2DFactory; }
const TQFactory* TQChannel2DOverRange::getFactory() const { return &k2DOverRangeFactory; }
const TQFactory* TQChannelScaleOverRange::getFactory() const { return &kScaleOverRangeFactory; }
const TQFactory* TQChannelRotation3D::getFactory() const { return &kRotation3DFactory; }
