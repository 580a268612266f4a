// SPDX-License-Identifier: BSL-1.0
// Reads the file beside a recorded list: verdicts, and what the user switched off. Writes again
// what was read.
#include "components/componentTools/records/verdictsFile.h"
#include "fuzz/fuzz.h"

#include <algorithm>
#include <fstream>
#include <iterator>

namespace {

using namespace Mz;
using namespace Mz::Tools;

/// The records on which the file may have a verdict.
RecordedLibraries records() {
    RecordedLibraries libraries(4);
    const wchar_t* const names[] = {L"a", L"b", L"\u00E9", L"\uFFFD"};
    for (std::size_t index = 0; index < libraries.size(); ++index) {
        libraries[index].directory = L"/d/";
        libraries[index].fileName = names[index];
        libraries[index].time = static_cast<std::uint32_t>(index);
        libraries[index].size = static_cast<std::int64_t>(index);
    }
    libraries[1].builders.resize(1);
    return libraries;
}

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream input(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(input), {}};
}

void expectSaveable(const RecordedLibraries& libraries) {
    for (const RecordedLibrary& library : libraries)
        if (library.kept && library.kept->verdict != Verdict::disabledByUser) {
            Fuzz::expect(library.builders.empty(), "what has builders has no saved verdict");
            Fuzz::expect(severityOf(library.kept->verdict) != Severity::note,
                         "a saved verdict is one that keeps a library out");
        }
}

void expectSame(const DisabledComponents& a, const DisabledComponents& b) {
    const auto isSame = [](const DisabledComponent& x, const DisabledComponent& y) {
        return x.directory == y.directory && x.fileName == y.fileName && x.reason == y.reason;
    };
    Fuzz::expect(std::ranges::equal(a, b, isSame), "what is switched off stays so");
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const Fuzz::InputFile file(Fuzz::Input(data, size).rest());
    RecordedLibraries libraries = records();
    readVerdicts(file.path(), libraries);
    expectSaveable(libraries);
    const std::string judgement = readJudgement(file.path());
    bool unreadable = true;
    const std::optional<DisabledComponents> disabled = readDisabled(file.path(), &unreadable);
    Fuzz::expect(!unreadable, "the system can read the file");
    if (!disabled)
        return 0;

    const Fuzz::InputFile first("");
    writeVerdicts(first.path(), libraries, *disabled, judgement);
    RecordedLibraries again = records();
    readVerdicts(first.path(), again);
    const std::optional<DisabledComponents> stillDisabled = readDisabled(first.path());
    Fuzz::expect(stillDisabled.has_value(), "what is written can be read");
    expectSame(*disabled, *stillDisabled);
    const Fuzz::InputFile second("");
    writeVerdicts(second.path(), again, *stillDisabled, readJudgement(first.path()));
    Fuzz::expectSame(contentOf(first.path()), contentOf(second.path()),
                     "what is read is what was written");
    return 0;
}
