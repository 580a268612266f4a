// SPDX-License-Identifier: BSL-1.0
/// The figures of a profile, and their texts. Numbers are formatted here, independent of the
/// locale.
#include "components/componentTools/profile.h"

#include <algorithm>
#include <charconv>
#include <numeric>

namespace Mz::Tools {

using std::chrono::nanoseconds;

namespace {

double millisecondsOf(nanoseconds time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

std::wstring fixed(double value, int digits) {
    char text[64];
    const auto end =
        std::to_chars(text, text + sizeof text, value, std::chars_format::fixed, digits).ptr;
    return std::wstring(text, end);
}

} // namespace

const wchar_t* titleOf(StartPhase phase) {
    switch (phase) {
    case StartPhase::check: return L"check";
    case StartPhase::probe: return L"probe";
    case StartPhase::load: return L"load with initialisers";
    case StartPhase::description: return L"description";
    case StartPhase::registration: break;
    }
    return L"registration";
}

nanoseconds ProfiledLibrary::total() const {
    return std::accumulate(times.begin(), times.end(), nanoseconds(0));
}

StartPhase ProfiledLibrary::longestPhase() const {
    return static_cast<StartPhase>(std::max_element(times.begin(), times.end()) - times.begin());
}

nanoseconds StartProfile::sum() const {
    nanoseconds all = listing + otherTime;
    for (const ProfiledLibrary& library : libraries)
        all += library.total();
    return all;
}

nanoseconds StartProfile::start() const {
    return initialize.value_or(sum());
}

double StartProfile::shareOf(const ProfiledLibrary& library) const {
    // The two come from different processes, so that the larger one is the whole.
    const nanoseconds whole = std::max(start(), sum());
    return whole.count() > 0 ? millisecondsOf(library.total()) / millisecondsOf(whole) : 0;
}

std::wstring timeText(nanoseconds time) {
    const double milliseconds = millisecondsOf(time);
    const double size = milliseconds < 0 ? -milliseconds : milliseconds;
    return fixed(milliseconds, size < 1 ? 3 : size < 10 ? 2 : 1) + L" ms";
}

std::wstring shareText(double share) {
    const double percent = share * 100;
    return fixed(percent, percent < 10 ? 1 : 0) + L" %";
}

std::wstring answerOf(const StartProfile& profile) {
    if (profile.libraries.empty() || !profile.libraries.front().measured)
        return L"the start takes " + timeText(profile.start()) + L" and no library was measured";
    const ProfiledLibrary& slowest = profile.libraries.front();
    const StartPhase phase = slowest.longestPhase();
    return displayName(slowest.path.filename()) + L" is the slowest library: it takes " +
           timeText(slowest.total()) + L" of " + timeText(profile.start()) + L" (" +
           shareText(profile.shareOf(slowest)) + L"), of which " +
           timeText(slowest.times[static_cast<std::size_t>(phase)]) + L" are for " + titleOf(phase);
}

} // namespace Mz::Tools
