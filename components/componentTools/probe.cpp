// SPDX-License-Identifier: BSL-1.0
/// Derives the verdict from two sources: the report of the child process, and the way in which the
/// process ended. A report is accepted only if it is complete and valid.
#include "components/componentTools/probe.h"

#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/uidText.h"

#include <algorithm>
#include <cstddef>
#include <optional>
#include <tuple>
#include <utility>

namespace Mz::Tools {

namespace {

/// The limit of a report, in bytes. Real libraries stay far below it.
constexpr std::size_t longestAnswer = std::size_t{64} << 20;

std::filesystem::path probeProgram(const ProbeOptions& options) {
    if (!options.program.empty())
        return options.program;
    return System::moduleFolder() /
           (std::string("mzcomponents-probe") + System::programExtension());
}

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

void noteBuilders(const Description& description, std::vector<Finding>& notes) {
    const auto& builders = description.builders;
    if (description.announced != builders.size())
        notes.push_back({Verdict::miscounted, std::to_wstring(description.announced),
                         std::to_wstring(builders.size())});
    std::vector<QrUid> uids;
    for (const RecordedBuilder& builder : builders)
        uids.push_back(builder.uid);
    const auto before = [](const QrUid& a, const QrUid& b) {
        return std::tie(a.w0, a.w1, a.w2, a.w3) < std::tie(b.w0, b.w1, b.w2, b.w3);
    };
    std::sort(uids.begin(), uids.end(), before);
    for (auto twice = std::adjacent_find(uids.begin(), uids.end()); twice != uids.end();
         twice =
             std::adjacent_find(std::upper_bound(twice, uids.end(), *twice, before), uids.end()))
        notes.push_back({Verdict::uidTwice, textOf(*twice), {}});
}

/// Returns whether a library may get this verdict only because the system limited its memory.
bool mayLackMemory(Verdict verdict) {
    switch (verdict) {
    case Verdict::loadFailed:
    case Verdict::nullDescription:
    case Verdict::wrongItem:
    case Verdict::threw:
    case Verdict::crashed:
    case Verdict::aborted:
    case Verdict::exited: return true;
    default: return false;
    }
}

/// \param refused  the memory limit that the system enforces, in bytes; 0 for none
ProbeResult probeOnce(const std::filesystem::path& file, const ProbeOptions& options,
                      std::uint64_t refused) {
    const System::ChildLimits limits{options.timeLimit, options.memoryLimit, refused, longestAnswer,
                                     options.interrupted};
    const System::ChildResult child = System::runChild(
        probeProgram(options), {std::filesystem::absolute(file), std::to_string(refused)}, limits);
    ProbeAnswer answer = decodeAnswer(child.output);
    ProbeResult result;
    result.verdict = judgeEnd(child, answer, options);
    const bool sound = result.verdict.verdict == Verdict::works ||
                       result.verdict.verdict == Verdict::offersNothing;
    if (sound) {
        noteBuilders(*answer.description, result.notes);
        result.label = std::move(answer.description->label);
        result.text = std::move(answer.description->text);
        result.builders = std::move(answer.description->builders);
    }
    return result;
}

} // namespace

ProbeResult probeLibrary(const std::filesystem::path& file, const ProbeOptions& options) {
    // The system counts reserved addresses too, so its limit must be far above the real one.
    const std::uint64_t refused = options.memoryLimit * 2 + (std::uint64_t{1} << 30);
    ProbeResult result = probeOnce(file, options, refused);
    if (mayLackMemory(result.verdict.verdict))
        result = probeOnce(file, options, 0);
    return result;
}

} // namespace Mz::Tools
