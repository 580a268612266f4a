// SPDX-License-Identifier: BSL-1.0
/// Takes the pages apart line by line. Only the Markdown that they use is known: headings,
/// comments, links, bold words, code, and blocks, which are indented here.
#include "tools/mzcomponents/helpPages.h"

#include <algorithm>
#include <cctype>
#include <regex>
#include <sstream>

namespace Mz::Commands {

namespace {

/// Returns a line of text without its marks.
std::string plain(const std::string& line) {
    static const std::regex link(R"(\[([^\]]*)\]\([^)]*\))"), mark(R"(\*\*|`)");
    return std::regex_replace(std::regex_replace(line, link, "$1"), mark, "");
}

std::string lower(std::string_view text) {
    std::string result(text);
    std::ranges::transform(result, result.begin(), [](unsigned char character) {
        return static_cast<char>(std::tolower(character));
    });
    while (result.ends_with('.') || result.ends_with(' '))
        result.pop_back();
    return result;
}

/// Appends a line unless two blank lines would meet.
void append(std::string& text, const std::string& line) {
    if (line.empty() && (text.empty() || text.ends_with("\n\n")))
        return;
    text += line + '\n';
}

} // namespace

std::vector<HelpTopic> topicsOf(const HelpPage& page) {
    std::vector<HelpTopic> topics;
    bool inTopic = false, inBlock = false;
    std::istringstream lines{std::string(page.text)};
    for (std::string line; std::getline(lines, line);) {
        if (line.starts_with("```")) {
            inBlock = !inBlock;
            if (inTopic)
                append(topics.back().text, "");
        } else if (!inBlock && line.starts_with("#")) {
            inTopic = line.starts_with("### ");
            if (inTopic)
                topics.push_back({std::string(page.name), plain(line.substr(4)), ""});
        } else if (inTopic && inBlock) {
            append(topics.back().text, line.empty() ? line : "    " + line);
        } else if (inTopic && !line.starts_with("<!--") && !line.starts_with("Next: ")) {
            append(topics.back().text, plain(line));
        }
    }
    for (HelpTopic& topic : topics)
        while (topic.text.ends_with("\n\n"))
            topic.text.pop_back();
    return topics;
}

bool isNamed(const HelpTopic& topic, std::string_view name) {
    const std::string wanted = lower(name);
    if (lower(topic.heading) == wanted)
        return true;
    const std::size_t open = topic.heading.rfind(" (");
    if (open == std::string::npos || !topic.heading.ends_with(')'))
        return false;
    return lower(topic.heading.substr(0, open)) == wanted ||
           lower(topic.heading.substr(open + 2, topic.heading.size() - open - 3)) == wanted;
}

} // namespace Mz::Commands
