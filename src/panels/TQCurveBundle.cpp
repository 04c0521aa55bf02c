#include "src/panels/TQCurveBundle.h"

#include "src/panels/TQVersion.h"
#include "src/resources/TQStrings.h"

const char TQCurveBundleIdentifier[] = "org.vantacurveeditor.VantaCurveEditor";

// Reading the keys builds the strings table, so that later lookups only read it.
TQCurveEditorBundle::TQCurveEditorBundle()
    : _identifier(TQCurveBundleIdentifier),
      _version(VantaCurveEditorVersionString),
      _keys(TQLocalizedStringKeys()) {}

std::string TQCurveEditorBundle::localizedStringForKey(const std::string& key) const {
    return TQLocalizedString(key);
}

std::shared_ptr<const BNImage> TQCurveEditorBundle::imageForResource(const std::string& name,
                                                                     double scale) const {
    return BNImageForResource(name, scale);
}

const TQCurveEditorBundle& vantaCurveEditorBundle() {
    // A function-local static is made exactly once, even when threads race to the first call.
    static const TQCurveEditorBundle bundle;
    return bundle;
}
