// SPDX-License-Identifier: BSL-1.0
// Passes each stored input to a target once, in builds without a fuzzer.
#include "fuzz/fuzz.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <vector>

namespace {

namespace fs = std::filesystem;

/// Returns the named files and the files of the named folders, sorted.
std::vector<fs::path> inputsOf(int count, char** names) {
    std::vector<fs::path> inputs;
    for (int index = 1; index < count; ++index) {
        if (!fs::is_directory(names[index])) {
            inputs.emplace_back(names[index]);
            continue;
        }
        for (const fs::directory_entry& entry : fs::directory_iterator(names[index]))
            inputs.push_back(entry.path());
    }
    std::ranges::sort(inputs);
    return inputs;
}

std::vector<std::uint8_t> contentOf(const fs::path& file) {
    std::ifstream stream(file, std::ios::binary);
    if (!stream) {
        std::fprintf(stderr, "cannot be opened: %s\n", file.string().c_str());
        std::exit(2);
    }
    return {std::istreambuf_iterator<char>(stream), {}};
}

} // namespace

int main(int argumentCount, char** arguments) {
    const std::vector<fs::path> inputs = inputsOf(argumentCount, arguments);
    if (inputs.empty()) {
        std::fputs("there is no input: name files, or folders of files\n", stderr);
        return 2;
    }
    for (const fs::path& input : inputs) {
        std::printf("%s\n", input.filename().string().c_str());
        std::fflush(stdout); // The last line then names an input that ends the program.
        const std::vector<std::uint8_t> content = contentOf(input);
        LLVMFuzzerTestOneInput(content.data(), content.size());
    }
    std::printf("%zu inputs hold\n", inputs.size());
    return 0;
}
