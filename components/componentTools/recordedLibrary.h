// SPDX-License-Identifier: BSL-1.0
/// The records of a recorded list, as plain data.
///
/// \since 0.2
#pragma once

#include "components/componentManager/uid.h"
#include "components/componentTools/export.h"
#include "components/componentTools/verdict.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The record of one builder.
struct RecordedBuilder {
    QrUid uid{};                ///< its identity
    std::wstring name;          ///< as the builder describes itself, as all that follows
    std::wstring label;         ///< for users
    std::wstring text;          ///< for users
    unsigned int number = 0;    ///< its meaning is up to host and component
    bool flag = false;          ///< its meaning is up to host and component
    std::int64_t position = -1; ///< its offset in the list file, in bytes; -1 if it was not read
};

/// The record of one file: a component library, or a file without builders.
struct RecordedLibrary {
    std::wstring directory;                ///< normalised as by the manager
    std::wstring fileName;                 ///< normalised as by the manager
    std::uint32_t time = 0;                ///< last modification, in seconds, truncated to 32 bits
    std::int64_t size = 0;                 ///< in bytes
    std::vector<RecordedBuilder> builders; ///< empty if the file is no component or failed
    std::int64_t position = -1; ///< its offset in the list file, in bytes; -1 if it was not read
    /// The saved verdict on a file without builders, or `disabledByUser`, which a file with
    /// builders can have, too. It is stored beside the list, not in it.
    std::optional<Finding> kept = std::nullopt;
};

/// All records of a list, in its order.
using RecordedLibraries = std::vector<RecordedLibrary>;

/// Returns the record with these normalised names, or null. The list owns it.
MZ_COMPONENT_TOOLS_API const RecordedLibrary* findRecord(const RecordedLibraries& libraries,
                                                         const std::wstring& directory,
                                                         const std::wstring& fileName);

} // namespace Mz::Tools
