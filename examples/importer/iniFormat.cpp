// SPDX-License-Identifier: BSL-1.0
/// Reads byte by byte, line by line. The buffer below is the standard stream's, so that single
/// bytes are cheap. `looksLikeIni` and `readIni` share the classification of a line.
#include "iniFormat.h"

#include <optional>
#include <string_view>

namespace {

std::string_view withoutBlanks(std::string_view text) {
    const std::size_t begin = text.find_first_not_of(" \t\r");
    if (begin == std::string_view::npos)
        return {};
    return text.substr(begin, text.find_last_not_of(" \t\r") - begin + 1);
}

/// Returns the next line without its end, or nothing at the end of the input.
std::optional<std::string> nextLine(Mz::QrBufferedIO& io, std::size_t longest, std::size_t number) {
    std::string line;
    int byte = io.read();
    if (byte < 0)
        return std::nullopt;
    for (; byte >= 0 && byte != '\n'; byte = io.read()) {
        if (byte < ' ' && byte != '\t' && byte != '\r')
            throw IniError(number, "a control character, so this is no text");
        if (line.size() == longest)
            throw IniError(number, "longer than " + std::to_string(longest) + " bytes");
        line += static_cast<char>(byte);
    }
    return line;
}

bool isComment(std::string_view line) {
    return line.empty() || line.front() == ';' || line.front() == '#';
}

bool isSection(std::string_view line) {
    return line.size() > 2 && line.front() == '[' && line.back() == ']';
}

bool isEntry(std::string_view line) {
    return !withoutBlanks(line.substr(0, line.find('='))).empty() &&
           line.find('=') != std::string_view::npos;
}

} // namespace

bool looksLikeIni(Mz::QrBufferedIO& io) {
    constexpr std::size_t enough = 1024; // of a line, to decide
    try {
        for (std::size_t number = 1;; ++number) {
            const std::optional<std::string> line = nextLine(io, enough, number);
            if (!line)
                return false;
            const std::string_view content = withoutBlanks(*line);
            if (!isComment(content))
                return isSection(content) || isEntry(content);
        }
    } catch (const IniError&) {
        return false;
    }
}

std::vector<Settings::Entry> readIni(Mz::QrBufferedIO& io, const IniLimits& limits) {
    std::vector<Settings::Entry> entries;
    std::string section;
    for (std::size_t number = 1;; ++number) {
        const std::optional<std::string> line = nextLine(io, limits.lineLength, number);
        if (!line)
            return entries;
        const std::string_view content = withoutBlanks(*line);
        if (isComment(content))
            continue;
        if (isSection(content)) {
            section = withoutBlanks(content.substr(1, content.size() - 2));
        } else if (isEntry(content)) {
            if (entries.size() == limits.entries)
                throw IniError(number, "more than " + std::to_string(limits.entries) + " entries");
            const std::size_t sign = content.find('=');
            entries.push_back({section, std::string(withoutBlanks(content.substr(0, sign))),
                               std::string(withoutBlanks(content.substr(sign + 1)))});
        } else {
            throw IniError(number, "neither a section nor `key = value`");
        }
    }
}
