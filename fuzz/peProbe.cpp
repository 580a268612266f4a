// SPDX-License-Identifier: BSL-1.0
// Probes a Windows library as the component manager does before it maps one. Two readers of the PE
// format, written independently, check each other.
#include "components/platform/windows/peProbe.h"

#include "components/componentTools/images/libraryImage.h"
#include "fuzz/fuzz.h"

#include <algorithm>

namespace {

/// The input as a source of bytes. The readers' work is bounded by its size.
class InputSource final : public Mz::platform::ByteSource {
  public:
    explicit InputSource(std::string_view content) : content(content) {}

    std::uint64_t size() const override { return content.size(); }
    std::size_t read(std::uint64_t offset, void* data, std::size_t length) override {
        ++reads;
        if (offset >= content.size())
            return 0;
        return content.copy(static_cast<char*>(data), length, static_cast<std::size_t>(offset));
    }

    std::size_t reads = 0;

  private:
    std::string_view content;
};

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    const std::string_view content = Fuzz::Input(data, size).rest();
    InputSource source(content);
    const bool exported = platform::peExportsFunction(source, Tools::entryPointName);
    // The reads: the headers, a few for each section and for each needed library, and two for each
    // step of the search.
    Fuzz::expect(source.reads < 3000, "a file is read in a few pieces");
    if (!exported)
        return 0;
    const Fuzz::InputFile file(content);
    const Tools::LibraryImage image = Tools::readLibraryImage(file.path());
    Fuzz::expect(image.format == Tools::ImageFormat::pe, "what is loaded has a format");
    Fuzz::expect(image.otherProcessor.empty(), "what is loaded is for this processor");
    Fuzz::expect(image.damage.empty(), "what is loaded is not damaged");
    Fuzz::expect(image.kind == Tools::LibraryImage::Kind::library, "what is loaded is a library");
    Fuzz::expect(image.entryPoint == Tools::LibraryImage::EntryPoint::function,
                 "what is loaded has the entry point");
    return 0;
}
