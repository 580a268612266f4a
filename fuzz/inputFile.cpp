// SPDX-License-Identifier: BSL-1.0
// Writes inputs to files of one temporary folder.
#include "fuzz/fuzz.h"
#include "tests/support/temporaryDirectory.h"

#include <fstream>

namespace Mz::Fuzz {

InputFile::InputFile(std::string_view content) {
    // One folder for the process: creating one for each input would take most of the time.
    static const Test::TemporaryDirectory folder;
    static int count = 0;
    name = folder.write("input" + std::to_string(++count), content);
}

InputFile::~InputFile() {
    std::error_code ignored;
    std::filesystem::remove(name, ignored);
}

} // namespace Mz::Fuzz
