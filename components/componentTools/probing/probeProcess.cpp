// SPDX-License-Identifier: BSL-1.0
/// Derives the verdict from two sources: the report of the child process, and the way in which the
/// process ended. A report is accepted only if it is complete and valid.
#include "components/componentTools/probing/probeProcess.h"

#include <string>

namespace Mz::Tools {

namespace {

std::wstring seconds(std::chrono::milliseconds time) {
    const auto tenths = time.count() / 100;
    std::wstring text = std::to_wstring(tenths / 10);
    return tenths % 10 ? text + L"." + std::to_wstring(tenths % 10) : text;
}

Finding memoryFinding(const ProbeAnswer& answer, const ProbeOptions& options) {
    return {Verdict::outOfMemory, nameOf(answer.stage), std::to_wstring(options.memoryLimit >> 20)};
}

/// Returns the fault that the child process reported, completed by the stage and the memory use.
Finding completed(const ProbeAnswer& answer, const System::ChildResult& child,
                  const ProbeOptions& options) {
    Finding fault = *answer.fault;
    if (fault.verdict == Verdict::outOfMemory) {
        if (child.memory >= options.memoryLimit / 2)
            return memoryFinding(answer, options);
        // The process used little memory: it requested too much at once, or throws without need.
        fault = {Verdict::threw, {}, L"std::bad_alloc"};
    }
    if (fault.subject.empty())
        fault.subject = nameOf(answer.stage);
    return fault;
}

/// Returns the verdict if the process exited without reporting a fault or a description.
Finding judgeMissingAnswer(const System::ChildResult& child, const ProbeAnswer& answer) {
    if (child.status != answeredStatus)
        return {Verdict::exited, nameOf(answer.stage), std::to_wstring(child.status)};
    // The probe sent its report completely, so the library must have closed or used the pipe.
    if (answer.cutOff)
        return {Verdict::garbled, L"its last message is not whole", {}};
    return {Verdict::answerLost, nameOf(answer.stage), {}};
}

} // namespace

std::filesystem::path probeProgram(const ProbeOptions& options) {
    if (!options.program.empty())
        return options.program;
    return System::moduleFolder() /
           (std::string("mzcomponents-probe") + System::programExtension());
}

std::uint64_t refusedMemory(const ProbeOptions& options) {
    return options.memoryLimit * 2 + (std::uint64_t{1} << 30);
}

Finding judgeEnd(const System::ChildResult& child, const ProbeAnswer& answer,
                 const ProbeOptions& options) {
    using End = System::ChildResult::End;
    const std::wstring stage = nameOf(answer.stage);
    switch (child.end) {
    case End::notStarted: return {Verdict::probeFailed, child.detail, {}};
    case End::interrupted: return {Verdict::interrupted, {}, {}};
    case End::timedOut: return {Verdict::timedOut, stage, seconds(options.timeLimit)};
    case End::outOfMemory: return memoryFinding(answer, options);
    case End::tooMuchOutput:
        return {Verdict::answerTooLong, std::to_wstring(longestAnswer >> 20), {}};
    default: break;
    }
    if (answer.garbled)
        return {Verdict::garbled, L"it contains bytes of another origin", {}};
    if (answer.fault)
        return completed(answer, child, options);
    // If the report is complete, the exit status does not matter.
    if (child.end == End::unknown && !answer.description)
        return {Verdict::endUnknown, stage, {}};
    if (child.end == End::crashed)
        return {Verdict::crashed, stage, child.detail};
    if (!answer.anything)
        return {Verdict::probeFailed,
                L"it ended at once, with status " + std::to_wstring(child.status),
                {}};
    if (!answer.description)
        return judgeMissingAnswer(child, answer);
    const std::size_t count = answer.description->builders.size();
    if (count == 0)
        return {Verdict::offersNothing, {}, {}};
    return {Verdict::works, std::to_wstring(count), {}};
}

} // namespace Mz::Tools
