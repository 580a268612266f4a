// SPDX-License-Identifier: BSL-1.0
/// The choice is written before the list. If the second step fails, the next scan completes it:
/// it drops the builders of a component that is switched off, and examines one without a verdict.
#include "components/componentTools/disabled.h"

#include "components/componentTools/discovery.h"
#include "components/componentTools/recordedList.h"
#include "components/componentTools/records/verdictsFile.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace Mz::Tools {

namespace {

/// A list and the file beside it, for one change.
class SwitchedList {
  public:
    SwitchedList(const std::filesystem::path& file, const std::filesystem::path& list)
        : candidate(candidateOf(file)), list(list) {
        read();
    }

    SwitchResult disable(const std::wstring& reason) {
        if (!result.problem.empty())
            return result;
        const auto status = platform::queryFile(candidate.path.native());
        const auto choice = findChoice();
        auto record = findRecord();
        if (!status && choice == disabled.end() && record == libraries.end())
            refuse(candidate.path, sentenceOf({Verdict::missing, {}, {}}));
        else if (status && !status->regular)
            refuse(candidate.path, sentenceOf({Verdict::notRegular, {}, {}}));
        if (!result.problem.empty())
            return result;
        result.changed = choice == disabled.end();
        if (result.changed)
            disabled.push_back({candidate.directory, candidate.fileName, reason});
        else
            choice->reason = reason;
        if (record == libraries.end() && status)
            record = libraries.insert(record, {candidate.directory, candidate.fileName, 0, 0, {}});
        if (record != libraries.end()) {
            record->builders.clear();
            record->kept.reset();
            record->time = status ? status->time : record->time;
            record->size = status ? status->size : record->size;
        }
        write();
        return result;
    }

    SwitchResult enable() {
        const auto choice = findChoice();
        result.changed = result.problem.empty() && choice != disabled.end();
        if (!result.changed)
            return result;
        disabled.erase(choice);
        if (const auto record = findRecord(); record != libraries.end())
            libraries.erase(record);
        write();
        return result;
    }

  private:
    void read() {
        if (candidate.directory.empty() || candidate.fileName.empty())
            return refuse(candidate.path, sentenceOf({Verdict::nameNotCarried, {}, {}}));
        ListReading reading = readRecordedList(list);
        if (reading.state == ListReading::State::rejected)
            return refuse(list, L"this is no recorded list: " + reading.reason);
        libraries = std::move(reading.libraries);
        std::optional<DisabledComponents> choices = readDisabled(verdictsFileOf(list));
        if (!choices)
            return refuse(verdictsFileOf(list),
                          L"this file is damaged. Repair or remove it, and scan again");
        disabled = *std::move(choices);
    }

    void refuse(const std::filesystem::path& file, const std::wstring& why) {
        result.problem = displayName(file) + L": " + why;
    }

    DisabledComponents::iterator findChoice() {
        return std::find_if(disabled.begin(), disabled.end(), [&](const auto& component) {
            return component.fileName == candidate.fileName &&
                   component.directory == candidate.directory;
        });
    }

    RecordedLibraries::iterator findRecord() {
        return std::find_if(libraries.begin(), libraries.end(), [&](const auto& library) {
            return library.fileName == candidate.fileName &&
                   library.directory == candidate.directory;
        });
    }

    void write() {
        writeVerdicts(verdictsFileOf(list), libraries, disabled);
        writeRecordedList(list, libraries);
    }

    const Candidate candidate;
    const std::filesystem::path& list;
    RecordedLibraries libraries;
    DisabledComponents disabled;
    SwitchResult result;
};

} // namespace

DisabledComponents disabledComponents(const std::filesystem::path& list) {
    return readDisabled(verdictsFileOf(list)).value_or(DisabledComponents());
}

SwitchResult disableComponent(const std::filesystem::path& file, const std::filesystem::path& list,
                              const std::wstring& reason) {
    return SwitchedList(file, list).disable(reason);
}

SwitchResult enableComponent(const std::filesystem::path& file, const std::filesystem::path& list) {
    return SwitchedList(file, list).enable();
}

} // namespace Mz::Tools
