// SPDX-License-Identifier: BSL-1.0
/// The .ini format, without anything of plug-ins.
///
/// A line is empty, a comment (`;` or `#`), a section (`[name]`) or an entry (`key = value`).
/// Blanks around names, keys and values do not count.
#pragma once

#include "settings.h"

#include "components/componentManager/bufferio.h"

#include <cstddef>
#include <stdexcept>
#include <string>
#include <vector>

/// What a file may contain at most. A file is data of strangers: without limits a small mistake, or
/// malice, takes all memory.
struct IniLimits {
    std::size_t lineLength = 64 * 1024; ///< in bytes
    std::size_t entries = 100'000;
};

/// Why a file is no .ini file, with the number of the line.
class IniError : public std::runtime_error {
  public:
    IniError(std::size_t line, const std::string& reason)
        : std::runtime_error("line " + std::to_string(line) + ": " + reason) {}
};

/// Returns whether the first line that is neither empty nor a comment is a section or an entry, and
/// no byte before its end is a control character.
bool looksLikeIni(Mz::QrBufferedIO& io);

/// Returns the entries of the file.
///
/// \throws IniError  if the file is invalid or exceeds a limit
std::vector<Settings::Entry> readIni(Mz::QrBufferedIO& io, const IniLimits& limits = {});
