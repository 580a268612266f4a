// SPDX-License-Identifier: BSL-1.0
/// Reads lines and words from a byte reader.
#pragma once

#include "byteReader.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace Meshes {

/// Reads text line by line, and a line word by word. Lines end with LF, CR LF or CR; words end with
/// white space.
///
/// Only one word is stored, and its length is limited; lines and texts may have any length. All
/// operations that read throw `ImportFailure` for a longer word.
class TextReader {
  public:
    struct Rules {
        bool comments = true;       ///< a word that begins with '#' ends the line
        bool continuations = false; ///< a '\' at the end of a line joins it with the next
    };

    /// The length of the longest accepted word, in bytes. No number or keyword is longer.
    static constexpr std::size_t longestWord = 1024;

    /// Starts before the first line, which has the number `firstLine`.
    TextReader(ByteReader& bytes, Rules rules, std::uint64_t firstLine = 1);

    /// Goes to the next line that has a word, and reads that word. Skips the rest of the current
    /// line.
    ///
    /// \return false at the end of the data
    bool nextLine();

    /// Reads the next word of the line.
    ///
    /// \return false at the end of the line
    bool nextWord();

    /// Returns the last word read; valid until the next one is read.
    std::string_view word() const { return current; }

    /// Returns the number of the line that contains the last word.
    std::uint64_t line() const { return lineNumber; }

    /// Reads the next word of the line and returns it as a number. `what` names it in messages.
    ///
    /// \throws ImportFailure if the line ends or the word is not such a number
    float nextNumber(const char* what);
    std::uint32_t nextCount(const char* what);

    /// Throws `ImportFailure` unless the line ends here.
    void expectEndOfLine();

    /// Throws `ImportFailure` with the reason "line 12: what".
    [[noreturn]] void fail(const std::string& what) const;

  private:
    void skipBlanks();
    void skipLine();
    void skipLineEnd();
    bool skipContinuation();
    void takeWord();

    ByteReader& bytes;
    Rules rules;
    std::string current;
    std::uint64_t lineNumber;
    std::uint64_t lineEnds = 0; ///< line ends that are not yet counted in `lineNumber`
    bool started = false;       ///< whether the first line was reached
    bool escaped = false;       ///< whether a '\' was consumed that did not end its line
};

} // namespace Meshes
