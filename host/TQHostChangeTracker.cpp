#include "host/TQHostChangeTracker.h"

#include "platform/channels/TQChannelFolder.h"

void TQHostChangeTracker::channelWillChange(const TQChannelBase& channel,
                                            const TQChannelBase* sceneRoot) {
    auto found = _entries.find(channel.getSerial());
    if (found != _entries.end() && found->second) return;  // the hot path of a drag
    if (!sceneRoot || &channel == sceneRoot) return;

    TQChannelRef ref(&channel, sceneRoot);
    if (!ref.isValid()) return;  // not below the scene root

    if (found != _entries.end()) {
        found->second = true;
    } else {
        _entries.emplace(channel.getSerial(), true);
    }
    _announced.push_back(ref);

    // Folders above it count as modified too; stop at the first one already recorded, since
    // its own ancestors were recorded with it.
    for (const TQChannelBase* folder = channel.getParent(); folder && folder != sceneRoot;
         folder = folder->getParent()) {
        if (!_entries.emplace(folder->getSerial(), false).second) break;
    }
}

bool TQHostChangeTracker::wasChannelModified(const TQChannelBase* channel,
                                             const TQChannelBase* sceneRoot) const {
    if (!channel || !sceneRoot || _entries.empty()) return false;
    // The node itself, announced or holding an announced node.
    if (_entries.contains(channel->getSerial())) return true;
    // A folder above it that was announced as a whole.
    for (const TQChannelBase* folder = channel->getParent(); folder && folder != sceneRoot;
         folder = folder->getParent()) {
        auto it = _entries.find(folder->getSerial());
        if (it != _entries.end() && it->second) return true;
    }
    return false;
}

void TQHostChangeTracker::reset() {
    _entries.clear();
    _announced.clear();
}
