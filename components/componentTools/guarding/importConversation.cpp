// SPDX-License-Identifier: BSL-1.0
/// A message that is invalid, out of place or too large ends the conversation, and with it the
/// child. Nothing that arrived before is used then, except the last activity.
#include "components/componentTools/guarding/importConversation.h"

#include "components/componentTools/probing/frames.h"

#include <algorithm>
#include <optional>

namespace Mz::Tools {

namespace {

/// The replies that may wait for the child. A child waits for each, so more means that it calls
/// without reading.
constexpr std::size_t mostReplies = std::size_t{4} << 20;

/// Returns a fraction that a controller can print.
float sound(float fraction) {
    return fraction >= 0 ? std::min(fraction, 1.0f) : 0.0f; // False for a NaN, too.
}

const wchar_t* pointer(const std::optional<std::wstring>& text) {
    return text ? text->c_str() : nullptr;
}

} // namespace

void ImportConversation::receive(std::string& bytes, std::string& replies) {
    FrameReader frames(bytes);
    while (const std::optional<Frame> frame = over ? std::nullopt : frames.next()) {
        started = true;
        take(static_cast<ImportKind>(frame->kind), frame->payload, replies);
    }
    if (!over && (frames.garbled() || frames.remaining() > largestPayload)) {
        started = true;
        breakOff(Kit::ImportVerdict::garbled);
    }
    bytes.erase(0, over ? bytes.size() : bytes.size() - frames.remaining());
}

void ImportConversation::take(ImportKind kind, std::string_view payload, std::string& replies) {
    bool valid = payload.size() <= largestPayload;
    if (valid && kind == ImportKind::object)
        return takePiece(payload);
    if (valid && kind == ImportKind::stage) {
        const std::optional<std::wstring> next = decodeActivity(payload);
        valid = next && next->size() <= longestText;
        if (valid)
            activity = *next;
    } else if (valid && kind == ImportKind::confined) {
        const std::optional<ImportConfinement> given = decodeConfinement(payload);
        valid = given.has_value();
        if (valid)
            confinement = *given;
    } else if (valid && kind == ImportKind::call) {
        const std::optional<ControllerCall> call = decodeCall(payload);
        valid = call.has_value();
        if (valid)
            takeCall(*call, replies);
    } else if (valid && kind == ImportKind::outcome) {
        const std::optional<ImportOutcome> outcome = decodeOutcome(payload);
        valid = outcome && outcome->detail.size() <= longestText;
        if (valid) {
            result = *outcome;
            over = true;
        }
    } else {
        valid = false;
    }
    if (!valid)
        breakOff(Kit::ImportVerdict::garbled);
}

void ImportConversation::takePiece(std::string_view piece) {
    if (piece.size() > limits.answer || object.size() > limits.answer - piece.size())
        return breakOff(Kit::ImportVerdict::answerTooLong, std::to_wstring(limits.answer >> 20));
    object += piece;
}

void ImportConversation::takeCall(const ControllerCall& call, std::string& replies) {
    if (++calls > limits.calls)
        return breakOff(Kit::ImportVerdict::tooManyCalls, std::to_wstring(limits.calls));
    const ControllerReply reply = relay(call);
    if (call.function == ControllerFunction::abort)
        return breakOff(Kit::ImportVerdict::programAborted, call.text);
    if (!hasReply(call.function))
        return;
    replies += encode(reply);
    if (replies.size() > mostReplies)
        breakOff(Kit::ImportVerdict::garbled);
}

ControllerReply ImportConversation::relay(const ControllerCall& call) {
    if (!controller)
        return {call.function != ControllerFunction::error, {}};
    const wchar_t* const text = call.text.c_str();
    switch (call.function) {
    case ControllerFunction::message: controller->message(call.code, text); break;
    case ControllerFunction::warning: return {controller->warning(call.code, text), {}};
    case ControllerFunction::progress:
        return {controller->progress(sound(call.fraction), text), {}};
    case ControllerFunction::status: controller->status(text); break;
    case ControllerFunction::error: return {controller->error(call.code, text), {}};
    case ControllerFunction::log: controller->log(call.code, text); break;
    case ControllerFunction::abort: controller->abort(call.code, text); break; // It throws.
    case ControllerFunction::findFile:
        return {true, controller->findFile(text, pointer(call.searchPath),
                                           pointer(call.fallbackSearchPath))};
    }
    return {};
}

void ImportConversation::breakOff(Kit::ImportVerdict verdict, const std::wstring& detail) {
    result = {verdict, detail};
    over = true;
}

} // namespace Mz::Tools
