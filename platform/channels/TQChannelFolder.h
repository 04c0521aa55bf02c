#pragma once
// A group of channels. A folder owns its children: destroying a folder destroys them, and a
// child destroyed on its own (by delete through its virtual destructor) first leaves its
// folder, so that the folder never holds a dangling pointer.
//
// Children are kept in display order in a vector that may be absent (null: no children, as
// after construction or removeAllChildren) and may hold null elements (slots a host left
// empty). Every walk over children skips the null elements.
//
// Adding, inserting, removing and taking children changes the tree's shape, and references
// (TQChannelRef) to the removed nodes then resolve to null. Keyframe handles are not affected.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/channels/TQFactory.h"

// Fold flags (32-bit words, tested with any-bit semantics).
enum : uint32_t {
    kTQFoldFlagCollapsed = 0x2,
    kTQFoldFlagLinked = 0x100000,
};

class TQChannelFolder : public TQChannelBase {
public:
    TQChannelFolder(const BNString& name, TQChannelId channelId);
    ~TQChannelFolder() override;

    using TQChannelBase::operator=;
    TQChannelFolder& operator=(const TQChannelFolder& other) {
        TQChannelBase::operator=(other);
        return *this;
    }

    const std::vector<TQChannelBase*>* getChildren() const override { return _children.get(); }

    // --- Children, for hosts building and editing their trees.
    // Number of slots, null ones included.
    size_t numberOfChildren() const { return _children ? _children->size() : 0; }
    // The child in a slot; null for an empty slot or an index past the end.
    TQChannelBase* getChild(size_t index) const;
    // First child (in display order) with this id, or null. Cheap: folders with many children
    // keep an index by id, rebuilt on the first lookup after a change of the children.
    TQChannelBase* findChild(TQChannelId channelId) const override;
    std::optional<size_t> indexOfChild(const TQChannelBase* child) const;

    // Appends a child (null appends an empty slot) and takes ownership; a child that still
    // belongs to another folder leaves it first. Answers the child.
    TQChannelBase* addChild(std::unique_ptr<TQChannelBase> child);
    // Inserts before `index`; an index past the end appends.
    TQChannelBase* insertChild(size_t index, std::unique_ptr<TQChannelBase> child);
    // Takes a child out of the tree and hands it to the caller; null when it is not a child.
    std::unique_ptr<TQChannelBase> takeChild(TQChannelBase* child);
    // Takes the slot out; null for an empty slot or an index past the end (nothing happens).
    std::unique_ptr<TQChannelBase> takeChildAt(size_t index);
    // Destroys a child; false when it is not a child of this folder.
    bool removeChild(TQChannelBase* child);
    // Removes the slot, destroying its child; false for an index past the end.
    bool removeChildAt(size_t index);
    // Destroys every child; the children vector is null afterwards.
    void removeAllChildren();

    // --- Fold flags.
    // testFoldFlag is true when any bit of the word is set.
    virtual bool testFoldFlag(uint32_t flag) const { return (_foldFlags & flag) != 0; }
    virtual void setFoldFlag(uint32_t flag) { _foldFlags |= flag; }
    virtual void resetFoldFlag(uint32_t flag) { _foldFlags &= ~flag; }
    uint32_t getFoldFlags() const { return _foldFlags; }

    // Appends every TQChannel below this folder, depth first in display order. A descendant
    // with any bit of `excludedFlags` is left out together with everything below it. With
    // `stopAtObjectRoots`, object roots below this folder (other objects' trees) are not
    // entered.
    virtual void getAllDescendantsFlattened(std::vector<TQChannelBase*>& out,
                                            uint32_t excludedFlags, bool stopAtObjectRoots) const;

    // True for a compound; a downcast to TQCompoundChannel then succeeds.
    virtual bool isCompoundChannel() const { return false; }

    TQChannelBase* cloneChannel() const override;
    // A folder holds no animation of its own: with `checkChildren` it answers for its
    // descendants, without it false.
    bool isAnimated(bool checkChildren = false) const override;
    // Resets every descendant; the folder's own flags and fold state stay.
    void reset(bool notify = false) override;

    const TQFactory* getFactory() const override;

protected:
    // Deep copy of `source` for cloneChannel: identity, state and a clone of every child
    // (null slots stay null). Subclasses chain to it from their own copying constructor.
    struct CloneTag {};
    TQChannelFolder(const TQChannelFolder& source, CloneTag);

    // Own fold state, then the children pairwise by position. A pair is assigned only when
    // both are present and of the same class; children beyond the shorter list stay.
    void assignState(const TQChannelBase& other) override;
    // Same fold state and, by position, the same children (null where the other has null).
    bool equalState(const TQChannelBase& other) const override;

private:
    friend class TQChannelBase;

    // A child's destructor calls this so that the folder drops the slot.
    void forgetChild(TQChannelBase* child);
    void childrenChanged() { _indexValid = false; }
    void rebuildIndex() const;

    std::unique_ptr<std::vector<TQChannelBase*>> _children;  // owned elements
    uint32_t _foldFlags = 0;

    // Lookup index by id: (id, slot) sorted by id then slot, so the first slot wins.
    mutable std::vector<std::pair<TQChannelId, uint32_t>> _index;
    mutable bool _indexValid = false;
};
