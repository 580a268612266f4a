// SPDX-License-Identifier: BSL-1.0
/// Components that end the program.
///
/// A component may call `exit` where it should return. Its status, often 0, must not pass for the
/// result of the command.
#pragma once

#include <string>

namespace Mz::Commands {

/// From the first call on, `exit` ends the program with status 1 and a message on standard error,
/// unless `commandIsDone` was called before. What the command has printed so far is written first.
/// Call it after the streams that the results go to were made, and before any component runs.
///
/// `quick_exit`, `_exit`, and a process that the system ends are out of its reach.
void guardExit();

/// Ends the guard: the program is about to return its own status.
void commandIsDone();

/// What components are asked to do while this object lives, for the message; nests.
class Activity {
  public:
    /// \param what completes the sentence "a component ended the program while …".
    explicit Activity(std::wstring what);
    ~Activity();
    Activity(const Activity&) = delete;
    Activity& operator=(const Activity&) = delete;

  private:
    std::wstring outer;
};

} // namespace Mz::Commands
