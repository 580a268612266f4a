// SPDX-License-Identifier: BSL-1.0
/// The messages between the processes of a profile, of which the reader trusts nothing.
#include "components/componentTools/profiling/profileMessages.h"
#include "components/componentTools/probing/frames.h"

#include <gtest/gtest.h>

using namespace Mz::Tools;
using namespace std::chrono_literals;

namespace {

LibrarySteps stepsOf(std::size_t index) {
    return {index, {1ns, 2ns, 3ns, 4ns, 5ns}, {Verdict::threw, L"its entry point", L"\u00E4\""}};
}

/// Returns a message with these times and this verdict, for the first library.
std::string stepsWith(const std::string& times, const std::string& verdict) {
    constexpr unsigned char kind = 128;
    return frameOf(kind, R"({"kind":"steps","index":0,"subject":"","words":"","times":[)" + times +
                             R"(],"verdict":")" + verdict + "\"}");
}

TEST(ProfileMessages, AreReadIfTheyAreWhole) {
    const ProfileReport report =
        decodeProfileReport(stepsWith("1,2,3,4,5", "works") + encodeListing(1ns), 2);
    EXPECT_FALSE(report.garbled);
    EXPECT_EQ(report.libraries.size(), 1u);
}

TEST(ProfileMessages, CarryTheTask) {
    const ProfileTask task = decodeProfileTask(encodeTask({true, 7, {2, 5}}));
    EXPECT_TRUE(task.whole);
    EXPECT_EQ(task.candidates, 7u);
    EXPECT_EQ(task.excluded, (std::set<std::size_t>{2, 5}));
    EXPECT_THROW(decodeProfileTask("{}"), std::exception);
}

TEST(ProfileMessages, CarryTheSteps) {
    const ProfileReport report = decodeProfileReport(
        encodeLibraryBegin(1) + encodeProfileStage(Stage::loading) + encodeSteps(stepsOf(1)) +
            encodeOthers(9, 70ns) + encodeListing(80ns),
        2);
    EXPECT_TRUE(report.done);
    EXPECT_FALSE(report.garbled || report.current || report.otherFolders);
    ASSERT_EQ(report.libraries.size(), 1u);
    EXPECT_EQ(report.libraries[0].index, 1u);
    EXPECT_EQ(report.libraries[0].times, stepsOf(1).times);
    EXPECT_EQ(report.libraries[0].verdict, stepsOf(1).verdict);
    EXPECT_EQ(report.otherFiles, 9u);
    EXPECT_EQ(report.otherTime, 70ns);
    EXPECT_EQ(report.listing, 80ns);
}

TEST(ProfileMessages, TellWhichLibraryWasLoadedLast) {
    const std::string bytes = encodeLibraryBegin(0) + encodeSteps(stepsOf(0)) +
                              encodeLibraryBegin(1) + encodeProfileStage(Stage::describing) +
                              encodeProfileFault(Verdict::aborted, L"", L"!");
    const ProfileReport report = decodeProfileReport(bytes, 2);
    EXPECT_EQ(report.current, 1u);
    EXPECT_EQ(report.stage, Stage::describing);
    ASSERT_TRUE(report.fault);
    EXPECT_EQ(report.fault->verdict, Verdict::aborted);
    EXPECT_FALSE(report.done || report.garbled);
    for (std::size_t size = 0; size < bytes.size(); ++size)
        EXPECT_FALSE(decodeProfileReport(bytes.substr(0, size), 2).done);
}

TEST(ProfileMessages, CarryTheTimeOfInitialize) {
    const ProfileReport without = decodeProfileReport(encodeWhole(std::nullopt, 3ns), 0);
    EXPECT_TRUE(without.done);
    EXPECT_EQ(without.initialize, 3ns);
    EXPECT_FALSE(without.listReading);
    EXPECT_EQ(decodeProfileReport(encodeWhole(2ns, 3ns), 0).listReading, 2ns);
    EXPECT_TRUE(decodeProfileReport(encodeOtherFolders(), 0).otherFolders);
}

TEST(ProfileMessages, ThatAreInvalidAreNotUsed) {
    constexpr unsigned char kind = 128;
    for (const std::string& invalid :
         {encodeLibraryBegin(2), encodeSteps(stepsOf(2)), encodeListing(-1ns),
          encodeOthers(1, -1ns), std::string("foreign bytes"), frameOf(kind, "no JSON"),
          frameOf(kind, "{}"), frameOf(kind, R"({"kind":"unknown"})"),
          frameOf(kind, R"({"kind":"stage","stage":5})"),
          frameOf(kind, R"({"kind":"stage","stage":-1})"),
          frameOf(kind, R"({"kind":"stage","stage":1e300})"),
          frameOf(kind, R"({"kind":"begin","index":0.5})"),
          frameOf(kind, R"({"kind":"others","count":1e300,"time":1})"),
          frameOf(kind, R"({"kind":"listing","time":"1"})"), stepsWith("1,2,3,4", "works"),
          stepsWith("1,2,3,4,5,6", "works"), stepsWith("1,2,3,4,5", "unheardOf"),
          frameOf(kind, R"({"kind":"fault","verdict":"unheardOf","subject":"","words":""})"),
          frameOf(0, R"({"kind":"begin"})")}) {
        const ProfileReport report = decodeProfileReport(invalid + encodeListing(1ns), 2);
        EXPECT_TRUE(report.garbled) << invalid;
        EXPECT_FALSE(report.done) << invalid;
        EXPECT_TRUE(report.libraries.empty()) << invalid;
        EXPECT_FALSE(report.fault) << invalid;
    }
}

} // namespace
