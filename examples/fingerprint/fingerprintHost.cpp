// SPDX-License-Identifier: BSL-1.0
/// A host that leaves out components whose interfaces are not its own, and says why.
///
/// The files are read before the component manager loads anything. `explainFile` compares the
/// interfaces of each with those of the program in which it runs: this one.
#include "components/componentKit/hostKit.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/explain.h"
#include "greeter.h"

#include <algorithm>
#include <iostream>
#include <vector>

using namespace Mz;

namespace {

/// Returns whether the library fits this host. Writes the reason if it does not.
bool fits(const std::filesystem::path& library) {
    const Tools::Explanation explanation = Tools::explainFile(library);
    if (Tools::severityOf(explanation.verdict.verdict) == Tools::Severity::good)
        return true;
    std::cout << utf8Name(library.filename()) << ": "
              << toUtf8(Tools::sentenceOf(explanation.verdict)) << ".\n  > "
              << toUtf8(Tools::cureOf(explanation.verdict)) << ".\n";
    return false;
}

/// Returns the search path of the folders in which everything fits.
std::wstring fittingFolders(const std::filesystem::path& components) {
    std::vector<std::filesystem::path> folders;
    for (const auto& folder : std::filesystem::directory_iterator(components))
        folders.push_back(folder.path());
    std::sort(folders.begin(), folders.end());
    std::wstring path;
    for (const std::filesystem::path& folder : folders) {
        const std::filesystem::directory_iterator files(folder);
        if (std::all_of(begin(files), end(files), [](const auto& file) { return fits(file); }))
            path += Kit::searchPath(folder) + L';';
    }
    return path;
}

} // namespace

int main() {
    const std::wstring path = fittingFolders(Kit::programFolder() / "components");
    QrGetComponentManager()->initialize(path.c_str());
    for (const QrUid& uid : {englishGreeterUid, frenchGreeterUid})
        if (const auto greeter = Kit::create<Greeter>(uid))
            std::cout << greeter->language() << ": " << greeter->greeting("world") << '\n';
}
