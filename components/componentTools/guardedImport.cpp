// SPDX-License-Identifier: BSL-1.0
/// Runs the child and derives the verdict from two sources: what the child has sent, and the way in
/// which its process ended. The child is killed as soon as its outcome has arrived: its end would
/// take longer, and nothing of it matters any more.
#include "components/componentTools/guardedImport.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/guarding/importConversation.h"
#include "components/componentTools/guarding/storedObject.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/exceptionText.h"
#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/probing/probeProcess.h"
#include "components/componentTools/records/readRecords.h"
#include "components/componentTools/uidText.h"

#include <algorithm>
#include <clocale>
#include <optional>
#include <set>
#include <sstream>
#include <stdexcept>
#include <utility>

namespace Mz::Tools {

namespace {

using Kit::ImportLimits;
using Kit::ImportVerdict;

/// The bytes that may wait for the rest of a message.
constexpr std::size_t mostPending = std::size_t{1} << 20;

/// Returns the recorded list of the component manager; nothing if it is not initialised.
std::string recordsOfManager() {
    std::ostringstream content;
    QrOutBuffer buffer(&content);
    QrBinaryStream stream(&buffer);
    QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()))->write(stream);
    return std::move(content).str();
}

/// Returns the search path of the folders in a recorded list.
std::wstring pathOfRecords(const std::string& recordedList) {
    std::istringstream content(recordedList);
    std::set<std::wstring> seen;
    std::vector<std::filesystem::path> folders;
    for (const RecordedLibrary& library : readRecords(content))
        if (seen.insert(library.directory).second)
            if (const auto folder = System::findFolder(library.directory))
                folders.push_back(*folder);
    return searchPathOf(folders);
}

/// Returns the first class if the component manager can make none of them.
std::optional<std::wstring> missingClass(const std::vector<QrUid>& classes) {
    class Search final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        explicit Search(const std::vector<QrUid>& wanted) : uids(wanted) {}
        Action process(QrCPtr<QrBuilderDescription> builder) override {
            const bool found = std::find(uids.begin(), uids.end(), builder->getUid()) != uids.end();
            return found ? Stop : Continue;
        }

      private:
        const std::vector<QrUid>& uids;
    } search(classes);
    if (classes.empty() || QrGetComponentManager()->enumerateBuilders(search) == QrEnum::Stop)
        return std::nullopt;
    return textOf(classes.front());
}

std::wstring seconds(std::chrono::milliseconds time) {
    const auto tenths = time.count() / 100;
    std::wstring text = std::to_wstring(tenths / 10);
    if (tenths % 10)
        text += L"." + std::to_wstring(tenths % 10);
    return text;
}

/// Returns the outcome of a process whose conversation is over, completed by its use of memory.
ImportOutcome completed(const ImportOutcome& outcome, const System::ChildResult& child,
                        const ImportLimits& limits) {
    if (outcome.verdict != ImportVerdict::outOfMemory)
        return outcome;
    if (child.memory >= limits.memory / 2)
        return {ImportVerdict::outOfMemory, std::to_wstring(limits.memory >> 20)};
    // It used little memory: it requested too much at once, or throws without need.
    return {ImportVerdict::threw, outcome.detail};
}

/// Returns the outcome of a process that ended by itself before its conversation was over.
ImportOutcome judgeEarlyEnd(const System::ChildResult& child,
                            const ImportConversation& conversation) {
    if (child.end == System::ChildResult::End::crashed)
        return {ImportVerdict::crashed, child.detail};
    if (child.end == System::ChildResult::End::unknown)
        return {ImportVerdict::answerLost, {}};
    if (!conversation.hasStarted())
        return {ImportVerdict::guardFailed,
                L"the process ended at once, with status " + std::to_wstring(child.status)};
    // The probe sends its outcome before it ends so, so something else has closed its pipe.
    if (child.status == answeredStatus)
        return {ImportVerdict::answerLost, {}};
    return {ImportVerdict::exited, std::to_wstring(child.status)};
}

