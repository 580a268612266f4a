// SPDX-License-Identifier: BSL-1.0
/// The marks beside a list that show which processes have begun and not ended.
#pragma once

#include "components/componentTools/platform/system.h"

#include <filesystem>
#include <optional>

namespace Mz::Tools {

/// What a mark says of its process.
enum class StartPhase {
    starting, ///< the component manager is being initialised
    working,  ///< after that
};

/// The mark of this process: a file beside the list, `LIST.running-` and the process's number.
class StartMark {
  public:
    /// Leaves the mark. Returns false if the file cannot be written.
    bool leave(const std::filesystem::path& list);
    /// Notes that the components have started.
    void startIsOver();
    /// Removes the mark. No-op if there is none.
    void remove();

  private:
    System::HeldFile file;
};

/// Removes the marks of processes that ended without removing them.
/// \return whether the last of them was starting or working; `std::nullopt` if there was none
std::optional<StartPhase> takeOrphanedMarks(const std::filesystem::path& list);

} // namespace Mz::Tools
