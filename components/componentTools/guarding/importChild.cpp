// SPDX-License-Identifier: BSL-1.0
/// Starts a component manager with the records of the host's, so that no library is loaded but
/// those that the import needs. The import builders are asked in the order of `QrBaseImporter`,
/// which cannot be used itself: before each call the child says which builder it calls, so that the
/// host can name the one that ended the process. The process ends without exit handlers, because
/// those of the libraries may fail.
#include "components/componentTools/guarding/importChild.h"

#include "components/base/assertions.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/guarding/relayController.h"
#include "components/componentTools/guarding/storedObject.h"
#include "components/componentTools/probing/exceptionText.h"
#include "components/componentTools/probing/fatalFaults.h"
#include "components/componentTools/probing/probeAnswer.h"

#include <algorithm>
#include <clocale>
#include <new>
#include <sstream>

namespace Mz::Tools {

namespace {

using Kit::ImportVerdict;

constexpr int usageStatus = 2;

System::AnswerPipe* answers = nullptr;

void send(const std::string& message) {
    answers->write(message.data(), message.size());
}

/// Ends this process.
[[noreturn]] void finish(const ImportOutcome& outcome) {
    ImportOutcome sent = outcome;
    sent.detail.resize(std::min(sent.detail.size(), longestText));
    std::erase(sent.detail, L'\0');
    send(encode(sent));
    System::endProcess(answeredStatus);
}

/// The encoder of `reportFatalFaults`.
std::string encodeFatalFault(Verdict, const std::wstring&, const std::wstring& words) {
    return encode(ImportOutcome{ImportVerdict::aborted, words.substr(0, longestText)});
}

void announce(std::wstring activity) {
    activity.resize(std::min(activity.size(), longestText));
    send(encodeActivity(activity));
}

/// Says that the import builder with this label is about to be called.
void announce(const wchar_t* activity, const std::wstring& label) {
    announce(activity + (L" \"" + label + L"\""));
}

class DescriptionCollector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    explicit DescriptionCollector(const std::wstring& builderName) : name(builderName) {}
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        if (name.empty() || name == textOrEmpty(builder->getName()))
            builders.push_back(std::move(builder));
        return Continue;
    }
    std::vector<QrCPtr<QrBuilderDescription>> builders;

  private:
    const std::wstring& name;
};

class ExtensionSearch final : public QrEnumerator<const wchar_t*> {
  public:
    explicit ExtensionSearch(std::wstring wanted) : extension(std::move(wanted)) {}
    Action process(const wchar_t* known) override {
        return extension == textOrEmpty(known) ? Stop : Continue;
    }

  private:
    std::wstring extension;
};

/// An import builder and its label.
struct Importing {
    QrCPtr<QrImportBuilder> builder;
    std::wstring label;
};

/// The import itself.
class Import {
  public:
    Import(const ImportTask& given, std::istream& file) : task(given), buffer(&file) {}

    /// \throws whatever the import builders throw
    ImportOutcome run(std::string& stored) {
        findBuilders();
        const std::wstring extension = task.fileName.substr(task.fileName.rfind(L'.') + 1);
        for (const bool byExtension : {true, false})
            for (const Importing& candidate : builders)
                if ((!byExtension || reads(candidate, extension)) && takes(candidate))
                    return importBy(candidate, stored);
        return {ImportVerdict::notTaken, {}};
    }

  private:
    void findBuilders() {
        DescriptionCollector all(task.builderName);
        QrGetComponentManager()->enumerateBuilders(all);
        for (const QrCPtr<QrBuilderDescription>& description : all.builders) {
            const std::wstring label = description->getLabel();
            announce(L"the start of", label);
            const QrCRefPtr<QrComponentBuilder> builder =
                static_cast<const QrBuilderDescription&>(*description).getBuilder();
            if (const auto importing =
                    queryCast<QrImportBuilder>(const_cast<QrComponentBuilder*>(builder.get())))
                builders.push_back({importing, label});
        }
    }

    static bool reads(const Importing& candidate, const std::wstring& extension) {
        announce(L"enumerateExtensions of", candidate.label);
        ExtensionSearch search(extension);
        return candidate.builder->enumerateExtensions(search) == QrEnum::Stop;
    }

    bool takes(const Importing& candidate) {
        announce(L"canImport of", candidate.label);
        const int64 position = buffer.seek(0, 1);
        const bool taken =
            candidate.builder->canImport(QrPtr<QrBufferedIO>(&buffer), task.fileName.c_str(), L"");
        buffer.seek(position, 0);
        return taken;
    }

    ImportOutcome importBy(const Importing& candidate, std::string& stored) {
        announce(L"the import by", candidate.label);
        const QrRef<QrCastable> object =
            candidate.builder->import(QrPtr<QrBufferedIO>(&buffer), task.fileName.c_str(), L"");
        if (!object)
            return {ImportVerdict::gaveNothing, candidate.label};
        // Never released: its destructor does not matter, and may fail.
        static_cast<void>(QrRef<QrCastable>(object).detach());
        announce(L"the storing of the object of", candidate.label);
        ImportOutcome outcome = storeObject(object.get(), stored);
        if (outcome.verdict == ImportVerdict::imported)
            outcome.detail = candidate.label;
        return outcome;
    }

    const ImportTask& task;
    QrInBuffer buffer;
    std::vector<Importing> builders;
};

void startManager(const ImportTask& task) {
    std::istringstream content(task.recordedList);
    QrInBuffer buffer(&content);
    QrBinaryStream stream(&buffer);
    QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()))->read(stream);
    announce(L"the start of the component manager");
    QrGetComponentManager()->initialize(task.searchPath.c_str());
}

/// Returns the outcome, with the exception if there is one.
ImportOutcome importCaught(const ImportTask& task, std::istream& file, std::string& stored) {
    try {
        startManager(task);
        return Import(task, file).run(stored);
    } catch (const std::bad_alloc&) {
        return {ImportVerdict::outOfMemory, L"std::bad_alloc"};
    } catch (...) {
        return {ImportVerdict::threw, exceptionText()};
    }
}

} // namespace

int runImportChild(const std::vector<std::string>& arguments, System::Confinement (*confine)()) {
    std::ifstream file;
    if (arguments.size() != 2 || !System::takeInheritedFile(arguments[1], file))
        return usageStatus;
    System::AnswerPipe pipe(true);
    System::InputPipe input;
    answers = &pipe;
    HostMessages host(input);
    const std::optional<std::string> payload = host.next(ImportKind::task);
    const std::optional<ImportTask> task = payload ? decodeTask(*payload) : std::nullopt;
    if (!task)
        return usageStatus;
    System::confine(task->refused);
    std::setlocale(LC_ALL, task->locale.c_str());
    const System::Confinement given = confine();
    send(encode(ImportConfinement{given.files, given.network, given.processes}));
    reportFatalFaults(pipe, encodeFatalFault);
    RelayController controller(pipe, host, *task);
    QrSetSystemProcessController(&controller);

    std::string stored;
    ImportOutcome outcome = importCaught(*task, file, stored);
    if (outcome.verdict == ImportVerdict::imported && stored.size() > task->answer)
        outcome = {ImportVerdict::answerTooLong, std::to_wstring(task->answer >> 20)};
    if (outcome.verdict == ImportVerdict::imported)
        for (std::string_view rest = stored; !rest.empty();
             rest.remove_prefix(std::min(rest.size(), largestPiece)))
            send(encodePiece(rest.substr(0, largestPiece)));
    finish(outcome);
}

} // namespace Mz::Tools
