// SPDX-License-Identifier: BSL-1.0
/// Common parts of the fuzz targets. A target is one source with a function that takes any bytes,
/// passes them to a reader of the library, and aborts the program if a property does not hold. A
/// reader may reject its input with a documented exception.
#pragma once

#include "components/base/exBase.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>
#include <string_view>

/// The target. Returns 0: the input was used.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace Mz::Fuzz {

/// Aborts the program, which the fuzzer reports, unless `holds`.
inline void expect(bool holds, const char* what) {
    if (holds)
        return;
    std::fprintf(stderr, "does not hold: %s\n", what);
    std::abort();
}

/// Aborts the program unless both texts are equal.
inline void expectSame(const std::string& a, const std::string& b, const char* what) {
    if (a != b)
        std::fprintf(stderr, "one: %s\ntwo: %s\n", a.c_str(), b.c_str());
    expect(a == b, what);
}

/// Returns the result of `work`, or the reason of the library's exception that it throws. Other
/// exceptions end the program.
template <class Work>
std::string outcomeOf(const Work& work) {
    try {
        return work();
    } catch (const ExBase& failure) {
        return failure.getReason();
    }
}

/// The input, consumed from its beginning.
class Input {
  public:
    Input(const std::uint8_t* data, std::size_t size)
        : bytes(reinterpret_cast<const char*>(data), size) {}

    /// Returns the next byte, 0 at the end.
    unsigned int byte() {
        if (bytes.empty())
            return 0;
        const auto result = static_cast<unsigned char>(bytes.front());
        bytes.remove_prefix(1);
        return result;
    }

    /// Returns the next `count` bytes, or fewer at the end.
    std::string_view take(std::size_t count) {
        const std::string_view result = bytes.substr(0, count);
        bytes.remove_prefix(result.size());
        return result;
    }

    std::string_view rest() { return take(bytes.size()); }

  private:
    std::string_view bytes;
};

/// A file that contains an input, for readers of files.
class InputFile {
  public:
    explicit InputFile(std::string_view content);
    ~InputFile();
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    const std::filesystem::path& path() const { return name; }

  private:
    std::filesystem::path name;
};

} // namespace Mz::Fuzz
