// SPDX-License-Identifier: BSL-1.0
/// What a host permits the import builders of one import (see `importFile.h`).
///
///     Mz::Kit::ImportPolicy policy;
///     policy.deny = {brokenBuilderUid};
///     policy.byteLimit = 50'000'000;
///     policy.timeLimit = std::chrono::seconds(10);
///
/// \since 0.2
#pragma once

#include "components/componentManager/uid.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <optional>
#include <vector>

namespace Mz::Kit {

/// The files that an import may use beside its input. Import builders find such *companion files*,
/// for example the materials of a mesh, by `QrProcessControl::findFile`.
enum class Companions {
    anywhere, ///< files in the folder of the input, then all that the host's controller finds
    beside,   ///< files in the folder of the input and in folders below it
    none      ///< no files
};

/// What a host permits the import builders of one import. The default permits everything, as
/// `QrBaseImporter::import` does.
///
/// The limits rely on the builders, whose code runs in the host's process: see `timeLimit`.
struct ImportPolicy {
    /// The uids of the only builders to ask; empty for all builders of the family.
    std::vector<QrUid> allow;

    /// The uids of builders that are not asked, even if `allow` contains them. Their libraries are
    /// not loaded for the import.
    std::vector<QrUid> deny;

    /// Whether builders that do not list the extension of the input are asked, too, after those
    /// that do.
    bool byContent = true;

    /// The largest size of the input, and of each companion file, in bytes. A larger input is
    /// rejected before a builder is asked. If the input grows during the import, reading beyond the
    /// limit throws `QrStreamEx::ExReadError` in the builder.
    std::optional<std::uint64_t> byteLimit;

    /// The longest duration of the import. When it is over, the process controller reports an
    /// interruption to the builder, and reading throws `QrStreamEx::ExReadError` in it.
    ///
    /// A builder that neither reads nor asks the controller is not stopped: a thread cannot be
    /// ended from outside.
    std::optional<std::chrono::milliseconds> timeLimit;

    /// The files that the builder may use beside the input.
    Companions companions = Companions::anywhere;

    /// Returns whether the builder `uid` may be asked.
    bool allows(const QrUid& uid) const {
        const auto contains = [&](const std::vector<QrUid>& uids) {
            return std::find(uids.begin(), uids.end(), uid) != uids.end();
        };
        return (allow.empty() || contains(allow)) && !contains(deny);
    }
};

} // namespace Mz::Kit
