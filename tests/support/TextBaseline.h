#pragma once
// Results compared with recorded text baselines: a checked-in file `<folder>/<name>.txt` of
// the repository, compared line by line, or one block of such a file, the lines after
// "== key" up to the next such line. To record or re-record, run the test with
// VCE_RECORD_BASELINES=1 in the environment: it writes the file (or the block, keeping the
// others) instead of comparing. Review the diff before committing it.

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

namespace tests_support {

inline std::string baselinePath(const std::string& folder, const std::string& name) {
    const char* root = std::getenv("VCE_SOURCE_DIR");
    return std::string(root ? root : ".") + "/" + folder + "/" + name + ".txt";
}

inline bool recordingBaselines() { return std::getenv("VCE_RECORD_BASELINES") != nullptr; }

// `have` against `want`, line by line, the first difference shown.
inline ::testing::AssertionResult sameLines(const std::string& what, const std::string& want,
                                            const std::string& have) {
    std::istringstream w(want), h(have);
    std::string a, b;
    for (int line = 1;; ++line) {
        const bool more = static_cast<bool>(std::getline(w, a));
        if (more != static_cast<bool>(std::getline(h, b)) || (more && a != b))
            return ::testing::AssertionFailure()
                   << what << " line " << line << "\n  want: " << (more ? a : "(end)")
                   << "\n  have: " << b;
        if (!more) return ::testing::AssertionSuccess();
    }
}

inline ::testing::AssertionResult matchesBaseline(const std::string& name, const std::string& text,
                                                  const std::string& folder) {
    const std::string path = baselinePath(folder, name);
    if (recordingBaselines()) {
        std::ofstream(path) << text;
        return ::testing::AssertionSuccess();
    }
    std::ifstream file(path);
    if (!file) return ::testing::AssertionFailure() << "no baseline " << path << ": record it";
    return sameLines(name, (std::ostringstream() << file.rdbuf()).str(), text);
}

inline ::testing::AssertionResult matchesBaselineBlock(const std::string& name,
                                                       const std::string& key,
                                                       const std::string& text,
                                                       const std::string& folder) {
    std::vector<std::pair<std::string, std::string>> blocks;
    std::ifstream file(baselinePath(folder, name));
    for (std::string line; std::getline(file, line);) {
        if (line.rfind("== ", 0) == 0)
            blocks.emplace_back(line.substr(3), "");
        else if (!blocks.empty())
            blocks.back().second += line + "\n";
    }
    auto it = blocks.begin();
    while (it != blocks.end() && it->first != key) ++it;
    if (recordingBaselines()) {
        if (it == blocks.end()) it = blocks.insert(it, {key, ""});
        it->second = text;
        std::ofstream out(baselinePath(folder, name));
        for (const auto& [k, t] : blocks) out << "== " << k << "\n" << t;
        return ::testing::AssertionSuccess();
    }
    if (it == blocks.end())
        return ::testing::AssertionFailure() << "no block " << key << ": record it";
    return sameLines(name + ", " + key, it->second, text);
}

}  // namespace tests_support
