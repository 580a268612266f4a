// SPDX-License-Identifier: BSL-1.0
/// The JSON of stored files and of messages between processes. Its reader and writers are compiled
/// once, because each source that instantiates them takes seconds.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// What was read, and messages. A file or a process may send any number of members, so they are
/// found in logarithmic time.
using Json = nlohmann::json;

/// What is written for people: members keep the order in which they are added.
using OrderedJson = nlohmann::ordered_json;

/// \throws Json::exception if the text is invalid
Json jsonIn(std::string_view text);

/// Reads a value up to the end of the input.
/// \throws Json::exception if the text is invalid
/// \throws std::ios_base::failure if the buffer of the stream throws it
Json jsonIn(std::istream& input);

/// Returns a whole number. What is read from a file may be any other number, which no integer
/// holds. \throws Json::exception if the value is no whole number
std::int64_t integerOf(const Json& value);

/// Returns the value on one line in ASCII, which does not depend on a locale. Invalid UTF-8 is
/// replaced.
std::string asciiOf(const Json& value);

/// Returns the value in ASCII for a file that people can read: indented, with an end of line.
/// \throws OrderedJson::exception if a text is invalid UTF-8
std::string linesOf(const OrderedJson& value);

} // namespace Mz::Tools
