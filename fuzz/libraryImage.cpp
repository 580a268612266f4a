// SPDX-License-Identifier: BSL-1.0
// Reads a file as `explain` does, in the formats of both systems.
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/inspecting/interfaceDifference.h"
#include "fuzz/fuzz.h"

#include <algorithm>
#include <set>
#include <string_view>
#include <vector>

namespace {

void judgeStamp(const Mz::ComponentStamp& stamp, std::string_view content) {
    using namespace Mz;
    const std::string_view bytes(reinterpret_cast<const char*>(&stamp), sizeof stamp);
    Fuzz::expect(content.find(bytes) != content.npos, "a stamp is bytes of the file");
    if (const auto difference = Tools::abiDifference(stamp))
        Fuzz::expect(difference->subject != difference->words, "both sides of a difference differ");
}

/// Reads the fingerprints of interfaces, which are in their own sections.
void readInterfaces(const std::filesystem::path& file, std::size_t size) {
    using namespace Mz;
    const std::vector<Tools::InterfaceTable> tables = Tools::interfaceTablesOf(file);
    std::size_t entries = 0, characters = 0;
    for (const Tools::InterfaceTable& table : tables) {
        entries += table.operations.size() + table.values.size() + table.bases.size();
        for (const Tools::InterfaceOperation& operation : table.operations)
            characters += operation.text.size();
    }
    // Sections may overlap, but what is read of them is limited.
    const std::size_t most = std::max(size, Tools::mostSectionBytes);
    Fuzz::expect(entries <= most / 8 && characters <= most, "no more than the file has room for");
    static_cast<void>(Tools::interfaceDifference(tables, tables));
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    const std::string_view content = Fuzz::Input(data, size).rest();
    const Fuzz::InputFile file(content);
    const Tools::LibraryImage image = Tools::readLibraryImage(file.path());
    Fuzz::expect(image.readable, "the file can be read");
    // Not more texts than the file has room for.
    std::size_t texts = image.needed.size() + image.rpath.size() + image.runpath.size();
    Fuzz::expect(texts <= size, "as many names as bytes at most");
    readInterfaces(file.path(), size);
    if (image.stamp)
        judgeStamp(*image.stamp, content);
    // The tools read symbols after a load has failed, so the file may be damaged.
    std::set<std::string> names;
    for (std::string& name : Tools::wantedSymbols(file.path()))
        names.insert(std::move(name));
    const std::size_t wanted = names.size();
    if (!Tools::removeDefined(file.path(), names))
        Fuzz::expect(names.size() == wanted, "what cannot be read defines nothing");
    return 0;
}
