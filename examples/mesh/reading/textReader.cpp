// SPDX-License-Identifier: BSL-1.0
/// Reads byte by byte with one byte of lookahead, and stores one word. Line ends inside a continued
/// line are counted separately and added when the next word begins, so that a message names the
/// line in which the word is and not the one in which its statement began.
#include "textReader.h"

#include "failure.h"
#include "number.h"

#include <optional>

namespace Meshes {

namespace {

bool isBlank(int byte) {
    return byte == ' ' || byte == '\t' || byte == '\v' || byte == '\f';
}

bool isLineEnd(int byte) {
    return byte == '\n' || byte == '\r';
}

} // namespace

TextReader::TextReader(ByteReader& bytes, Rules rules, std::uint64_t firstLine)
    : bytes(bytes), rules(rules), lineNumber(firstLine) {}

bool TextReader::nextLine() {
    if (started)
        skipLine();
    started = true;
    while (!nextWord()) {
        if (bytes.peek() == ByteReader::end)
            return false;
        skipLineEnd();
    }
    return true;
}

bool TextReader::nextWord() {
    skipBlanks();
    const int byte = bytes.peek();
    if (!escaped) {
        if (byte == ByteReader::end || isLineEnd(byte))
            return false;
        if (rules.comments && byte == '#') {
            while (bytes.peek() != ByteReader::end && !isLineEnd(bytes.peek()))
                bytes.get();
            return false;
        }
    }
    takeWord();
    return true;
}

void TextReader::takeWord() {
    lineNumber += lineEnds;
    lineEnds = 0;
    current.clear();
    if (escaped)
        current.push_back('\\');
    escaped = false;
    for (int byte = bytes.peek(); byte != ByteReader::end && !isBlank(byte) && !isLineEnd(byte);
         byte = bytes.peek()) {
        bytes.get();
        if (rules.continuations && byte == '\\' && isLineEnd(bytes.peek())) {
            skipLineEnd();
            return;
        }
        if (current.size() == longestWord)
            fail("a word of more than " + std::to_string(longestWord) + " bytes, " +
                 quoted(current));
        current.push_back(static_cast<char>(byte));
    }
}

void TextReader::skipBlanks() {
    while (!escaped && (isBlank(bytes.peek()) || skipContinuation()))
        if (isBlank(bytes.peek()))
            bytes.get();
}

/// Skips a '\' and the line end after it. A '\' before anything else begins a word.
bool TextReader::skipContinuation() {
    if (!rules.continuations || bytes.peek() != '\\')
        return false;
    bytes.get();
    if (isLineEnd(bytes.peek()))
        skipLineEnd();
    else
        escaped = true;
    return !escaped;
}

void TextReader::skipLine() {
    bool comment = false;
    int previous = escaped ? '\\' : ' ';
    escaped = false;
    for (int byte = bytes.peek(); byte != ByteReader::end && !isLineEnd(byte);
         byte = bytes.peek()) {
        bytes.get();
        comment = comment || (rules.comments && byte == '#' && isBlank(previous));
        // A '\' at the end of a comment does not continue the line: the comment may be a path.
        if (rules.continuations && !comment && byte == '\\' && isLineEnd(bytes.peek()))
            skipLineEnd();
        previous = byte;
    }
}

void TextReader::skipLineEnd() {
    if (bytes.get() == '\r' && bytes.peek() == '\n')
        bytes.get();
    ++lineEnds;
}

float TextReader::nextNumber(const char* what) {
    if (!nextWord())
        fail(std::string("the line ends before ") + what);
    const std::optional<float> number = parseFloat(current);
    if (!number)
        fail(quoted(current) + " is no number for " + what);
    return *number;
}

std::uint32_t TextReader::nextCount(const char* what) {
    if (!nextWord())
        fail(std::string("the line ends before ") + what);
    const std::optional<std::uint32_t> count = parseUnsigned(current);
    if (!count)
        fail(quoted(current) + " is no number for " + what);
    return *count;
}

void TextReader::expectEndOfLine() {
    if (nextWord())
        fail(quoted(current) + " is more than this line may have");
}

void TextReader::fail(const std::string& what) const {
    throw ImportFailure{"line " + std::to_string(lineNumber) + ": " + what};
}

} // namespace Meshes
