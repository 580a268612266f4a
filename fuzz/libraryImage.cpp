// SPDX-License-Identifier: BSL-1.0
// Reads a file as `explain` does, in the formats of both systems.
#include "components/componentTools/images/libraryImage.h"
#include "fuzz/fuzz.h"

#include <set>

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    const Fuzz::InputFile file(Fuzz::Input(data, size).rest());
    const Tools::LibraryImage image = Tools::readLibraryImage(file.path());
    Fuzz::expect(image.readable, "the file can be read");
    // Not more texts than the file has room for.
    std::size_t texts = image.needed.size() + image.rpath.size() + image.runpath.size();
    Fuzz::expect(texts <= size, "as many names as bytes at most");
    // The tools read symbols after a load has failed, so the file may be damaged.
    std::set<std::string> names;
    for (std::string& name : Tools::wantedSymbols(file.path()))
        names.insert(std::move(name));
    const std::size_t wanted = names.size();
    if (!Tools::removeDefined(file.path(), names))
        Fuzz::expect(names.size() == wanted, "what cannot be read defines nothing");
    return 0;
}
