#pragma once
// What loading a built scene into the reference host means, shared by the sample and the dense
// scene: a fresh scene of the family, the time settings, the objects, the first object
// selected, and a clean history.

#include <functional>

#include "host/TQHostScene.h"
#include "platform/media/CMTime.h"

class TQHostAppDelegate;

// Empties the host's scene into `family`, sets the frame duration and the display range,
// lets `populate` add the objects, puts the playhead at 0 (which hands the time to the new
// object roots), selects the first object, forgets the undo history and the modified set
// (building announces nothing the user did) and posts kTQNotifySceneChanged.
void TQHostLoadBuiltScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                          const CMTime& frameDuration, const CMTimeRange& displayRange,
                          const std::function<void(TQHostScene&)>& populate);