ImportOutcome judge(const System::ChildResult& child, const ImportConversation& conversation,
                    const ImportLimits& limits) {
    using End = System::ChildResult::End;
    if (conversation.isOver())
        return completed(conversation.outcome(), child, limits);
    switch (child.end) {
    case End::notStarted: return {ImportVerdict::guardFailed, child.detail};
    case End::interrupted: return {ImportVerdict::interrupted, {}};
    case End::timedOut: return {ImportVerdict::timedOut, seconds(limits.time)};
    case End::outOfMemory:
        return {ImportVerdict::outOfMemory, std::to_wstring(limits.memory >> 20)};
    case End::tooMuchOutput: return {ImportVerdict::garbled, {}};
    default: return judgeEarlyEnd(child, conversation);
    }
}

/// Returns what the child does.
/// \throws std::exception if the manager's records cannot be sent or understood
ImportTask taskFor(const std::filesystem::path& file, const ImportLimits& limits,
                   const QrProcessControl* controller) {
    ImportTask task;
    task.recordedList = recordsOfManager();
    if (task.recordedList.empty())
        return task;
    task.searchPath =
        limits.searchPath.empty() ? pathOfRecords(task.recordedList) : limits.searchPath;
    task.locale = std::setlocale(LC_ALL, nullptr);
    task.fileName = toWideName(file).value_or(displayName(file));
    task.builderName = limits.builderName;
    task.refused = limits.memory * 2 + (std::uint64_t{1} << 30);
    task.answer = limits.answer;
    if (auto* const shown = const_cast<QrProcessControl*>(controller)) {
        task.progressShown = shown->isProgressShown();
        task.statusShown = shown->isStatusShown();
        task.errorShown = shown->isErrorShown();
    }
    return task;
}

/// Runs the child.
ImportOutcome converse(const System::InheritableFile& file, const ImportTask& task,
                       const ImportLimits& limits, QrProcessControl* controller,
                       ImportConversation& conversation) {
    std::string input = encode(task);
    System::ChildLimits allowed{limits.time, limits.memory, task.refused, mostPending,
                                [&] { return controller && controller->isInterrupted(); }};
    allowed.received = [&](std::string& output) { conversation.receive(output, input); };
    allowed.complete = [&] { return conversation.isOver(); };
    ProbeOptions options;
    options.program = limits.program;
    const System::ChildResult child = System::runChild(
        probeProgram(options), {importArgument, file.argument()}, allowed, {&input, &file});
    return judge(child, conversation, limits);
}

Kit::GuardedImport importByChild(const std::filesystem::path& path, const ImportTask& task,
                                 const ImportLimits& limits, QrProcessControl* controller) {
    Kit::GuardedImport result;
    const System::InheritableFile file(path);
    if (!file.isOpen()) {
        result.verdict = ImportVerdict::fileMissing;
        return result;
    }
    ImportConversation conversation(controller, limits);
    ImportOutcome outcome = converse(file, task, limits, controller, conversation);
    result.activity = conversation.activity;
    result.withoutFiles = conversation.confinement.files;
    result.withoutNetwork = conversation.confinement.network;
    result.withoutProcesses = conversation.confinement.processes;
    if (outcome.verdict == ImportVerdict::imported) {
        const ImportOutcome restored =
            restoreObject(std::move(conversation.object), limits, result.object);
        if (restored.verdict != ImportVerdict::imported)
            outcome = restored;
    }
    result.verdict = outcome.verdict;
    result.detail = std::move(outcome.detail);
    return result;
}

Kit::GuardedImport importOrRefuse(const std::filesystem::path& path, const ImportLimits& limits) {
    Kit::GuardedImport refused;
    QrProcessControl* const controller = QrGetProcessController();
    ImportTask task;
    try {
        task = taskFor(path, limits, controller);
    } catch (const QrStreamEx&) {
        refused.detail = L"the records of the component manager: " + exceptionText();
        return refused;
    } catch (const std::runtime_error&) {
        refused.detail = L"the records of the component manager: " + exceptionText();
        return refused;
    }
    if (task.recordedList.empty()) {
        refused.verdict = ImportVerdict::noManager;
        return refused;
    }
    if (const std::optional<std::wstring> missing = missingClass(limits.classes)) {
        refused.verdict = ImportVerdict::noClass;
        refused.detail = *missing;
        return refused;
    }
    // For an empty path the child's manager would search the folder of its program.
    if (task.searchPath.empty()) {
        refused.verdict = ImportVerdict::notTaken;
        return refused;
    }
    return importByChild(path, task, limits, controller);
}

