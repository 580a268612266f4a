// SPDX-License-Identifier: BSL-1.0
/// JUnit XML is written by hand: it is a few elements, and a library for XML would be one more
/// thing to install.
#include "tools/mzcomponents/checkReports.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/uidText.h"

#include "components/componentManager/utf8.h"

#include <algorithm>

namespace Mz::Commands {

namespace {

std::wstring sentenceOf(const Tools::CheckFinding& finding) {
    return finding.place.empty() ? finding.sentence : finding.place + L": " + finding.sentence;
}

/// Returns the command that repeats the finding.
std::wstring commandOf(const Tools::CheckResult& result, const Tools::CheckFinding& finding) {
    return L"mzcomponents check \"" + shown(result.file) + L"\" --reproduce " +
           wide(finding.reproduce.c_str());
}

bool fails(const CheckedLibrary& library, std::size_t index, Tools::Grade failOn) {
    return library.reasons[index].empty() && library.result.findings[index].rule->grade >= failOn;
}

/// Returns text for XML, in UTF-8. Characters that XML cannot contain become U+FFFD.
std::string xmlOf(const std::wstring& text) {
    std::string result;
    for (const char character : toUtf8(text))
        switch (character) {
        case '&': result += "&amp;"; break;
        case '<': result += "&lt;"; break;
        case '>': result += "&gt;"; break;
        case '"': result += "&quot;"; break;
        case '\n': result += "&#10;"; break;
        case '\t': result += "&#9;"; break;
        default:
            if (static_cast<unsigned char>(character) < ' ')
                result += "\xEF\xBF\xBD";
            else
                result += character;
        }
    return result;
}

Json jsonOfFinding(const CheckedLibrary& library, std::size_t index) {
    const Tools::CheckFinding& finding = library.result.findings[index];
    return {{"rule", finding.rule->id},       {"grade", Tools::nameOf(finding.rule->grade)},
            {"place", utf8(finding.place)},   {"sentence", utf8(finding.sentence)},
            {"reproduce", finding.reproduce}, {"suppressed", utf8(library.reasons[index])}};
}

bool isNotRun(const Tools::CheckResult& result, const Tools::CheckRule* rule) {
    return std::find(result.notRun.begin(), result.notRun.end(), rule) != result.notRun.end();
}

/// Returns the test case of one rule.
std::string junitCase(const CheckedLibrary& library, const Tools::CheckRule& rule,
                      Tools::Grade failOn, int& failures, int& skipped) {
    const std::string suite = xmlOf(shown(library.result.file.filename()));
    std::string failure, output;
    for (std::size_t index = 0; index < library.result.findings.size(); ++index) {
        const Tools::CheckFinding& finding = library.result.findings[index];
        if (finding.rule != &rule)
            continue;
        const std::wstring text = sentenceOf(finding);
        std::string& target = fails(library, index, failOn) ? failure : output;
        target += xmlOf(text + L"\n" + commandOf(library.result, finding) + L"\n");
    }
    std::string text = "    <testcase classname=\"" + suite + "\" name=\"" + rule.id + "\">";
    if (!failure.empty()) {
        ++failures;
        text += "<failure message=\"" + xmlOf(rule.title) + "\">" + failure + "</failure>";
    } else if (isNotRun(library.result, &rule)) {
        ++skipped;
        text += "<skipped/>";
    }
    if (!output.empty())
        text += "<system-out>" + output + "</system-out>";
    return text + "</testcase>\n";
}

Json sarifRules() {
    Json rules = Json::array();
    for (const Tools::CheckRule* rule : Tools::checkRules())
        rules.push_back({{"id", rule->id},
                         {"shortDescription", {{"text", utf8(rule->title)}}},
                         {"fullDescription", {{"text", utf8(rule->explanation)}}},
                         {"defaultConfiguration", {{"level", Tools::nameOf(rule->grade)}}},
                         {"properties", {{"group", rule->group}}}});
    return rules;
}

Json sarifResult(const CheckedLibrary& library, std::size_t index) {
    const Tools::CheckFinding& finding = library.result.findings[index];
    const std::u8string uri = library.result.file.generic_u8string();
    Json result{
        {"ruleId", finding.rule->id},
        {"level", Tools::nameOf(finding.rule->grade)},
        {"message", {{"text", utf8(sentenceOf(finding))}}},
        {"locations",
         Json::array({{{"physicalLocation",
                        {{"artifactLocation", {{"uri", std::string(uri.begin(), uri.end())}}}}}}})},
        {"properties", {{"reproduce", utf8(commandOf(library.result, finding))}}}};
    if (!library.reasons[index].empty())
        result["suppressions"] =
            Json::array({{{"kind", "external"}, {"justification", utf8(library.reasons[index])}}});
    return result;
}

} // namespace

std::wstring wide(const char* ascii) {
    return std::wstring(ascii, ascii + std::char_traits<char>::length(ascii));
}

bool anyFails(const std::vector<CheckedLibrary>& libraries, Tools::Grade failOn) {
    for (const CheckedLibrary& library : libraries)
        for (std::size_t index = 0; index < library.result.findings.size(); ++index)
            if (fails(library, index, failOn))
                return true;
    return false;
}

void printChecks(const std::vector<CheckedLibrary>& libraries) {
    std::size_t counts[3] = {}, suppressed = 0;
    for (const CheckedLibrary& library : libraries)
        for (std::size_t index = 0; index < library.result.findings.size(); ++index) {
            const Tools::CheckFinding& finding = library.result.findings[index];
            if (!library.reasons[index].empty()) {
                ++suppressed;
                continue;
            }
            ++counts[static_cast<std::size_t>(finding.rule->grade)];
            printLine(shown(library.result.file) + L": " +
                      wide(Tools::nameOf(finding.rule->grade)) + L": " + sentenceOf(finding) +
                      L" [" + wide(finding.rule->id) + L"]");
            if (finding.reproduce != finding.rule->id)
                printLine(L"    repeat it: " + commandOf(library.result, finding));
        }
    printLine(counted(libraries.size(), L"library", L"libraries") + L": " +
              counted(counts[2], L"error", L"errors") + L", " +
              counted(counts[1], L"warning", L"warnings") + L", " +
              counted(counts[0], L"note", L"notes") +
              (suppressed ? L"; " + std::to_wstring(suppressed) + L" suppressed" : L""));
}

Json jsonOf(const std::vector<CheckedLibrary>& libraries) {
    Json list = Json::array();
    for (const CheckedLibrary& library : libraries) {
        Json findings = Json::array(), notRun = Json::array(), builders = Json::array();
        for (std::size_t index = 0; index < library.result.findings.size(); ++index)
            findings.push_back(jsonOfFinding(library, index));
        for (const Tools::CheckRule* rule : library.result.notRun)
            notRun.push_back(rule->id);
        for (const Tools::CheckedBuilder& builder : library.result.builders)
            builders.push_back(
                {{"uid", utf8(Tools::textOf(builder.uid))}, {"name", utf8(builder.name)}});
        list.push_back({{"file", utf8(Tools::displayName(library.result.file))},
                        {"findings", findings},
                        {"notRun", notRun},
                        {"builders", builders},
                        {"interrupted", library.result.interrupted}});
    }
    return {{"libraries", list}};
}

std::string junitOf(const std::vector<CheckedLibrary>& libraries, Tools::Grade failOn) {
    std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<testsuites>\n";
    for (const CheckedLibrary& library : libraries) {
        int failures = 0, skipped = 0;
        std::string cases;
        for (const Tools::CheckRule* rule : Tools::checkRules())
            cases += junitCase(library, *rule, failOn, failures, skipped);
        text += "  <testsuite name=\"" + xmlOf(shown(library.result.file)) + "\" tests=\"" +
                std::to_string(Tools::checkRules().size()) + "\" failures=\"" +
                std::to_string(failures) + "\" skipped=\"" + std::to_string(skipped) + "\">\n" +
                cases + "  </testsuite>\n";
    }
    return text + "</testsuites>\n";
}

std::string sarifOf(const std::vector<CheckedLibrary>& libraries) {
    Json list = Json::array();
    for (const CheckedLibrary& library : libraries)
        for (std::size_t index = 0; index < library.result.findings.size(); ++index)
            list.push_back(sarifResult(library, index));
    const Json log{{"$schema", "https://json.schemastore.org/sarif-2.1.0.json"},
                   {"version", "2.1.0"},
                   {"runs", Json::array({{{"tool",
                                           {{"driver",
                                             {{"name", "mzcomponents check"},
                                              {"version", MZ_VERSION},
                                              {"rules", sarifRules()}}}}},
                                          {"results", list}}})}};
    return log.dump(2, ' ', true) + "\n";
}

} // namespace Mz::Commands
