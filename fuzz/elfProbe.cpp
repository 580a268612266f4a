// SPDX-License-Identifier: BSL-1.0
// Probes a file as the component manager does before it loads one. Two readers of the ELF format,
// written independently, check each other.
#include "components/componentTools/images/libraryImage.h"
#include "components/platform/platform.h"
#include "fuzz/fuzz.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    const Fuzz::InputFile file(Fuzz::Input(data, size).rest());
    if (!platform::exportsFunction(file.path().native(), Tools::entryPointName))
        return 0;
    const Tools::LibraryImage image = Tools::readLibraryImage(file.path());
    Fuzz::expect(image.format == Tools::ImageFormat::elf, "what is loaded has a format");
    Fuzz::expect(image.otherProcessor.empty(), "what is loaded is for this processor");
    Fuzz::expect(image.kind == Tools::LibraryImage::Kind::library, "what is loaded is a library");
    Fuzz::expect(image.entryPoint == Tools::LibraryImage::EntryPoint::function,
                 "what is loaded has the entry point");
    return 0;
}
