// SPDX-License-Identifier: BSL-1.0
/// Results have their own stream, whose buffer is exchanged when components may start to print.
/// JSON is ASCII. Lines use the terminal's encoding, with control characters escaped.
#include "tools/mzcomponents/output.h"
#include "components/componentTools/consoleText.h"
#include "components/componentTools/uidText.h"

#include "components/base/exBase.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/console.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/reasonText.h"
#include "components/componentTools/standardOutput.h"

#include <algorithm>
#include <exception>
#include <iostream>
#include <vector>

namespace Mz::Commands {

std::string utf8(const std::wstring& text) {
    return toUtf8(text);
}

std::ostream& results() {
    static std::ostream stream(std::cout.rdbuf());
    return stream;
}

void reserveResults() {
    static Tools::ReservedOutput reserved;
    results().rdbuf(&reserved);
}

bool flushResults() {
    // The command line parser writes its help to `std::cout`.
    const bool helped = static_cast<bool>(std::cout.flush());
    return static_cast<bool>(results().flush()) && helped;
}

void printError(const std::wstring& text) {
    std::cerr << "mzcomponents: " << Tools::forOutput(Tools::withoutControls(text)) << std::endl;
}

std::wstring toWide(const std::string& bytes) {
    return Tools::displayName(Tools::pathOf(bytes));
}

std::wstring exceptionText() {
    try {
        throw;
    } catch (const ExBase& failure) {
        return Tools::reasonText(failure.getReason());
    } catch (const std::exception& failure) {
        return toWide(failure.what());
    } catch (...) {
        return L"a component threw what is no exception of any known kind";
    }
}

std::wstring shown(const std::filesystem::path& path) {
    return Tools::withoutControls(Tools::displayName(path));
}

void reportList(Tools::ConsoleController& controller, const std::wstring& list,
                const Tools::ScanResult& result) {
    const std::wstring name = Tools::withoutControls(list);
    if (!result.rejected.empty())
        controller.warning(0, (name + L": this is no recorded list: " + result.rejected).c_str());
    if (!result.keptAs.empty())
        controller.warning(0,
                           (name + L": what was in it is kept as " + shown(result.keptAs)).c_str());
    if (!result.notWritten.empty())
        controller.error(0, Tools::withoutControls(result.notWritten).c_str());
}

void printLine(const std::wstring& text) {
    results() << Tools::forOutput(Tools::withoutControls(text)) << '\n';
}

void printJson(const Json& value) {
    results() << value.dump(2, ' ', true) << '\n';
}

Json jsonOf(const Tools::Finding& finding) {
    return {{"verdict", Tools::nameOf(finding.verdict)},
            {"sentence", utf8(Tools::sentenceOf(finding))},
            {"cure", utf8(Tools::cureOf(finding))}};
}

Json jsonOf(const Tools::RecordedBuilder& builder) {
    return {{"uid", utf8(Tools::textOf(builder.uid))},
            {"name", utf8(builder.name)},
            {"label", utf8(builder.label)},
            {"text", utf8(builder.text)},
            {"number", builder.number},
            {"flag", builder.flag}};
}

Json jsonOf(const Tools::RecordedLibrary& library) {
    Json builders = Json::array();
    for (const Tools::RecordedBuilder& builder : library.builders) {
        builders.push_back(jsonOf(builder));
        builders.back()["position"] = builder.position;
    }
    return {{"position", library.position},
            {"directory", utf8(library.directory)},
            {"fileName", utf8(library.fileName)},
            {"time", library.time},
            {"size", library.size},
            {"builders", builders}};
}

std::wstring counted(std::size_t count, const wchar_t* one, const wchar_t* several) {
    return std::to_wstring(count) + L" " + (count == 1 ? one : several);
}

std::wstring padded(std::wstring text, std::size_t width) {
    text.resize(std::max(text.size(), width), L' ');
    return text;
}

std::wstring nameOf(const Tools::Finding& finding) {
    const std::string name = Tools::nameOf(finding.verdict);
    return std::wstring(name.begin(), name.end());
}

bool isFault(const Tools::Finding& finding) {
    return Tools::severityOf(finding.verdict) == Tools::Severity::fault;
}

} // namespace Mz::Commands
