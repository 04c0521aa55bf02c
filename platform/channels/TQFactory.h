#pragma once
// Factories of the channel classes. Each class has one factory, named by a 128-bit identifier
// (two 64-bit words, in order) that saved data and hosts use to tell the classes apart and to
// make a node of a class again. The identifiers are fixed forever: never renumber them.

#include <cstdint>
#include <memory>

#include "platform/channels/TQChannelBase.h"
#include "platform/support/BNString.h"

struct TQFactoryId {
    uint64_t word0 = 0;
    uint64_t word1 = 0;

    bool isNull() const { return word0 == 0 && word1 == 0; }
    friend bool operator==(const TQFactoryId&, const TQFactoryId&) = default;
};

// The classes of this library. They share the first word; the second numbers the class.
inline constexpr TQFactoryId kTQChannelFactoryId{0x229211d70b00de81, 0x9389b702ac3d0001};
inline constexpr TQFactoryId kTQChannelFolderFactoryId{0x229211d70b00de81, 0x9389b702ac3d0002};
inline constexpr TQFactoryId kTQChannelBoolFactoryId{0x229211d70b00de81, 0x9389b702ac3d0003};
inline constexpr TQFactoryId kTQChannelCurveFactoryId{0x229211d70b00de81, 0x9389b702ac3d0004};
inline constexpr TQFactoryId kTQChannelBlindDataFactoryId{0x229211d70b00de81, 0x9389b702ac3d0005};
inline constexpr TQFactoryId kTQChannelAngleFactoryId{0x229211d70b00de81, 0x9389b702ac3d0006};
inline constexpr TQFactoryId kTQChannelDecibelFactoryId{0x229211d70b00de81, 0x9389b702ac3d0007};
inline constexpr TQFactoryId kTQCompoundChannelFactoryId{0x229211d70b00de81, 0x9389b702ac3d0008};
inline constexpr TQFactoryId kTQChannel2DFactoryId{0x229211d70b00de81, 0x9389b702ac3d0009};
inline constexpr TQFactoryId kTQChannel2DOverRangeFactoryId{0x229211d70b00de81, 0x9389b702ac3d000a};
inline constexpr TQFactoryId kTQChannelScaleOverRangeFactoryId{0x229211d70b00de81,
                                                               0x9389b702ac3d000b};
inline constexpr TQFactoryId kTQChannelRotation3DFactoryId{0x229211d70b00de81, 0x9389b702ac3d000c};
inline constexpr TQFactoryId kTQChannelObjectRootFactoryId{0x229211d70b00de81, 0x9389b702ac3d000d};

class TQFactory {
public:
    using CreateFunction = TQChannelBase* (*)(const BNString& name, TQChannelId channelId);

    constexpr TQFactory(TQFactoryId identifier, const char* className, CreateFunction create)
        : _identifier(identifier), _className(className), _create(create) {}

    const TQFactoryId& getIdentifier() const { return _identifier; }
    const char* getClassName() const { return _className; }
    // A new node of the class in its default state (typed compounds come with their
    // components), owned by the caller.
    std::unique_ptr<TQChannelBase> create(const BNString& name, TQChannelId channelId) const {
        return std::unique_ptr<TQChannelBase>(_create(name, channelId));
    }

    // The factory of a class of this library with that identifier, or null.
    static const TQFactory* find(const TQFactoryId& identifier);

private:
    TQFactoryId _identifier;
    const char* _className;
    CreateFunction _create;
};

// The identifier of a node's class; the null identifier for a null node or a class without a
// factory.
TQFactoryId TQChannelFactoryIdOf(const TQChannelBase* channel);
