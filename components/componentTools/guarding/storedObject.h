// SPDX-License-Identifier: BSL-1.0
/// The stored form of an object that an importer made: written in the child, read in the host.
#pragma once

#include "components/componentTools/guarding/importMessages.h"

#include <functional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// Stores `object` with everything that it refers to.
/// \param bytes  receives the stored form
/// \return `imported`, or why the object cannot be stored, with the name of the class
/// \throws whatever the object's code throws, except exceptions of streams
ImportOutcome storeObject(const QrCastable* object, std::string& bytes);

/// Reads what `storeObject` stored, which may be anything, with the component manager of this
/// process. Catches whatever the object's code throws.
/// \param object  receives the object; null if it was not accepted
/// \return `imported` or `answerRejected`
ImportOutcome restoreObject(std::string bytes, const Kit::ImportLimits& limits,
                            QrRef<QrCastable>& object);

} // namespace Mz::Tools
