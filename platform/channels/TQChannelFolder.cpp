#include "platform/channels/TQChannelFolder.h"

#include <algorithm>
#include <typeinfo>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelObjectRootBase.h"

namespace {
// Below this many slots a straight scan beats keeping an index.
constexpr size_t kIndexedLookupMinChildren = 12;
}  // namespace

TQChannelFolder::TQChannelFolder(const BNString& name, TQChannelId channelId)
    : TQChannelBase(name, channelId) {}

TQChannelFolder::TQChannelFolder(const TQChannelFolder& source, CloneTag)
    : TQChannelBase(source.getName(), source.getChannelId()) {
    copyIdentityFrom(source);
    TQChannelBase::assignState(source);
    _foldFlags = source._foldFlags;
    if (!source._children) return;
    _children = std::make_unique<std::vector<TQChannelBase*>>();
    _children->reserve(source._children->size());
    for (const TQChannelBase* child : *source._children) {
        TQChannelBase* copy = child ? child->cloneChannel() : nullptr;
        if (copy) copy->_parent = this;
        _children->push_back(copy);
    }
}

TQChannelFolder::~TQChannelFolder() { removeAllChildren(); }

TQChannelBase* TQChannelFolder::getChild(size_t index) const {
    if (!_children || index >= _children->size()) return nullptr;
    return (*_children)[index];
}

void TQChannelFolder::rebuildIndex() const {
    _index.clear();
    if (_children) {
        _index.reserve(_children->size());
        for (size_t i = 0; i < _children->size(); ++i) {
            if (const TQChannelBase* child = (*_children)[i]) {
                _index.emplace_back(child->getChannelId(), static_cast<uint32_t>(i));
            }
        }
    }
    std::sort(_index.begin(), _index.end());
    _indexValid = true;
}

TQChannelBase* TQChannelFolder::findChild(TQChannelId channelId) const {
    if (!_children) return nullptr;
    if (_children->size() < kIndexedLookupMinChildren) {
        for (TQChannelBase* child : *_children) {
            if (child && child->getChannelId() == channelId) return child;
        }
        return nullptr;
    }
    if (!_indexValid) rebuildIndex();
    const auto it = std::lower_bound(_index.begin(), _index.end(),
                                     std::pair<TQChannelId, uint32_t>(channelId, 0));
    if (it == _index.end() || it->first != channelId) return nullptr;
    return (*_children)[it->second];
}

std::optional<size_t> TQChannelFolder::indexOfChild(const TQChannelBase* child) const {
    if (!_children || !child || child->getParent() != this) return std::nullopt;
    const auto it = std::find(_children->begin(), _children->end(), child);
    if (it == _children->end()) return std::nullopt;
    return static_cast<size_t>(it - _children->begin());
}

TQChannelBase* TQChannelFolder::addChild(std::unique_ptr<TQChannelBase> child) {
    return insertChild(numberOfChildren(), std::move(child));
}

TQChannelBase* TQChannelFolder::insertChild(size_t index, std::unique_ptr<TQChannelBase> child) {
    if (child && child->_parent) {
        // Still listed by another folder (or this one): leave it without being destroyed.
        TQChannelFolder* previous = child->_parent;
        previous->forgetChild(child.get());
        child->_parent = nullptr;
    }
    if (!_children) _children = std::make_unique<std::vector<TQChannelBase*>>();
    index = std::min(index, _children->size());
    TQChannelBase* raw = child.release();
    _children->insert(_children->begin() + static_cast<std::ptrdiff_t>(index), raw);
    if (raw) raw->_parent = this;
    childrenChanged();
    return raw;
}

std::unique_ptr<TQChannelBase> TQChannelFolder::takeChild(TQChannelBase* child) {
    const std::optional<size_t> index = indexOfChild(child);
    if (!index) return nullptr;
    return takeChildAt(*index);
}

std::unique_ptr<TQChannelBase> TQChannelFolder::takeChildAt(size_t index) {
    if (!_children || index >= _children->size()) return nullptr;
    TQChannelBase* child = (*_children)[index];
    if (!child) return nullptr;
    _children->erase(_children->begin() + static_cast<std::ptrdiff_t>(index));
    child->_parent = nullptr;
    childrenChanged();
    return std::unique_ptr<TQChannelBase>(child);
}

