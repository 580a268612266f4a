// SPDX-License-Identifier: BSL-1.0
/// Detects components that call `exit`.
///
/// A component may call `exit` where it should return. Its status, often 0, must not become the
/// exit status of the command.
#pragma once

#include <string>

namespace Mz::Commands {

/// Installs the guard: `exit` then ends the program with status 1 and a message on standard error,
/// unless `commandIsDone` was called before. The results so far are flushed first. Call it after
/// the streams for results were constructed, and before any component runs. Further calls are
/// no-ops.
///
/// The guard does not detect `quick_exit`, `_exit`, or an end by the system.
void guardExit();

/// Disables the guard. Call it before the program returns its own status.
void commandIsDone();

/// Scope of an activity of components, for the guard's message. Scopes can be nested.
class Activity {
  public:
    /// \param what  completes the sentence "a component ended the program while …"
    explicit Activity(std::wstring what);
    ~Activity();
    Activity(const Activity&) = delete;
    Activity& operator=(const Activity&) = delete;

  private:
    std::wstring outer;
};

} // namespace Mz::Commands
