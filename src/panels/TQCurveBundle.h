#pragma once
// The framework's bundle: its identity and its own resources, the strings table and the
// images, reached as one object.
//
// vantaCurveEditorBundle() makes it on the first call, once, from whichever thread calls
// first (others wait for it), and keeps it for the life of the process: the reference stays
// valid and may be used from any thread. The strings table and the images are compiled into
// the framework, so nothing here touches the disk.

#include <memory>
#include <string>
#include <vector>

#include "src/resources/BNImage.h"

// The framework's bundle identifier.
extern const char TQCurveBundleIdentifier[];

class TQCurveEditorBundle {
public:
    TQCurveEditorBundle(const TQCurveEditorBundle&) = delete;
    TQCurveEditorBundle& operator=(const TQCurveEditorBundle&) = delete;

    const std::string& bundleIdentifier() const { return _identifier; }
    // "major.minor.patch" of the framework.
    const std::string& version() const { return _version; }
    // The text of a key of the strings table; the key itself when the table lacks it, so
    // that a missing entry shows up as its key.
    std::string localizedStringForKey(const std::string& key) const;
    // Every key of the table, sorted.
    const std::vector<std::string>& localizedStringKeys() const { return _keys; }
    // An image of the resources by name (no extension, no "@2x"), at the file that suits the
    // scale (pixels per point); null for a name the resources do not hold.
    std::shared_ptr<const BNImage> imageForResource(const std::string& name,
                                                    double scale = 1.0) const;

private:
    friend const TQCurveEditorBundle& vantaCurveEditorBundle();
    TQCurveEditorBundle();

    std::string _identifier;
    std::string _version;
    std::vector<std::string> _keys;
};

const TQCurveEditorBundle& vantaCurveEditorBundle();
