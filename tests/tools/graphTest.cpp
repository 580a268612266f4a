// SPDX-License-Identifier: BSL-1.0
// The graph of components: its text, and what happens where Graphviz is missing.
#include "components/componentTools/graph.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <iterator>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

constexpr QrUid uidOf(std::uint32_t number) {
    return {number, 0, 0, 0};
}

RecordedBuilder builder(std::uint32_t number, const wchar_t* name, const wchar_t* label = L"") {
    RecordedBuilder made;
    made.uid = uidOf(number);
    made.name = name;
    made.label = label;
    return made;
}

RecordedLibrary library(const wchar_t* file, std::vector<RecordedBuilder> builders) {
    RecordedLibrary made;
    made.directory = L"dir";
    made.fileName = file;
    made.builders = std::move(builders);
    return made;
}

/// Returns the lines of the graph that are arrows, and those that mark importers.
std::string arrowsOf(const RecordedLibraries& libraries,
                     const std::vector<GraphImporter>& importers) {
    std::istringstream dot(dotOf(libraries, importers));
    std::string arrows;
    for (std::string line; std::getline(dot, line);)
        if (line.find("->") != std::string::npos || line.find("bold") != std::string::npos)
            arrows += line + '\n';
    return arrows;
}

const RecordedLibraries someLibraries{
    library(L"empty", {}),
    library(L"importers", {builder(1, L"importer", L"Meshes"), builder(2, L"importer")}),
    library(L"formats", {builder(3, L"mesh"), builder(4, L"image"), builder(5, L"mesh")})};

TEST(Graph, HasABoxForEachLibraryWithBuilders) {
    EXPECT_EQ(dotOf({library(L"empty", {}),
                     library(L"a\"b", {builder(1, L"name", L"label"), builder(2, L"only name")})},
                    {}),
              "digraph components {\n  rankdir=LR;\n  node [shape=box, style=rounded];\n"
              "  subgraph cluster1 {\n"
              "    label=\"a\\\"b\";\n"
              "    tooltip=\"dir\\\\a\\\"b\";\n"
              "    builder1_0 [label=\"label\", "
              "tooltip=\"00000001-00000000-00000000-00000000\"];\n"
              "    builder1_1 [label=\"only name\", "
              "tooltip=\"00000002-00000000-00000000-00000000\"];\n"
              "  }\n}\n");
}

TEST(Graph, LeadsFromEachImporterToItsFormats) {
    EXPECT_EQ(arrowsOf(someLibraries, {{uidOf(1), L"mesh"}, {uidOf(2), L"image"}}),
              "  builder1_0 [style=\"rounded,bold\"];\n"
              "  builder1_0 -> builder2_0;\n"
              "  builder1_0 -> builder2_2;\n"
              "  builder1_1 [style=\"rounded,bold\"];\n"
              "  builder1_1 -> builder2_1;\n");
}

TEST(Graph, LeadsNowhereFromAnImporterWithoutFormats) {
    EXPECT_EQ(arrowsOf(someLibraries, {{uidOf(1), L"Mesh"}}),
              "  builder1_0 [style=\"rounded,bold\"];\n");
    EXPECT_EQ(arrowsOf(someLibraries, {{uidOf(6), L"mesh"}}), "") << "an importer of no library";
    EXPECT_EQ(arrowsOf(someLibraries, {}), "");
}

TEST(Graph, IsNotDrawnWithoutGraphviz) {
    const TemporaryDirectory folder;
    setEnvironment("PATH", folder.path().string());
    folder.write("svg", "old");
    std::wstring why;
    EXPECT_FALSE(drawSvg(dotOf({}, {}), folder.path() / "svg", why));
    EXPECT_EQ(why, L"Graphviz (the program dot) is not installed");
    EXPECT_EQ(std::filesystem::file_size(folder.path() / "svg"), 3U);
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path()), {}), 1);
}

} // namespace
