/// Text for files that are the same in every locale.
#pragma once

#include "components/componentTools/export.h"

#include <string>
#include <string_view>

namespace Mz::Tools {

/// `text` in UTF-8. Characters of two units, and single units that are none, are converted too.
MZ_COMPONENT_TOOLS_API std::string toUtf8(std::wstring_view text);

/// The reverse of `toUtf8`; what is no UTF-8 becomes U+FFFD.
MZ_COMPONENT_TOOLS_API std::wstring fromUtf8(std::string_view bytes);

} // namespace Mz::Tools
