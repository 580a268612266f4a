// SPDX-License-Identifier: BSL-1.0
/// Examines a file in stages, from cheap to expensive: its path and content, its dependencies, its
/// record, and then, on request, a probe. A later stage replaces the verdict of an earlier one only
/// if it explains more.
#include "components/componentTools/explain.h"

#include "components/componentTools/discovery.h"
#include "components/componentTools/inspecting/explaining.h"
#include "components/componentTools/inspecting/hostNeeds.h"
#include "components/componentTools/inspecting/inspection.h"
#include "components/componentTools/inspecting/uidNotes.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <cstddef>
#include <optional>
#include <system_error>
#include <utility>

namespace Mz::Tools {

namespace {

/// Compares the file with its record, which may be null.
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

/// Adds what the list has on the file. A component that is switched off has that verdict, unless
/// there is a fault to report: the host would meet it after the component is switched on.
void judgeRecord(Explanation& explanation, const RecordedLibrary* record, bool load) {
    Finding recorded = judgeRecord(record, explanation.file);
    if (!record || !record->kept || record->kept->verdict != Verdict::disabledByUser) {
        explanation.notes.push_back(std::move(recorded));
        return;
    }
    if (explanation.verdict.verdict == Verdict::component && !load)
        explanation.verdict = *record->kept;
    else
        explanation.notes.push_back(*record->kept);
    if (recorded.verdict != Verdict::recordedFailed) // A host loads it, whatever the user wants.
        explanation.notes.push_back(std::move(recorded));
}

/// Adds the notes on builders whose uids collide with the list.
void compareUids(Explanation& explanation, const RecordedLibraries& recorded,
                 const RecordedLibrary* own) {
    const std::size_t position =
        own ? static_cast<std::size_t>(own - recorded.data()) : UidNotes::afterAll;
    for (Finding& note : UidNotes(recorded).notesOn(explanation.builders, position))
        explanation.notes.push_back(std::move(note));
}

/// Returns whether one of the folders contains the file, as a verdict.
Finding judgePath(const std::vector<std::filesystem::path>& folders,
                  const std::filesystem::path& file) {
    const bool leads =
        std::any_of(folders.begin(), folders.end(), [&](const std::filesystem::path& folder) {
            std::error_code ignored;
            return std::filesystem::equivalent(folder, file.parent_path(), ignored);
        });
    return {leads ? Verdict::onPath : Verdict::notOnPath, {}, {}};
}

void load(Explanation& explanation, const ExplainOptions& options) {
    ProbeResult result = probeLibrary(explanation.file, options.probe);
    if (result.verdict.verdict == Verdict::loadFailed && options.followDependencies)
        if (auto symbol = symbolOfHost(explanation.file, explanation.dependencies))
            result.verdict = std::move(*symbol);
    // The missing dependency explains more than the loader's error about it.
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
    return explainFile(file, options, HostInterfaces(options.hosts));
}

Explanation explainFile(const std::filesystem::path& file, const ExplainOptions& options,
                        const HostInterfaces& host) {
    const Candidate candidate = candidateOf(file);
    Explanation explanation;
    explanation.file = candidate.path;
    LibraryImage image;
    explanation.verdict = inspectFile(candidate.path, image);
    if (explanation.verdict.verdict == Verdict::component)
        if (auto difference = host.difference(candidate.path))
            explanation.verdict = std::move(*difference);
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
        judgeRecord(explanation, record, options.load);
    if (options.load && component)
        load(explanation, options);
    else if (record)
        explanation.builders = record->builders;
    const RecordedLibraries nothing;
    compareUids(explanation, options.recorded ? *options.recorded : nothing, record);
    // To move another file to the search path is no cure.
    if (options.folders && explanation.verdict.verdict != Verdict::notALibrary)
        explanation.notes.push_back(judgePath(*options.folders, candidate.path));
    return explanation;
}

} // namespace Mz::Tools
