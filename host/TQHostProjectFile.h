#pragma once
// The reference host's project file: one XML document with the scene, the time settings, the
// object selection and the editor's two saved trees.
//
//   <project version="5" family="kestrel">
//     <timing frameduration="1/30" rangestart="0/1" rangeduration="10/1" currenttime="0/1"
//             firstframe="0" starttimecode="0" textstep="1/1" asframes="false"/>
//     <scene>
//       <channel factory="..." id="1" name="Title" ...>       an object's root
//         <channel factory="..." id="100" ...>                 its children, in child order
//           <key t="0/262144" v="1" ou="0.1" i="4"/>
//           <behavior kind="Oscillate" amplitude="2" frequency="0.5" phase="0" .../>
//         </channel>
//         <empty/>                                             an empty child slot
//       </channel>
//     </scene>
//     <selection><selected ref="./1"/></selection>
//     <curveeditor>...</curveeditor>                           TQCurveEditorState
//     <curvesets selected="1">...</curvesets>                  TQCurveSetListSerializer
//   </project>
//
// Every node carries its class (the factory identifier, two 64-bit words in hex) and all of
// its state: flags, lock, hints, value range, own time offset, time extent; folders their
// fold flags; animated values their initial and default values, interpolation of new
// keyframes, extrapolation on both sides, whether animation is enabled, and every keyframe
// and behaviour. A keyframe's handles (iu, iv, ou, ov) are left out when they are +0, and its
// flags locked, enabled, broken and scaled when they are false, true, false, false. Times keep
// their value and timescale, doubles their bits.
//
// Reading is strict in the host's part: an element or attribute out of place, a missing
// attribute, a value out of range, a time that is not a number where one is needed, an
// unknown class or behaviour, keyframes out of time order or a selection that names no object
// fail the whole read. Inside the editor's trees unknown elements are skipped, as the trees
// define. The file format version says how the editor reads its trees: 5 now, 1 to 4 for
// older documents; a newer version is refused.

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "host/TQHostObjectModel.h"
#include "platform/support/BNSerializer.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "src/curvesets/TQCurveEditorState.h"
#include "src/curvesets/TQCurveSetListSerializer.h"

class TQHostAppDelegate;

inline constexpr int32_t kTQHostProjectVersion = 5;

// The document of one host: the scene and time settings live in the host; the editor's state
// and its saved custom sets live here. While the project exists the host's
// getCurveSetListSerializer answers this project's list.
class TQHostProject {
public:
    explicit TQHostProject(TQHostAppDelegate& host);
    ~TQHostProject();
    TQHostProject(const TQHostProject&) = delete;
    TQHostProject& operator=(const TQHostProject&) = delete;

    TQHostAppDelegate& host() { return _host; }
    // Fill these before writing (the controller's saveCurveSets, the state's setters); read
    // them after reading (constructCurveSets, the state's getters).
    TQCurveEditorState& editorState() { return *_state; }
    TQCurveSetListSerializer& curveSets() { return *_curveSets; }

    // A new, empty document: the host's scene is emptied into `family` with the default time
    // settings, the state is made anew from the user defaults, and the list is empty.
    void newDocument(TQHostObjectFamily family);

    std::optional<BNSerializerError> write(BNOutputSink& sink);
    // Writes through a temporary file beside `path` that replaces it only once complete, so a
    // failed save leaves the file that was there as it was.
    std::optional<BNSerializerError> save(const std::string& path);

    // All or nothing: on success the host's scene, time settings, selection and document
    // version, the state and the list are replaced, and the undo history and the modified
    // set are forgotten; the host posts kTQNotifySceneReset first and kTQNotifySceneChanged
    // last (with the range and selection words between). On failure nothing has changed.
    std::optional<BNSerializerError> read(std::string_view document);
    std::optional<BNSerializerError> open(const std::string& path);

private:
    struct Loaded;
    std::optional<BNSerializerError> commit(std::optional<BNSerializerError> error,
                                            std::unique_ptr<Loaded> loaded);

    TQHostAppDelegate& _host;
    std::unique_ptr<TQCurveEditorState> _state;
    std::unique_ptr<TQCurveSetListSerializer> _curveSets;
};

// Reads the editor's two trees alone: a "curveeditor" or "curvesets" document, or such
// elements among the children of the root element, whatever its name (others are skipped).
// `version` and `frameDuration` stand for what a project's root and timing give. The objects
// are filled as far as the read got, also when it fails. For tools and tests.
std::optional<BNSerializerError> TQHostReadEditorTrees(std::string_view document,
                                                       TQCurveEditorState& state,
                                                       TQCurveSetListSerializer& curveSets,
                                                       int32_t version,
                                                       const CMTime& frameDuration);
