// SPDX-License-Identifier: BSL-1.0
/// Finds the component, or the components that only fail together, with which a host fails.
///
/// The host is started again and again, each time with a recorded list in which some components are
/// switched off. It must take its list from `Kit::listFromEnvironment`.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/scan.h"

#include <chrono>
#include <cstddef>
#include <filesystem>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// One start of the host.
struct HostStart {
    int number = 0;         ///< counted from 1
    std::size_t active = 0; ///< the number of components that were not switched off
    std::wstring ending;    ///< how the host ended, for people
    bool failed = false;    ///< whether that counts as a failure
};

/// The options of `bisect`.
struct BisectOptions {
    /// The folders that the host searches, in its order; see `foldersOf`.
    std::vector<std::filesystem::path> folders;
    /// The recorded list to update and use; empty for none. The host does not change it.
    std::filesystem::path list;
    /// The host: a path, or the name of a program in PATH.
    std::filesystem::path host;
    /// The arguments of the host.
    std::vector<std::filesystem::path> arguments;
    /// How often the host is started with a set of components before the set counts as good. A
    /// failure that shows in the share p of the starts is overlooked with the probability
    /// (1 - p) ^ repeat.
    int repeat = 1;
    /// When the host is killed; zero for never.
    std::chrono::milliseconds timeLimit{60'000};
    /// Whether a host that was killed at its time limit was good. If false, it failed.
    bool runningIsGood = false;
    /// Decides whether a start failed, for example by a question; may be empty. Gets the start with
    /// its number, its ending and the verdict of the exit status. `std::nullopt` stops the search.
    std::function<std::optional<bool>(const HostStart&)> judge;
    /// Receives the standard output of the host, in pieces; may be empty.
    std::function<void(std::string_view)> output;
    /// Called after each start; may be empty.
    std::function<void(const HostStart&)> started;
    /// The limits of the scan. If `interrupted` returns true, scan, host and search are stopped.
    ProbeOptions probe;
    /// Receives the progress of the scan; may be null. The caller owns it.
    QrProcessControl* controller = nullptr;
};

/// A component with which the host fails.
struct Culprit {
    std::filesystem::path path; ///< the full path
    Finding verdict;            ///< of the scan
    std::wstring stamp;         ///< the properties that its stamp names; empty if it has none
    RecordedLibrary record;     ///< with time, size and builders
};

/// The result of `bisect`.
struct BisectResult {
    /// How the search ended.
    enum class State {
        found,      ///< the host fails with the culprits, and not without any one of them
        allPass,    ///< the host does not fail, even with all components
        noneFails,  ///< the host fails even if all components are switched off
        notStarted, ///< the host cannot be started, or its exit status is not available
        stopped,    ///< the user stopped the search; the culprits are the smallest set seen to fail
    };
    State state = State::stopped;  ///< how the search ended
    std::vector<Culprit> culprits; ///< in the host's order
    std::size_t components = 0;    ///< the number of components that were searched
    int starts = 0;                ///< of the host
    int failures = 0;              ///< the number of starts that failed
    std::wstring ending;           ///< how the host ended when it last failed
    std::wstring problem;          ///< why the state is `notStarted`
    std::wstring stamp;            ///< what the stamp of this library's build would name
    ScanResult scanned;            ///< the scan before the first start
};

/// Searches the components with which the host fails. Blocks until the search has ended.
///
/// A start fails if the host crashes, exits with another status than 0, or still runs at its time
/// limit; `runningIsGood` and `judge` change that. The host runs with empty standard input, and its
/// standard error is discarded. At its end, the processes that it started are killed.
///
/// Components are libraries that the scan recorded with builders, or that need their host's
/// program. Others, and those that the user switched off, stay off. With n components, one culprit
/// takes at most ceil(log2(n)) + 2 sets of components, each with at most `repeat` starts; k that
/// fail together take at most k times as many, and k more.
///
/// The lists for the host are in a temporary folder, which is removed at the end.
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError if a temporary list cannot be written
/// \throws std::filesystem::filesystem_error if the temporary folder cannot be created
/// \throws whatever the functions in `options` throw
MZ_COMPONENT_TOOLS_API BisectResult bisect(const BisectOptions& options);

} // namespace Mz::Tools
