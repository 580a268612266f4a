// SPDX-License-Identifier: BSL-1.0
/// Measures where the time of a host's start goes, for each component library.
///
/// Each run uses two new processes of `mzcomponents-probe`, so that each is a first start. One
/// calls `QrComponentManager::initialize` and measures its time. The other takes the same steps in
/// the same order, one library at a time, with a clock around each. The component manager itself is
/// not changed for this and has no hooks.
///
/// \since 0.2
#pragma once

#include "components/componentTools/discovery.h"
#include "components/componentTools/probe.h"

#include <array>
#include <chrono>
#include <cstddef>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// What the manager does with one candidate, in this order.
enum class StartPhase {
    check, ///< the query of the file's time and size
    probe, ///< reading the file: does it export the entry point?
    /// Mapping, resolving and initialising the library and those of its dependencies that the
    /// process does not have yet. The systems do not report when the initialisers begin.
    load,
    /// The code of the library: the entry point, its texts, `enumerateBuilders`, and the release of
    /// the description; for a library that fails, unloading it, too.
    description,
    /// Copying the values of each builder, which the library's builder descriptions return, and
    /// entering it in the index; for an unchanged library of the recorded list, entering only.
    registration,
};

/// The number of phases.
inline constexpr std::size_t startPhaseCount = 5;

/// Returns the phase's title, for example "load with initialisers".
MZ_COMPONENT_TOOLS_API const wchar_t* titleOf(StartPhase phase);

/// The times of one library, indexed by `StartPhase`.
using PhaseTimes = std::array<std::chrono::nanoseconds, startPhaseCount>;

/// The options of `profileStart`.
struct ProfileOptions {
    /// The folders to search, in the host's order; see `foldersOf`.
    std::vector<std::filesystem::path> folders;
    /// The recorded list that the host reads before its start; empty for a start without one.
    std::filesystem::path list;
    /// The number of runs, at least 1. One more run goes before them, to fill the file cache.
    int runs = 5;
    /// The limits. `timeLimit` is for one library, `memoryLimit` for the process that holds all of
    /// them. If `interrupted` returns true, the measurement stops.
    ProbeOptions process;
};

/// The result for one library: a file that exports the entry point, or has builders in the list.
struct ProfiledLibrary {
    std::filesystem::path path; ///< the full path
    /// `works`, `offersNothing`, `recordedUnchanged` (not loaded), or a fault.
    Finding verdict;
    /// With a list: `recordedUnchanged`, or why the library is loaded nonetheless.
    std::optional<Finding> record = std::nullopt;
    /// Whether a start loads the library, or tries to.
    bool loaded = false;
    /// False if the library ended or blocked its process. The measured starts then go without it,
    /// and it has no times.
    bool measured = true;
    PhaseTimes times{}; ///< the medians of all runs

    /// Returns the sum of the times.
    MZ_COMPONENT_TOOLS_API std::chrono::nanoseconds total() const;
    /// Returns the phase that takes longest.
    MZ_COMPONENT_TOOLS_API StartPhase longestPhase() const;
};

/// The result of `profileStart`. All times are medians of the runs, with a warm file cache.
struct StartProfile {
    /// The slowest first, then those that could not be measured.
    std::vector<ProfiledLibrary> libraries;
    /// The candidates that are no component libraries, and the time for checking and probing them.
    std::size_t otherFiles = 0;
    std::chrono::nanoseconds otherTime{0};
    /// Listing the folders, and normalising the names in them.
    std::chrono::nanoseconds listing{0};
    /// Reading the recorded list into the manager, before `initialize`; unset without a list.
    std::optional<std::chrono::nanoseconds> listReading = std::nullopt;
    /// The manager's own `initialize`; unset if it could not be measured.
    std::optional<std::chrono::nanoseconds> initialize = std::nullopt;
    int runs = 0; ///< the number of runs that were measured

    /// The search folders that cannot be searched.
    std::vector<Discovery::LeftOut> leftOut;
    std::wstring listProblem; ///< why the list was not used; empty if it was, or there is none
    std::wstring problem;     ///< why not everything was measured; empty if it was
    bool interrupted = false; ///< the user stopped the measurement

    /// Returns the sum of all times but `listReading`, which `initialize` should equal.
    MZ_COMPONENT_TOOLS_API std::chrono::nanoseconds sum() const;
    /// Returns the time of the start: `initialize`, or without it `sum()`.
    MZ_COMPONENT_TOOLS_API std::chrono::nanoseconds start() const;
    /// Returns the share of a library in the time of the start, from 0 to 1.
    MZ_COMPONENT_TOOLS_API double shareOf(const ProfiledLibrary& library) const;
};

/// Measures the start of a host with these folders. Blocks until all processes have ended.
///
/// A library that ends its process, or does not return, is excluded, with its verdict, and the
/// measurement begins again. One whose load or description fails is measured, because a start takes
/// that time, too.
///
/// A damaged list is reported and not used.
/// \throws whatever `options.process.interrupted` throws
MZ_COMPONENT_TOOLS_API StartProfile profileStart(const ProfileOptions& options);

/// Returns the answer to "which library makes the start slow?" as a sentence without a full stop.
MZ_COMPONENT_TOOLS_API std::wstring answerOf(const StartProfile& profile);

/// Returns a time in milliseconds, for people, for example "12.3 ms".
MZ_COMPONENT_TOOLS_API std::wstring timeText(std::chrono::nanoseconds time);

/// Returns a share, for people, for example "88 %".
/// \param share  from 0 to 1
MZ_COMPONENT_TOOLS_API std::wstring shareText(double share);

} // namespace Mz::Tools
