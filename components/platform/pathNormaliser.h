/// The one form of directory and file names.
#pragma once

#include <string>

namespace Mz {

/// `path` in the form in which names are stored and compared; the same text always gives the same
/// result, and no file is looked at.
///
/// Lower case; one '\' for each run of separators between names and none at the end. A root stays
/// as it is: `\\server\share`, a drive letter, a leading separator. "." leaves the separators on
/// both sides of it (`a/./b` gives `a\\b`), ".." behind something else leaves one of them
/// (`a/b/../c` gives `a\b\c`), and neither is resolved: these forms are in the recorded lists of
/// users and must never change. What would be empty is ".", but null gives an empty string.
///
/// In list mode `path` is a list of names separated by ';', each of which is treated so; runs of
/// ';' become one, those at the ends vanish.
std::wstring normalisePath(const wchar_t* path, bool listMode);

} // namespace Mz
