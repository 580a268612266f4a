// SPDX-License-Identifier: BSL-1.0
/// Tests the messages between the processes of a check, and that the process of a check ends at
/// once if it is not started as it should be.
#include "components/componentTools/checking/checkMessages.h"
#include "components/componentTools/checking/checkChild.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/frames.h"

#include <gtest/gtest.h>

using namespace Mz;
using namespace Mz::Tools;

namespace {

/// Returns the messages of a process that checks one rule and has one finding.
std::string messagesWithAFinding() {
    std::string bytes;
    CheckSender sender([&](const std::string& message) { bytes += message; });
    sender.rule("extension-form");
    sender.finding({findCheckRule("extension-form"), L"place", L"A sentence \x20AC.", "again", {}});
    return bytes;
}

TEST(CheckMessages, ArriveAsTheyWereSent) {
    CheckReport report;
    std::string bytes = messagesWithAFinding();
    decodeReport(bytes, report);
    EXPECT_EQ(bytes, "");
    EXPECT_FALSE(report.garbled);
    EXPECT_EQ(report.rule, "extension-form");
    ASSERT_EQ(report.findings.size(), 1u);
    EXPECT_EQ(report.findings[0].rule, findCheckRule("extension-form"));
    EXPECT_EQ(report.findings[0].place, L"place");
    EXPECT_EQ(report.findings[0].sentence, L"A sentence \x20AC.");
    EXPECT_EQ(report.findings[0].reproduce, "again");
}

TEST(CheckMessages, AreNotBelievedAfterAnInvalidOne) {
    constexpr unsigned char kind = 64;
    for (const std::string& invalid :
         {frameOf(kind, "no JSON"), frameOf(kind, R"({"id": "a message without a kind"})"),
          frameOf(kind, R"({"kind": "rule"})"), frameOf(kind, R"({"kind": "rule", "id": 7})"),
          std::string("no frame")}) {
        CheckReport report;
        std::string bytes = invalid + messagesWithAFinding();
        decodeReport(bytes, report);
        EXPECT_TRUE(report.garbled) << invalid;
        EXPECT_TRUE(report.findings.empty()) << invalid;
        // Nor if they arrive later.
        std::string later = messagesWithAFinding();
        decodeReport(later, report);
        EXPECT_TRUE(report.findings.empty()) << invalid;
        EXPECT_EQ(report.rule, "") << invalid;
    }
}

TEST(CheckMessages, OfOtherVersionsAreSkipped) {
    constexpr unsigned char kind = 64;
    CheckReport report;
    std::string bytes =
        frameOf(kind, R"({"kind": "a new kind"})") +
        frameOf(kind, R"({"kind": "finding", "rule": "no-such-rule", "place": "", "sentence": "",
                          "reproduce": "", "missingClass": [0, 0, 0, 0]})") +
        messagesWithAFinding();
    decodeReport(bytes, report);
    EXPECT_FALSE(report.garbled);
    ASSERT_EQ(report.findings.size(), 1u);
    EXPECT_EQ(report.findings[0].rule, findCheckRule("extension-form"));
    EXPECT_FALSE(report.done);
}

/// Returns the exit status of the process; -1 if it did not exit by itself or said something.
int statusFor(std::vector<std::filesystem::path> arguments) {
    arguments.insert(arguments.begin(), checkArgument);
    const System::ChildLimits limits{
        std::chrono::seconds(60), std::uint64_t{1} << 30, 0, std::size_t{1} << 20, {}};
    const System::ChildResult child = System::runChild(MZ_PROBE, arguments, limits);
    return child.end == System::ChildResult::End::exited && child.output.empty() ? child.status
                                                                                 : -1;
}

TEST(CheckChild, EndsWithoutATask) {
    constexpr int usage = 2;
    EXPECT_EQ(statusFor({}), usage);
    EXPECT_EQ(statusFor({"0", encodeTask(CheckTask())}), usage);
    EXPECT_EQ(statusFor({"0", "no task", "library"}), usage);
    EXPECT_EQ(statusFor({"0", "{}", "library"}), usage);
}

} // namespace
