#include "platform/channels/TQChannelBase.h"

#include <atomic>
#include <typeinfo>

#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelRef.h"

namespace {
// Atomic although channels live on the main thread: a host may build a scene off it.
std::atomic<TQChannelSerial> gNextChannelSerial{1};
}  // namespace

TQChannelBase::TQChannelBase(const BNString& name, TQChannelId channelId)
    : _name(name),
      _channelId(channelId),
      _serial(gNextChannelSerial.fetch_add(1, std::memory_order_relaxed)) {}

TQChannelBase::~TQChannelBase() {
    // Deleted on its own while still in a folder: leave it, so the folder keeps no dangling
    // pointer and references to this node resolve to null from now on.
    if (_parent) _parent->forgetChild(this);
}

bool TQChannelBase::testFlag(uint64_t flag) const { return (_flags & flag) != 0; }

void TQChannelBase::setFlag(uint64_t flag, bool notify) {
    if (notify) noteWillChange(true);
    _flags |= flag;
}

void TQChannelBase::resetFlag(uint64_t flag, bool notify) {
    if (notify) noteWillChange(true);
    _flags &= ~flag;
}

TQChannelBase& TQChannelBase::operator=(const TQChannelBase& other) {
    if (this != &other) assignState(other);
    return *this;
}

bool TQChannelBase::operator==(const TQChannelBase& other) const {
    if (this == &other) return true;
    // A boolean channel is no plain channel even with the same keyframes.
    if (typeid(*this) != typeid(other)) return false;
    return equalState(other);
}

TQChannelBase* TQChannelBase::getChannelRoot() const {
    for (const TQChannelBase* node = this; node; node = node->_parent) {
        if (dynamic_cast<const TQChannelObjectRootBase*>(node)) {
            return const_cast<TQChannelBase*>(node);
        }
    }
    return nullptr;
}

bool TQChannelBase::isLocked(bool checkAncestors) const {
    return checkAncestors ? isAnyAncestorLocked() : _locked;
}

bool TQChannelBase::isAnyAncestorLocked() const {
    for (const TQChannelBase* node = this; node; node = node->_parent) {
        if (node->_locked) return true;
    }
    return false;
}

void TQChannelBase::setLocked(bool locked, bool notify) {
    if (_locked == locked) return;
    if (notify) noteWillChange(true);
    _locked = locked;
}

TQChannelRef TQChannelBase::getRef(bool relativeToObjectRoot) const {
    return TQChannelRef(this, relativeToObjectRoot ? getChannelRoot() : nullptr);
}

void TQChannelBase::noteWillChange(bool notify) {
    if (!notify) return;
    for (const TQChannelBase* node = this; node; node = node->_parent) {
        if (node->_observer) {
            node->_observer->channelWillChange(*this);
            return;
        }
    }
}

void TQChannelBase::beginValueEdit(const BNString& undoText) {
    if (_manipulator) _manipulator->beginValueEdit(*this, undoText);
}

CMTime TQChannelBase::timeOffset() const {
    CMTime sum = kCMTimeZero;
    for (const TQChannelBase* node = this; node; node = node->_parent) {
        sum = BN_CMTimeSaferAdd(sum, node->_ownTimeOffset);
    }
    return sum;
}

void TQChannelBase::assignState(const TQChannelBase& other) {
    _flags = other._flags;
    _locked = other._locked;
    _info = other._info;
    _impl = other._impl;
}

bool TQChannelBase::equalState(const TQChannelBase& other) const {
    return _flags == other._flags && _locked == other._locked && _info == other._info &&
           _impl.range() == other._impl.range();
}

void TQChannelBase::copyIdentityFrom(const TQChannelBase& other) {
    _name = other._name;
    _channelId = other._channelId;
    _ownTimeOffset = other._ownTimeOffset;
    _timeExtent = other._timeExtent;
    _xAxisLabel = other._xAxisLabel;
}
