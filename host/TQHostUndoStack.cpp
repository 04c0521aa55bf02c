#include "host/TQHostUndoStack.h"

#include <algorithm>
#include <typeinfo>
#include <utility>

namespace {

// Sets a flag for the lifetime of the scope, on every way out.
class FlagScope {
public:
    explicit FlagScope(bool& flag) : _flag(flag) { _flag = true; }
    ~FlagScope() { _flag = false; }
    FlagScope(const FlagScope&) = delete;
    FlagScope& operator=(const FlagScope&) = delete;

private:
    bool& _flag;
};

bool sameClass(const TQChannelBase& a, const TQChannelBase& b) { return typeid(a) == typeid(b); }

}  // namespace

TQHostUndoStack::TQHostUndoStack(SceneRootProvider sceneRoot) : _sceneRoot(std::move(sceneRoot)) {}

TQHostUndoStack::~TQHostUndoStack() = default;

// --- Recording ---

void TQHostUndoStack::beginStep(const BNString& description) {
    if (_applying) return;
    if (_depth == 0) {
        settlePending();
        _open = std::make_unique<Step>();
        _open->description = description;
    }
    ++_depth;
}

void TQHostUndoStack::endStep() {
    if (_applying || _depth == 0) return;  // an unbalanced end is tolerated
    if (--_depth == 0) closeStep(std::move(_open));
}

void TQHostUndoStack::closeOpenStep() {
    if (_applying || _depth == 0) return;
    _depth = 0;
    closeStep(std::move(_open));
}

void TQHostUndoStack::announceChannel(const TQChannelBase* channel) {
    if (_applying || !_open || !channel) return;
    captureBefore(*_open, *channel);
}

void TQHostUndoStack::channelWillChange(const TQChannelBase& channel) {
    if (_applying) return;
    if (_open) {
        captureBefore(*_open, channel);
        return;
    }
    // A change announced with no bracket around it (a Control band's flatten, the value
    // panel's write) is still the user's edit: it joins the step waiting for its "after"
    // state, or becomes a step of its own, which the channels announced after it join until
    // the history is next read or changed.
    if (!_pending) {
        _pending = std::make_unique<Step>();
        _pending->description = kImplicitStepDescription;
    }
    captureBefore(*_pending, channel);
    if (_pending->parts.empty()) _pending.reset();
}

void TQHostUndoStack::addChannelStep(const TQChannelBase* channel, const BNString& description) {
    if (_applying || !channel) return;
    if (_open) {
        // Inside a bracket the channel simply belongs to the open step.
        captureBefore(*_open, *channel);
        return;
    }
    settlePending();
    auto step = std::make_unique<Step>();
    step->description = description;
    captureBefore(*step, *channel);
    if (!step->parts.empty()) _pending = std::move(step);
}

bool TQHostUndoStack::addClientStep(const void* object, uint32_t type, uint32_t action,
                                    const BNString& description) {
    if (_applying) return false;
    auto found = _clients.find(object);
    if (found == _clients.end()) return false;

    ClientPart part{object, type, action, found->second->captureUndoState(type, action)};
    if (_open) {
        _open->parts.emplace_back(std::move(part));
        return true;
    }
    settlePending();
    auto step = std::make_unique<Step>();
    step->description = description;
    step->parts.emplace_back(std::move(part));
    pushUndo(std::move(step));
    return true;
}

void TQHostUndoStack::captureBefore(Step& step, const TQChannelBase& channel) {
    if (step.captured.contains(channel.getSerial())) return;
    TQChannelBase* root = _sceneRoot ? _sceneRoot() : nullptr;
    if (!root) return;
    TQChannelRef ref(&channel, root);
    // A channel outside the scene could never be found again to restore it.
    if (!ref.isValid() || ref.getChannel(root) != &channel) return;

    step.captured.insert(channel.getSerial());
    step.parts.emplace_back(
        ChannelPart{std::move(ref), std::unique_ptr<TQChannelBase>(channel.cloneChannel()), {}});
}

void TQHostUndoStack::closeStep(std::unique_ptr<Step> step) {
    if (!step) return;
    step->captured.clear();  // only needed while the step is open

    TQChannelBase* root = _sceneRoot ? _sceneRoot() : nullptr;
    std::erase_if(step->parts, [root](Part& part) {
        auto* channelPart = std::get_if<ChannelPart>(&part);
        if (!channelPart) return false;
        TQChannelBase* live = root ? channelPart->ref.getChannel(root) : nullptr;
        if (live) channelPart->after.reset(live->cloneChannel());
        const TQChannelBase* after = channelPart->after.get();
        return after && sameClass(*after, *channelPart->before) && *after == *channelPart->before;
    });
    if (step->parts.empty()) return;  // nothing changed: the history stays as it was
    pushUndo(std::move(step));
}

void TQHostUndoStack::settlePending() {
    if (_pending) closeStep(std::move(_pending));
}

