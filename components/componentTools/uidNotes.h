/// What is worth knowing of the identifiers of builders.
#pragma once

#include "components/componentTools/recordedList.h"

#include <cstddef>
#include <unordered_map>
#include <vector>

namespace Mz::Tools {

/// Which libraries of a list offer which builders. Of several that offer one identifier the last
/// one wins, as in a host that has the list.
class UidNotes {
  public:
    /// The list must outlive this.
    explicit UidNotes(const RecordedLibraries& libraries);

    /// The position of a library that is not in the list. It is taken to come last, as one does
    /// that is new to a host's last folder.
    static constexpr std::size_t behindAll = static_cast<std::size_t>(-1);

    /// The notes `uidTaken`, with the winner, `uidWins`, with the last one that loses, and `uidNil`
    /// on the builders of the library at that position.
    std::vector<Finding> notesOn(const std::vector<RecordedBuilder>& builders,
                                 std::size_t position) const;

  private:
    struct Hash {
        std::size_t operator()(const QrUid& uid) const { return uid.w0; }
    };

    const RecordedLibraries& libraries;
    std::unordered_map<QrUid, std::vector<std::size_t>, Hash> offers; ///< positions, ascending
};

} // namespace Mz::Tools
