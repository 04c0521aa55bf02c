#pragma once
// Internal: writing and reading the project file (format in host/TQHostProjectFile.h). The
// reader builds everything into a LoadedProject apart from the host, so that a failed read
// leaves the open document as it was.

#include <functional>
#include <memory>
#include <optional>
#include <vector>

#include "host/TQHostObjectModel.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/support/BNSerializerReadStream.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "src/curvesets/TQCurveEditorState.h"
#include "src/curvesets/TQCurveSetListSerializer.h"

class TQHostAppDelegate;

namespace tq_host {

struct LoadedProject {
    int32_t version = 0;
    TQHostObjectFamily family = TQHostObjectFamily::Kestrel;
    CMTime frameDuration = kCMTimeInvalid;
    CMTimeRange displayRange = kCMTimeRangeInvalid;
    CMTime currentTime = kCMTimeInvalid;
    uint32_t firstFrameNumber = 0;
    uint32_t startTimecode = 0;
    CMTime secondsPerTextStep = kCMTimeInvalid;
    bool displayTimeAsFrames = false;
    std::vector<std::unique_ptr<TQChannelObjectRootBase>> objects;
    std::vector<TQChannelId> selection;  // object ids, in selection order
    // Made anew for each read (the state from the user defaults), filled by the trees.
    std::unique_ptr<TQCurveEditorState> state = std::make_unique<TQCurveEditorState>();
    std::unique_ptr<TQCurveSetListSerializer> curveSets =
        std::make_unique<TQCurveSetListSerializer>();
};

void writeProject(BNSerializerWriteStream& stream, TQHostAppDelegate& host,
                  TQCurveEditorState& state, TQCurveSetListSerializer& curveSets);

// Reads with `read`, which runs the stream over the document with the handler it is given.
std::optional<BNSerializerError> readProject(
    const std::function<std::optional<BNSerializerError>(BNSerializerReadStream&, BNSerializer&)>&
        read,
    LoadedProject& loaded);

// Takes element 500 or 600 for the editor's trees: pushes the state, or reads "selected" and
// pushes the list. False for any other element.
bool readEditorTree(BNSerializerReadStream& stream, const BNStreamElement& element,
                    TQCurveEditorState& state, TQCurveSetListSerializer& curveSets);

}  // namespace tq_host
