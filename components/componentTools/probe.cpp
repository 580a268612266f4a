#include "components/componentTools/probe.h"

#include "components/componentTools/platform/system.h"
#include "components/componentTools/probeAnswer.h"

#include <algorithm>

namespace Mz::Tools {

namespace {

/// The sum of all texts of a library; no real one comes near.
constexpr std::size_t longestAnswer = std::size_t{64} << 20;

std::filesystem::path probeProgram(const ProbeOptions& options) {
    if (!options.program.empty())
        return options.program;
    return System::ownFolder() / (std::string("mzcomponents-probe") + System::programExtension());
}

std::wstring seconds(std::chrono::milliseconds time) {
    const auto tenths = time.count() / 100;
    std::wstring text = std::to_wstring(tenths / 10);
    return tenths % 10 ? text + L"." + std::to_wstring(tenths % 10) : text;
}

Finding memoryFinding(const ProbeAnswer& answer, const ProbeOptions& options) {
    return {Verdict::outOfMemory, nameOf(answer.stage), std::to_wstring(options.memoryLimit >> 20)};
}

/// What the process itself said, completed by what only we know.
Finding completed(const ProbeAnswer& answer, const System::ChildResult& child,
                  const ProbeOptions& options) {
    Finding fault = *answer.fault;
    if (fault.verdict == Verdict::outOfMemory) {
        if (child.memory >= options.memoryLimit / 2)
            return memoryFinding(answer, options);
        // It asked for too much at once, or throws it without need.
        fault = {Verdict::threw, {}, L"std::bad_alloc"};
    }
    if (fault.subject.empty())
        fault.subject = nameOf(answer.stage);
    return fault;
}

/// The process has ended without a fault and without a description.
Finding judgeMissingAnswer(const System::ChildResult& child, const ProbeAnswer& answer) {
    if (child.status != answeredStatus)
        return {Verdict::exited, nameOf(answer.stage), std::to_wstring(child.status)};
    // It did answer, so the library has got at the pipe.
    if (answer.cutOff)
        return {Verdict::garbled, L"its last message is not whole", {}};
    return {Verdict::answerLost, nameOf(answer.stage), {}};
}

Finding judgeEnd(const System::ChildResult& child, const ProbeAnswer& answer,
                 const ProbeOptions& options) {
    using End = System::ChildResult::End;
    const std::wstring stage = nameOf(answer.stage);
    switch (child.end) {
    case End::notStarted: return {Verdict::probeFailed, child.words, {}};
    case End::interrupted: return {Verdict::interrupted, {}, {}};
    case End::timedOut: return {Verdict::timedOut, stage, seconds(options.timeLimit)};
    case End::outOfMemory: return memoryFinding(answer, options);
    case End::tooMuchOutput:
        return {Verdict::answerTooLong, std::to_wstring(longestAnswer >> 20), {}};
    default: break;
    }
    if (answer.garbled)
        return {Verdict::garbled, L"something else came between", {}};
    if (answer.fault)
        return completed(answer, child, options);
    // With its whole answer, its end does not matter.
    if (child.end == End::unknown && !answer.description)
        return {Verdict::endUnknown, stage, {}};
    if (child.end == End::crashed)
        return {Verdict::crashed, stage, child.words};
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

/// Whether a library may get this verdict because it was refused memory.
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

/// `refused` is how much memory the system refuses the process, in bytes; 0 for no such limit.
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
    // What is only reserved counts for the system as well, so it refuses no less than this.
    const std::uint64_t refused = options.memoryLimit * 2 + (std::uint64_t{1} << 30);
    ProbeResult result = probeOnce(file, options, refused);
    if (mayLackMemory(result.verdict.verdict))
        result = probeOnce(file, options, 0);
    return result;
}

} // namespace Mz::Tools
