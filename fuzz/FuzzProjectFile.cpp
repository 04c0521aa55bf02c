// libFuzzer target: the reference host's project file reader.
//
// Beside the sanitizers' findings it checks two promises of the reader and writer:
//   - a read that fails leaves the open document exactly as it was;
//   - a document that reads saves to a text that reads back and saves to the same text.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostProjectFile.h"
#include "platform/channels/TQChannel.h"

namespace {

std::string written(TQHostProject& project) {
    std::string text;
    BNStringSink sink(text);
    if (auto error = project.write(sink)) {
        std::fprintf(stderr, "a loaded document cannot be written: %s\n", error->text().c_str());
        std::abort();
    }
    return text;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string_view input(reinterpret_cast<const char*>(data), size);

    TQHostAppDelegate host;
    TQHostProject project(host);
    // Something small for a failed read to leave alone.
    auto object = std::make_unique<TQChannelObjectRootBase>("Open", 1);
    auto* channel = static_cast<TQChannel*>(object->addChild(std::make_unique<TQChannel>("X", 2)));
    channel->setKeyframe(CMTimeMake(1, 30), 0.5);
    host.scene().adoptObject(std::move(object));
    const std::string before = written(project);

    if (project.read(input)) {
        if (written(project) != before) {
            std::fprintf(stderr, "a failed read changed the open document\n");
            std::abort();
        }
        return 0;
    }
    const std::string first = written(project);
    TQHostAppDelegate again;
    TQHostProject reread(again);
    if (auto error = reread.read(first)) {
        std::fprintf(stderr, "a saved document does not read back: %s\n", error->text().c_str());
        std::abort();
    }
    if (written(reread) != first) {
        std::fprintf(stderr, "a saved document reads back as something else\n");
        std::abort();
    }
    return 0;
}
