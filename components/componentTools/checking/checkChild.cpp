// SPDX-License-Identifier: BSL-1.0
/// The process ends without exit handlers, because those of the library may fail. Before that, and
/// in the handlers of `abort` and `std::terminate`, it says so; whatever else ends it, the parent
/// process sees.
#include "components/componentTools/checking/checkChild.h"

#include "components/componentTools/checking/rules.h"
#include "components/componentTools/checking/survey.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/exceptionText.h"

#include <clocale>
#include <csignal>
#include <cstdlib>
#include <exception>

namespace Mz::Tools {

namespace {

constexpr int abortStatus = 3, usageStatus = 2;

System::AnswerPipe* answers = nullptr;
std::string abortMessage;

void onAbort(int) {
    answers->write(abortMessage.data(), abortMessage.size());
    System::endProcess(abortStatus);
}

void onTerminate() {
    std::wstring text = L"calls std::terminate";
    if (std::current_exception())
        text += L", because nothing catches an exception: " + exceptionText();
    const std::string message = CheckSender::faultMessage(text);
    answers->write(message.data(), message.size());
    System::endProcess(abortStatus);
}

} // namespace

void carryOut(const CheckTask& task, CheckSender& sender) {
    CheckContext context(task, sender);
    if (task.rules.empty())
        survey(context);
    bool usable = true;
    for (const std::string& id : task.rules) {
        const RuleEntry& entry = ruleEntry(id);
        context.begin(entry.facts);
        if (usable)
            entry.check(context);
        else
            sender.skipped();
        // The other rules would repeat the fault in other words.
        usable = usable && !(entry.needed && context.hasFinding());
    }
    sender.done();
}

int runCheckChild(const std::vector<std::string>& arguments) {
    if (arguments.size() < 4)
        return usageStatus;
    CheckTask task;
    try {
        task = decodeCheckTask(arguments[2]);
    } catch (const std::exception&) {
        return usageStatus;
    }
    task.file = System::pathOfArgument(arguments[3]);
    for (std::size_t index = 4; index < arguments.size(); ++index)
        task.samples.push_back(System::pathOfArgument(arguments[index]));
    System::AnswerPipe pipe;
    answers = &pipe;
    abortMessage = CheckSender::faultMessage(L"calls abort");
    System::confine(std::strtoull(arguments[1].c_str(), nullptr, 10));
    std::setlocale(LC_ALL, "");
    enterSurroundings(task);
    std::signal(SIGABRT, onAbort);
    std::set_terminate(onTerminate);
    CheckSender sender(
        [&](const std::string& message) { pipe.write(message.data(), message.size()); });
    carryOut(task, sender);
    System::endProcess(0);
}

} // namespace Mz::Tools
