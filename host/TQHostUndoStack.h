#pragma once
// The host's undo history, built on the framework's capture brackets.
//
// A step holds parts, in the order they were recorded:
//   - channel parts: a snapshot of the channel before its first change in the step and one
//     when the step closed, with the channel's reference from the scene root. Undo resolves
//     the reference against the scene root of that moment (the channel object may have been
//     replaced) and assigns the "before" snapshot; redo assigns the "after" one. A reference
//     that no longer resolves, or that resolves to a node of another class, is skipped.
//   - client parts: a step that is not a channel's (a curve set's content, a box). The object
//     that owns what changes registers a TQHostUndoClient; the part holds the memento that
//     the client gave when the step was recorded, and undo and redo swap it with a fresh one.
//
// Steps:
//   - beginStep / endStep bracket one step and nest by counting: only the outermost pair
//     opens and closes it, under the outermost description. An end with no open step is
//     ignored.
//   - While a step is open, announceChannel (the framework's will... calls) and
//     channelWillChange (a channel's own noteWillChange) capture the "before" state of a
//     channel the first time it is seen. Outside a step announceChannel does nothing, and
//     channelWillChange joins the step addChannelStep left waiting, or starts one of its own,
//     described kImplicitStepDescription, which later announcements outside a step join.
//   - addChannelStep outside a step records the channel as a step of its own; its "after"
//     state is taken lazily, just before the history is next read or changed, since the
//     change it stands for follows the call with no bracket around it.
//   - A closed step whose channels all compare equal to their "before" state, and that holds
//     no client part, is dropped: the history stays as it was, redo side included.
//   - A step that is kept clears the redo side.
//
// Undo and redo are refused while a step is open or while an undo or redo runs (a client's
// restore that posts back into the host cannot nest one).

#include <any>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <unordered_map>
#include <unordered_set>
#include <variant>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/support/BNString.h"

// The owner of a step that is not a channel's.
class TQHostUndoClient {
public:
    virtual ~TQHostUndoClient() = default;
    // The state that undo must give back, taken when a step of this client is recorded
    // (before the change), and again before each undo or redo to make the opposite memento.
    virtual std::any captureUndoState(uint32_t type, uint32_t action) = 0;
    virtual void restoreUndoState(uint32_t type, uint32_t action, const std::any& state) = 0;
};

class TQHostUndoStack {
public:
    // The description of a step made of changes announced outside any bracket.
    static constexpr const char* kImplicitStepDescription = "Change";

    // Resolves references at capture and restore time; it may answer a different root each
    // time, or null (then channel parts are skipped).
    using SceneRootProvider = std::function<TQChannelBase*()>;

    explicit TQHostUndoStack(SceneRootProvider sceneRoot);
    ~TQHostUndoStack();
    TQHostUndoStack(const TQHostUndoStack&) = delete;
    TQHostUndoStack& operator=(const TQHostUndoStack&) = delete;

    // --- Recording ---
    void beginStep(const BNString& description);
    void endStep();
    // Closes the open step at whatever depth, as its outermost end would have: for a step
    // that was left open (the ends still to come are then ignored as unbalanced).
    void closeOpenStep();
    bool isStepOpen() const { return _depth > 0; }
    int depth() const { return _depth; }

    void announceChannel(const TQChannelBase* channel);
    void channelWillChange(const TQChannelBase& channel);
    void addChannelStep(const TQChannelBase* channel, const BNString& description);
    // False when no client is registered for `object` (nothing is recorded).
    bool addClientStep(const void* object, uint32_t type, uint32_t action,
                       const BNString& description);

    // Not owned. Unregistering removes every part of that object from the history, and
    // steps left empty with it.
    void registerClient(const void* object, TQHostUndoClient* client);
    void unregisterClient(const void* object);

    // --- History ---
    bool canUndo();
    bool canRedo();
    bool undo();
    bool redo();
    // The description of the step that undo or redo would act on; empty when there is none.
    BNString undoDescription();
    BNString redoDescription();
    size_t undoCount();
    size_t redoCount();
    // Where the history stands: an identity of the step that undo would take back, 0 with
    // none. Undo and redo back to a step give its identity again and a new step never reuses
    // one, so a host that notes the position when it saves can tell whether its document
    // changed since.
    uint64_t position();
    // Forgets the history; an open step stays open.
    void clear();

    // Steps kept beyond this many are forgotten, oldest first; 0 keeps every step. Each step
    // holds two whole snapshots of each of its channels, so the default bounds the memory
    // a long session takes.
    static constexpr size_t kDefaultLevelsOfUndo = 250;
    void setLevelsOfUndo(size_t levels);
    size_t levelsOfUndo() const { return _levels; }

private:
    struct ChannelPart {
        TQChannelRef ref;
        std::unique_ptr<TQChannelBase> before;
        std::unique_ptr<TQChannelBase> after;  // null: the channel was gone when the step closed
    };
    struct ClientPart {
        const void* object = nullptr;
        uint32_t type = 0;
        uint32_t action = 0;
        std::any state;
    };
    using Part = std::variant<ChannelPart, ClientPart>;
    struct Step {
        BNString description;
        uint64_t identity = 0;  // given when the step enters the history
        std::vector<Part> parts;
        // Serials of the channels captured while the step is open, so that each channel is
        // captured once (an address may be reused by a channel made inside the step).
        std::unordered_set<TQChannelSerial> captured;
    };

    void captureBefore(Step& step, const TQChannelBase& channel);
    // Takes the "after" states, drops unchanged parts, and keeps the step if anything is left.
    void closeStep(std::unique_ptr<Step> step);
    void settlePending();
    void pushUndo(std::unique_ptr<Step> step);
    void apply(Step& step, bool undoing);
    void restoreChannel(const ChannelPart& part, const TQChannelBase* snapshot,
                        TQChannelBase* root);
    void swapClientState(ClientPart& part);

    SceneRootProvider _sceneRoot;
    std::unique_ptr<Step> _open;     // the step between the outermost begin and end
    std::unique_ptr<Step> _pending;  // a step waiting for its "after" state
    int _depth = 0;
    bool _applying = false;
    size_t _levels = kDefaultLevelsOfUndo;
    uint64_t _lastIdentity = 0;
    std::vector<std::unique_ptr<Step>> _undo;  // oldest first
    std::vector<std::unique_ptr<Step>> _redo;  // the next redo last
    std::unordered_map<const void*, TQHostUndoClient*> _clients;
};
