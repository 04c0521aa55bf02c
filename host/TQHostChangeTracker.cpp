#include "host/TQHostChangeTracker.h"

#include "platform/channels/TQChannelFolder.h"

void TQHostChangeTracker::channelWillChange(const TQChannelBase& channel,
                                            const TQChannelBase* sceneRoot) {
    auto found = _entries.find(&channel);
    if (found != _entries.end() && found->second.announced) return;  // the hot path of a drag
    if (!sceneRoot || &channel == sceneRoot) return;

    TQChannelRef ref(&channel, sceneRoot);
    if (!ref.isValid()) return;  // not below the scene root

    if (found != _entries.end()) {
        found->second = Entry{ref, true};
    } else {
        _entries.emplace(&channel, Entry{ref, true});
    }
    _announced.push_back(ref);

    // Folders above it count as modified too; stop at the first one already recorded, since
    // its own ancestors were recorded with it.
    for (const TQChannelBase* folder = channel.getParent(); folder && folder != sceneRoot;
         folder = folder->getParent()) {
        if (_entries.contains(folder)) break;
        _entries.emplace(folder, Entry{TQChannelRef(folder, sceneRoot), false});
    }
}

bool TQHostChangeTracker::entryNames(const Entry& entry, const TQChannelBase* node,
                                     const TQChannelBase* sceneRoot) const {
    return entry.ref.getChannel(sceneRoot) == node;
}

bool TQHostChangeTracker::wasChannelModified(const TQChannelBase* channel,
                                             const TQChannelBase* sceneRoot) const {
    if (!channel || !sceneRoot || _entries.empty()) return false;
    // The node itself, announced or holding an announced node.
    if (auto it = _entries.find(channel);
        it != _entries.end() && entryNames(it->second, channel, sceneRoot))
        return true;
    // A folder above it that was announced as a whole.
    for (const TQChannelBase* folder = channel->getParent(); folder && folder != sceneRoot;
         folder = folder->getParent()) {
        auto it = _entries.find(folder);
        if (it != _entries.end() && it->second.announced &&
            entryNames(it->second, folder, sceneRoot))
            return true;
    }
    return false;
}

void TQHostChangeTracker::reset() {
    _entries.clear();
    _announced.clear();
}
