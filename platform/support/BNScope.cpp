#include "platform/support/BNScope.h"

const char* BNScope::elementName(uint32_t elementId) const {
    for (const BNScopeEntry* e = _entries; e->name; ++e)
        if (e->elementId == elementId && e->attributeId == 0) return e->name;
    return nullptr;
}

const char* BNScope::attributeName(uint32_t elementId, uint32_t attributeId) const {
    if (attributeId == 0) return nullptr;
    for (const BNScopeEntry* e = _entries; e->name; ++e)
        if (e->elementId == elementId && e->attributeId == attributeId) return e->name;
    return nullptr;
}

uint32_t BNScope::elementId(std::string_view name) const {
    for (const BNScopeEntry* e = _entries; e->name; ++e)
        if (e->attributeId == 0 && name == e->name) return e->elementId;
    return 0;
}
