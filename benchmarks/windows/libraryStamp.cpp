// SPDX-License-Identifier: BSL-1.0
// Writes the time of linking. Wine's loader asks its server about each loaded library that has the
// same time, checksum and size, which takes most of the time with 1,000 copies of one library.
// Libraries that were linked one by one have different times.
#include "libraryStamp.h"

#include <cstddef>
#include <cstring>
#include <stdexcept>
#include <windows.h>

namespace Mz::Benchmarks {

void setStamp(std::string& library, unsigned int number) {
    IMAGE_DOS_HEADER header{};
    if (library.size() >= sizeof header)
        std::memcpy(&header, library.data(), sizeof header);
    const std::size_t offset = static_cast<std::size_t>(header.e_lfanew) +
                               FIELD_OFFSET(IMAGE_NT_HEADERS64, FileHeader.TimeDateStamp);
    constexpr DWORD firstTime = 0x60000000;
    const DWORD time = firstTime + number;
    if (offset + sizeof time > library.size())
        throw std::runtime_error("the generated component is no library");
    std::memcpy(library.data() + offset, &time, sizeof time);
}

} // namespace Mz::Benchmarks