bool TQChannelFolder::removeChild(TQChannelBase* child) {
    // Taking it first keeps the destructor from coming back into this folder.
    return takeChild(child) != nullptr;
}

bool TQChannelFolder::removeChildAt(size_t index) {
    if (!_children || index >= _children->size()) return false;
    TQChannelBase* child = (*_children)[index];
    _children->erase(_children->begin() + static_cast<std::ptrdiff_t>(index));
    childrenChanged();
    if (child) {
        child->_parent = nullptr;
        delete child;
    }
    return true;
}

void TQChannelFolder::removeAllChildren() {
    // Detach the vector first: destructors of children must find no slot to leave.
    std::unique_ptr<std::vector<TQChannelBase*>> children = std::move(_children);
    childrenChanged();
    if (!children) return;
    for (TQChannelBase* child : *children) {
        if (!child) continue;
        child->_parent = nullptr;
        delete child;
    }
}

void TQChannelFolder::forgetChild(TQChannelBase* child) {
    if (!_children) return;
    const auto it = std::find(_children->begin(), _children->end(), child);
    if (it == _children->end()) return;
    _children->erase(it);
    childrenChanged();
}

void TQChannelFolder::getAllDescendantsFlattened(std::vector<TQChannelBase*>& out,
                                                 uint32_t excludedFlags,
                                                 bool stopAtObjectRoots) const {
    if (!_children) return;
    for (TQChannelBase* child : *_children) {
        if (!child || child->testFlag(excludedFlags)) continue;
        if (dynamic_cast<TQChannel*>(child)) {
            out.push_back(child);
            continue;
        }
        const auto* folder = dynamic_cast<const TQChannelFolder*>(child);
        if (!folder) continue;
        if (stopAtObjectRoots && dynamic_cast<const TQChannelObjectRootBase*>(folder)) continue;
        folder->getAllDescendantsFlattened(out, excludedFlags, stopAtObjectRoots);
    }
}

TQChannelBase* TQChannelFolder::cloneChannel() const {
    return new TQChannelFolder(*this, CloneTag{});
}

bool TQChannelFolder::isAnimated(bool checkChildren) const {
    if (!checkChildren || !_children) return false;
    return std::any_of(_children->begin(), _children->end(),
                       [](const TQChannelBase* child) { return child && child->isAnimated(true); });
}

void TQChannelFolder::reset(bool notify) {
    if (!_children) return;
    for (TQChannelBase* child : *_children) {
        if (child) child->reset(notify);
    }
}

void TQChannelFolder::assignState(const TQChannelBase& other) {
    TQChannelBase::assignState(other);
    const auto* folder = dynamic_cast<const TQChannelFolder*>(&other);
    if (!folder) return;
    _foldFlags = folder->_foldFlags;
    const size_t n = std::min(numberOfChildren(), folder->numberOfChildren());
    for (size_t i = 0; i < n; ++i) {
        TQChannelBase* mine = (*_children)[i];
        const TQChannelBase* theirs = (*folder->_children)[i];
        // Different classes at one position: the shapes differ there, and a channel's state
        // can't be poured into a folder or the other way round.
        if (mine && theirs && typeid(*mine) == typeid(*theirs)) *mine = *theirs;
    }
}

bool TQChannelFolder::equalState(const TQChannelBase& other) const {
    if (!TQChannelBase::equalState(other)) return false;
    const auto* folder = dynamic_cast<const TQChannelFolder*>(&other);
    if (!folder || _foldFlags != folder->_foldFlags) return false;
    const size_t n = numberOfChildren();
    if (n != folder->numberOfChildren()) return false;
    for (size_t i = 0; i < n; ++i) {
        const TQChannelBase* mine = (*_children)[i];
        const TQChannelBase* theirs = (*folder->_children)[i];
        if (!mine || !theirs) {
            if (mine != theirs) return false;
            continue;
        }
        if (!(*mine == *theirs)) return false;
    }
    return true;
}
