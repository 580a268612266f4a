// SPDX-License-Identifier: BSL-1.0
/// Uids as text for people.
///
/// \since 0.2
#pragma once

#include "components/componentManager/uid.h"
#include "components/componentTools/export.h"

#include <string>

namespace Mz::Tools {

/// Returns a uid as text: four words of eight hexadecimal digits, joined by '-'.
MZ_COMPONENT_TOOLS_API std::wstring textOf(const QrUid& uid);

} // namespace Mz::Tools
