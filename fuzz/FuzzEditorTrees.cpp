// libFuzzer target: the editor's two saved trees alone ("curveeditor", "curvesets"), read as
// the host reads them. The first byte picks the document version (old versions take another
// path through the display range); the rest is the document.
//
// A document that reads is written (the state, then the list, as a project holds them), read
// and written again until the text settles: the range travels as start and end, so its
// duration may come back once in another timescale, after which the text must stay the same.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "host/TQHostProjectFile.h"
#include "platform/support/BNSerializerWriteStream.h"

namespace {

std::string written(TQCurveEditorState& state, TQCurveSetListSerializer& list) {
    static const BNScopeEntry kRoot[] = {{"trees", 1, 0}, {nullptr, 0, 0}};
    static const BNScope kRootScope(kRoot);
    std::string text;
    BNStringSink sink(text);
    BNSerializerWriteStream stream(sink);
    stream.pushScope(kRootScope);
    stream.openElement(1);
    state.writeHeader(stream, false);
    state.writeBody(stream, false, true, true);
    stream.closeElement();
    list.writeHeader(stream, false);
    list.writeBody(stream, false, true, true);
    stream.closeElement();
    stream.closeElement();
    if (auto error = stream.finish()) {
        std::fprintf(stderr, "trees that read cannot be written: %s\n", error->text().c_str());
        std::abort();
    }
    return text;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    if (size == 0) return 0;
    const int32_t version = 1 + data[0] % 6;
    const std::string_view input(reinterpret_cast<const char*>(data + 1), size - 1);

    TQCurveEditorState state;
    TQCurveSetListSerializer list;
    if (TQHostReadEditorTrees(input, state, list, version, CMTimeMake(1, 30))) return 0;

    // What was read is written in the current version: read it back as such.
    std::string text = written(state, list);
    std::string previous;
    for (int round = 0; round < 2; ++round) {
        TQCurveEditorState stateAgain;
        TQCurveSetListSerializer listAgain;
        if (auto error = TQHostReadEditorTrees(text, stateAgain, listAgain, 5, CMTimeMake(1, 30))) {
            std::fprintf(stderr, "written trees do not read back: %s\n", error->text().c_str());
            std::abort();
        }
        previous = std::move(text);
        text = written(stateAgain, listAgain);
    }
    if (text != previous) {
        std::fprintf(stderr, "written trees do not settle:\n%s\n%s\n", previous.c_str(),
                     text.c_str());
        std::abort();
    }
    return 0;
}
