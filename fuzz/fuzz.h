// SPDX-License-Identifier: BSL-1.0
/// What the fuzz targets share. A target is one source: a function that takes any bytes, gives them
/// to a reader of the library, and stops the program where something does not hold. What a reader
/// refuses in the stated way holds.
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

/// The target. Always returns 0: the input was used.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace Mz::Fuzz {

/// Ends the program, as the fuzzer wants it, unless `holds`.
inline void expect(bool holds, const char* what) {
    if (holds)
        return;
    std::fprintf(stderr, "does not hold: %s\n", what);
    std::abort();
}

/// Ends the program unless the two, however they were come by, are the same.
inline void expectSame(const std::string& a, const std::string& b, const char* what) {
    if (a != b)
        std::fprintf(stderr, "one: %s\ntwo: %s\n", a.c_str(), b.c_str());
    expect(a == b, what);
}

/// What `work` tells, or the reason of the failure that it ends in. Exceptions that are not the
/// library's own end the program.
template <class Work>
std::string outcomeOf(const Work& work) {
    try {
        return work();
    } catch (const ExBase& failure) {
        return failure.getReason();
    }
}

/// The input, taken from its front.
class Input {
  public:
    Input(const std::uint8_t* data, std::size_t size)
        : bytes(reinterpret_cast<const char*>(data), size) {}

    /// The next byte; 0 at the end.
    unsigned int byte() {
        if (bytes.empty())
            return 0;
        const auto result = static_cast<unsigned char>(bytes.front());
        bytes.remove_prefix(1);
        return result;
    }

    /// The next `count` bytes, or as many as there are.
    std::string_view take(std::size_t count) {
        const std::string_view result = bytes.substr(0, count);
        bytes.remove_prefix(result.size());
        return result;
    }

    std::string_view rest() { return take(bytes.size()); }

  private:
    std::string_view bytes;
};

/// A file that holds an input, for readers that take nothing but files.
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
