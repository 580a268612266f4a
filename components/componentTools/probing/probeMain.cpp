// SPDX-License-Identifier: BSL-1.0
/// The program `mzcomponents-probe FILE MEMORY`. With `--check` as its first argument it is the
/// child process of a check (`checking/checkChild.h`), with `--profile` that of the measurement of
/// a start (`profiling/profileChild.h`), with `--import` that of a guarded import
/// (`guarding/importChild.h`). Else the program loads one library, requests
/// its description as the component manager does, and reports on standard output.
/// libMZcomponentTools starts it. Before each stage it reports the stage, so that the parent
/// process knows where a crash happened. It ends without running exit handlers, because the
/// library's handlers and destructors may fail.
#include "components/componentManager/componentImp.h"
#include "components/componentManager/recordFormat.h"
#include "components/componentTools/checking/checkChild.h"
#include "components/componentTools/guarding/importChild.h"
#include "components/componentTools/guarding/importMessages.h"
#include "components/componentTools/platform/confinement.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/fatalFaults.h"
#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/profiling/profileChild.h"
#include "components/platform/platform.h"

#include <clocale>
#include <cstdio>
#include <cstdlib>

#ifdef MZ_UNLIMITED_ADDRESSES
/// Lets a crash end the process by its signal under the sanitizers too.
extern "C" MZ_EXPORT const char* __asan_default_options() {
    return "handle_segv=0:handle_sigbus=0:handle_sigill=0:handle_sigfpe=0:handle_abort=0:"
           "detect_leaks=0";
}
#endif

using namespace Mz;
using namespace Mz::Tools;

namespace {

System::AnswerPipe* answers = nullptr;

void send(const std::string& message) {
    answers->write(message.data(), message.size());
}

void sendFault(Verdict verdict, const std::wstring& subject = {}, const std::wstring& words = {}) {
    send(encodeFault(verdict, subject, words));
}

/// Copies the builder descriptions, with the same calls as the manager. Reports an item that is no
/// builder description, which the manager cannot.
class Collector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    explicit Collector(std::vector<RecordedBuilder>& target) : builders(target) {}

    Action process(QrCPtr<QrBuilderDescription> item) override {
        wrongItem = item ? L"an object of another interface" : L"null";
        const auto description =
            QrCPtr<QrBuilderDescription>::adopt(safeCast<QrBuilderDescription>(item.get()));
        wrongItem = nullptr;
        detail::copyDescription(*description, builders.emplace_back());
        return Continue;
    }

    const wchar_t* wrongItem = nullptr;

  private:
    std::vector<RecordedBuilder>& builders;
};

void describe(QrGetComponentDescriptionFunction* entryPoint, const wchar_t*& wrongItem) {
    const QrPtr<QrCastable> described = entryPoint();
    if (!described)
        return sendFault(Verdict::nullDescription);
    const auto description = queryCast<QrComponentDescription>(described.get());
    if (!description)
        return sendFault(Verdict::wrongInterface);
    send(encodeStage(Stage::describing));
    Description answer;
    int64 unused = 0;
    answer.announced = detail::copyDescription(*description, unused, answer.text, answer.label);
    send(encodeStage(Stage::enumerating));
    Collector collector(answer.builders);
    try {
        description->enumerateBuilders(collector);
    } catch (...) {
        wrongItem = collector.wrongItem;
        throw;
    }
    send(encodeDescription(answer));
}

void describeGuarded(QrGetComponentDescriptionFunction* entryPoint) {
    const wchar_t* wrongItem = nullptr;
    try {
        describe(entryPoint, wrongItem);
    } catch (const QrComponentManagerEx::ExBadCast&) {
        if (wrongItem)
            return sendFault(Verdict::wrongItem, wrongItem);
        const Finding finding = exceptionFinding(Verdict::threw, {});
        sendFault(finding.verdict, finding.subject, finding.words);
    } catch (...) {
        const Finding finding = exceptionFinding(Verdict::threw, {});
        sendFault(finding.verdict, finding.subject, finding.words);
    }
}

void probe(const System::NativePath& file) {
    if (!platform::exportsFunction(file.native(), entryPointName))
        return sendFault(Verdict::noEntryPoint);
    send(encodeStage(Stage::loading));
    const platform::Module module = platform::loadLibrary(file.native());
    if (!module) {
        const std::wstring fault = System::caughtFault();
        if (!fault.empty())
            return sendFault(Verdict::crashed, {}, fault);
        return sendFault(Verdict::loadFailed, {}, System::loaderError(file));
    }
    send(encodeStage(Stage::entryPoint));
    const auto entryPoint = reinterpret_cast<QrGetComponentDescriptionFunction*>(
        platform::findSymbol(module, entryPointName));
    if (!entryPoint)
        return sendFault(Verdict::entryPointNoFunction);
    describeGuarded(entryPoint);
}

} // namespace

int main(int argc, char** argv) {
    const std::vector<std::string> arguments = System::arguments(argc, argv);
    if (!arguments.empty() && arguments[0] == checkArgument)
        return runCheckChild(arguments);
    if (!arguments.empty() && arguments[0] == profileArgument)
        return runProfileChild(arguments);
    if (!arguments.empty() && arguments[0] == importArgument)
        return runImportChild(arguments, System::confineToReading);
    if (arguments.size() != 2) {
        std::fputs("mzcomponents-probe is started by libMZcomponentTools; see mzcomponents\n",
                   stderr);
        return 2;
    }
    System::AnswerPipe pipe;
    answers = &pipe;
    System::confine(std::strtoull(arguments[1].c_str(), nullptr, 10));
    std::setlocale(LC_ALL, "");
    reportFatalFaults(pipe, encodeFault);
    send(encodeStage(Stage::starting));
    probe(System::pathOfArgument(arguments[0]));
    System::endProcess(answeredStatus);
}
