#pragma once
// The host's record of which channels changed since the last reset.
//
// A channel counts as modified when its own noteWillChange was heard, when it lies inside a
// folder whose noteWillChange was heard (a compound announced before a linked edit), or when
// it is a folder holding a channel that was (an object root whose channel changed). The list
// of modified channels holds exactly the announced nodes, in order of first announcement,
// as references from the scene root.
//
// Records are keyed by the channel's serial, never by its address: a channel made where a
// destroyed, announced one lay is a channel of its own, modified only once announced itself.

#include <cstddef>
#include <unordered_map>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/channels/TQChannelRef.h"

class TQHostChangeTracker {
public:
    // Records an announcement of `channel` below `sceneRoot`. Cheap when the channel is
    // already recorded: a drag announces its channels at every step. A channel outside the
    // scene (no path from the root) is not recorded.
    void channelWillChange(const TQChannelBase& channel, const TQChannelBase* sceneRoot);

    // `channel` must be live (or null): its ancestors are walked. Callers resolve it from a
    // reference just before asking, as the framework does.
    bool wasChannelModified(const TQChannelBase* channel, const TQChannelBase* sceneRoot) const;
    const std::vector<TQChannelRef>& modifiedChannels() const { return _announced; }
    bool isEmpty() const { return _announced.empty(); }

    void reset();

private:
    // By serial; true: announced itself, false: only a folder above an announced node.
    std::unordered_map<TQChannelSerial, bool> _entries;
    std::vector<TQChannelRef> _announced;
};
