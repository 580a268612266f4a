// SPDX-License-Identifier: BSL-1.0
/// The text begins with the answer; the table and the sums that follow are its proof. All figures
/// of a table are medians, so that its sum is the sum of the rows.
#include "tools/mzcomponents/profileReport.h"

#include <algorithm>
#include <set>

namespace Mz::Commands {

namespace {

using std::chrono::nanoseconds;
using Tools::ProfiledLibrary;
using Tools::StartPhase;
using Tools::StartProfile;

constexpr std::size_t shareWidth = 7, totalWidth = 11, sumWidth = 28;

double millisecondsOf(nanoseconds time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

std::wstring aligned(const std::wstring& text, std::size_t width) {
    return text.size() < width ? std::wstring(width - text.size(), L' ') + text : text;
}

std::size_t widthOf(StartPhase phase) {
    return std::max<std::size_t>(std::wstring(Tools::titleOf(phase)).size() + 2, 10);
}

template <class Cell>
std::wstring row(const std::wstring& share, const std::wstring& total, Cell cell,
                 const std::wstring& name) {
    std::wstring line = aligned(share, shareWidth) + aligned(total, totalWidth);
    for (std::size_t index = 0; index < Tools::startPhaseCount; ++index)
        line += aligned(cell(index), widthOf(static_cast<StartPhase>(index)));
    return line + L"  " + name;
}

/// Returns a cell of the table. A phase that a start skips has none.
std::wstring cellOf(nanoseconds time) {
    return time == nanoseconds(0) ? L"-" : Tools::timeText(time);
}

void printTable(const StartProfile& profile) {
    printLine(row(
        L"share", L"time",
        [](std::size_t index) {
            return std::wstring(Tools::titleOf(static_cast<StartPhase>(index)));
        },
        L"library"));
    for (const ProfiledLibrary& library : profile.libraries)
        if (library.measured)
            printLine(row(
                Tools::shareText(profile.shareOf(library)), Tools::timeText(library.total()),
                [&](std::size_t index) { return cellOf(library.times[index]); },
                Tools::displayName(library.path)));
}

void printSum(const std::wstring& name, nanoseconds time, const std::wstring& note = {}) {
    printLine(padded(name, sumWidth) + aligned(Tools::timeText(time), totalWidth) + note);
}

/// Returns a remark if the sum differs from the manager's own time by more than a tenth. Of a busy
/// machine, a long measurement feels more than the medians of short ones.
std::wstring doubtAbout(const StartProfile& profile) {
    const nanoseconds own = *profile.initialize - profile.sum();
    const bool differs = std::max(own, -own) * 10 > *profile.initialize;
    return differs ? L", more than 10 %. If the machine is busy, repeat it with more --runs" : L"";
}

void printSums(const StartProfile& profile) {
    nanoseconds libraries(0);
    for (const ProfiledLibrary& library : profile.libraries)
        libraries += library.total();
    printSum(L"libraries", libraries);
    printSum(L"other files", profile.otherTime,
             L"  (" + std::to_wstring(profile.otherFiles) +
                 (profile.otherFiles == 1 ? L" file)" : L" files)"));
    printSum(L"listing the folders", profile.listing);
    if (profile.initialize) {
        printSum(L"the manager's own steps", *profile.initialize - profile.sum(),
                 L"  (the difference" + doubtAbout(profile) + L")");
        printSum(L"initialize", *profile.initialize, L"  (measured as a whole)");
    }
    if (profile.listReading)
        printSum(L"reading the list", *profile.listReading, L"  (before initialize)");
}

/// Writes which libraries are loaded though there is a list, and why.
void printReasons(const StartProfile& profile) {
    for (const ProfiledLibrary& library : profile.libraries)
        if (library.loaded && library.record)
            printLine(Tools::displayName(library.path) + L": is loaded in spite of the list: " +
                      Tools::sentenceOf(*library.record));
}

void printAdvice(const MeasuredStarts& measured) {
    if (measured.without && measured.without->initialize && measured.start.initialize) {
        const nanoseconds with =
            *measured.start.initialize + measured.start.listReading.value_or(nanoseconds(0));
        printLine(L"With the list the start takes " + Tools::timeText(with) + L", without it " +
                  Tools::timeText(*measured.without->initialize) + L".");
    }
    const auto& libraries = measured.start.libraries;
    const bool canRecord =
        std::any_of(libraries.begin(), libraries.end(), [](const ProfiledLibrary& library) {
            return library.loaded && library.verdict.verdict == Tools::Verdict::works;
        });
    if (canRecord)
        printLine(L"A start with a current recorded list does not load these libraries: "
                  L"\"mzcomponents scan --cache LIST\" writes one.");
}

/// \param reported  the libraries that were reported before; receives the others
void reportFaults(const StartProfile& profile, std::set<std::filesystem::path>& reported) {
    for (const ProfiledLibrary& library : profile.libraries)
        if (isFault(library.verdict) && reported.insert(library.path).second) {
            const std::wstring cure = Tools::cureOf(library.verdict);
            printError(Tools::displayName(library.path) + L": " + nameOf(library.verdict) + L": " +
                       Tools::sentenceOf(library.verdict) + (cure.empty() ? L"" : L"; " + cure));
        }
}

Json jsonOfLibrary(const ProfiledLibrary& library, const StartProfile& profile) {
    Json entry{{"file", utf8(Tools::displayName(library.path))}};
    entry.update(jsonOf(library.verdict));
    entry["record"] = library.record ? jsonOf(*library.record) : Json();
    entry["loaded"] = library.loaded;
    entry["measured"] = library.measured;
    entry["share"] = profile.shareOf(library);
    entry["time"] = millisecondsOf(library.total());
    const auto timeOf = [&](StartPhase phase) {
        return millisecondsOf(library.times[static_cast<std::size_t>(phase)]);
    };
    entry["check"] = timeOf(StartPhase::check);
    entry["probe"] = timeOf(StartPhase::probe);
    entry["loadWithInitialisers"] = timeOf(StartPhase::load);
    entry["description"] = timeOf(StartPhase::description);
    entry["registration"] = timeOf(StartPhase::registration);
    return entry;
}

Json jsonOfTime(const std::optional<nanoseconds>& time) {
    return time ? Json(millisecondsOf(*time)) : Json();
}

Json jsonOfStart(const StartProfile& profile) {
    Json libraries = Json::array(), folders = Json::array();
    for (const ProfiledLibrary& library : profile.libraries)
        libraries.push_back(jsonOfLibrary(library, profile));
    for (const Tools::Discovery::LeftOut& left : profile.leftOut) {
        folders.push_back({{"file", utf8(Tools::displayName(left.path))}});
        folders.back().update(jsonOf(left.finding));
    }
    const Json own =
        profile.initialize ? Json(millisecondsOf(*profile.initialize - profile.sum())) : Json();
    return {{"answer", utf8(Tools::answerOf(profile))},
            {"runs", profile.runs},
            {"fileCache", "warm"},
            {"initialize", jsonOfTime(profile.initialize)},
            {"sum", millisecondsOf(profile.sum())},
            {"managersOwnSteps", own},
            {"listing", millisecondsOf(profile.listing)},
            {"otherFiles",
             {{"count", profile.otherFiles}, {"time", millisecondsOf(profile.otherTime)}}},
            {"listReading", jsonOfTime(profile.listReading)},
            {"libraries", std::move(libraries)},
            {"skippedFolders", std::move(folders)},
            {"listProblem", utf8(profile.listProblem)},
            {"problem", utf8(profile.problem)},
            {"interrupted", profile.interrupted}};
}

} // namespace

void printProfile(const MeasuredStarts& measured) {
    const StartProfile& profile = measured.start;
    printLine(Tools::answerOf(profile) + L".");
    printLine(L"Medians of " + std::to_wstring(profile.runs) +
              L" first starts in new processes, with a warm file cache:");
    printTable(profile);
    printSums(profile);
    printReasons(profile);
    printAdvice(measured);
    std::set<std::filesystem::path> reported;
    reportFaults(profile, reported);
    if (measured.without)
        reportFaults(*measured.without, reported);
}

Json jsonOf(const MeasuredStarts& measured) {
    Json value = jsonOfStart(measured.start);
    value["withoutList"] = measured.without ? jsonOfStart(*measured.without) : Json();
    return value;
}

} // namespace Mz::Commands
