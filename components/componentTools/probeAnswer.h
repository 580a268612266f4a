/// What the process that loads a library tells the one that started it.
///
/// A sequence of messages, each with a mark, its kind, its length and a sum over it. The process
/// may end after any byte, and the library in it may have written anything: the reader takes
/// nothing on trust.
#pragma once

#include "components/componentTools/probe.h"

#include <optional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// How far the process has come.
enum class Stage : unsigned char { starting, loading, entryPoint, describing, enumerating };

/// "its initialisers", …
const wchar_t* nameOf(Stage stage);

/// What the library said of itself.
struct Description {
    std::wstring label, text;
    unsigned int announced = 0; ///< how many builders it says it has
    std::vector<RecordedBuilder> builders;
};

/// The bytes of one message.
std::string encodeStage(Stage stage);
std::string encodeFault(Verdict verdict, const std::wstring& subject, const std::wstring& words);
std::string encodeDescription(const Description& description);

/// Everything that came.
struct ProbeAnswer {
    Stage stage = Stage::starting;
    bool anything = false; ///< whether the process has said a word
    bool garbled = false;  ///< there is something that is no message
    bool cutOff = false;   ///< the last message is not whole, and counts as not sent
    std::optional<Finding> fault;
    std::optional<Description> description;
};

/// The status with which the process ends by itself, after its last message: one that no library is
/// likely to exit with.
inline constexpr int answeredStatus = 217;

/// Reads the messages up to the end, or up to the first thing that is none.
ProbeAnswer decodeAnswer(std::string_view bytes);

} // namespace Mz::Tools
