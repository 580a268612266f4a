// SPDX-License-Identifier: BSL-1.0
/// The protocol between `mzcomponents-probe` and the process that started it.
///
/// The probe writes a sequence of messages. Each has a magic number, a kind, a length and a
/// checksum. The probe may end after any byte, and the library in it may write anything into the
/// pipe, so the decoder trusts nothing.
#pragma once

#include "components/componentTools/probe.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// The stages of a probe, in order.
enum class Stage : unsigned char { starting, loading, entryPoint, describing, enumerating };

/// Returns the stage as part of a sentence, for example "its initialisers".
const wchar_t* nameOf(Stage stage);

/// The description of a library.
struct Description {
    std::wstring label, text;
    unsigned int announced = 0; ///< the result of `getBuilderCount`
    std::vector<RecordedBuilder> builders;
};

/// Return the bytes of one message.
std::string encodeStage(Stage stage);
std::string encodeFault(Verdict verdict, const std::wstring& subject, const std::wstring& words);
std::string encodeDescription(const Description& description);

/// The decoded messages.
struct ProbeAnswer {
    Stage stage = Stage::starting;
    bool anything = false; ///< at least one valid message arrived
    bool garbled = false;  ///< the bytes contain something that is not a valid message
    bool cutOff = false;   ///< the last message is incomplete and was ignored
    std::optional<Finding> fault;
    std::optional<Description> description;
};

/// The exit status of a probe that has sent its last message. A library is unlikely to exit with
/// it.
inline constexpr int answeredStatus = 217;

/// Decodes the messages up to the end, or up to the first invalid byte. A later message of a kind
/// replaces an earlier one.
ProbeAnswer decodeAnswer(std::string_view bytes);

} // namespace Mz::Tools
