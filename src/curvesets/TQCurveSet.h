#pragma once
// A curve set: a named collection of editor items, what the channel list shows and the curve
// view draws at one moment. Members sit on two levels: root items (one folder item per scene
// object) and below each root its channel items. Operations that speak of items work on the
// children of the roots unless their name says root.
//
// An absolute set holds fixed items. A relative set holds paths (`_ids`, TQChannelRef relative
// to an object's root) and rebuilds its roots at every refresh from the objects the host has
// selected, keeping of each only the channels whose path it holds.
//
// Lifetime: the set owns its items; the delegate is not owned and must outlive the set. Sets
// are built in two phases (construct, then initWithName) so that subclasses can extend the
// initialisation.

#include <algorithm>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <unordered_map>
#include <vector>

#include "platform/channels/TQChannelRef.h"
#include "platform/support/BNString.h"
#include "src/data/TQCurveEditorItem.h"

class TQCurveEditorAppDelegate;
class TQChannel;

// Running number of the automatically named new sets; starts at 1.
extern uint32_t gNewCurveSetIndex;

class TQCurveSet;
using TQCurveSetPtr = std::shared_ptr<TQCurveSet>;

class TQCurveSet {
public:
    TQCurveSet() = default;
    virtual ~TQCurveSet() = default;
    TQCurveSet(const TQCurveSet&) = delete;
    TQCurveSet& operator=(const TQCurveSet&) = delete;

    // Empty roots and shortcut, no paths, absolute, a new set id, hidden channels ignored.
    virtual void initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate);

    // A set of the receiver's own class with copies of the roots, the shortcut, the kind and
    // the source's paths (also those with no item at present).
    virtual TQCurveSetPtr copy() const;
    // By name only.
    bool isEqual(const TQCurveSet& other) const { return _name == other._name; }

    const BNString& curveSetName() const { return _name; }
    void setCurveSetName(const BNString& name) { _name = name; }
    uint32_t curveSetId() const { return _curveSetId; }
    TQCurveEditorAppDelegate* appDelegate() const { return _pAppDelegate; }
    bool ignoreHiddenChannels() const { return _ignoreHiddenChannels; }
    void setIgnoreHiddenChannels(bool ignore) { _ignoreHiddenChannels = ignore; }
    const BNString& curveSetShortcut() const { return _shortcut; }
    // Stored lower case, character by character (any script, not only ASCII).
    void setCurveSetShortcut(const BNString& shortcut);
    // The first character of the shortcut as a UTF-16 code unit, 0 when there is none.
    uint16_t shortcut() const;
    bool isRelative() const { return _relative; }
    // True freezes the present channels into paths; false forgets the paths.
    void setRelative(bool relative);
    bool hasReferences() const { return !_ids->empty(); }
    std::vector<TQChannelRef>* references() { return _ids.get(); }
    const std::vector<TQChannelRef>* references() const { return _ids.get(); }
    void setReferences(const std::vector<TQChannelRef>* references);

    // --- Roots ---
    void setRootItem(const TQCurveEditorFolderItemPtr& root);
    void addRootItem(const TQCurveEditorFolderItemPtr& root);
    // Merges the other set's roots (the same items, not copies).
    void addCurveSet(TQCurveSet& other);
    TQCurveEditorFolderItemPtr rootItemAtIndex(uint32_t index) const {
        return index < _roots.size() ? _roots[index] : nullptr;
    }
    const std::vector<TQCurveEditorFolderItemPtr>& roots() const { return _roots; }
    // Empties the roots; the paths stay.
    void reset();

    // --- Lookup: roots in order, each root's children in order, first match ---
    TQCurveEditorItemPtr itemWithIdentifier(uint32_t identifier) const;
    TQCurveEditorItemPtr itemWithChannel(const TQChannelBase* channel) const;
    // By a flat index through the children of all roots (the name is historical).
    TQCurveEditorItemPtr channeItemAtIndex(uint32_t index) const;
    TQCurveEditorItemPtr childrenAtIndex(uint32_t index, const TQCurveEditorItemPtr& item) const;
    TQCurveEditorItemPtr selectedItem() const;
    TQCurveEditorItemPtr enabledItem() const;

    std::vector<TQCurveEditorItemPtr> selectedItems() const;
    std::vector<TQCurveEditorItemPtr> enabledItems() const;
    std::vector<TQCurveEditorItemPtr> allItems() const;
    std::vector<TQCurveEditorFolderItemPtr> selectedRootItems() const;

    uint32_t numberOfItems() const { return static_cast<uint32_t>(_roots.size()); }
    uint32_t numberOfChannelItems() const;
    uint32_t numberOfEnabledItems() const;
    uint32_t numberOfSelectedItems() const;
    uint32_t numberOfSelectedRootItems() const;

    // --- Selection and enabling ---
    // Disabled items keep their selected flag on purpose.
    void deselectAll();
    void enableAll(bool state, const TQCurveEditorItem* excludeItem);
    void disableAll() { enableAll(false, nullptr); }
    void takeSnapshot(bool withChannels);

    // --- Removal ---
    bool removeItem(const TQCurveEditorItemPtr& item);
    bool removeItemWithIdentifier(uint32_t identifier);

    // --- Refresh ---
    // The membership rule: absolute sets drop empty roots; relative sets keep the channels
    // whose path they hold.
    virtual void filterList();
    virtual void refresh(uint32_t numberOfSamples, bool snapshot);
    // The enable state of each present item, by channel (the first item of a channel counts,
    // as itemWithChannel finds it).
    using EnableStates = std::unordered_map<const TQChannelBase*, bool>;
    // A rebuild takes the states before it builds new items: a new item enables its channel,
    // and the state lives on the channel, so afterwards the old items would all read enabled.
    EnableStates captureEnableStates() const;
    // Carries the captured states over to a new folder: an item whose channel was in the set
    // takes the state it had, any other item is enabled.
    void validateCurveSet(TQCurveEditorFolderItem& folder, const EnableStates& before) const;
    bool isChannelAffectedBySelectedBehaviors(const TQChannel* channel) const;

