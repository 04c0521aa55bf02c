#include "platform/channels/TQChannelRef.h"

#include <algorithm>
#include <charconv>
#include <limits>

#include "platform/channels/TQChannelFolder.h"

TQChannelRef::TQChannelRef(const TQChannelBase* channel, const TQChannelBase* root) {
    if (!channel) return;
    // Collected from the channel upwards, then reversed into path order.
    const TQChannelBase* node = channel;
    while (node != root) {
        const TQChannelFolder* parent = node->getParent();
        if (!parent) {
            // Reached the top. Without a root that is where the path starts; with one, the
            // root was not an ancestor and there is no path.
            if (root) {
                _ids.clear();
                return;
            }
            break;
        }
        _ids.push_back(node->getChannelId());
        node = parent;
    }
    std::reverse(_ids.begin(), _ids.end());
    _valid = true;
}

TQChannelRef::TQChannelRef(const BNString& text) {
    const char* p = text.data();
    const char* const end = p + text.size();
    if (p == end || *p != '.') {
        _invalidText = text;
        return;
    }
    ++p;
    while (p != end) {
        TQChannelId id = 0;
        // Each step is "/" and a plain decimal id; no sign, no blanks, no empty step.
        if (*p != '/' || p + 1 == end || p[1] < '0' || p[1] > '9') break;
        const auto [next, ec] = std::from_chars(p + 1, end, id);
        if (ec != std::errc()) break;  // out of the 32-bit range
        _ids.push_back(id);
        p = next;
    }
    if (p != end) {
        _ids.clear();
        _invalidText = text;
        return;
    }
    _valid = true;
}

const TQChannelBase* TQChannelRef::getChannel(const TQChannelBase* root) const {
    if (!root || !_valid) return nullptr;
    const TQChannelBase* node = root;
    for (const TQChannelId id : _ids) {
        node = node->findChild(id);  // a leaf has no children
        if (!node) return nullptr;
    }
    return node;
}

TQChannelBase* TQChannelRef::getChannel(TQChannelBase* root) const {
    // The walk never writes; the tree it runs over is the caller's, mutable or not.
    return const_cast<TQChannelBase*>(getChannel(static_cast<const TQChannelBase*>(root)));
}

BNString TQChannelRef::getText() const {
    if (!_valid) return _invalidText;
    BNString text;
    text.reserve(1 + _ids.size() * 6);
    text.push_back('.');
    char digits[std::numeric_limits<TQChannelId>::digits10 + 2];
    for (const TQChannelId id : _ids) {
        text.push_back('/');
        const auto [last, ec] = std::to_chars(digits, digits + sizeof digits, id);
        (void)ec;  // a 32-bit id always fits
        text.append(digits, last);
    }
    return text;
}

bool operator==(const TQChannelRef& a, const TQChannelRef& b) {
    if (a._valid != b._valid) return false;
    if (!a._valid) return a._invalidText == b._invalidText;
    return a._ids == b._ids;
}

bool operator<(const TQChannelRef& a, const TQChannelRef& b) {
    if (a._valid != b._valid) return a._valid;
    if (!a._valid) return a._invalidText < b._invalidText;
    return a._ids < b._ids;
}

size_t TQChannelRef::hash() const {
    if (!_valid) return std::hash<BNString>{}(_invalidText);
    // FNV-1a over the ids; paths are short, so this stays cheap.
    uint64_t h = 0xcbf29ce484222325ull;
    for (const TQChannelId id : _ids) {
        h ^= id;
        h *= 0x100000001b3ull;
    }
    h ^= _ids.size();
    return static_cast<size_t>(h);
}
