// SPDX-License-Identifier: BSL-1.0
/// One pass over the list builds the index. Then each library needs one look-up per builder, so the
/// time is linear in the number of builders.
#include "components/componentTools/inspecting/uidNotes.h"
#include "components/componentTools/uidText.h"

#include <memory>
#include <string>
#include <utility>

namespace Mz::Tools {

UidNotes::UidNotes(const RecordedLibraries& allLibraries) : libraries(allLibraries) {
    for (std::size_t position = 0; position < libraries.size(); ++position)
        for (const RecordedBuilder& builder : libraries[position].builders) {
            std::vector<std::size_t>& positions = offers[builder.uid];
            if (positions.empty() || positions.back() != position)
                positions.push_back(position);
        }
}

std::vector<Finding> UidNotes::notesOn(const std::vector<RecordedBuilder>& builders,
                                       std::size_t position) const {
    std::vector<Finding> notes;
    const auto note = [&](Verdict verdict, const RecordedBuilder& builder, std::size_t other) {
        notes.push_back({verdict, textOf(builder.uid),
                         libraries[other].directory + L"\\" + libraries[other].fileName});
    };
    for (const RecordedBuilder& builder : builders) {
        if (builder.uid == QrUid{})
            notes.push_back({Verdict::uidNil, textOf(builder.uid), builder.name});
        const auto found = offers.find(builder.uid);
        if (found == offers.end())
            continue;
        const std::vector<std::size_t>& positions = found->second;
        if (position != afterAll && positions.back() > position)
            note(Verdict::uidTaken, builder, positions.back());
        else if (positions.back() != position)
            note(Verdict::uidWins, builder, positions.back());
        else if (positions.size() > 1)
            note(Verdict::uidWins, builder, positions[positions.size() - 2]);
    }
    return notes;
}

} // namespace Mz::Tools
