// SPDX-License-Identifier: BSL-1.0
/// Opens the files that importers read.
#pragma once

#include <fstream>

namespace Mz {

/// Opens the file `path` for binary reading, without denying any access to other openers. No search
/// path is used.
///
/// \param stream  stream that is not open yet
/// \param path    name of the file; may be null
/// \return whether the file was opened. False, with nothing open, for a null or empty name, a name
///         that the system cannot represent, a directory, or a file that cannot be opened.
bool openInputFile(std::ifstream& stream, const wchar_t* path);

} // namespace Mz
