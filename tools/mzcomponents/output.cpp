#include "tools/mzcomponents/output.h"

#include "components/componentTools/console.h"
#include "components/componentTools/utf8.h"

#include <iostream>

namespace Mz::Commands {

std::string utf8(const std::wstring& text) {
    return Tools::toUtf8(text);
}

void printLine(const std::wstring& text) {
    std::cout << Tools::forOutput(text) << '\n';
}

void printJson(const Json& value) {
    std::cout << value.dump(2, ' ', true) << '\n';
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