protected:
    // A rebuild adds its roots one at a time, and each addition filters every root again.
    // Nothing changes the channels while a rebuild runs, so within one a root whose children
    // all passed the rule at an earlier pass, and that has not changed since, is not asked
    // about again: the quadratic walk over children becomes one over roots. The refreshes
    // open this scope on each set they fill; nested scopes share the outer one.
    class RebuildScope {
    public:
        explicit RebuildScope(TQCurveSet& set);
        ~RebuildScope();
        RebuildScope(const RebuildScope&) = delete;
        RebuildScope& operator=(const RebuildScope&) = delete;

    private:
        TQCurveSet& _set;
        bool _outer;
    };

    // Keeps, under each root in order, the children that `keep` accepts (a child without a
    // channel reaches `keep` too). The drop list runs across the roots and is applied to each
    // root in turn by isEqual (same channel). Then each root is opened. A root left without
    // children goes only if it had none at the outset: what goes on the removal list is the
    // item handled last, which is the root only then. Kept on purpose: refreshes drop the
    // roots that the filter emptied.
    void filterChildren(const std::function<bool(const TQCurveEditorItem&)>& keep);

    // Within a rebuild: whether the root's children all passed at an earlier pass.
    bool isSettled(const TQCurveEditorFolderItem& root) const;
    // Within a rebuild: the root's present children have all passed the rule.
    void settle(const TQCurveEditorFolderItemPtr& root);

    // An uninitialised set of the receiver's own class, for copy().
    virtual TQCurveSetPtr makeEmpty() const;
    // The path of an item's channel below its object's root (invalid without a channel).
    static TQChannelRef relativeRef(const TQCurveEditorItem& item);
    // Whether an item belongs under a root by name: an item without a root name matches any.
    static bool sameRootName(const TQCurveEditorItem& item, const TQCurveEditorItem& root);
    // Removes every element that is equal (isEqual) to one of `doomed`.
    template <class Ptr, class Doomed>
    static void removeEqual(std::vector<Ptr>& from, const std::vector<Doomed>& doomed) {
        if (doomed.empty()) return;
        std::erase_if(from, [&](const Ptr& e) {
            return std::any_of(doomed.begin(), doomed.end(), [&](const Doomed& d) {
                return e.get() == d.get() || (e && d && e->isEqual(*d));
            });
        });
    }

    BNString _name;
    BNString _shortcut;
    std::vector<TQCurveEditorFolderItemPtr> _roots;
    TQCurveEditorAppDelegate* _pAppDelegate = nullptr;  // not owned
    bool _relative = false;
    std::unique_ptr<std::vector<TQChannelRef>> _ids = std::make_unique<std::vector<TQChannelRef>>();
    uint32_t _curveSetId = 0;
    bool _ignoreHiddenChannels = true;

private:
    // The roots settled in the open rebuild, each with what it held then; absent outside one.
    struct Settled {
        TQCurveEditorFolderItemPtr pinned;  // so that no other root takes its address meanwhile
        size_t count;
        const TQCurveEditorItem* first;
        const TQCurveEditorItem* last;
    };
    std::optional<std::unordered_map<const TQCurveEditorFolderItem*, Settled>> _settled;
};

// A set whose membership a user changes by hand: the class of every custom set.
class TQCurveSetMutable : public TQCurveSet {
public:
    // Copies of the other set's roots, its kind and its paths; the shortcut is deliberately
    // not carried over.
    void initWithCurveSet(const TQCurveSet& other);

    void appendItem(const TQCurveEditorItemPtr& item);
    // Inserts before the child with that identifier; nothing happens when there is none.
    void insertItem(const TQCurveEditorItemPtr& item, uint32_t beforeIdentifier);
    // Always answers false.
    bool removeItemNotInList(const std::vector<TQCurveEditorItemPtr>& keep);
    bool removeSelectedItem();
    void setItem(const TQCurveEditorItemPtr& item);
    void clear();

protected:
    TQCurveSetPtr makeEmpty() const override { return std::make_shared<TQCurveSetMutable>(); }
};

using TQCurveSetMutablePtr = std::shared_ptr<TQCurveSetMutable>;
