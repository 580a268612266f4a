// SPDX-License-Identifier: BSL-1.0
#include "tools/mzcomponents/host.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/consoleText.h"
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/output.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"

#include <map>
#include <set>
#include <sstream>

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

void giveToManager(const Tools::RecordedLibraries& libraries) {
    std::stringstream bytes;
    Tools::writeRecordedList(bytes, libraries);
    QrInBuffer buffer(&bytes);
    QrBinaryStream stream(&buffer);
    const auto companion =
        QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
    companion->read(stream);
}

/// The normalised name of a folder.
std::wstring directoryOf(const std::filesystem::path& folder) {
    return Tools::candidateOf(folder / "file").directory;
}

/// The files that the manager may meet: it does not load them, or they have shown that it may.
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

/// By the names of folders, a file in each that the manager would load unseen.
using Doubts = std::map<std::wstring, std::filesystem::path>;

/// Whether the manager would load a file that cannot be recorded.
bool isLoadedUnseen(const std::filesystem::path& file) {
    if (Tools::candidateOf(file).fileName.empty())
        return false; // Nor does the manager see such a name.
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
        else if (isLoadedUnseen(left.path))
            doubts.emplace(Tools::candidateOf(left.path).directory, left.path);
    }
    return doubts;
}

/// Folders that are wrong themselves have been told of.
void tellOfDoubt(Tools::ConsoleController& controller, const std::filesystem::path& folder,
                 const std::filesystem::path& file) {
    if (!file.empty())
        controller.error(0, (shown(folder) + L": nothing of this folder is used, for " +
                             shown(file.filename()) +
                             L" is not in the record, and would be loaded without a trial")
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
    tellFaults(common.cache);
    if (!scanned.interrupted)
        start(safeOnes(options.folders));
}

void Host::tellFaults(const std::string& cache) {
    tellOfList(controller, widened(cache), scanned);
    complete = scanned.notWritten.empty();
    for (const Tools::ScannedFile& file : scanned.files) {
        if (!isFault(file.verdict))
            continue;
        controller.error(0, (shown(file.path) + L": " + Tools::sentenceOf(file.verdict)).c_str());
        // It is passed over, as in any host, but an error is never a success.
        complete = false;
    }
}

/// The folders in which the manager meets nothing but what the scan has recorded, or seen to work.
std::vector<std::filesystem::path> Host::safeOnes(std::vector<std::filesystem::path> folders) {
    const Judged judged(scanned);
    // Without one folder the manager may meet a file in another one, under another name.
    for (;;) {
        const Doubts doubts = doubtsAbout(folders, judged);
        if (doubts.empty())
            return folders;
        complete = false;
        const auto count = std::erase_if(folders, [&](const std::filesystem::path& folder) {
            const auto doubt = doubts.find(directoryOf(folder));
            if (doubt != doubts.end())
                tellOfDoubt(controller, folder, doubt->second);
            return doubt != doubts.end();
        });
        if (count == 0)
            return {}; // Of none of them, as far as names tell; then none is sure.
    }
}

void Host::start(const std::vector<std::filesystem::path>& folders) {
    previous = QrGetSystemProcessController();
    installed = true;
    QrSetSystemProcessController(&controller);
    const std::wstring searchPath = Tools::searchPathOf(folders);
    if (searchPath.empty())
        return; // The manager would take the folder of this program instead.
    Tools::RecordedLibraries known = scanned.libraries;
    known.insert(known.end(), scanned.unjudged.begin(), scanned.unjudged.end());
    giveToManager(known);
    const Activity activity(L"the component manager started");
    QrGetComponentManager()->initialize(searchPath.c_str());
}

Host::~Host() {
    // Libraries may ask for a controller while they are unloaded, long after this one is gone.
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
        return {}; // What another library throws when asked for its builder.
    }
}

std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder) {
    ExtensionCollector collector;
    try {
        builder.enumerateExtensions(collector);
    } catch (...) {
        return {}; // What another library throws when asked what it reads.
    }
    return collector.extensions;
}

} // namespace Mz::Commands
