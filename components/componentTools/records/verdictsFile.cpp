// SPDX-License-Identifier: BSL-1.0
/// The verdicts are stored as JSON beside the list, because the format of the list is fixed. Each
/// has the time and size of its library, so that it is ignored after the library has changed. What
/// the user switched off has neither: the choice outlasts a change of the file, and its absence.
/// Names, not numbers, identify verdicts, so that versions can exchange files.
#include "components/componentTools/records/verdictsFile.h"

#include "components/componentManager/utf8.h"
#include "components/componentTools/records/json.h"
#include "components/componentTools/records/openPatiently.h"
#include "components/componentTools/records/replaceChanged.h"

#include <fstream>
#include <initializer_list>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace Mz::Tools {

namespace {

constexpr int version = 1;

std::wstring wide(const Json& entry, const char* key) {
    return fromUtf8(entry.at(key).get<std::string>());
}

/// Verdicts by directory and file name.
using Verdicts = std::map<std::pair<std::wstring, std::wstring>, const Json*>;

Verdicts verdictsOf(const Json& all) {
    Verdicts verdicts;
    if (integerOf(all.at("version")) == version)
        for (const Json& entry : all.at("libraries"))
            verdicts[{wide(entry, "directory"), wide(entry, "fileName")}] = &entry;
    return verdicts;
}

/// Returns whether a scan can save this verdict for a library that it records without builders.
bool isKept(Verdict verdict) {
    switch (verdict) {
    case Verdict::component: // Replaced by the verdict of the probe.
    case Verdict::works:
    case Verdict::disabledByUser: // Stored apart.
    case Verdict::directory:      // Not candidates.
    case Verdict::hidden:
    case Verdict::systemFile:
    case Verdict::notRegular:
    case Verdict::missing: // Not recorded.
    case Verdict::unreachable:
    case Verdict::notAFolder:
    case Verdict::nameNotCarried:
    case Verdict::notSearchable:
    case Verdict::sameName:
    case Verdict::textNotCarried:
    case Verdict::needsHost:
    case Verdict::probeFailed:
    case Verdict::interrupted: return false;
    default: return severityOf(verdict) != Severity::note;
    }
}

void fillIn(RecordedLibrary& library, const Verdicts& verdicts) {
    const auto found = verdicts.find({library.directory, library.fileName});
    if (found == verdicts.end())
        return;
    const Json& entry = *found->second;
    if (integerOf(entry.at("time")) != library.time || integerOf(entry.at("size")) != library.size)
        return;
    const auto verdict = verdictNamed(entry.at("verdict").get<std::string>());
    if (verdict && isKept(*verdict))
        library.kept = Finding{*verdict, wide(entry, "subject"), wide(entry, "words")};
}

/// Older versions write no choices.
DisabledComponents disabledIn(const Json& all) {
    DisabledComponents disabled;
    if (integerOf(all.at("version")) == version && all.contains("disabled"))
        for (const Json& entry : all.at("disabled"))
            disabled.push_back(
                {wide(entry, "directory"), wide(entry, "fileName"), wide(entry, "reason")});
    return disabled;
}

} // namespace

void readVerdicts(const std::filesystem::path& file, RecordedLibraries& libraries) {
    std::ifstream input;
    if (!openPatiently(input, file))
        return;
    try {
        const Json all = jsonIn(input);
        const Verdicts verdicts = verdictsOf(all);
        for (RecordedLibrary& library : libraries)
            if (library.builders.empty())
                fillIn(library, verdicts);
        for (const DisabledComponent& component : disabledIn(all))
            for (RecordedLibrary& library : libraries)
                if (isRecordOf(library, component))
                    library.kept = disabledFinding(component);
    } catch (const Json::exception&) {
        return; // Without verdicts the next scan only retries more.
    } catch (const std::ios_base::failure&) {
        return; // The buffer of a file throws it, and JSON is read from the buffer.
    }
}

std::optional<DisabledComponents> readDisabled(const std::filesystem::path& file,
                                               bool* unreadable) {
    std::ifstream input;
    bool isRead = openPatiently(input, file);
    if (unreadable)
        *unreadable = false;
    if (!isRead && isMissing(file))
        return std::optional<DisabledComponents>(std::in_place);
    std::error_code unknown;
    if (!isRead && std::filesystem::is_directory(file, unknown))
        return std::nullopt; // No choices can be in it.
    try {
        if (isRead)
            return disabledIn(jsonIn(input));
    } catch (const Json::exception&) {
        isRead = !input.bad();
    } catch (const std::ios_base::failure&) { // Of the file's buffer, from which JSON is read.
        isRead = false;
    }
    if (unreadable)
        *unreadable = !isRead;
    return std::nullopt;
}

std::string readJudgement(const std::filesystem::path& file) {
    std::ifstream input;
    if (!openPatiently(input, file))
        return {};
    try {
        const Json all = jsonIn(input);
        if (integerOf(all.at("version")) == version)
            return all.value("judgement", "");
    } catch (const Json::exception&) {        // NOLINT(bugprone-empty-catch)
    } catch (const std::ios_base::failure&) { // NOLINT(bugprone-empty-catch)
    }
    return {}; // The next scan only compares more.
}

bool isRecordOf(const RecordedLibrary& library, const DisabledComponent& component) {
    return library.fileName == component.fileName && library.directory == component.directory;
}

Finding disabledFinding(const DisabledComponent& component) {
    return {Verdict::disabledByUser, component.reason,
            component.reason.empty() ? std::wstring() : L" (" + component.reason + L")"};
}

void writeVerdicts(const std::filesystem::path& file, const RecordedLibraries& libraries,
                   const DisabledComponents& disabled, const std::string& judgement) {
    OrderedJson entries = OrderedJson::array(), choices = OrderedJson::array();
    for (const DisabledComponent& component : disabled)
        choices.push_back({{"directory", toUtf8(component.directory)},
                           {"fileName", toUtf8(component.fileName)},
                           {"reason", toUtf8(component.reason)}});
    for (const RecordedLibrary& library : libraries)
        if (library.kept && library.kept->verdict != Verdict::disabledByUser)
            entries.push_back({{"directory", toUtf8(library.directory)},
                               {"fileName", toUtf8(library.fileName)},
                               {"time", library.time},
                               {"size", library.size},
                               {"verdict", nameOf(library.kept->verdict)},
                               {"subject", toUtf8(library.kept->subject)},
                               {"words", toUtf8(library.kept->words)},
                               {"sentence", toUtf8(sentenceOf(*library.kept))},
                               {"cure", toUtf8(cureOf(*library.kept))}});
    OrderedJson all{{"version", version}, {"libraries", entries}, {"disabled", choices}};
    if (!judgement.empty())
        all["judgement"] = judgement;
    replaceChanged(file, linesOf(all));
}

} // namespace Mz::Tools
