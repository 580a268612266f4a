// SPDX-License-Identifier: BSL-1.0
/// Writes SVG as text: a heading, a legend and a row for each library. Lengths are in units of the
/// view box, which viewers scale. Names of files can contain any character, so that control
/// characters are replaced and the special characters of XML are escaped.
#include "components/componentTools/profileChart.h"

#include "components/componentManager/utf8.h"
#include "components/componentTools/consoleText.h"

#include <algorithm>
#include <charconv>

namespace Mz::Tools {

namespace {

using std::chrono::nanoseconds;

constexpr std::size_t mostBars = 40;
constexpr std::size_t longestLabel = 36; ///< in characters; the tooltip has the whole name

constexpr double width = 960, labelWidth = 270, barWidth = 590, margin = 16;
constexpr double headHeight = 92, rowHeight = 24, barHeight = 16;

constexpr const char* style = R"(<style>
svg { font: 13px sans-serif; }
.page { fill: #ffffff; }
text { fill: #1c2128; }
.heading { font-size: 16px; font-weight: bold; }
.name { text-anchor: end; }
.check { fill: #8c959f; }
.probe { fill: #3f78b5; }
.load { fill: #d1495b; }
.description { fill: #d98e04; }
.registration { fill: #3d8f4f; }
@media (prefers-color-scheme: dark) {
.page { fill: #16191e; }
text { fill: #e6e9ed; }
.check { fill: #9aa4ae; }
.probe { fill: #6ea8e5; }
.load { fill: #f0788a; }
.description { fill: #f2b544; }
.registration { fill: #6cc580; }
}
</style>
)";

constexpr const char* classes[startPhaseCount] = {"check", "probe", "load", "description",
                                                  "registration"};

/// Returns `text` for the content of an element or a quoted attribute.
std::string escaped(const std::wstring& text) {
    std::string result;
    for (const char character : toUtf8(withoutControls(text))) {
        switch (character) {
        case '&': result += "&amp;"; break;
        case '<': result += "&lt;"; break;
        case '>': result += "&gt;"; break;
        case '"': result += "&quot;"; break;
        case '\'': result += "&apos;"; break;
        default: result += character;
        }
    }
    // The two codes that are characters, but not of XML.
    for (const char* forbidden : {"\xEF\xBF\xBE", "\xEF\xBF\xBF"})
        for (std::size_t at; (at = result.find(forbidden)) != std::string::npos;)
            result.replace(at, 3, "\xEF\xBF\xBD");
    return result;
}

std::string number(double value) {
    char text[64];
    return std::string(
        text, std::to_chars(text, text + sizeof text, value, std::chars_format::fixed, 2).ptr);
}

/// One row of the chart.
struct Bar {
    std::wstring name;
    PhaseTimes times{};
    nanoseconds total{0};
};

std::vector<Bar> barsOf(const StartProfile& profile) {
    std::vector<Bar> bars;
    std::size_t rest = 0;
    for (const ProfiledLibrary& library : profile.libraries) {
        if (!library.measured)
            continue;
        if (bars.size() < mostBars)
            bars.push_back({displayName(library.path.filename()), {}, {}});
        else
            bars.back().name = std::to_wstring(++rest + 1) + L" others";
        Bar& bar = bars.back();
        bar.total += library.total();
        for (std::size_t phase = 0; phase < startPhaseCount; ++phase)
            bar.times[phase] += library.times[phase];
    }
    return bars;
}

std::wstring shortened(std::wstring name) {
    if (name.size() > longestLabel)
        name = name.substr(0, longestLabel - 1) + L"\u2026";
    return name;
}

std::string textAt(double x, double y, const char* kind, const std::wstring& text) {
    return "<text class=\"" + std::string(kind) + "\" x=\"" + number(x) + "\" y=\"" + number(y) +
           "\">" + escaped(text) + "</text>\n";
}

std::string rectangle(double x, double y, double length, double height, const char* kind) {
    return "<rect class=\"" + std::string(kind) + "\" x=\"" + number(x) + "\" y=\"" + number(y) +
           "\" width=\"" + number(length) + "\" height=\"" + number(height) + "\"";
}

std::string legend() {
    std::string text;
    double x = margin;
    for (std::size_t phase = 0; phase < startPhaseCount; ++phase) {
        const std::wstring title = titleOf(static_cast<StartPhase>(phase));
        text += rectangle(x, 66, 12, 12, classes[phase]) + "/>\n";
        text += textAt(x + 18, 77, "key", title);
        x += 40 + 8 * static_cast<double>(title.size());
    }
    return text;
}

std::string row(const Bar& bar, double y, nanoseconds longest) {
    std::string text = "<g>\n<title>" + escaped(bar.name + L": " + timeText(bar.total)) +
                       "</title>\n" + textAt(labelWidth, y + 13, "name", shortened(bar.name));
    double x = labelWidth + 10;
    for (std::size_t phase = 0; phase < startPhaseCount; ++phase) {
        const double share = longest.count() > 0 ? static_cast<double>(bar.times[phase].count()) /
                                                       static_cast<double>(longest.count())
                                                 : 0;
        const std::wstring tip = std::wstring(titleOf(static_cast<StartPhase>(phase))) + L": " +
                                 timeText(bar.times[phase]);
        text += rectangle(x, y, share * barWidth, barHeight, classes[phase]) + "><title>" +
                escaped(bar.name + L", " + tip) + "</title></rect>\n";
        x += share * barWidth;
    }
    return text + textAt(x + 6, y + 13, "time", timeText(bar.total)) + "</g>\n";
}

} // namespace

std::string chartOf(const StartProfile& profile) {
    const std::vector<Bar> bars = barsOf(profile);
    nanoseconds longest(0);
    for (const Bar& bar : bars)
        longest = std::max(longest, bar.total);
    const double height = headHeight + rowHeight * static_cast<double>(bars.size()) + margin;
    const std::wstring heading = L"Start: " + timeText(profile.start());
    std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                       "<svg xmlns=\"http://www.w3.org/2000/svg\" role=\"img\" viewBox=\"0 0 " +
                       number(width) + " " + number(height) + "\">\n<title>" +
                       escaped(answerOf(profile)) + "</title>\n" + style;
    text += rectangle(0, 0, width, height, "page") + "/>\n";
    text += textAt(margin, 28, "heading", heading);
    text += textAt(margin, 50, "key",
                   L"Medians of " + std::to_wstring(profile.runs) +
                       L" first starts in new processes, with a warm file cache");
    text += legend();
    double y = headHeight;
    for (const Bar& bar : bars) {
        text += row(bar, y, longest);
        y += rowHeight;
    }
    return text + "</svg>\n";
}

} // namespace Mz::Tools
