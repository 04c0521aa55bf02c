#pragma once
// A set of row indexes, as tables and outlines keep their selection: sorted, each index once.
// A small value type; copy it freely. Lookups are binary searches, so a selection of thousands
// of rows stays cheap to test row by row.

#include <algorithm>
#include <cstdint>
#include <initializer_list>
#include <vector>

class RWIndexSet {
public:
    RWIndexSet() = default;
    RWIndexSet(std::initializer_list<int64_t> indexes) {
        for (int64_t i : indexes) addIndex(i);
    }
    // The indexes of a vector, in any order, repeats dropped; negative ones are left out.
    static RWIndexSet fromVector(const std::vector<int64_t>& indexes) {
        RWIndexSet set;
        for (int64_t i : indexes)
            if (i >= 0) set._indexes.push_back(i);
        std::sort(set._indexes.begin(), set._indexes.end());
        set._indexes.erase(std::unique(set._indexes.begin(), set._indexes.end()),
                           set._indexes.end());
        return set;
    }
    // [first, first + count).
    static RWIndexSet range(int64_t first, int64_t count) {
        RWIndexSet set;
        for (int64_t i = 0; i < count; ++i) set._indexes.push_back(first + i);
        return set;
    }

    bool containsIndex(int64_t index) const {
        return std::binary_search(_indexes.begin(), _indexes.end(), index);
    }
    void addIndex(int64_t index) {
        if (index < 0) return;
        const auto it = std::lower_bound(_indexes.begin(), _indexes.end(), index);
        if (it == _indexes.end() || *it != index) _indexes.insert(it, index);
    }
    void removeIndex(int64_t index) {
        const auto it = std::lower_bound(_indexes.begin(), _indexes.end(), index);
        if (it != _indexes.end() && *it == index) _indexes.erase(it);
    }
    void removeAllIndexes() { _indexes.clear(); }
    // Every index at or past `from` moves by `delta`; indexes that would fall below `from`
    // (a removal of rows) are dropped first by the caller.
    void shiftIndexesStartingAtIndex(int64_t from, int64_t delta) {
        for (int64_t& i : _indexes)
            if (i >= from) i += delta;
    }
    // Drops the indexes in [first, first + count).
    void removeIndexesInRange(int64_t first, int64_t count) {
        std::erase_if(_indexes, [&](int64_t i) { return i >= first && i < first + count; });
    }
    // Drops the indexes at or past `limit`.
    void removeIndexesFrom(int64_t limit) {
        std::erase_if(_indexes, [&](int64_t i) { return i >= limit; });
    }

    size_t count() const { return _indexes.size(); }
    bool empty() const { return _indexes.empty(); }
    // -1 when empty.
    int64_t firstIndex() const { return _indexes.empty() ? -1 : _indexes.front(); }
    int64_t lastIndex() const { return _indexes.empty() ? -1 : _indexes.back(); }
    const std::vector<int64_t>& indexes() const { return _indexes; }
    auto begin() const { return _indexes.begin(); }
    auto end() const { return _indexes.end(); }

    friend bool operator==(const RWIndexSet&, const RWIndexSet&) = default;

private:
    std::vector<int64_t> _indexes;
};
