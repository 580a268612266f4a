// Files as `explain` looks at them, in the formats of both systems.
#include "components/componentTools/libraryImage.h"
#include "fuzz/fuzz.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    const Fuzz::InputFile file(Fuzz::Input(data, size).rest());
    const Tools::LibraryImage image = Tools::readLibraryImage(file.path());
    Fuzz::expect(image.readable, "the file can be read");
    // No more than the file has room for.
    std::size_t texts = image.needed.size() + image.rpath.size() + image.runpath.size();
    Fuzz::expect(texts <= size, "as many names as bytes at most");
    return 0;
}
