// SPDX-License-Identifier: BSL-1.0
/// Findings that a project tolerates, with their reasons.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Commands {

/// The suppressions of a file. Each line has a rule, the name of a library's file or `*`, and a
/// reason, separated by blanks. A file name with blanks is in double quotes. Empty lines and those
/// that begin with `#` are skipped.
///
///     library-exports  mesh.so  The host of 2019 calls meshVersion.
class Suppressions {
  public:
    /// Reads a file. Reports on standard error what is wrong with it.
    /// \return false if the file cannot be read or a line is invalid
    bool read(const std::string& file);

    /// Returns the reason to tolerate a finding; empty if there is none.
    std::wstring reasonFor(const std::string& rule, const std::filesystem::path& library);

    /// Reports the lines that suppressed nothing, on standard error.
    void printUnused() const;

  private:
    struct Line {
        int number;
        std::string rule, library, reason;
        bool used = false;
    };
    bool parse(const std::string& text, int number);
    void complain(int number, const std::wstring& text) const;

    std::string name;
    std::vector<Line> lines;
};

} // namespace Mz::Commands
