#include "src/curvesets/TQCurveSet.h"

#include <algorithm>
#include <unordered_set>

#include "platform/channels/TQChannel.h"
#include "platform/support/BNStringCase.h"
#include "src/contract/TQCurveEditorAppDelegate.h"

uint32_t gNewCurveSetIndex = 1;

namespace {
uint32_t g_uniqueId = 0;

bool containsEqual(const std::vector<TQCurveEditorItemPtr>& list, const TQCurveEditorItem& item) {
    return std::any_of(list.begin(), list.end(),
                       [&](const TQCurveEditorItemPtr& e) { return e && e->isEqual(item); });
}
}  // namespace

void TQCurveSet::initWithName(const BNString& name, TQCurveEditorAppDelegate* appDelegate) {
    _roots.clear();
    _shortcut.clear();
    _name = name;
    _ids = std::make_unique<std::vector<TQChannelRef>>();
    _relative = false;
    _curveSetId = ++g_uniqueId;
    _pAppDelegate = appDelegate;
    _ignoreHiddenChannels = true;
}

TQCurveSetPtr TQCurveSet::makeEmpty() const { return std::make_shared<TQCurveSet>(); }

TQCurveSetPtr TQCurveSet::copy() const {
    TQCurveSetPtr set = makeEmpty();
    set->initWithName(_name, _pAppDelegate);
    for (const TQCurveEditorFolderItemPtr& root : _roots)
        if (root) set->addRootItem(root->copyWithRoot());
    set->setCurveSetShortcut(_shortcut);
    set->setRelative(isRelative());
    set->setReferences(_ids.get());
    return set;
}

void TQCurveSet::setCurveSetShortcut(const BNString& shortcut) {
    _shortcut = BNLowercaseString(shortcut);
}

uint16_t TQCurveSet::shortcut() const { return BNFirstUTF16Unit(_shortcut); }

TQChannelRef TQCurveSet::relativeRef(const TQCurveEditorItem& item) {
    TQChannelBase* c = item.channelBase();
    return c ? TQChannelRef(c, c->getChannelRoot()) : TQChannelRef();
}

bool TQCurveSet::sameRootName(const TQCurveEditorItem& item, const TQCurveEditorItem& root) {
    // An item without a root name compares equal to any root, as a message to nothing answers
    // "same"; a root without one matches only such an item.
    const std::optional<BNString>& mine = item.rootName();
    if (!mine) return true;
    const std::optional<BNString>& theirs = root.rootName();
    return theirs && *mine == *theirs;
}

void TQCurveSet::setRelative(bool relative) {
    _relative = relative;
    _ids->clear();
    if (!relative) return;
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child) _ids->push_back(relativeRef(*child));
    }
}

void TQCurveSet::setReferences(const std::vector<TQChannelRef>* references) {
    if (!references || references == _ids.get()) return;
    *_ids = *references;
}

void TQCurveSet::setRootItem(const TQCurveEditorFolderItemPtr& root) {
    _roots.clear();
    if (root) _roots.push_back(root);
    filterList();
}

void TQCurveSet::addRootItem(const TQCurveEditorFolderItemPtr& root) {
    if (!root) return;
    _roots.push_back(root);
    root->collapse(false);
    filterList();
}

void TQCurveSet::addCurveSet(TQCurveSet& other) {
    const bool wasRelative = _relative;
    setRelative(false);
    // Copy the list first: merging a set into itself must not walk a growing list.
    const std::vector<TQCurveEditorFolderItemPtr> theirs = other._roots;
    for (const TQCurveEditorFolderItemPtr& root : theirs) addRootItem(root);
    setRelative(wasRelative ? true : other.isRelative());
}

void TQCurveSet::reset() {
    _roots.clear();
    filterList();
}

// --- Lookup ---------------------------------------------------------------------------------

TQCurveEditorItemPtr TQCurveSet::itemWithIdentifier(uint32_t identifier) const {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child->channelId() == identifier) return child;
    }
    return nullptr;
}

TQCurveEditorItemPtr TQCurveSet::itemWithChannel(const TQChannelBase* channel) const {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child->channelBase() == channel) return child;
    }
    return nullptr;
}

TQCurveEditorItemPtr TQCurveSet::channeItemAtIndex(uint32_t index) const {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        const uint32_t n = root->numberOfChildren();
        if (index < n) return root->children()[index];
        index -= n;
    }
    return nullptr;
}

