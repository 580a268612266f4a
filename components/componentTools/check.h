// SPDX-License-Identifier: BSL-1.0
/// Checks whether a component library keeps the rules of the component manager.
///
/// The checks call the library as a host does, and as a host does only in bad moments: with damaged
/// files, without memory, in another locale. They run in child processes. A crash, a hang or an
/// exit becomes a finding of the rule that was being checked, and the other rules are checked in a
/// new process.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"
#include "components/componentTools/probe.h"

#include "components/componentManager/uid.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// How serious it is to break a rule.
enum class Grade {
    note,    ///< worth knowing
    warning, ///< tolerated by hosts, but not meant
    error,   ///< harms hosts or users
};

/// Returns the grade's name: "note", "warning" or "error".
MZ_COMPONENT_TOOLS_API const char* nameOf(Grade grade);

/// One rule. All texts are static.
struct CheckRule {
    const char* id;             ///< its identifier, which never changes
    const char* group;          ///< for example "builders"
    Grade grade;                ///< of its findings
    const wchar_t* title;       ///< what a good library does, as one sentence
    const wchar_t* explanation; ///< why, and what to do
};

/// Returns all rules, in the order of the documentation. The pointers are never null and stay
/// valid.
MZ_COMPONENT_TOOLS_API const std::vector<const CheckRule*>& checkRules();

/// Returns the rule with that identifier, or null.
MZ_COMPONENT_TOOLS_API const CheckRule* findCheckRule(std::string_view id);

/// One broken rule.
struct CheckFinding {
    const CheckRule* rule = nullptr; ///< never null in a result
    std::wstring place;    ///< for example a builder, with name and uid; empty for the library
    std::wstring sentence; ///< the fact and the remedy
    std::string reproduce; ///< the value of `CheckOptions::reproduce` that repeats the finding
    QrUid missingClass{};  ///< the class that has no builder in the library, else nil
};

/// What is checked, and how.
struct CheckOptions {
    /// Program, limits and interruption of the child processes. The time limit is that of one rule.
    ProbeOptions process;
    /// The start of the sequence of random input.
    std::uint32_t seed = 1;
    /// How long the rules that read input go on with random input, each; 0 for a fixed number of
    /// inputs.
    std::chrono::milliseconds fuzzTime{0};
    /// Files that import builders can read. They are read whole, cut off and changed.
    std::vector<std::filesystem::path> samples;
    /// Programs and libraries of the host, with which the interfaces of the library are compared:
    /// see `ExplainOptions::hosts`.
    std::vector<std::filesystem::path> hosts;
    /// Whether the library says that its builders may be used by several threads at a time.
    bool threadSafe = false;
    /// The rule to check, as an identifier, or the value of a finding; empty for all rules.
    std::string reproduce;
    /// Check in this process, for a debugger. A crash ends it. The rules of the group
    /// "surroundings" that need several processes are not checked.
    bool inProcess = false;
};

/// A builder that a library describes.
struct CheckedBuilder {
    QrUid uid{};       ///< its identity
    std::wstring name; ///< as the library describes it
};

/// The result of `checkLibrary`.
struct CheckResult {
    std::filesystem::path file;           ///< the library
    std::vector<CheckFinding> findings;   ///< in the order of `checkRules`
    std::vector<const CheckRule*> notRun; ///< rules that were not checked
    std::vector<CheckedBuilder> builders; ///< the builders of the library
    bool interrupted = false;             ///< `options.process.interrupted` stopped the check
};

/// Checks one library. Blocks until all child processes have ended.
///
/// \throws whatever `options.process.interrupted` throws
/// \throws std::invalid_argument if `options.reproduce` names no rule
MZ_COMPONENT_TOOLS_API CheckResult checkLibrary(const std::filesystem::path& file,
                                                const CheckOptions& options = {});

/// Compares the libraries of one search path. Adds the findings that only the comparison shows:
/// uids that several libraries use. Removes those that it refutes: classes of stored objects whose
/// builder another library has.
MZ_COMPONENT_TOOLS_API void compareLibraries(std::vector<CheckResult>& libraries);

} // namespace Mz::Tools
