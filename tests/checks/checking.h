// SPDX-License-Identifier: BSL-1.0
/// What the tests of the checks share.
#pragma once

#include "tests/tools/toolsFixture.h"

#include "components/componentManager/utf8.h"
#include "components/componentTools/check.h"

#include <set>

namespace Mz::Test {

/// Returns the findings as text, for people.
inline std::string textOf(const Tools::CheckResult& result) {
    std::string text;
    for (const Tools::CheckFinding& finding : result.findings)
        text += std::string(finding.rule->id) + ": " + toUtf8(finding.place) + ": " +
                toUtf8(finding.sentence) + "\n";
    return text;
}

inline std::set<std::string> rulesOf(const Tools::CheckResult& result) {
    std::set<std::string> rules;
    for (const Tools::CheckFinding& finding : result.findings)
        rules.insert(finding.rule->id);
    return rules;
}

/// Time for a process under load, but not for a test that waits for a library that hangs.
inline Tools::CheckOptions options(int seconds = 30) {
    Tools::CheckOptions result;
    result.process.timeLimit = std::chrono::seconds(seconds);
    return result;
}

/// Whether the child process can let the allocations of libraries fail, and count their memory.
inline constexpr bool limitsAllocations = MZ_LIMITS_ALLOCATIONS;
inline constexpr bool countsMemory = MZ_COUNTS_MEMORY;

} // namespace Mz::Test
