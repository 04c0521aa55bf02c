#pragma once
// The reference host's object model: how one scene object's channel tree is laid out.
//
// Two families of object exist, chosen by the host's isKestrel setting, each with the channel
// ids that the automatic curve sets look for (paths from the object root):
//
//   property   kestrel family                       other family
//   position   ./1/100/101/{1,2,3}  compound X Y Z  ./43/3795058304/1/{1,2}   2D X Y
//   scale      ./1/100/105/{1,2,3}  compound X Y Z  ./43/3795058304/3/{1,2}   2D X Y
//   rotation   ./1/100/109/{1,2,3}  3D rotation     ./43/3795058304/2         angle
//   shear      ./1/100/106/{1,2}    2D X Y          (none)
//   pivot      ./1/100/107/{1,2,3}  compound X Y Z  ./43/3795058304/4/{1,2}   2D X Y
//   opacity    ./1/200/202                          ./43/44/2
//   retiming   ./1/304                              ./43/817009658/{1002,1004}
//
// Beside these, each object carries one channel of every typed kind, so that each downcast
// the editor makes finds something: a boolean, a decibel, a 2D pair, both over-range pairs,
// a fixed-interpolation curve, blind data, and a 3D rotation in quaternion mode (in the
// kestrel family the transform's own rotation takes that mode when asked).

#include <memory>
#include <vector>

#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/support/BNString.h"

enum class TQHostObjectFamily {
    Kestrel,  // isKestrel true
    Other,    // isKestrel false
};

// The channel path tables, by property, in the order the automatic curve sets list them.
enum class TQHostProperty { Position, Scale, Rotation, Shear, Pivot, Opacity, Retiming };
const std::vector<BNString>& TQHostPropertyPaths(TQHostObjectFamily family,
                                                 TQHostProperty property);

// Ids of the channels every object carries beyond the tables.
struct TQHostTypedChannelPaths {
    BNString visible;      // TQChannelBool
    BNString volume;       // TQChannelDecibel
    BNString offset;       // TQChannel2D
    BNString gradient;     // TQChannel2DOverRange
    BNString taper;        // TQChannelScaleOverRange
    BNString softness;     // TQChannelCurve
    BNString fontIndex;    // TQChannelBlindData
    BNString orientation;  // TQChannelRotation3D, quaternion mode
};
const TQHostTypedChannelPaths& TQHostTypedPaths(TQHostObjectFamily family);

struct TQHostObjectOptions {
    // Kestrel family: the transform's rotation blends as quaternions.
    bool quaternionRotation = false;
};

// A new object of the family in its default state, owned by the caller.
std::unique_ptr<TQChannelObjectRootBase> TQHostMakeObject(const BNString& name,
                                                          TQChannelId objectId,
                                                          TQHostObjectFamily family,
                                                          const TQHostObjectOptions& options = {});
