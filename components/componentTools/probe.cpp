// SPDX-License-Identifier: BSL-1.0
/// Runs the probe program once for a library, and again without the system's limit of memory if
/// that may have been the reason of a failure. The verdict comes from `judgeEnd`.
#include "components/componentTools/probe.h"

#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/probing/probeProcess.h"
#include "components/componentTools/uidText.h"

#include <algorithm>
#include <cstddef>
#include <optional>
#include <tuple>
#include <utility>

namespace Mz::Tools {

namespace {

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
    ProbeResult result = probeOnce(file, options, refusedMemory(options));
    if (mayLackMemory(result.verdict.verdict))
        result = probeOnce(file, options, 0);
    return result;
}

} // namespace Mz::Tools
