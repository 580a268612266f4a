// SPDX-License-Identifier: BSL-1.0
/// Tests when the process of a guarded import is not started, and that it ends at once if it is not
/// started as it should be.
#include "components/componentTools/guarding/importChild.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/guardedImport.h"
#include "components/componentTools/guarding/importMessages.h"
#include "components/componentTools/platform/system.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gtest/gtest.h>

#include <clocale>
#include <filesystem>

using namespace Mz;
using namespace Mz::Tools;

namespace {

const std::filesystem::path license = std::filesystem::path(MZ_SOURCE_PATH) / "LICENSE";

/// Starts the process with a file, and with `input` as its standard input. Returns its exit status;
/// -1 if it did not exit by itself.
int statusFor(std::vector<std::filesystem::path> arguments, std::string input) {
    const System::InheritableFile file(license);
    for (std::filesystem::path& argument : arguments)
        if (argument == "FILE")
            argument = file.argument();
    arguments.insert(arguments.begin(), importArgument);
    const System::ChildLimits limits{
        std::chrono::seconds(60), std::uint64_t{1} << 30, 0, std::size_t{1} << 20, {}};
    const System::ChildResult child =
        System::runChild(MZ_PROBE, arguments, limits, {&input, &file});
    return child.end == System::ChildResult::End::exited && child.output.empty() ? child.status
                                                                                 : -1;
}

TEST(ImportChild, EndsWithoutAFileAndATask) {
    ASSERT_TRUE(std::filesystem::exists(license));
    constexpr int usage = 2;
    EXPECT_EQ(statusFor({}, ""), usage);
    EXPECT_EQ(statusFor({"FILE", "more"}, ""), usage);
    EXPECT_EQ(statusFor({"no number"}, ""), usage);
    EXPECT_EQ(statusFor({"FILE"}, "no message"), usage);
    EXPECT_EQ(statusFor({"FILE"}, encodeActivity(L"a message to the host")), usage);
}

TEST(ProbeProcess, EndsAtOnceIfAPersonStartsIt) {
    const System::ChildLimits limits{
        std::chrono::seconds(60), std::uint64_t{1} << 30, 0, std::size_t{1} << 20, {}};
    for (const std::vector<std::filesystem::path>& arguments :
         {std::vector<std::filesystem::path>{}, {"one"}, {"one", "2", "three"}}) {
        const System::ChildResult child = System::runChild(MZ_PROBE, arguments, limits);
        EXPECT_EQ(child.end, System::ChildResult::End::exited);
        EXPECT_EQ(child.status, 2);
        EXPECT_EQ(child.output, "");
    }
}

TEST(GuardedImport, StartsNoProcessForAManagerWithoutLibraries) {
    const Mz::Test::TemporaryDirectory empty;
    QrGetComponentManager()->initialize(Mz::Test::searchPathOf(empty.path()).c_str());
    Kit::ImportLimits limits;
    limits.program = empty.path() / "missing"; // Would be another verdict.
    const Kit::GuardedImport import = Kit::importGuarded("file", limits);
    EXPECT_EQ(import.verdict, Kit::ImportVerdict::notTaken);
    EXPECT_EQ(import.sentence(), L"file: no import builder takes this file.");
}

TEST(GuardedImport, SaysThatTheLocaleCannotRepresentTheRecords) {
    const Mz::Test::TemporaryDirectory folder;
    const std::wstring name = std::wstring(L"wideTexts") + MZ_LIBRARY_EXTENSION;
    std::filesystem::copy_file(std::filesystem::path(MZ_BUILD_PATH) / "components" / "sound" / name,
                               folder.path() / name);
    ASSERT_TRUE(std::setlocale(LC_ALL, "C"));
    QrGetComponentManager()->initialize(Mz::Test::searchPathOf(folder.path()).c_str());
    const Kit::GuardedImport import = Kit::importGuarded("file");
    EXPECT_EQ(import.verdict, Kit::ImportVerdict::guardFailed);
    EXPECT_TRUE(import.detail.starts_with(L"the records of the component manager: "))
        << toUtf8(import.detail);
}

} // namespace
