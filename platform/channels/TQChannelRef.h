#pragma once
// A channel named by its path: the chain of channel ids from just below a root down to the
// channel. The text form is "." followed by "/<id>" per step, ids in decimal: "./1/100/101/1".
// The reference of the root itself is ".".
//
// A reference holds no pointer into the tree. It is resolved anew against whatever root the
// caller has now, so it outlives the channels it names: once a step of the path is gone it
// resolves to null. Because the root is not part of the path, a channel under one object root
// has the same reference as the channel in the same place under another object root.
//
// Text that does not parse gives an invalid reference: it resolves to nothing, keeps its text
// (so saving it again loses nothing) and equals only an invalid reference of the same text.

#include <cstddef>
#include <cstdint>
#include <functional>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/support/BNString.h"

class TQChannelRef {
public:
    // An invalid reference with empty text.
    TQChannelRef() = default;
    // Names `channel` relative to `root`. A null root names it from the top of its tree (the
    // topmost ancestor is the root then). A null channel, or a root that is neither the
    // channel nor one of its ancestors, gives an invalid reference.
    TQChannelRef(const TQChannelBase* channel, const TQChannelBase* root);
    // From the text form.
    explicit TQChannelRef(const BNString& text);

    // Resolves against `root`: walks the path one child id at a time. Null when the root is
    // null, the reference is invalid, or a step is missing. Allocates nothing.
    TQChannelBase* getChannel(TQChannelBase* root) const;
    const TQChannelBase* getChannel(const TQChannelBase* root) const;

    bool isValid() const { return _valid; }
    // The path ids from below the root down to the channel; empty for the root itself.
    const std::vector<TQChannelId>& getIds() const { return _ids; }
    size_t depth() const { return _ids.size(); }

    // The text form; for an invalid reference, the text it was made from.
    BNString getText() const;

    friend bool operator==(const TQChannelRef& a, const TQChannelRef& b);
    // A strict order for sorted containers and sorted walks: valid references by their ids
    // lexicographically (a folder before what lies below it), then invalid ones by text.
    friend bool operator<(const TQChannelRef& a, const TQChannelRef& b);
    // Consistent with ==, for hashed containers.
    size_t hash() const;

private:
    std::vector<TQChannelId> _ids;
    BNString _invalidText;  // only for invalid references
    bool _valid = false;
};

template <>
struct std::hash<TQChannelRef> {
    size_t operator()(const TQChannelRef& ref) const noexcept { return ref.hash(); }
};
