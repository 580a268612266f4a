// SPDX-License-Identifier: BSL-1.0
/// What the two processes of a profile say to each other: the task for the child process, and the
/// messages that it sends back.
#pragma once

#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/profile.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// What one child process does.
struct ProfileTask {
    bool whole = false;             ///< measure `initialize`, instead of its steps
    std::size_t candidates = 0;     ///< the number of candidates that the parent found
    std::set<std::size_t> excluded; ///< the candidates that must not be loaded, by their index
};

/// Returns the task as ASCII text, which is valid in every locale.
std::string encodeTask(const ProfileTask& task);

/// Returns the task that `encodeTask` encoded.
/// \throws std::exception if the text is invalid
ProfileTask decodeProfileTask(const std::string& text);

/// The steps of one candidate that exports the entry point, or has builders in the list.
struct LibrarySteps {
    std::size_t index = 0;
    PhaseTimes times{};
    Finding verdict;
};

/// Return the bytes of one message.
/// @{
/// The process continues with this candidate.
std::string encodeLibraryBegin(std::size_t index);
std::string encodeProfileStage(Stage stage);
std::string encodeProfileFault(Verdict verdict, const std::wstring& subject,
                               const std::wstring& words);
std::string encodeSteps(const LibrarySteps& steps);
/// All other candidates so far.
std::string encodeOthers(std::size_t count, std::chrono::nanoseconds time);
/// The last message of the steps.
std::string encodeListing(std::chrono::nanoseconds time);
/// The only message of a process that calls `initialize`.
std::string encodeWhole(std::optional<std::chrono::nanoseconds> listReading,
                        std::chrono::nanoseconds initialize);
/// The folders have changed: they do not have the candidates of the task.
std::string encodeOtherFolders();
/// @}

/// The decoded messages.
struct ProfileReport {
    bool done = false; ///< the last message arrived
    bool garbled = false;
    bool otherFolders = false;
    std::optional<std::size_t> current; ///< the candidate that has begun and not ended
    Stage stage = Stage::starting;
    std::optional<Finding> fault; ///< how the process ended, if it knew
    std::vector<LibrarySteps> libraries;
    std::size_t otherFiles = 0;
    std::chrono::nanoseconds otherTime{0}, listing{0}, initialize{0};
    std::optional<std::chrono::nanoseconds> listReading;
};

/// Decodes the messages up to the end, or up to the first invalid byte.
/// \param candidates  the number of candidates; a message about another one is invalid
ProfileReport decodeProfileReport(std::string_view bytes, std::size_t candidates);

} // namespace Mz::Tools
