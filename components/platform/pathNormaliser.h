// SPDX-License-Identifier: BSL-1.0
/// The normal form of directory and file names.
#pragma once

#include <string>

namespace Mz {

/// Returns `path` in the form in which names are stored and compared. The result depends on the
/// text alone; no file is accessed.
///
/// - All letters are in lower case.
/// - Each run of separators between names becomes one '\'. Separators at the end are removed.
/// - A root is kept: `\\server\share`, a drive letter, a leading separator.
/// - "." is removed, but the separators on both sides of it stay (`a/./b` becomes `a\\b`).
/// - ".." is removed with one of the separators beside it (`a/b/../c` becomes `a\b\c`); the name
///   before it stays. Directly after the root, or at the beginning, ".." is kept.
/// - An empty result becomes ".".
///
/// The recorded lists of users contain these forms. They must never change.
///
/// \param path  the path; for null the result is an empty string
/// \param listMode  whether `path` is a search path (`searchPath.h`). Then each element is
///     normalised, runs of ';' become one, and those at the ends are removed.
std::wstring normalisePath(const wchar_t* path, bool listMode);

/// Returns the same form of a path that is usually a name, as a directory lists it. Takes over the
/// memory of a name.
std::wstring normaliseName(std::wstring name);

} // namespace Mz
