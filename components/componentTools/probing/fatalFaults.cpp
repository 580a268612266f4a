// SPDX-License-Identifier: BSL-1.0
/// The message about `abort` is encoded in advance, because a signal handler must not allocate
/// memory. `std::terminate` is called as a function, so its message may name the exception.
#include "components/componentTools/probing/fatalFaults.h"

#include "components/base/exBase.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/probing/exceptionText.h"

#include <csignal>
#include <exception>
#include <new>

namespace Mz::Tools {

namespace {

constexpr int abortStatus = 3;

System::AnswerPipe* answers = nullptr;
FaultEncoder encodeMessage = nullptr;
std::string abortedMessage;

void onAbort(int) {
    answers->write(abortedMessage.data(), abortedMessage.size());
    System::endProcess(abortStatus);
}

void onTerminate() {
    Finding finding{Verdict::aborted, {}, L" (std::terminate)"};
    if (std::current_exception())
        finding = exceptionFinding(Verdict::aborted, L": uncaught exception: ");
    const std::string message = encodeMessage(finding.verdict, finding.subject, finding.words);
    answers->write(message.data(), message.size());
    System::endProcess(abortStatus);
}

} // namespace

Finding exceptionFinding(Verdict verdict, const std::wstring& before) {
    try {
        throw;
    } catch (const std::bad_alloc&) {
        return {Verdict::outOfMemory, {}, {}};
    } catch (const ExBase& failure) {
        return {verdict, {}, before + displayText(failure.getReason())};
    } catch (const std::exception& failure) {
        return {verdict, {}, before + foreignText(failure.what())};
    } catch (...) {
        return {verdict, {}, before + exceptionClass()};
    }
}

void reportFatalFaults(System::AnswerPipe& pipe, FaultEncoder encode) {
    answers = &pipe;
    encodeMessage = encode;
    abortedMessage = encode(Verdict::aborted, {}, {});
    std::signal(SIGABRT, onAbort);
    std::set_terminate(onTerminate);
}

} // namespace Mz::Tools
