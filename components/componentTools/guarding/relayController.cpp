// SPDX-License-Identifier: BSL-1.0
/// A reply takes a switch of processes, which is far longer than a call of a function. Progress and
/// status, which importers report for every line of a file, are therefore sent at most every 10 ms.
#include "components/componentTools/guarding/relayController.h"

#include "components/base/assertions.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/probing/frames.h"

#include <utility>

namespace Mz::Tools {

namespace {

constexpr std::chrono::milliseconds reportInterval{10};

/// Returns the beginning of a text, as much as the host accepts.
std::wstring cut(const wchar_t* text) {
    return std::wstring(textOrEmpty(text)).substr(0, longestText);
}

std::optional<std::wstring> cutUnlessNull(const wchar_t* text) {
    return text ? std::optional(cut(text)) : std::nullopt;
}

ControllerCall report(ControllerFunction function, int code, const wchar_t* text) {
    ControllerCall call;
    call.function = function;
    call.code = code;
    call.text = cut(text);
    return call;
}

} // namespace

std::optional<std::string> HostMessages::next(ImportKind kind) {
    char block[65536];
    for (;;) {
        FrameReader frames(bytes);
        if (const std::optional<Frame> frame = frames.next()) {
            const bool expected = frame->kind == static_cast<unsigned char>(kind);
            std::string payload(frame->payload);
            bytes.erase(0, bytes.size() - frames.remaining());
            return expected ? std::optional(std::move(payload)) : std::nullopt;
        }
        const std::size_t got = frames.garbled() ? 0 : input.read(block, sizeof block);
        if (got == 0)
            return std::nullopt;
        bytes.append(block, got);
    }
}

/// Requires the lock.
ControllerReply RelayController::call(const ControllerCall& call) {
    const std::string message = encode(call);
    answers.write(message.data(), message.size());
    if (!hasReply(call.function))
        return {};
    const std::optional<std::string> payload = host.next(ImportKind::reply);
    const std::optional<ControllerReply> reply = payload ? decodeReply(*payload) : std::nullopt;
    return reply.value_or(ControllerReply{});
}

bool RelayController::isDue(std::optional<Clock::time_point>& last) {
    const Clock::time_point now = Clock::now();
    if (last && now - *last < reportInterval)
        return false;
    last = now;
    return true;
}

void RelayController::message(int code, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    call(report(ControllerFunction::message, code, text));
}

bool RelayController::warning(int code, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    return call(report(ControllerFunction::warning, code, text)).go;
}

bool RelayController::progress(float fraction, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    if (!isDue(lastProgress) && fraction < 1)
        return continues;
    ControllerCall progress = report(ControllerFunction::progress, 0, text);
    progress.fraction = fraction;
    continues = call(progress).go;
    return continues;
}

void RelayController::status(const wchar_t* text) {
    const std::lock_guard lock(mutex);
    if (isDue(lastStatus))
        call(report(ControllerFunction::status, 0, text));
}

bool RelayController::error(int code, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    return call(report(ControllerFunction::error, code, text)).go;
}

void RelayController::log(int code, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    call(report(ControllerFunction::log, code, text));
}

void RelayController::abort(int code, const wchar_t* text) {
    const std::lock_guard lock(mutex);
    call(report(ControllerFunction::abort, code, text));
    // The host kills this process meanwhile.
    Assertions::throwProgramAborted("components/componentTools/guarding/relayController", __LINE__);
}

std::wstring RelayController::findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                       const wchar_t* fallbackSearchPath) {
    const std::lock_guard lock(mutex);
    ControllerCall search = report(ControllerFunction::findFile, 0, fileName);
    search.searchPath = cutUnlessNull(searchPath);
    search.fallbackSearchPath = cutUnlessNull(fallbackSearchPath);
    return call(search).file;
}

} // namespace Mz::Tools
