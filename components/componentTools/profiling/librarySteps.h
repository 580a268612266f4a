// SPDX-License-Identifier: BSL-1.0
/// The steps of a start, for one candidate after the other, with a clock around each.
#pragma once

#include "components/componentTools/profiling/phaseClock.h"
#include "components/componentTools/profiling/profileMessages.h"
#include "components/componentTools/profiling/startFiles.h"

#include "components/componentManager/componentImp.h"

#include <cstddef>
#include <functional>
#include <memory>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

namespace Mz::Tools {

/// Takes the steps of the manager's `initialize` in this process, and reports their times. The
/// libraries stay loaded until the process ends.
class StartSteps {
  public:
    /// \param files     the candidates, with their records
    /// \param excluded  the candidates that must not be loaded, by their index
    /// \param write     receives each message as bytes
    StartSteps(const std::vector<StartFile>& files, const std::set<std::size_t>& excluded,
               std::function<void(const std::string&)> write);

    /// Goes through all candidates.
    void run();

  private:
    /// The index of the builders, as large as that of the manager.
    struct UidHash {
        std::size_t operator()(const QrUid& uid) const { return uid.w0; }
    };
    using Index = std::unordered_map<QrUid, const RecordedBuilder*, UidHash>;
    /// The records of one library. They do not move in memory, because the index points to them.
    using Builders = std::vector<std::unique_ptr<RecordedBuilder>>;
    class Registration;

    void examine(std::size_t index);
    void restore(std::size_t index, PhaseClock& clock);
    Finding load(const platform::NativePath& path, PhaseClock& clock);
    Finding describe(QrGetComponentDescriptionFunction* entryPoint, PhaseClock& clock);
    void noteOther(const PhaseClock& clock);

    const std::vector<StartFile>& files;
    const std::set<std::size_t>& excluded;
    std::function<void(const std::string&)> send;
    Index builderIndex;
    std::vector<Builders> records;
    std::size_t otherFiles = 0;
    std::chrono::nanoseconds otherTime{0};
};

} // namespace Mz::Tools