TQCurveEditorItemPtr TQCurveSet::childrenAtIndex(uint32_t index,
                                                 const TQCurveEditorItemPtr& item) const {
    auto* folder = dynamic_cast<TQCurveEditorFolderItem*>(item.get());
    return folder ? folder->childrenAtIndex(index) : nullptr;
}

TQCurveEditorItemPtr TQCurveSet::selectedItem() const {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child->isSelected()) return child;
    }
    return nullptr;
}

TQCurveEditorItemPtr TQCurveSet::enabledItem() const {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child->isEnabledItem() != 0) return child;
    }
    return nullptr;
}

std::vector<TQCurveEditorItemPtr> TQCurveSet::selectedItems() const {
    std::vector<TQCurveEditorItemPtr> out;
    for (const TQCurveEditorItemPtr& child : allItems())
        if (child->isSelected()) out.push_back(child);
    return out;
}

std::vector<TQCurveEditorItemPtr> TQCurveSet::enabledItems() const {
    std::vector<TQCurveEditorItemPtr> out;
    for (const TQCurveEditorItemPtr& child : allItems())
        if (child->isEnabledItem() != 0) out.push_back(child);
    return out;
}

std::vector<TQCurveEditorItemPtr> TQCurveSet::allItems() const {
    std::vector<TQCurveEditorItemPtr> out;
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child) out.push_back(child);
    }
    return out;
}

std::vector<TQCurveEditorFolderItemPtr> TQCurveSet::selectedRootItems() const {
    std::vector<TQCurveEditorFolderItemPtr> out;
    for (const TQCurveEditorFolderItemPtr& root : _roots)
        if (root && root->isSelected()) out.push_back(root);
    return out;
}

uint32_t TQCurveSet::numberOfChannelItems() const {
    uint32_t n = 0;
    for (const TQCurveEditorFolderItemPtr& root : _roots)
        if (root) n += root->numberOfChildren();
    return n;
}

uint32_t TQCurveSet::numberOfEnabledItems() const {
    return static_cast<uint32_t>(enabledItems().size());
}

uint32_t TQCurveSet::numberOfSelectedItems() const {
    return static_cast<uint32_t>(selectedItems().size());
}

uint32_t TQCurveSet::numberOfSelectedRootItems() const {
    return static_cast<uint32_t>(selectedRootItems().size());
}

// --- Selection and enabling -----------------------------------------------------------------

void TQCurveSet::deselectAll() {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        if (root->isEnabledItem() != 0) root->select(false);
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child->isEnabledItem() != 0) child->select(false);
    }
}

void TQCurveSet::enableAll(bool state, const TQCurveEditorItem* excludeItem) {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root || root.get() == excludeItem) continue;
        for (const TQCurveEditorItemPtr& child : root->children())
            if (child && child.get() != excludeItem) child->enableItem(state ? 1 : 0);
    }
}

void TQCurveSet::takeSnapshot(bool withChannels) {
    for (const TQCurveEditorFolderItemPtr& root : _roots)
        if (root) root->takeCurveSnapshot(withChannels ? 1 : 0);
}

// --- Removal --------------------------------------------------------------------------------

bool TQCurveSet::removeItem(const TQCurveEditorItemPtr& item) {
    if (!item) return false;
    if (_roots.empty()) {
        filterList();
        return false;
    }
    // Iterate over a copy: the removal below changes _roots.
    const std::vector<TQCurveEditorFolderItemPtr> roots = _roots;
    for (const TQCurveEditorFolderItemPtr& root : roots) {
        if (!root) continue;
        if (root->isEqual(*item)) {
            const bool removed = removeItemWithIdentifier(root->channelId());
            filterList();
            return removed;
        }
        if (!sameRootName(*item, *root)) continue;
        for (const TQCurveEditorItemPtr& child : root->children()) {
            if (child && child->isEqual(*item)) {
                const bool removed = removeItemWithIdentifier(child->channelId());
                filterList();
                return removed;
            }
        }
    }
    filterList();
    return false;
}

bool TQCurveSet::removeItemWithIdentifier(uint32_t identifier) {
    if (_roots.empty()) return false;
    for (auto it = _roots.begin(); it != _roots.end(); ++it) {
        const TQCurveEditorFolderItemPtr root = *it;
        if (!root) continue;
        if (root->channelId() == identifier) {
            _roots.erase(it);  // the whole root goes, without filtering
            return true;
        }
        if (!root->hasChildren()) continue;
        auto& kids = root->children();
        auto match = std::find_if(kids.begin(), kids.end(), [&](const TQCurveEditorItemPtr& c) {
            return c && c->channelId() == identifier;
        });
        if (match != kids.end()) {
            kids.erase(match);
            filterList();
            return true;
        }
    }
    return false;
}

