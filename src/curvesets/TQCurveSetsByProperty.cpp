// The sets by property: relative sets over a fixed table of paths per object model.
#include <array>
#include <vector>

#include "src/contract/TQCurveEditorAppDelegate.h"
#include "src/curvesets/TQAutomaticCurveSets.h"

namespace {

struct PropertyTable {
    const char* shortcut;
    std::vector<const char*> kestrel;
    std::vector<const char*> other;
};

// In the first model the transform properties share the folder ./1/100 (the next id picks
// the property, the last its axis); in the second they share ./43/3795058304, with two axes
// and rotation a single channel. The second model has no shear.
const PropertyTable& tableOf(TQCurveSetProperty property) {
    static const std::array<PropertyTable, 7> kTables = {{
        {"p",
         {"./1/100/101/1", "./1/100/101/2", "./1/100/101/3"},
         {"./43/3795058304/1/1", "./43/3795058304/1/2"}},
        {"s",
         {"./1/100/105/1", "./1/100/105/2", "./1/100/105/3"},
         {"./43/3795058304/3/1", "./43/3795058304/3/2"}},
        {"r", {"./1/100/109/1", "./1/100/109/2", "./1/100/109/3"}, {"./43/3795058304/2"}},
        {"h", {"./1/100/106/1", "./1/100/106/2"}, {}},
        {"a",
         {"./1/100/107/1", "./1/100/107/2", "./1/100/107/3"},
         {"./43/3795058304/4/1", "./43/3795058304/4/2"}},
        {"o", {"./1/200/202"}, {"./43/44/2"}},
        {"t", {"./1/304"}, {"./43/817009658/1002", "./43/817009658/1004"}},
    }};
    return kTables[static_cast<size_t>(property)];
}

}  // namespace

std::vector<TQChannelRef> TQCurveSetByProperty::paths(TQCurveSetProperty property, bool kestrel) {
    const PropertyTable& table = tableOf(property);
    std::vector<TQChannelRef> out;
    for (const char* path : kestrel ? table.kestrel : table.other) out.emplace_back(BNString(path));
    return out;
}

void TQCurveSetByProperty::initWithName(const BNString& name,
                                        TQCurveEditorAppDelegate* appDelegate) {
    TQCurveSet::initWithName(name, appDelegate);
    setCurveSetShortcut(tableOf(_property).shortcut);
    // Directly, not through setRelative, which would freeze the (absent) items into paths.
    _relative = true;
    *_ids = paths(_property, appDelegate && appDelegate->isKestrel());
}
