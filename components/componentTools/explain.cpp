#include "components/componentTools/explain.h"

#include "components/componentManager/platform/platform.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/hostNeeds.h"
#include "components/componentTools/inspection.h"

#include <algorithm>

namespace Mz::Tools {

namespace {

/// What the list says of the file.
Finding judgeRecord(const RecordedLibrary* record, const std::filesystem::path& file) {
    if (!record)
        return {Verdict::notRecorded, {}, {}};
    const auto status = platform::queryFile(file.native());
    const bool sameTime = status && status->time == record->time;
    const bool sameSize = status && status->size == record->size;
    if (!sameTime || !sameSize)
        return {Verdict::recordedChanged,
                sameSize   ? L"time"
                : sameTime ? L"size"
                           : L"time and size",
                {}};
    if (record->builders.empty())
        return {Verdict::recordedFailed,
                {},
                record->kept ? L" (" + sentenceOf(*record->kept) + L")" : std::wstring()};
    return {Verdict::recordedUnchanged, std::to_wstring(record->builders.size()), {}};
}

bool offers(const RecordedLibrary& library, const QrUid& uid) {
    return std::any_of(library.builders.begin(), library.builders.end(),
                       [&](const RecordedBuilder& builder) { return builder.uid == uid; });
}

/// Who else in the list offers builders of the same identity, and who wins: the one that comes
/// later. A file that is not in the list is taken to come last, as one that is new to a host's last
/// folder does.
void compareUids(Explanation& explanation, const RecordedLibraries& recorded,
                 const RecordedLibrary* own) {
    for (const RecordedBuilder& builder : explanation.builders)
        for (const RecordedLibrary& other : recorded)
            if (&other != own && offers(other, builder.uid))
                explanation.notes.push_back(
                    {own && own < &other ? Verdict::uidTaken : Verdict::uidWins,
                     textOf(builder.uid), other.directory + L"\\" + other.fileName});
}

void load(Explanation& explanation, const ExplainOptions& options) {
    ProbeResult result = probeLibrary(explanation.file, options.probe);
    if (result.verdict.verdict == Verdict::loadFailed && options.followDependencies)
        if (auto symbol = symbolOfHost(explanation.file, explanation.dependencies))
            result.verdict = std::move(*symbol);
    // What is missing says more than the loader's words about it.
    if (result.verdict.verdict != Verdict::loadFailed ||
        explanation.verdict.verdict != Verdict::dependencyMissing)
        explanation.verdict = std::move(result.verdict);
    explanation.notes.insert(explanation.notes.end(), result.notes.begin(), result.notes.end());
    explanation.label = std::move(result.label);
    explanation.text = std::move(result.text);
    explanation.builders = std::move(result.builders);
}

} // namespace

Explanation explainFile(const std::filesystem::path& file, const ExplainOptions& options) {
    const Candidate candidate = candidateOf(file);
    Explanation explanation;
    explanation.file = candidate.path;
    LibraryImage image;
    explanation.verdict = inspectFile(candidate.path, image);
    bool component = explanation.verdict.verdict == Verdict::component;
    if (options.followDependencies && image.format != ImageFormat::none &&
        explanation.verdict.verdict != Verdict::otherSystem)
        explanation.dependencies = dependenciesOf(candidate.path, image, options.programFolder);
    if (component) {
        if (auto program = programOfHost(image, explanation.dependencies)) {
            explanation.verdict = std::move(*program);
            component = false;
        } else if (auto missing = missingDependency(candidate.path, explanation.dependencies)) {
            explanation.verdict = std::move(*missing);
        }
    }
    const RecordedLibrary* record =
        options.recorded ? findRecord(*options.recorded, candidate.directory, candidate.fileName)
                         : nullptr;
    if (options.recorded)
        explanation.notes.push_back(judgeRecord(record, candidate.path));
    if (options.load && component)
        load(explanation, options);
    else if (record)
        explanation.builders = record->builders;
    if (options.recorded)
        compareUids(explanation, *options.recorded, record);
    return explanation;
}

} // namespace Mz::Tools
