// SPDX-License-Identifier: BSL-1.0
/// Formats the reasons of exceptions for people.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"

#include <string>

namespace Mz::Tools {

/// Returns the reason of one of the library's exceptions (`ExBase::getReason`) for people. The
/// second line of a failed opening joins the first one. Null counts as empty.
MZ_COMPONENT_TOOLS_API std::wstring reasonText(const char* reason);

} // namespace Mz::Tools
