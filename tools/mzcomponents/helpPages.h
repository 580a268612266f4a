// SPDX-License-Identifier: BSL-1.0
/// The pages of the documentation that the program contains.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Commands {

/// A page, in Markdown.
struct HelpPage {
    std::string_view name;
    std::string_view text;
};

/// Returns the pages with a section for each verdict, each rule of the check and each reason of an
/// exception.
std::span<const HelpPage> helpPages();

/// A section of a page: its heading, without marks, and its text, for a terminal.
struct HelpTopic {
    std::string page;
    std::string heading;
    std::string text;
};

/// Returns the topics of a page: its headings of the third level.
std::vector<HelpTopic> topicsOf(const HelpPage& page);

/// Returns whether the user means this topic by `name`: its heading, the part before or within
/// round brackets, in any case, with or without a full stop.
bool isNamed(const HelpTopic& topic, std::string_view name);

} // namespace Mz::Commands
