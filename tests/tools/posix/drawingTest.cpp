// SPDX-License-Identifier: BSL-1.0
// Drawing by Graphviz, of which a script takes the place.
#include "components/componentTools/graph.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Drawing : public testing::Test {
  protected:
    /// Draws with a program "dot" that runs `script`.
    bool draw(const std::string& script) {
        const std::filesystem::path dot = programs.write("dot", "#!/bin/sh\n" + script + "\n");
        std::filesystem::permissions(dot, std::filesystem::perms::owner_all);
        setEnvironment("PATH", programs.path().string());
        return drawSvg("digraph {}\n", svg, why);
    }

    std::string drawn() const {
        std::ifstream in(svg, std::ios::binary);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    /// Returns the number of files beside the picture, which is one of them.
    std::ptrdiff_t files() const {
        return std::distance(std::filesystem::directory_iterator(folder.path()), {});
    }

    TemporaryDirectory programs;
    TemporaryDirectory folder;
    const std::filesystem::path svg = folder.write("graph.svg", "old");
    std::wstring why;
};

TEST_F(Drawing, KeepsWhatGraphvizPrints) {
    EXPECT_TRUE(draw("echo \"$# $1\"; while read line; do echo \"$line\"; done < \"$2\""));
    EXPECT_EQ(drawn(), "2 -Tsvg\ndigraph {}\n");
    EXPECT_EQ(why, L"");
    EXPECT_EQ(files(), 1);
}

TEST_F(Drawing, KeepsTheOldPictureIfGraphvizFails) {
    for (const char* script : {"echo new; exit 3", "echo new; kill -9 $$"}) {
        why.clear();
        EXPECT_FALSE(draw(script)) << script;
        EXPECT_EQ(why, L"Graphviz could not draw it");
        EXPECT_EQ(drawn(), "old");
        EXPECT_EQ(files(), 1);
    }
}

TEST_F(Drawing, FindsNoGraphvizThatCannotBeRun) {
    const std::filesystem::path dot = programs.write("dot", "#!/bin/sh\n");
    std::filesystem::permissions(dot, std::filesystem::perms::owner_read);
    setEnvironment("PATH", programs.path().string());
    EXPECT_FALSE(drawSvg("digraph {}\n", svg, why));
    EXPECT_EQ(why, L"Graphviz (the program dot) is not installed");
}

} // namespace
