// SPDX-License-Identifier: BSL-1.0
/// To compare an unchanged library with a host, its file has to be read, which took half of the
/// time of a scan that finds nothing new. The answer depends on the two files only, so a scan
/// leaves a digest of all of them beside the list, and the next scan skips the comparison if the
/// digest is the same. A list that a host has written meanwhile has another digest: a host does not
/// compare.
///
/// The files of a host are known by path, size and time (MinGW: in whole seconds), those of
/// libraries by what the list has of them.
#include "components/componentTools/scanning/judgement.h"

#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/inspecting/interfaceDifference.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <string_view>
#include <system_error>

namespace Mz::Tools {

namespace {

/// FNV-1a with 64 bits. It need not withstand an attack: who can write the digest can write the
/// list as well.
class Digest {
  public:
    void addNumber(std::uint64_t number) {
        for (int byte = 0; byte < 8; ++byte, number >>= 8)
            value = (value ^ (number & 0xFF)) * 0x100000001B3;
    }

    template <class Char>
    void addText(std::basic_string_view<Char> text) {
        addNumber(text.size()); // So that no two sequences of texts are added alike.
        for (const Char character : text)
            addNumber(static_cast<std::uint64_t>(character));
    }

    std::string text() const {
        char digits[17];
        std::snprintf(digits, sizeof digits, "%016llx", static_cast<unsigned long long>(value));
        return digits;
    }

  private:
    std::uint64_t value = 0xCBF29CE484222325;
};

bool addFile(Digest& digest, const std::filesystem::path& file) {
    std::error_code noSize, noTime;
    const std::uintmax_t size = std::filesystem::file_size(file, noSize);
    const auto time = std::filesystem::last_write_time(file, noTime);
    if (noSize || noTime)
        return false;
    digest.addText(std::basic_string_view<std::filesystem::path::value_type>(file.native()));
    digest.addNumber(size);
    digest.addNumber(static_cast<std::uint64_t>(time.time_since_epoch().count()));
    return true;
}

} // namespace

std::string judgementOf(const RecordedLibraries& libraries,
                        const std::vector<std::filesystem::path>& hosts) {
    Digest digest;
    digest.addText(std::wstring_view(ownStampText()));
    for (const std::filesystem::path& host : HostInterfaces::filesOf(hosts))
        if (!addFile(digest, host))
            return {};
    for (const RecordedLibrary& library : libraries) {
        if (library.builders.empty())
            continue;
        digest.addText(std::wstring_view(library.directory));
        digest.addText(std::wstring_view(library.fileName));
        digest.addNumber(library.time);
        digest.addNumber(static_cast<std::uint64_t>(library.size));
    }
    return digest.text();
}

} // namespace Mz::Tools
