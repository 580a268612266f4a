// SPDX-License-Identifier: BSL-1.0
/// Writes and reads the persistent objects of the library that is checked.
#pragma once

#include "components/componentTools/checking/checkContext.h"

#include "components/componentManager/persistant.h"

#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The form in which an object is written.
enum class StoredForm { binary, text };

/// How an input is supplied.
enum class Supply {
    whole,  ///< from memory
    pieces, ///< three bytes at a time, without positions
};

/// Returns what the object writes; `std::nullopt` if it throws. Objects inside it are written too.
std::optional<std::string> writtenBytes(CheckContext& context, const std::wstring& place,
                                        QrPersistant& object, StoredForm form);

/// Returns the class uids of the objects inside the object that no builder of the library has, each
/// once.
std::vector<QrUid> missingClassesInside(CheckContext& context, const std::wstring& place,
                                        QrPersistant& object);

/// Reads the object from what `writtenBytes` returned. Objects inside it are made by the library's
/// own builders.
/// \return whether `read` returned; `context.lastException` has the reason otherwise
bool readBytes(CheckContext& context, const std::wstring& place, QrPersistant& object,
               StoredForm form, const std::string& bytes, Supply supply = Supply::whole,
               const std::wstring& detail = {}, const std::string& reproduce = {});

} // namespace Mz::Tools
