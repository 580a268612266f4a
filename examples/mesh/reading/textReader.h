/// Lines of words from a byte reader.
#pragma once

#include "byteReader.h"

#include <string>
#include <string_view>

namespace Meshes {

/// Walks through text line by line, and through a line word by word. Lines end with LF, CR LF or
/// CR, words with white space.
///
/// Nothing is stored but one word, which has a limit: a line, and the text, may be as long as they
/// like.
class TextReader {
  public:
    struct Rules {
        bool comments = true;       ///< a word that begins with '#' ends the line
        bool continuations = false; ///< a '\' at the end of a line joins it with the next
    };

    /// The longest word that is read, in bytes. Longer ones are no numbers and no keywords.
    static constexpr std::size_t longestWord = 1024;

    /// Begins in front of the first line, which has the number `firstLine`.
    TextReader(ByteReader& bytes, Rules rules, std::uint64_t firstLine = 1);

    /// Goes to the next line that has a word, and takes that word; false at the end of the data.
    /// What was left of the current line is passed over.
    bool nextLine();

    /// Takes the next word of the line; false where the line ends.
    bool nextWord();

    /// The word taken last. Valid until the next one is taken.
    std::string_view word() const { return current; }

    /// The number of the line, counted from 1, that the word taken last stands in.
    std::uint64_t line() const { return lineNumber; }

    /// The next word of the line as a number; gives up where there is none. `what` names it.
    float nextNumber(const char* what);
    std::uint32_t nextCount(const char* what);

    /// Gives up unless the line ends here.
    void expectEndOfLine();

    /// Gives up with the reason "line 12: what".
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
    std::uint64_t lineEnds = 0; ///< passed, but not yet counted in `lineNumber`
    bool started = false;       ///< the first line is no longer ahead
    bool escaped = false;       ///< a '\' was taken that did not end its line
};

} // namespace Meshes
