// SPDX-License-Identifier: BSL-1.0
/// A fixture with a folder in which tests replace a file.
#pragma once

#include "components/componentManager/files.h"
#include "tests/support/temporaryDirectory.h"

#include <gmock/gmock.h>

#include <fstream>
#include <iterator>
#include <string>
#include <string_view>

namespace Mz::Test {

class ReplaceFile : public testing::Test {
  protected:
    static void put(const std::filesystem::path& path, std::string_view content) {
        replaceFile(path, content);
    }

    std::string content() const { return contentOf(file); }
    static std::string contentOf(const std::filesystem::path& path) {
        std::ifstream stream(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    std::size_t filesInFolder() const {
        const std::filesystem::directory_iterator entries(folder.path());
        return static_cast<std::size_t>(std::distance(begin(entries), end(entries)));
    }

    TemporaryDirectory folder;
    const std::filesystem::path file = folder.path() / "file with spaces.bin";
};

} // namespace Mz::Test
