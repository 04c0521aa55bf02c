#pragma once
// Scripts of steps separated by ";", each a name and its arguments ("move 3 0; nudge 0 0.5"),
// run through a table of steps by name. While a step runs, `args` holds its arguments as
// words, and as the text after its name; `each` runs before every step and `after` after it,
// given the step's text; a name the table does not hold goes to `otherwise`, or fails the test
// when there is none.

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>

namespace tests_support {

struct StepArgs {
    std::vector<std::string> words;
    std::string rest;
    double number(size_t i) const {
        return i < words.size() ? std::strtod(words[i].c_str(), nullptr) : 0.0;
    }
    std::string word(size_t i) const { return i < words.size() ? words[i] : std::string(); }
};

using Steps = std::map<std::string, std::function<void()>>;

inline void runSteps(const std::string& script, StepArgs& args, const Steps& steps,
                     const std::function<void(const std::string& name)>& otherwise = {},
                     const std::function<void()>& each = {},
                     const std::function<void(const std::string& step)>& after = {}) {
    std::istringstream in(script);
    for (std::string step; std::getline(in, step, ';');) {
        std::istringstream words(step);
        std::string name, word;
        words >> name;
        args.words.clear();
        while (words >> word) args.words.push_back(word);
        const size_t restAt = step.find(name) + name.size() + 1;
        args.rest = restAt < step.size() ? step.substr(restAt) : "";
        args.rest.erase(args.rest.find_last_not_of(' ') + 1);
        if (each) each();
        if (steps.count(name))
            steps.at(name)();
        else if (otherwise)
            otherwise(name);
        else
            ADD_FAILURE() << "no such step: " << step;
        if (after) after(step.erase(0, step.find_first_not_of(' ')));
    }
}

}  // namespace tests_support