/// The names and sentences of the verdicts. In a sentence, %a is the activity and %d the detail.
struct VerdictText {
    ImportVerdict verdict;
    const char* name;
    const wchar_t* sentence;
};

constexpr VerdictText texts[] = {
    {ImportVerdict::imported, "imported", L"imported by \"%d\", in a process of its own."},
    {ImportVerdict::fileMissing, "fileMissing",
     L"there is no such file, or it cannot be read, or it is not a regular one."},
    {ImportVerdict::noManager, "noManager",
     L"not imported, because the component manager is not initialised. Initialise it first."},
    {ImportVerdict::noClass, "noClass",
     L"not imported, because no component library makes objects of the class %d. Install the one "
     L"that does."},
    {ImportVerdict::notTaken, "notTaken", L"no import builder takes this file."},
    {ImportVerdict::gaveNothing, "gaveNothing", L"\"%d\" takes this file, but imports nothing."},
    {ImportVerdict::notPersistent, "notPersistent",
     L"an object of the class %d cannot come back from the importer's process, because the class "
     L"does not implement QrPersistant. Import the file without a guard, or extend the class."},
    {ImportVerdict::unknownClass, "unknownClass",
     L"an object of the class %d cannot come back from the importer's process, because no builder "
     L"makes objects of that class. Install the component library that has one."},
    {ImportVerdict::notStored, "notStored", L"the object cannot be stored: %d"},
    {ImportVerdict::threw, "threw", L"an exception ended %a: %d"},
    {ImportVerdict::programAborted, "programAborted", L"the importer gave up: %d"},
    {ImportVerdict::crashed, "crashed",
     L"%a crashed: %d. The host is not affected. Report it to the author of the importer."},
    {ImportVerdict::aborted, "aborted",
     L"%a aborted its process%d. The host is not affected. Report it to the author of the "
     L"importer."},
    {ImportVerdict::exited, "exited",
     L"%a ended its process with status %d. The host is not affected. Report it to the author of "
     L"the importer."},
    {ImportVerdict::timedOut, "timedOut",
     L"%a did not end within %d seconds. ImportLimits::time (--time-limit) allows more."},
    {ImportVerdict::outOfMemory, "outOfMemory",
     L"%a used more memory than the %d MiB allowed. ImportLimits::memory (--memory-limit) allows "
     L"more."},
    {ImportVerdict::interrupted, "interrupted", L"the import was interrupted."},
    {ImportVerdict::answerTooLong, "answerTooLong",
     L"the stored object has more than the %d MiB allowed. ImportLimits::answer allows more."},
    {ImportVerdict::tooManyCalls, "tooManyCalls",
     L"%a called the process controller more than %d times. ImportLimits::calls allows more."},
    {ImportVerdict::garbled, "garbled",
     L"%a sent bytes of its own in place of a result. The host is not affected."},
    {ImportVerdict::answerLost, "answerLost",
     L"the process ended without a result; the last activity was %a. It may have closed files "
     L"that it did not open."},
    {ImportVerdict::answerRejected, "answerRejected",
     L"the object that came back was rejected: %d"},
    {ImportVerdict::guardFailed, "guardFailed", L"the import could not be started: %d"},
};

const VerdictText& textFor(ImportVerdict verdict) {
    const auto* const found =
        std::find_if(std::begin(texts), std::end(texts),
                     [&](const VerdictText& text) { return text.verdict == verdict; });
    return found == std::end(texts) ? std::end(texts)[-1] : *found;
}

} // namespace

} // namespace Mz::Tools

namespace Mz::Kit {

const char* nameOf(ImportVerdict verdict) {
    return Tools::textFor(verdict).name;
}

std::wstring GuardedImport::sentence() const {
    return Tools::displayName(file) + L": " + reason();
}

std::wstring GuardedImport::reason() const {
    std::wstring text;
    for (const wchar_t* rest = Tools::textFor(verdict).sentence; *rest; ++rest) {
        if (*rest != L'%')
            text += *rest;
        else if (*++rest == L'd')
            text += detail;
        else
            text += activity.empty() ? std::wstring_view(L"the start of the process") : activity;
    }
    return text;
}

GuardedImport importGuarded(const std::filesystem::path& file, const ImportLimits& limits) {
    GuardedImport result = Tools::importOrRefuse(file, limits);
    result.file = file;
    return result;
}

} // namespace Mz::Kit
