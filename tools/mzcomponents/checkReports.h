// SPDX-License-Identifier: BSL-1.0
/// The result of `check` for people and for programs.
#pragma once

#include "components/componentTools/check.h"
#include "tools/mzcomponents/output.h"

#include <string>
#include <vector>

namespace Mz::Commands {

/// The result of one library, and for each finding the reason to tolerate it; empty for none.
struct CheckedLibrary {
    Tools::CheckResult result;
    std::vector<std::wstring> reasons;
};

/// Returns ASCII text, such as the name of a rule, as wide text.
std::wstring wide(const char* ascii);

/// Returns whether a finding of this grade or a more serious one is not tolerated.
bool anyFails(const std::vector<CheckedLibrary>& libraries, Tools::Grade failOn);

/// Prints one line for each finding, and a summary.
void printChecks(const std::vector<CheckedLibrary>& libraries);

Json jsonOf(const std::vector<CheckedLibrary>& libraries);

/// Returns JUnit XML: a test suite for each library, a test case for each rule. A rule fails if it
/// has a finding of the grade `failOn` or a more serious one.
std::string junitOf(const std::vector<CheckedLibrary>& libraries, Tools::Grade failOn);

/// Returns a log in the form SARIF 2.1.0.
std::string sarifOf(const std::vector<CheckedLibrary>& libraries);

} // namespace Mz::Commands