// --- Refresh --------------------------------------------------------------------------------

void TQCurveSet::filterList() {
    if (!_relative) {
        std::erase_if(_roots,
                      [](const TQCurveEditorFolderItemPtr& r) { return !r || !r->hasChildren(); });
        return;
    }
    filterChildren([this](const TQCurveEditorItem& child) {
        return std::find(_ids->begin(), _ids->end(), relativeRef(child)) != _ids->end();
    });
}

void TQCurveSet::filterChildren(const std::function<bool(const TQCurveEditorItem&)>& keep) {
    // Items are equal when they resolve to the same channel, so the drop list is kept as the
    // set of dropped channels: one resolution per child instead of one per comparison.
    std::unordered_set<const TQChannelBase*> dropped;  // runs across all roots
    std::vector<TQCurveEditorItemPtr> emptyRoots;
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        const bool settled = isSettled(*root);
        TQCurveEditorItemPtr lastHandled = root;
        for (const TQCurveEditorItemPtr& child : root->children()) {
            if (!child) continue;
            lastHandled = child;
            if (!settled && !keep(*child)) dropped.insert(child->channelBase());
        }
        if (!dropped.empty())
            std::erase_if(root->children(), [&](const TQCurveEditorItemPtr& c) {
                return c && dropped.contains(c->channelBase());
            });
        root->collapse(false);
        if (!root->hasChildren()) emptyRoots.push_back(lastHandled);
        settle(root);
    }
    removeEqual(_roots, emptyRoots);
}

TQCurveSet::RebuildScope::RebuildScope(TQCurveSet& set)
    : _set(set), _outer(!set._settled.has_value()) {
    if (_outer) _set._settled.emplace();
}

TQCurveSet::RebuildScope::~RebuildScope() {
    if (_outer) _set._settled.reset();
}

bool TQCurveSet::isSettled(const TQCurveEditorFolderItem& root) const {
    if (!_settled) return false;
    const auto found = _settled->find(&root);
    if (found == _settled->end()) return false;
    const auto& kids = root.children();
    const Settled& then = found->second;
    return then.count == kids.size() &&
           then.first == (kids.empty() ? nullptr : kids.front().get()) &&
           then.last == (kids.empty() ? nullptr : kids.back().get());
}

void TQCurveSet::settle(const TQCurveEditorFolderItemPtr& root) {
    if (!_settled || !root) return;
    const auto& kids = root->children();
    (*_settled)[root.get()] = {root, kids.size(), kids.empty() ? nullptr : kids.front().get(),
                               kids.empty() ? nullptr : kids.back().get()};
}

void TQCurveSet::refresh(uint32_t numberOfSamples, bool snapshot) {
    if (!_relative) {
        TQCurveEditorItem::resetColorIndex();
        std::vector<TQCurveEditorItemPtr> gone;
        for (const TQCurveEditorItemPtr& item : allItems())
            if (!item->channel()) gone.push_back(item);
        for (const TQCurveEditorItemPtr& item : gone) removeItem(item);
    } else {
        const std::vector<TQChannelBase*> objects =
            _pAppDelegate ? _pAppDelegate->selectedObjectsRootChannels()
                          : std::vector<TQChannelBase*>{};
        const EnableStates before = captureEnableStates();
        const RebuildScope rebuilding(*this);
        reset();
        for (TQChannelBase* object : objects) {
            TQCurveEditorItem::resetColorIndex();  // colours restart for each object
            auto folder = std::make_shared<TQCurveEditorFolderItem>();
            folder->initWithChannel(object, numberOfSamples, _pAppDelegate, _ignoreHiddenChannels);
            validateCurveSet(*folder, before);
            addRootItem(folder);
            if (!folder->hasChildren()) removeItem(folder);
        }
    }
    if (snapshot) takeSnapshot(true);
}

TQCurveSet::EnableStates TQCurveSet::captureEnableStates() const {
    EnableStates states;
    for (const TQCurveEditorItemPtr& item : allItems())
        if (const TQChannelBase* c = item->channelBase())
            states.try_emplace(c, item->isEnabledItem() != 0);
    return states;
}

void TQCurveSet::validateCurveSet(TQCurveEditorFolderItem& folder,
                                  const EnableStates& before) const {
    for (const TQCurveEditorItemPtr& item : folder.flattenDescendants()) {
        if (!item) continue;
        const TQChannelBase* c = item->channelBase();
        if (!c) continue;
        const auto present = before.find(c);
        item->enableItem(present == before.end() || present->second ? 1 : 0);
    }
    if (folder.isEnabledItem() == -1) folder.enableItemNoDescendants(-1);
}

