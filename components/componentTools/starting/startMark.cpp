// SPDX-License-Identifier: BSL-1.0
/// Each process has its own mark and holds the file, so that several instances of a host may use
/// one list: the mark of a process that still runs is held, and is no sign of an unclean end.
#include "components/componentTools/starting/startMark.h"

#include "components/componentTools/records/openPatiently.h"

#include <string>
#include <system_error>
#include <vector>

namespace Mz::Tools {

namespace {

constexpr const char* starting = "starting\n";
constexpr const char* working = "working\n";

/// Returns the name of the mark without the number.
std::filesystem::path prefixOf(const std::filesystem::path& list) {
    std::filesystem::path prefix = list;
    prefix += ".running-";
    return prefix;
}

std::vector<std::filesystem::path> orphanedMarks(const std::filesystem::path& list) {
    std::vector<std::filesystem::path> marks;
    const auto prefix = prefixOf(list).filename().native();
    const auto folder = list.has_parent_path() ? list.parent_path() : std::filesystem::path(".");
    std::error_code failure;
    std::filesystem::directory_iterator entry(folder, failure);
    for (const std::filesystem::directory_iterator end; !failure && entry != end;
         entry.increment(failure))
        if (entry->path().filename().native().starts_with(prefix) && !System::isHeld(entry->path()))
            marks.push_back(entry->path());
    return marks;
}

} // namespace

bool StartMark::leave(const std::filesystem::path& list) {
    std::filesystem::path path = prefixOf(list);
    path += std::to_string(System::processNumber());
    return file.create(path) && file.write(starting);
}

void StartMark::startIsOver() {
    file.write(working);
}

void StartMark::remove() {
    file.remove();
}

std::optional<StartPhase> takeOrphanedMarks(const std::filesystem::path& list) {
    std::optional<StartPhase> phase;
    std::filesystem::file_time_type latest;
    for (const std::filesystem::path& mark : orphanedMarks(list)) {
        std::string content;
        std::ifstream input;
        if (openPatiently(input, mark))
            std::getline(input, content);
        input.close();
        std::error_code ignored;
        const auto time = std::filesystem::last_write_time(mark, ignored);
        if (!phase || time >= latest) {
            phase = content + "\n" == starting ? StartPhase::starting : StartPhase::working;
            latest = time;
        }
        std::filesystem::remove(mark, ignored);
    }
    return phase;
}

} // namespace Mz::Tools
