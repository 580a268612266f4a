// SPDX-License-Identifier: BSL-1.0
/// Loads only libraries that a probe has loaded before. The manager searches whole folders, so a
/// folder is used only if each of its files is recorded, was tried, or is skipped by the manager.
/// All others would be loaded into this process untried.
#include "tools/mzcomponents/host.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/consoleText.h"
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/output.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"

#include <functional>
#include <map>
#include <set>
#include <sstream>
#include <utility>

namespace Mz::Commands {

namespace {

class BuilderCollector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        builders.push_back(std::move(builder));
        return Continue;
    }
    std::vector<QrCPtr<QrBuilderDescription>> builders;
};

class ExtensionCollector final : public QrEnumerator<const wchar_t*> {
  public:
    Action process(const wchar_t* extension) override {
        extensions.emplace_back(textOrEmpty(extension));
        return Continue;
    }
    std::vector<std::wstring> extensions;
};

void loadIntoManager(const Tools::RecordedLibraries& libraries) {
    std::stringstream bytes;
    Tools::writeRecordedList(bytes, libraries);
    QrInBuffer buffer(&bytes);
    QrBinaryStream stream(&buffer);
    const auto companion =
        QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
    companion->read(stream);
}

/// Returns the normalised name of a folder.
std::wstring directoryOf(const std::filesystem::path& folder) {
    return Tools::candidateOf(folder / "file").directory;
}

/// The files that are safe for the manager: it does not load them, or a probe has loaded them.
class Judged {
  public:
    explicit Judged(const Tools::ScanResult& scanned) {
        for (const Tools::ScannedFile& file : scanned.files)
            if (file.recorded || file.verdict.verdict == Tools::Verdict::textNotCarried ||
                file.verdict.verdict == Tools::Verdict::needsHost)
                names.emplace(file.directory, file.fileName);
    }
    bool has(const Tools::Candidate& candidate) const {
        return names.contains({candidate.directory, candidate.fileName});
    }

  private:
    std::set<std::pair<std::wstring, std::wstring>> names;
};

/// Maps the normalised names of folders to a file in each that the manager would load untried. The
/// file is empty if the folder itself is faulty.
using Doubts = std::map<std::wstring, std::filesystem::path>;

/// Returns whether the manager would load a file that cannot be recorded.
bool isLoadedUntried(const std::filesystem::path& file) {
    if (Tools::candidateOf(file).fileName.empty())
        return false; // The manager does not see such a name either.
    Tools::ExplainOptions fromOutside;
    fromOutside.followDependencies = false;
    const Tools::Finding seen = Tools::explainFile(file, fromOutside).verdict;
    return Tools::severityOf(seen.verdict) != Tools::Severity::bystander;
}

Doubts doubtsAbout(const std::vector<std::filesystem::path>& folders, const Judged& judged) {
    Doubts doubts;
    const Tools::Discovery discovery = Tools::discover(folders);
    for (const Tools::Candidate& candidate : discovery.candidates)
        if (!judged.has(candidate))
            doubts.emplace(candidate.directory, candidate.path);
    for (const Tools::Discovery::LeftOut& left : discovery.leftOut) {
        if (left.folder)
            doubts.emplace(directoryOf(left.path), std::filesystem::path());
        else if (isLoadedUntried(left.path))
            doubts.emplace(Tools::candidateOf(left.path).directory, left.path);
    }
    return doubts;
}

/// Reports a skipped folder. A faulty folder, without a file, was already reported by the scan.
void reportSkippedFolder(Tools::ConsoleController& controller, const std::filesystem::path& folder,
                         const std::filesystem::path& file) {
    if (!file.empty())
        controller.error(0, (shown(folder) + L": this folder is skipped, because " +
                             shown(file.filename()) +
                             L" is not recorded and would be loaded without a trial")
                                .c_str());
}

} // namespace

Host::Host(const Common& common, const ProbeArguments& probe) {
    reserveResults();
    guardExit();
    Tools::ScanOptions options;
    options.folders = Tools::foldersOf(Tools::pathOf(common.path));
    if (!common.cache.empty())
        options.list = Tools::pathOf(common.cache);
    options.probe = probe.options();
    options.probe.interrupted = [this] { return controller.isInterrupted(); };
    scanned = Tools::scan(options);
    reportFaults(common.cache);
    if (!scanned.interrupted)
        start(safeFolders(options.folders));
}

void Host::reportFaults(const std::string& cache) {
    reportList(controller, toWide(cache), scanned);
    complete = scanned.notWritten.empty();
    for (const Tools::ScannedFile& file : scanned.files) {
        if (!isFault(file.verdict))
            continue;
        controller.error(0, (shown(file.path) + L": " + Tools::sentenceOf(file.verdict)).c_str());
        // The file is skipped, as in any host, but every reported error causes status 1.
        complete = false;
    }
}

/// Returns the folders in which every file is safe for the manager.
std::vector<std::filesystem::path> Host::safeFolders(std::vector<std::filesystem::path> folders) {
    const Judged judged(scanned);
    // Repeat: without one folder, the manager finds a file in another one, under another name.
    for (;;) {
        const Doubts doubts = doubtsAbout(folders, judged);
        if (doubts.empty())
            return folders;
        complete = false;
        const auto count = std::erase_if(folders, [&](const std::filesystem::path& folder) {
            const auto doubt = doubts.find(directoryOf(folder));
            if (doubt != doubts.end())
                reportSkippedFolder(controller, folder, doubt->second);
            return doubt != doubts.end();
        });
        if (count == 0)
            return {}; // The folder in doubt cannot be identified, so no folder is safe.
    }
}

void Host::start(const std::vector<std::filesystem::path>& folders) {
    previous = QrGetSystemProcessController();
    installed = true;
    QrSetSystemProcessController(&controller);
    const std::wstring searchPath = Tools::searchPathOf(folders);
    if (searchPath.empty())
        return; // For an empty path the manager would search the program's folder.
    Tools::RecordedLibraries known = scanned.libraries;
    known.insert(known.end(), scanned.unjudged.begin(), scanned.unjudged.end());
    loadIntoManager(known);
    const Activity activity(L"the component manager started");
    QrGetComponentManager()->initialize(searchPath.c_str());
}

Host::~Host() {
    // Libraries may use the process's controller while they are unloaded, after this object's end.
    if (installed)
        QrSetSystemProcessController(previous);
}

std::vector<QrCPtr<QrBuilderDescription>> Host::builders() const {
    BuilderCollector collector;
    QrGetComponentManager()->enumerateBuilders(collector);
    return std::move(collector.builders);
}

QrCPtr<QrImportBuilder> importBuilder(const QrBuilderDescription& description) {
    try {
        const QrCRefPtr<QrComponentBuilder> builder = description.getBuilder();
        return builder ? queryCast<QrImportBuilder>(const_cast<QrComponentBuilder*>(builder.get()))
                       : QrPtr<QrImportBuilder>();
    } catch (...) {
        return {}; // The library's `getBuilder` threw.
    }
}

std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder) {
    ExtensionCollector collector;
    try {
        builder.enumerateExtensions(collector);
    } catch (...) {
        return {}; // The library's `enumerateExtensions` threw.
    }
    return collector.extensions;
}

} // namespace Mz::Commands