bool TQCurveSet::isChannelAffectedBySelectedBehaviors(const TQChannel* channel) const {
    return channel && channel->isChannelAffectedBySelectedBehaviors();
}

// --- TQCurveSetMutable ----------------------------------------------------------------------

void TQCurveSetMutable::initWithCurveSet(const TQCurveSet& other) {
    initWithName(other.curveSetName(), other.appDelegate());
    for (const TQCurveEditorFolderItemPtr& root : other.roots())
        if (root) _roots.push_back(root->copyWithRoot());
    setRelative(other.isRelative());
    setReferences(other.references());
}

void TQCurveSetMutable::appendItem(const TQCurveEditorItemPtr& item) {
    if (!item || !item->isValid()) return;
    item->enableItem(1);
    TQCurveEditorFolderItemPtr target;
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        if (containsEqual(root->children(), *item)) return;
        if (sameRootName(*item, *root)) {
            target = root;
            break;
        }
    }
    TQChannelBase* c = item->channelBase();
    if (target) {
        target->addChild(item);
    } else {
        auto folder = std::make_shared<TQCurveEditorFolderItem>();
        folder->initWithRoot(c ? c->getChannelRoot() : nullptr, 0, _pAppDelegate,
                             item->ignoreHiddenChannels());
        folder->addChild(item);
        _roots.push_back(folder);
    }
    if (_relative) _ids->push_back(relativeRef(*item));
    filterList();
}

void TQCurveSetMutable::insertItem(const TQCurveEditorItemPtr& item, uint32_t beforeIdentifier) {
    if (!item || !item->isValid()) return;
    item->enableItem(1);
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        if (containsEqual(root->children(), *item)) return;
        if (!sameRootName(*item, *root)) continue;
        auto& kids = root->children();
        auto at = std::find_if(kids.begin(), kids.end(), [&](const TQCurveEditorItemPtr& c) {
            return c && c->channelId() == beforeIdentifier;
        });
        if (at != kids.end()) {
            kids.insert(at, item);
            filterList();
            return;
        }
    }
}

bool TQCurveSetMutable::removeItemNotInList(const std::vector<TQCurveEditorItemPtr>& keep) {
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root || !root->hasChildren()) continue;
        std::erase_if(root->children(), [&](const TQCurveEditorItemPtr& c) {
            return !c || !containsEqual(keep, *c);
        });
    }
    std::vector<TQCurveEditorFolderItemPtr> emptyRoots;
    for (const TQCurveEditorFolderItemPtr& root : _roots)
        if (root && !root->hasChildren()) emptyRoots.push_back(root);
    removeEqual(_roots, emptyRoots);
    filterList();
    return false;
}

bool TQCurveSetMutable::removeSelectedItem() {
    const uint32_t selectedCount = numberOfSelectedItems();
    std::vector<TQCurveEditorFolderItemPtr> doomedRoots;
    std::vector<TQChannelRef> noted;
    auto noteSelectedChildren = [&](TQCurveEditorFolderItem& root) {
        std::vector<TQCurveEditorItemPtr> selected;
        for (const TQCurveEditorItemPtr& child : root.children()) {
            if (!child || !child->isSelected()) continue;
            selected.push_back(child);
            if (TQChannelBase* c = child->channelBase()) noted.push_back(c->getRef(true));
        }
        return selected;
    };
    for (const TQCurveEditorFolderItemPtr& root : _roots) {
        if (!root) continue;
        if (root->isSelected()) {
            doomedRoots.push_back(root);
            if (root->hasChildren()) noteSelectedChildren(*root);
            break;  // roots after the first selected root are not looked at
        }
        if (root->hasChildren()) removeEqual(root->children(), noteSelectedChildren(*root));
    }
    for (auto it = noted.rbegin(); it != noted.rend(); ++it) {
        auto match = std::find(_ids->begin(), _ids->end(), *it);
        if (match != _ids->end()) _ids->erase(match);
    }
    removeEqual(_roots, doomedRoots);
    filterList();
    return selectedCount != 0;
}

void TQCurveSetMutable::setItem(const TQCurveEditorItemPtr& item) {
    if (!item || !item->isValid()) return;
    _roots.clear();
    appendItem(item);
    filterList();
}

void TQCurveSetMutable::clear() {
    _ids->clear();
    _roots.clear();
    filterList();
}
