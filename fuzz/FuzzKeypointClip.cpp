// libFuzzer target: keypoints on the clipboard, read as a paste reads them. Whatever another
// program or a damaged payload puts under our type must give a clip or a refusal, never a
// crash; a clip that reads must write back to text that reads to the same clip.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "src/editor/TQKeypointClipboard.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    const TQKeypointClipReading read = TQReadKeypointClip(text);
    if (read.status != TQKeypointClipRead::kOk) return 0;
    const std::string written = TQWriteKeypointClip(read.clip);
    const TQKeypointClipReading again = TQReadKeypointClip(written);
    if (again.status != TQKeypointClipRead::kOk || TQWriteKeypointClip(again.clip) != written) {
        std::fprintf(stderr, "a clip that reads does not read back:\n%s", written.c_str());
        std::abort();
    }
    (void)TQDescribeKeypointClip(read.clip);
    return 0;
}
