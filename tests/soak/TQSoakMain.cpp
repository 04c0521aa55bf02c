// The long soak: vce_soak [--steps N] [--seed S] [--sessions K]
// Runs K seeded sessions of N steps each (seeds S, S+1, ...), each unwound at the end, and
// prints what each action ran and where a session broke. Exit 1 on the first failure.
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "tests/soak/TQSoakSession.h"

int main(int argc, char** argv) {
    unsigned long steps = 10000, seed = 1, sessions = 1;
    for (int i = 1; i + 1 < argc; i += 2) {
        unsigned long* target = !std::strcmp(argv[i], "--steps")      ? &steps
                                : !std::strcmp(argv[i], "--seed")     ? &seed
                                : !std::strcmp(argv[i], "--sessions") ? &sessions
                                                                      : nullptr;
        if (!target) {
            std::fprintf(stderr, "usage: %s [--steps N] [--seed S] [--sessions K]\n", argv[0]);
            return 2;
        }
        *target = std::strtoul(argv[i + 1], nullptr, 10);
    }
    for (unsigned long s = seed; s < seed + sessions; ++s) {
        TQSoakSession session(static_cast<uint32_t>(s));
        for (unsigned long i = 0; i < steps; ++i) {
            const std::string broken = session.step();
            if (!broken.empty()) {
                std::printf("seed %lu, step %lu: %s\n", s, i + 1, broken.c_str());
                return 1;
            }
        }
        const std::string broken = session.unwind();
        std::printf("seed %lu: %lu steps, %zu presses on a keypoint;", s, steps,
                    session.keypointPresses());
        for (const auto& [name, count] : session.actionCounts())
            std::printf(" %s %zu,", name.c_str(), count);
        std::printf(" %s\n", broken.empty() ? "undo to the start and redo to the end exact"
                                            : broken.c_str());
        if (!broken.empty()) return 1;
    }
    return 0;
}
