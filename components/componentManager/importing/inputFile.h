/// Opening a file to import.
#pragma once

#include <fstream>

namespace Mz {

/// Opens the file `path` for reading in binary, by that very name, denying nothing to other
/// openers. False, with nothing open, for a null or empty name, a name that the system cannot
/// express, a directory, and whatever else cannot be opened.
bool openInputFile(std::ifstream& stream, const wchar_t* path);

} // namespace Mz
