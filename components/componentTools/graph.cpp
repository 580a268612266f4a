// SPDX-License-Identifier: BSL-1.0
/// The DOT text has one cluster for each library. Nodes are numbered in the order of the list, so
/// that equal input results in equal text. Graphviz reads the text from a temporary file beside the
/// result, because child processes have no standard input here.
#include "components/componentTools/graph.h"

#include "components/componentManager/files.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/uidText.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <system_error>

namespace Mz::Tools {

namespace {

/// Returns `text` as a quoted DOT string, in UTF-8. Control characters are dropped.
std::string quoted(const std::wstring& text) {
    std::string result = "\"";
    for (const char character : toUtf8(text)) {
        if (character == '"' || character == '\\')
            result += '\\';
        if (static_cast<unsigned char>(character) >= ' ')
            result += character;
    }
    return result + "\"";
}

std::string nodeOf(std::size_t library, std::size_t builder) {
    return "builder" + std::to_string(library) + "_" + std::to_string(builder);
}

std::string libraryBox(const RecordedLibrary& library, std::size_t number) {
    std::string box = "  subgraph cluster" + std::to_string(number) +
                      " {\n    label=" + quoted(library.fileName) +
                      ";\n    tooltip=" + quoted(library.directory + L"\\" + library.fileName) +
                      ";\n";
    for (std::size_t index = 0; index < library.builders.size(); ++index) {
        const RecordedBuilder& builder = library.builders[index];
        const std::wstring& shown = builder.label.empty() ? builder.name : builder.label;
        box += "    " + nodeOf(number, index) + " [label=" + quoted(shown) +
               ", tooltip=" + quoted(textOf(builder.uid)) + "];\n";
    }
    return box + "  }\n";
}

/// Calls `action` with the node's name and the record of each builder.
template <class Action>
void forEachBuilder(const RecordedLibraries& libraries, Action action) {
    for (std::size_t library = 0; library < libraries.size(); ++library)
        for (std::size_t index = 0; index < libraries[library].builders.size(); ++index)
            action(nodeOf(library, index), libraries[library].builders[index]);
}

} // namespace

std::string dotOf(const RecordedLibraries& libraries, const std::vector<GraphImporter>& importers) {
    std::string dot = "digraph components {\n  rankdir=LR;\n  node [shape=box, style=rounded];\n";
    for (std::size_t number = 0; number < libraries.size(); ++number)
        if (!libraries[number].builders.empty())
            dot += libraryBox(libraries[number], number);
    for (const GraphImporter& importer : importers)
        forEachBuilder(libraries, [&](const std::string& from, const RecordedBuilder& maker) {
            if (!(maker.uid == importer.uid))
                return;
            dot += "  " + from + " [style=\"rounded,bold\"];\n";
            forEachBuilder(libraries, [&](const std::string& to, const RecordedBuilder& used) {
                if (used.name == importer.builderName)
                    dot += "  " + from + " -> " + to + ";\n";
            });
        });
    return dot + "}\n";
}

bool drawSvg(const std::string& dot, const std::filesystem::path& svg, std::wstring& why) {
    const System::NativePath program = System::findProgram("dot");
    if (program.empty()) {
        why = L"Graphviz (the program dot) is not installed";
        return false;
    }
    const System::ChildLimits limits{
        std::chrono::minutes(2), std::uint64_t{4} << 30, 0, std::size_t{256} << 20, {}};
    std::filesystem::path input = svg;
    input += ".dot-" + std::to_string(System::processNumber());
    replaceFile(input, dot);
    const System::ChildResult drawn =
        System::runChild(program, {std::filesystem::path("-Tsvg"), input}, limits);
    std::error_code ignored;
    std::filesystem::remove(input, ignored);
    if (drawn.end != System::ChildResult::End::exited || drawn.status != 0) {
        why = L"Graphviz could not draw it";
        return false;
    }
    replaceFile(svg, drawn.output);
    return true;
}

} // namespace Mz::Tools
