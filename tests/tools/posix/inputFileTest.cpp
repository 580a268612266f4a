// SPDX-License-Identifier: BSL-1.0
/// Tests the messages of `import` and `show` about files that they cannot read.
#include "tests/tools/toolsFixture.h"

#include <nlohmann/json.hpp>
#include <sys/stat.h>

using namespace Mz::Test;
using Json = nlohmann::json;

namespace {

class InputFile : public ToolsTest {
  protected:
    ProgramResult run(const std::vector<std::string>& arguments) const {
        const auto program = buildFolder / "bin" / "mzcomponents";
        return runProgram(program, program.string(), arguments, work.path());
    }

    std::string reason(const std::string& file) const {
        const ProgramResult result =
            run({"import", file, "--json", "--path", folder.path().string()});
        EXPECT_EQ(result.exitCode, 1);
        return Json::parse(result.output).at("files").at(0).at("object");
    }

    TemporaryDirectory work;
};

TEST_F(InputFile, ThatIsAFolderOrAPipeIsCalledThat) {
    add(L"notes");
    std::filesystem::create_directory(work.path() / "folder.note");
    ASSERT_EQ(::mkfifo((work.path() / "pipe.note").c_str(), 0600), 0);
    EXPECT_EQ(reason("folder.note"), "it is a folder, not a file");
    EXPECT_EQ(reason("pipe.note"), "it is a pipe or a device, not a file");
    EXPECT_EQ(reason("missing.note"), "there is no such file");
    for (const char* name : {"folder.note", "pipe.note", "missing.note"})
        EXPECT_EQ(run({"show", name}).exitCode, 1) << name;
}

TEST_F(InputFile, WhoseNameIsNoTextIsRefusedForItsName) {
    add(L"notes");
    const std::string name = "caf\xE9.note";
    std::ofstream(work.path() / name, std::ios::binary) << "N1";
    setEnvironment("LC_ALL", "C");
    const ProgramResult plain = run({"import", name, "--path", folder.path().string()});
    EXPECT_EQ(plain.exitCode, 0);
    setEnvironment("LC_ALL", "C.UTF-8");
    EXPECT_THAT(reason(name), ::testing::StartsWith("the file's name has no form in the current "
                                                    "locale"));
}

} // namespace
