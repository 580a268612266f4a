// SPDX-License-Identifier: BSL-1.0
/// One table contains everything that is known of each verdict, so that a new verdict needs one
/// entry. The table is searched linearly: it is short, and verdicts are only looked up for output.
#include "components/componentTools/verdict.h"

#include "components/componentTools/platform/system.h"

#include <iterator>

namespace Mz::Tools {

namespace {

/// The properties of a verdict. In the texts, %1 is replaced by the finding's subject, %2 by its
/// words, and %L by the environment variable with the loader's search path. A noun in braces after
/// a number gets its plural where it needs one: %2{second}.
struct Entry {
    Verdict verdict;
    const char* name;
    Severity severity;
    const wchar_t* sentence;
    const wchar_t* cure;
};

constexpr Entry entries[] = {
    {Verdict::component, "component", Severity::good,
     L"it is a component library, as far as reading the file can show", L""},
    {Verdict::works, "works", Severity::good, L"it loads and describes its builders (%1)", L""},
    {Verdict::offersNothing, "offersNothing", Severity::bystander,
     L"it loads and describes itself, but has no builder", L""},

    {Verdict::directory, "directory", Severity::bystander,
     L"it is a folder, and sub-folders of a search folder are not searched",
     L"name the folder itself in the search path"},
    {Verdict::hidden, "hidden", Severity::bystander, L"it is hidden, and hidden files are skipped",
     L"make the file visible"},
    {Verdict::systemFile, "systemFile", Severity::bystander,
     L"it has the system attribute, and system files are skipped",
     L"remove the attribute from the file"},
    {Verdict::notRegular, "notRegular", Severity::bystander,
     L"it is not a regular file, and only regular files are candidates", L""},
    {Verdict::notALibrary, "notALibrary", Severity::bystander, L"it is no library", L""},
    {Verdict::program, "program", Severity::bystander, L"it is a program, not a library", L""},
    {Verdict::noEntryPoint, "noEntryPoint", Severity::bystander,
     L"it is a library, but does not export \"QrGetComponentDescription\" itself",
     L"if it is meant to be a component, define and export that function (MZ_COMPONENT does)"},
    {Verdict::disabledByUser, "disabledByUser", Severity::bystander,
     L"it is switched off in the list%2, so no host that reads the list loads it",
     L"mzcomponents enable switches it on"},

    {Verdict::missing, "missing", Severity::fault, L"there is no such file", L"check the path"},
    {Verdict::unreachable, "unreachable", Severity::fault,
     L"it cannot be examined, because a folder above it denies access",
     L"check the permissions of the folders above it"},
    {Verdict::notAFolder, "notAFolder", Severity::fault,
     L"it is a file, and a search path consists of folders", L"name the folder that contains it"},
    {Verdict::unreadable, "unreadable", Severity::fault, L"it cannot be read",
     L"check the permissions of the file and of its folders"},
    {Verdict::nameNotCarried, "nameNotCarried", Severity::fault,
     L"its name has no form in the current locale, so it cannot be recorded",
     L"rename it, or choose a locale that has its characters"},
    {Verdict::notSearchable, "notSearchable", Severity::fault,
     L"its name contains ';', the separator of search paths, so no host can search it",
     L"rename it, or the folder above it whose name contains ';'"},
    {Verdict::sameName, "sameName", Severity::fault,
     L"its name differs from %1 only in case, and a list can contain only one of them",
     L"rename one of the two"},
    {Verdict::otherSystem, "otherSystem", Severity::fault,
     L"it is a library for another system: %1", L"get the library that was built for this system"},
    {Verdict::otherProcessor, "otherProcessor", Severity::fault,
     L"it is a library for another processor: %1",
     L"get the library that was built for this processor"},
    {Verdict::otherAbi, "otherAbi", Severity::fault,
     L"it was built for %1, and this libMZcomponentManager for %2, so neither can use objects of "
     L"the other",
     L"build it with the compiler, the options and the libMZcomponentManager of its host: %2"},
    {Verdict::otherInterface, "otherInterface", Severity::fault, L"%2",
     L"rebuild it with the %1 of its host, or give the changed interface a uid of its own"},
    {Verdict::damaged, "damaged", Severity::fault, L"it is damaged or truncated: %1",
     L"build or copy it again"},
    {Verdict::entryPointNoFunction, "entryPointNoFunction", Severity::fault,
     L"it exports \"QrGetComponentDescription\", but not for a function of this library",
     L"define the function in the library itself"},
    {Verdict::dependencyMissing, "dependencyMissing", Severity::fault,
     L"it needs %1, which cannot be found%2",
     L"install what has %1, or add its folder to the loader's path (%L)"},

    {Verdict::loadFailed, "loadFailed", Severity::fault, L"the system cannot load it: %2", L""},
    {Verdict::needsHost, "needsHost", Severity::fault,
     L"it needs %1 from the program of its host%2, so only that host can load it, and a scan does "
     L"not record it",
     L"if the host has it, let the host load the library; to have it scanned as well, move what it "
     L"needs into a library that both link. If no host has it, link the library that defines it"},
    {Verdict::nullDescription, "nullDescription", Severity::fault,
     L"its entry point returns null instead of a description", L"return a description"},
    {Verdict::wrongInterface, "wrongInterface", Severity::fault,
     L"the object that its entry point returns does not support QrComponentDescription",
     L"derive the description from QrComponentDescription through a cast template"},
    {Verdict::wrongItem, "wrongItem", Severity::fault,
     L"it enumerates %1 instead of a builder description",
     L"enumerate only objects that support QrBuilderDescription"},
    {Verdict::threw, "threw", Severity::fault, L"it throws in %1: %2", L""},
    {Verdict::crashed, "crashed", Severity::fault, L"it crashes in %1: %2", L""},
    {Verdict::aborted, "aborted", Severity::fault, L"it aborts the process in %1%2", L""},
    {Verdict::exited, "exited", Severity::fault, L"it ends the process in %1, with status %2", L""},
    {Verdict::timedOut, "timedOut", Severity::fault,
     L"it did not come to an end in %1 within %2{second}; --time-limit allows more",
     L"if it only needs more time, raise --time-limit (in a host: ProbeOptions::timeLimit)"},
    {Verdict::outOfMemory, "outOfMemory", Severity::fault,
     L"it uses more memory in %1 than the %2 MiB allowed; --memory-limit allows more",
     L"if it really needs more, raise --memory-limit (in a host: ProbeOptions::memoryLimit)"},
    {Verdict::textNotCarried, "textNotCarried", Severity::fault,
     L"the text \"%1\" of a builder has no form in the current locale, so it cannot be recorded",
     L"choose a locale that has its characters"},
    {Verdict::garbled, "garbled", Severity::fault,
     L"the report of the process that loaded it is invalid: %1", L""},
    {Verdict::answerLost, "answerLost", Severity::fault,
     L"it closed files in %1 that it did not open, the connection to this process among them, so "
     L"its builders are unknown",
     L"close only files that the library itself opened"},
    {Verdict::answerTooLong, "answerTooLong", Severity::fault,
     L"the report of the process that loaded it exceeds %1 MiB, the limit of a description",
     L"describe fewer builders, or shorten their texts"},
    {Verdict::probeFailed, "probeFailed", Severity::fault,
     L"the process to load it in could not be started: %1",
     L"check that mzcomponents-probe is in the folder of libMZcomponentTools"},
    {Verdict::endUnknown, "endUnknown", Severity::fault,
     L"it reached %1, and the exit status of the process that loaded it is not available",
     L"do not ignore SIGCHLD in the program that checks it"},
    {Verdict::interrupted, "interrupted", Severity::fault, L"the check was interrupted", L""},

    {Verdict::notRecorded, "notRecorded", Severity::note,
     L"the list does not have it, so a host loads it at its next start", L""},
    {Verdict::recordedUnchanged, "recordedUnchanged", Severity::note,
     L"the list has it (builders: %1), and it has not changed: a host whose search path leads to "
     L"the recorded names does not load it at start",
     L""},
    {Verdict::recordedFailed, "recordedFailed", Severity::note,
     L"the list has it without builders%2, and it has not changed: a host does not try it again "
     L"until its time or size changes",
     L"repair the file, or scan again with --retry (in a host: ScanOptions::retry)"},
    {Verdict::recordedChanged, "recordedChanged", Severity::note,
     L"it changed in %1 since it was recorded, so a host loads it at its next start",
     L"scan again"},

    {Verdict::onPath, "onPath", Severity::note, L"the search path leads to its folder", L""},
    {Verdict::notOnPath, "notOnPath", Severity::note,
     L"the search path does not lead to its folder, so a host with that path does not know it",
     L"add its folder to the host's search path"},

    {Verdict::miscounted, "miscounted", Severity::note,
     L"it announces %1{builder} and enumerates %2",
     L"let getBuilderCount return the number of enumerated builders"},
    {Verdict::uidTaken, "uidTaken", Severity::note,
     L"builder %1 is offered by %2 too, which comes later and wins", L"generate a new uid"},
    {Verdict::uidWins, "uidWins", Severity::note,
     L"builder %1 is offered by %2 too, and this one, which comes later, wins",
     L"generate a new uid"},
    {Verdict::uidNil, "uidNil", Severity::note,
     L"the uid of its builder \"%2\" is nil, so it collides with every other nil uid",
     L"generate a new uid"},
    {Verdict::uidTwice, "uidTwice", Severity::note, L"it has builder %1 twice",
     L"generate a new uid"},
};

const Entry& entryOf(Verdict verdict) {
    for (const Entry& entry : entries)
        if (entry.verdict == verdict)
            return entry;
    return entries[0];
}

/// Returns the value, and the noun in braces at `text`, if there is one. Sets `text` to its last
/// character.
std::wstring counted(const std::wstring& value, const wchar_t*& text) {
    if (text[1] != L'{')
        return value;
    const std::wstring_view noun(text + 2);
    text += 2 + noun.find(L'}');
    return value + L" " + std::wstring(noun.substr(0, noun.find(L'}'))) +
           (value == L"1" ? L"" : L"s");
}

std::wstring substituted(const wchar_t* text, const Finding& finding) {
    std::wstring result;
    for (; *text; ++text) {
        if (*text != L'%') {
            result += *text;
            continue;
        }
        switch (*++text) {
        case L'1': result += counted(finding.subject, text); break;
        case L'2': result += counted(finding.words, text); break;
        default: result += System::loaderPathVariable(); break;
        }
    }
    return result;
}

} // namespace

const char* nameOf(Verdict verdict) {
    return entryOf(verdict).name;
}

std::optional<Verdict> verdictNamed(std::string_view name) {
    for (const Entry& entry : entries)
        if (entry.name == name)
            return entry.verdict;
    return std::nullopt;
}

Severity severityOf(Verdict verdict) {
    return entryOf(verdict).severity;
}

std::wstring sentenceOf(const Finding& finding) {
    return substituted(entryOf(finding.verdict).sentence, finding);
}

std::wstring cureOf(const Finding& finding) {
    return substituted(entryOf(finding.verdict).cure, finding);
}

} // namespace Mz::Tools
