// SPDX-License-Identifier: BSL-1.0
/// A line without a reason is refused: whoever reads the file later must know whether the
/// suppression is still needed.
#include "tools/mzcomponents/suppressions.h"

#include "components/componentTools/check.h"
#include "components/componentTools/consoleText.h"
#include "tools/mzcomponents/output.h"

#include <fstream>
#include <iomanip>
#include <sstream>

namespace Mz::Commands {

bool Suppressions::read(const std::string& file) {
    name = file;
    std::ifstream stream(Tools::pathOf(file));
    if (!stream) {
        printError(toWide(file) + L": this file of suppressions cannot be read");
        return false;
    }
    bool valid = true;
    std::string text;
    for (int number = 1; std::getline(stream, text); ++number)
        valid = parse(text, number) && valid;
    return valid;
}

bool Suppressions::parse(const std::string& text, int number) {
    std::istringstream words(text);
    Line line{number, {}, {}, {}, false};
    if (!(words >> line.rule) || line.rule.starts_with('#'))
        return true;
    words >> std::quoted(line.library) >> std::ws;
    std::getline(words, line.reason);
    while (!line.reason.empty() && static_cast<unsigned char>(line.reason.back()) <= ' ')
        line.reason.pop_back();
    if (!Tools::findCheckRule(line.rule)) {
        complain(number, L"there is no rule " + toWide(line.rule));
        return false;
    }
    if (line.library.empty() || line.reason.empty()) {
        complain(number, L"a rule, a library and a reason are needed");
        return false;
    }
    lines.push_back(std::move(line));
    return true;
}

std::wstring Suppressions::reasonFor(const std::string& rule,
                                     const std::filesystem::path& library) {
    for (Line& line : lines)
        if (line.rule == rule &&
            (line.library == "*" || Tools::pathOf(line.library) == library.filename())) {
            line.used = true;
            return toWide(line.reason);
        }
    return {};
}

void Suppressions::printUnused() const {
    for (const Line& line : lines)
        if (!line.used)
            complain(line.number, L"this suppression is not needed any more");
}

void Suppressions::complain(int number, const std::wstring& text) const {
    printError(toWide(name) + L":" + std::to_wstring(number) + L": " + text);
}

} // namespace Mz::Commands
