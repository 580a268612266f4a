// SPDX-License-Identifier: BSL-1.0
/// What a plug-ins dialog shows, as text: the plug-ins that work, with what they offer, and each
/// other file in their folder, with the reason why it is no plug-in and what to do about it.
///
/// The first part comes from the component manager, which has loaded the plug-ins. The second part
/// comes from libMZcomponentTools, which reads the files and runs nothing of them.
#include "components/componentKit/hostKit.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/explain.h"

#include <iostream>
#include <string>
#include <vector>

using namespace Mz;

namespace {

/// Writes text in the encoding of the terminal's locale.
void line(const std::wstring& text) {
    std::cout << toNarrow(text, '?') << '\n';
}

/// Lists the builders below the labels of their plug-ins. The manager lists them plug-in by
/// plug-in.
void listPlugins() {
    std::wstring plugin;
    for (const auto& builder : Kit::builders()) {
        const std::wstring label = builder->getComponentLabel();
        if (label != plugin)
            line(label + L": " + builder->getComponentText());
        plugin = label;
        const std::wstring text = builder->getText();
        line(L"  + " + std::wstring(builder->getLabel()) + (text.empty() ? L"" : L" " + text));
    }
}

/// Lists the files that are no plug-ins, each with its verdict.
void listOthers(const std::filesystem::path& folder) {
    const std::vector<std::filesystem::path> folders = {folder};
    Tools::ExplainOptions options;
    options.folders = &folders;
    for (const Tools::Candidate& candidate : Tools::discover(folders).candidates) {
        const Tools::Explanation explanation = Tools::explainFile(candidate.path, options);
        if (Tools::severityOf(explanation.verdict.verdict) == Tools::Severity::good)
            continue;
        line(displayName(candidate.path.filename()) + L": " +
             Tools::sentenceOf(explanation.verdict) + L".");
        if (const std::wstring cure = Tools::cureOf(explanation.verdict); !cure.empty())
            line(L"  > " + cure + L".");
    }
}

} // namespace

int main() {
    const auto folder = Kit::initialize(Kit::programFolder() / "plugins");
    std::cout << "Plug-ins\n--------\n";
    listPlugins();
    std::cout << "\nOther files\n-----------\n";
    listOthers(folder);
}
