// SPDX-License-Identifier: BSL-1.0
/// What the two processes of a guarded import say to each other, in the frames of
/// `probing/frames.*`.
///
/// The child sends stages, calls of the process controller, pieces of the stored object, and last
/// its outcome. The host sends the task, and a reply to each call that has a result.
#pragma once

#include "components/componentTools/guardedImport.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// The argument by which `mzcomponents-probe` becomes the child of a guarded import.
inline constexpr const char* importArgument = "--import";

/// The kinds of the frames. Those of other children are smaller.
enum class ImportKind : unsigned char {
    task = 128,
    reply,
    confined,
    stage,
    call,
    object, ///< a piece of the stored object, without any structure
    outcome,
};

/// The largest piece of the stored object in one frame, and the largest other payload, in bytes.
inline constexpr std::size_t largestPiece = 65536, largestPayload = std::size_t{1} << 19;

/// The longest text of a call, in characters. The sender cuts longer ones.
inline constexpr std::size_t longestText = 16384;

/// What the child does.
struct ImportTask {
    std::string recordedList; ///< of the host's component manager
    std::wstring searchPath;
    std::string locale;    ///< for `setlocale(LC_ALL, …)`
    std::wstring fileName; ///< for the import builders
    std::wstring builderName;
    std::uint64_t refused = 0; ///< memory that the system enforces, in bytes
    std::uint64_t answer = 0;  ///< as in `ImportLimits`
    bool progressShown = false, statusShown = false, errorShown = false;
};

/// What the child cannot do any more, as in `GuardedImport`.
struct ImportConfinement {
    bool files = false, network = false, processes = false;
};

/// A function of the process controller that an importer calls.
enum class ControllerFunction : unsigned char {
    message,
    warning,
    progress,
    status,
    error,
    log,
    abort,
    findFile,
};

/// A call of the process controller.
struct ControllerCall {
    ControllerFunction function = ControllerFunction::message;
    int code = 0;
    float fraction = 0;
    std::wstring text;                                          ///< or the name of a file
    std::optional<std::wstring> searchPath, fallbackSearchPath; ///< of `findFile`; may be null
};

/// Returns whether the child waits for a reply to the call.
bool hasReply(ControllerFunction function);

/// The result of a call.
struct ControllerReply {
    bool go = false;
    std::wstring file;
};

/// The end of an import, as the child reports it.
struct ImportOutcome {
    Kit::ImportVerdict verdict = Kit::ImportVerdict::guardFailed;
    std::wstring detail;
};

/// Return the bytes of one message.
std::string encode(const ImportTask& task);
std::string encode(const ControllerReply& reply);
std::string encode(const ImportConfinement& confinement);
std::string encodeActivity(const std::wstring& activity);
std::string encode(const ControllerCall& call);
std::string encodePiece(std::string_view bytes);
std::string encode(const ImportOutcome& outcome);

/// Decode the payload of one message; `std::nullopt` if it is invalid. Memory use is bounded by the
/// size of the payload.
std::optional<ImportTask> decodeTask(std::string_view payload);
std::optional<ControllerReply> decodeReply(std::string_view payload);
std::optional<ImportConfinement> decodeConfinement(std::string_view payload);
std::optional<std::wstring> decodeActivity(std::string_view payload);
std::optional<ControllerCall> decodeCall(std::string_view payload);
/// Accepts only verdicts that a child can reach.
std::optional<ImportOutcome> decodeOutcome(std::string_view payload);

} // namespace Mz::Tools
