#pragma once
// A scope: the table that gives the text names of the numeric element and attribute ids of a
// serializer while it is pushed on a stream. Serializers speak only in ids; the names are
// what stands in the file.
//
// A table is an array of rows that ends with an empty row ({nullptr, 0, 0}). A row with
// attribute id 0 names an element; any other row names an attribute of the element with
// that element id. The table is not copied: it must outlive the scope (tables are static
// data in practice).

#include <cstdint>
#include <string_view>

struct BNScopeEntry {
    const char* name;
    uint32_t elementId;
    uint32_t attributeId;
};

class BNScope {
public:
    // `entries` ends with a row whose name is null.
    explicit constexpr BNScope(const BNScopeEntry* entries) : _entries(entries) {}

    // The name of an element or attribute id, null when the table has none.
    const char* elementName(uint32_t elementId) const;
    const char* attributeName(uint32_t elementId, uint32_t attributeId) const;
    // The id of an element name, 0 when the table has none (0 is never an element id).
    uint32_t elementId(std::string_view name) const;

    const BNScopeEntry* entries() const { return _entries; }

private:
    const BNScopeEntry* _entries;
};
