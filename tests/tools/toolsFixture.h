// SPDX-License-Identifier: BSL-1.0
/// Fixture with a folder for component libraries and other files, for the tests of the tools.
#pragma once

#include "components/componentTools/explain.h"
#include "components/componentTools/scan.h"
#include "tests/components/testUids.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace Mz::Tools {

inline void PrintTo(Verdict verdict, std::ostream* out) {
    *out << nameOf(verdict);
}

} // namespace Mz::Tools

namespace Mz::Test {

inline const std::filesystem::path buildFolder = MZ_BUILD_PATH;

inline std::filesystem::path builtComponent(const std::wstring& name,
                                            const std::wstring& folder = {}) {
    return buildFolder / "components" / (folder.empty() ? name : folder) /
           (name + MZ_LIBRARY_EXTENSION);
}

/// The program of a host with other interfaces than those of the component changedInterface.
inline std::filesystem::path hostWithInterfaces() {
    return buildFolder / "interfaces" / "own" / "host.program";
}

inline std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(stream), {});
}

/// Runs the command line in `folder`, and waits for its end.
inline ProgramResult runCommandLine(const std::vector<std::string>& arguments,
                                    const std::filesystem::path& folder) {
    const auto program =
        buildFolder / "bin" / (std::wstring(L"mzcomponents") + MZ_PROGRAM_EXTENSION);
    ProgramResult result = runProgram(program, program.string(), arguments, folder);
    EXPECT_TRUE(result.finished);
    return result;
}

/// Returns the file with another processor in its header, in either format.
inline std::string forOtherProcessor(std::string content) {
    if (content.starts_with("\177ELF")) {
        // 64-bit ARM; a library for that becomes one for x86-64.
        constexpr char arm = '\xB7', x86_64 = '\x3E';
        content[18] = content[18] == arm ? x86_64 : arm;
    } else {
        std::uint32_t header = 0;
        std::memcpy(&header, content.data() + 0x3C, sizeof header);
        content[header + 4] = 0x64;
        content[header + 5] = static_cast<char>(0xAA);
    }
    return content;
}

class ToolsTest : public ::testing::Test {
  protected:
    /// Copies a test component to the folder, as `name` if given, and returns its new path.
    std::filesystem::path add(const std::wstring& component,
                              const std::filesystem::path& name = {}) {
        const std::filesystem::path source = builtComponent(component);
        std::filesystem::path target = folder.path() / (name.empty() ? source.filename() : name);
        std::filesystem::remove(target);
        std::filesystem::copy_file(source, target);
        return target;
    }

    static Tools::ProbeOptions patient() {
        Tools::ProbeOptions options;
        options.timeLimit = std::chrono::seconds(60);
        return options;
    }

    TemporaryDirectory folder;
};

} // namespace Mz::Test