void TQHostUndoStack::pushUndo(std::unique_ptr<Step> step) {
    step->identity = ++_lastIdentity;
    _redo.clear();
    _undo.push_back(std::move(step));
    if (_levels > 0 && _undo.size() > _levels)
        _undo.erase(_undo.begin(), _undo.begin() + static_cast<ptrdiff_t>(_undo.size() - _levels));
}

// --- Clients ---

void TQHostUndoStack::registerClient(const void* object, TQHostUndoClient* client) {
    if (!object) return;
    if (!client) {
        unregisterClient(object);
        return;
    }
    _clients[object] = client;
}

void TQHostUndoStack::unregisterClient(const void* object) {
    if (_clients.erase(object) == 0) return;

    auto dropParts = [object](Step& step) {
        std::erase_if(step.parts, [object](const Part& part) {
            auto* clientPart = std::get_if<ClientPart>(&part);
            return clientPart && clientPart->object == object;
        });
    };
    auto dropFrom = [&](std::vector<std::unique_ptr<Step>>& steps) {
        for (auto& step : steps) dropParts(*step);
        std::erase_if(steps, [](const std::unique_ptr<Step>& step) { return step->parts.empty(); });
    };
    dropFrom(_undo);
    dropFrom(_redo);
    if (_open) dropParts(*_open);  // stays open, empty or not: its end is still to come
}

// --- History ---

bool TQHostUndoStack::canUndo() {
    if (_depth > 0 || _applying) return false;
    settlePending();
    return !_undo.empty();
}

bool TQHostUndoStack::canRedo() {
    if (_depth > 0 || _applying) return false;
    settlePending();
    return !_redo.empty();
}

bool TQHostUndoStack::undo() {
    if (!canUndo()) return false;
    std::unique_ptr<Step> step = std::move(_undo.back());
    _undo.pop_back();
    apply(*step, true);
    _redo.push_back(std::move(step));
    return true;
}

bool TQHostUndoStack::redo() {
    if (!canRedo()) return false;
    std::unique_ptr<Step> step = std::move(_redo.back());
    _redo.pop_back();
    apply(*step, false);
    _undo.push_back(std::move(step));
    return true;
}

BNString TQHostUndoStack::undoDescription() {
    if (_depth == 0) settlePending();
    return _undo.empty() ? BNString() : _undo.back()->description;
}

BNString TQHostUndoStack::redoDescription() {
    if (_depth == 0) settlePending();
    return _redo.empty() ? BNString() : _redo.back()->description;
}

size_t TQHostUndoStack::undoCount() {
    if (_depth == 0) settlePending();
    return _undo.size();
}

size_t TQHostUndoStack::redoCount() {
    if (_depth == 0) settlePending();
    return _redo.size();
}

uint64_t TQHostUndoStack::position() {
    if (_depth == 0) settlePending();
    return _undo.empty() ? 0 : _undo.back()->identity;
}

void TQHostUndoStack::clear() {
    _pending.reset();
    _undo.clear();
    _redo.clear();
}

void TQHostUndoStack::setLevelsOfUndo(size_t levels) {
    _levels = levels;
    if (_levels > 0 && _undo.size() > _levels)
        _undo.erase(_undo.begin(), _undo.begin() + static_cast<ptrdiff_t>(_undo.size() - _levels));
}

void TQHostUndoStack::apply(Step& step, bool undoing) {
    FlagScope applying(_applying);
    TQChannelBase* root = _sceneRoot ? _sceneRoot() : nullptr;

    // Undo walks the parts backwards, so that a channel captured twice (a compound and then
    // one of its components) ends in its earliest state; redo walks them forwards.
    auto visit = [&](Part& part) {
        if (auto* channelPart = std::get_if<ChannelPart>(&part)) {
            restoreChannel(*channelPart,
                           undoing ? channelPart->before.get() : channelPart->after.get(), root);
        } else {
            swapClientState(std::get<ClientPart>(part));
        }
    };
    if (undoing) {
        for (auto it = step.parts.rbegin(); it != step.parts.rend(); ++it) visit(*it);
    } else {
        for (auto& part : step.parts) visit(part);
    }
}

void TQHostUndoStack::restoreChannel(const ChannelPart& part, const TQChannelBase* snapshot,
                                     TQChannelBase* root) {
    if (!snapshot || !root) return;
    TQChannelBase* live = part.ref.getChannel(root);
    // Gone, or replaced by a node of another class: nothing this snapshot can be assigned to.
    if (!live || !sameClass(*live, *snapshot)) return;
    live->noteWillChange(true);
    *live = *snapshot;
}

void TQHostUndoStack::swapClientState(ClientPart& part) {
    auto found = _clients.find(part.object);
    if (found == _clients.end()) return;
    TQHostUndoClient* client = found->second;
    std::any current = client->captureUndoState(part.type, part.action);
    client->restoreUndoState(part.type, part.action, part.state);
    part.state = std::move(current);
}
