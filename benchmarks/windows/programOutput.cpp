// SPDX-License-Identifier: BSL-1.0
// Starts the program through the shell of the system, which makes the pipe.
#include "programOutput.h"

#include <cstdio>
#include <filesystem>
#include <stdexcept>

namespace Mz::Benchmarks {

std::string outputOf(const std::string& program, const std::string& work,
                     const std::string& folder) {
    const std::string name = std::filesystem::path(program).make_preferred().string();
    // The shell removes the outer quotes.
    const std::string command = "\"\"" + name + "\" " + work + " \"" + folder + "\"\"";
    std::FILE* const pipe = ::_popen(command.c_str(), "rb");
    std::string output;
    char block[256];
    while (const std::size_t got = pipe ? std::fread(block, 1, sizeof block, pipe) : 0)
        output.append(block, got);
    if (!pipe || ::_pclose(pipe) != 0)
        throw std::runtime_error(command + " failed");
    return output;
}

} // namespace Mz::Benchmarks
