#pragma once
// The host's record of which channels changed since the last reset.
//
// A channel counts as modified when its own noteWillChange was heard, when it lies inside a
// folder whose noteWillChange was heard (a compound announced before a linked edit), or when
// it is a folder holding a channel that was (an object root whose channel changed). The list
// of modified channels holds exactly the announced nodes, in order of first announcement,
// as references from the scene root.
//
// The tracker keeps channel pointers only as keys and never follows one without first
// checking, through its stored reference, that the pointer still names the same place of
// the scene: a destroyed channel whose address is reused does not count as modified.

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
    struct Entry {
        TQChannelRef ref;
        bool announced = false;  // false: only a folder above an announced node
    };
    // The entry names `node` if its reference still resolves to that very node.
    bool entryNames(const Entry& entry, const TQChannelBase* node,
                    const TQChannelBase* sceneRoot) const;

    std::unordered_map<const TQChannelBase*, Entry> _entries;
    std::vector<TQChannelRef> _announced;
};
