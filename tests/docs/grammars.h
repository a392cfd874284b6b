#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <string>
#include <vector>

#include "program.h"

namespace zr::test {

struct Grammar {
    std::string name;
    std::string files;  // vocabulary, lexer, rules, as arguments
};

inline std::vector<Grammar> grammarsIn(const std::string& folder) {
    std::vector<Grammar> found;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        if (entry.path().extension() != ".tokens") continue;
        const std::string name = entry.path().stem();
        const std::string base = folder + "/" + name;
        std::vector<std::string> rules;
        for (const auto& other : std::filesystem::directory_iterator(folder)) {
            const std::string file = other.path().filename();
            if (file.starts_with(name + ".") && file.ends_with(".grammar")) rules.push_back(other.path());
        }
        std::sort(rules.begin(), rules.end());
        std::string files = base + ".tokens " + base + ".lexer";
        for (const std::string& rule : rules) files += " " + rule;
        found.push_back({name, files});
    }
    return found;
}

inline std::vector<Grammar> allGrammars() {
    std::vector<Grammar> all;
    for (const auto& entry : std::filesystem::directory_iterator(ZR_SOURCE_DIR "/grammar"))
        if (entry.is_directory())
            for (Grammar& grammar : grammarsIn(entry.path())) all.push_back(std::move(grammar));
    return all;
}

// What zrdiagrams makes of a grammar.
inline std::string made(const std::string& what, const Grammar& grammar) {
    const ProgramResult result = runShell("build/release/bin/zrdiagrams " + what + " " + grammar.files);
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    return result.output;
}

}  // namespace zr::test
