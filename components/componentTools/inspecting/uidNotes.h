// SPDX-License-Identifier: BSL-1.0
/// Finds builders whose uids collide or are nil.
#pragma once

#include "components/componentTools/recordedLibrary.h"

#include <cstddef>
#include <unordered_map>
#include <vector>

namespace Mz::Tools {

/// An index from uids to the libraries of a list that have a builder with that uid. The last such
/// library wins, as in a host that reads the list.
class UidNotes {
  public:
    /// Builds the index. The list must outlive this object.
    explicit UidNotes(const RecordedLibraries& libraries);

    /// The position of a library that is not in the list. It counts as the last one, like a new
    /// library in the last folder of a host.
    static constexpr std::size_t afterAll = static_cast<std::size_t>(-1);

    /// Returns the notes on the builders of the library at `position`: `uidTaken` with the winner,
    /// `uidWins` with the last library that loses, and `uidNil`.
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
