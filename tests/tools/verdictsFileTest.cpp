// SPDX-License-Identifier: BSL-1.0
// What the file beside a list may contain that the tools have not written.
#include "components/componentTools/records/verdictsFile.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <string>

using namespace Mz;
using namespace Mz::Tools;

namespace {

/// Returns whether a file with these numbers has a verdict on a library with time 3 and size 12.
bool isKept(const std::string& time, const std::string& size, const std::string& version = "1",
            const std::string& verdict = "crashed") {
    const Test::TemporaryDirectory folder;
    const auto file = folder.write(
        "verdicts.json", R"({"version":)" + version + R"(,"libraries":[{"directory":"/d/",)" +
                             R"("fileName":"a","time":)" + time + R"(,"size":)" + size +
                             R"(,"verdict":")" + verdict + R"(","subject":"","words":""}]})");
    RecordedLibraries libraries(1);
    libraries[0].directory = L"/d/";
    libraries[0].fileName = L"a";
    libraries[0].time = 3;
    libraries[0].size = 12;
    readVerdicts(file, libraries);
    return libraries[0].kept.has_value();
}

TEST(VerdictsFile, HasAVerdictOnALibraryOfThatTimeAndSize) {
    EXPECT_TRUE(isKept("3", "12"));
    EXPECT_FALSE(isKept("4", "12"));
    EXPECT_FALSE(isKept("3", "13"));
    EXPECT_FALSE(isKept("3", "12", "2"));
}

TEST(VerdictsFile, HasNoVerdictByANumberThatNoneOfItsIntegersHolds) {
    EXPECT_FALSE(isKept("4294967299", "12")) << "3 in 32 bits";
    EXPECT_FALSE(isKept("-4294967293", "12")) << "3 in 32 bits";
    EXPECT_FALSE(isKept("3", "18446744073709551628")) << "12 in 64 bits";
    for (const char* number : {"3.5", "1e300", "-1e300", "null", "\"3\"", "[3]"}) {
        EXPECT_FALSE(isKept(number, "12")) << number;
        EXPECT_FALSE(isKept("3", number)) << number;
        EXPECT_FALSE(isKept("3", "12", number)) << number;
    }
    EXPECT_FALSE(isKept("3", "12.5"));
    EXPECT_FALSE(isKept("3", "12", "1.5"));
}

TEST(VerdictsFile, HasNoVerdictOfALaterVersionAndNoneThatNoScanSaves) {
    EXPECT_TRUE(isKept("3", "12", "1", "offersNothing"));
    EXPECT_FALSE(isKept("3", "12", "1", "unheardOf"));
    EXPECT_FALSE(isKept("3", "12", "1", "works"));
}

TEST(VerdictsFile, HasChoicesOfALibraryByItsFolderAndItsName) {
    const RecordedLibrary library{L"\\d", L"a", 3, 12, {}};
    EXPECT_TRUE(isRecordOf(library, {L"\\d", L"a", L""}));
    EXPECT_FALSE(isRecordOf(library, {L"\\e", L"a", L""}));
    EXPECT_FALSE(isRecordOf(library, {L"\\d", L"b", L""}));
}

} // namespace
