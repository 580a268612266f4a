// SPDX-License-Identifier: BSL-1.0
/// All numbers are big-endian. Texts are sent as character codes, so that they arrive unchanged in
/// every locale. A payload is read to its last byte, and each count is compared with the bytes that
/// are there before anything is reserved.
#include "components/componentTools/guarding/importMessages.h"

#include "components/componentTools/probing/frames.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <limits>

namespace Mz::Tools {

namespace {

/// Appends values to a payload. Each function takes what that of `Reader` returns.
class Writer {
  public:
    void number(std::uint64_t value, int size) {
        for (int shift = size * 8 - 8; shift >= 0; shift -= 8)
            bytes += static_cast<char>(value >> shift & 255);
    }
    void flag(bool value) { number(value, 1); }
    void data(const std::string& value) {
        number(value.size(), 4);
        bytes += value;
    }
    void text(const std::wstring& value) {
        number(value.size(), 4);
        for (const wchar_t character : value)
            number(static_cast<std::uint32_t>(character), 4);
    }
    void text(const std::optional<std::wstring>& value) {
        flag(value.has_value());
        if (value)
            text(*value);
    }

    std::string frame(ImportKind kind) const {
        return frameOf(static_cast<unsigned char>(kind), bytes);
    }

  private:
    std::string bytes;
};

/// Takes values from a payload. After the first invalid one it returns zeros.
class Reader {
  public:
    explicit Reader(std::string_view payload) : rest(payload) {}

    std::uint64_t number(std::size_t size) {
        if (rest.size() < size)
            return fail();
        std::uint64_t value = 0;
        for (const char byte : rest.substr(0, size))
            value = value << 8 | static_cast<unsigned char>(byte);
        rest.remove_prefix(size);
        return value;
    }
    std::uint32_t word() { return static_cast<std::uint32_t>(number(4)); }
    bool flag() {
        const std::uint64_t value = number(1);
        return value > 1 ? fail() != 0 : value == 1;
    }
    std::string data() {
        const std::size_t size = word();
        if (size > rest.size())
            return fail(), std::string();
        std::string value(rest.substr(0, size));
        rest.remove_prefix(size);
        return value;
    }
    std::wstring text() {
        const std::size_t size = word();
        if (size > rest.size() / 4)
            return fail(), std::wstring();
        std::wstring value;
        value.reserve(size);
        while (value.size() < size) {
            const std::uint32_t code = word();
            // A NUL would cut the text for its receiver.
            if (code == 0 || code > std::uint32_t{std::numeric_limits<wchar_t>::max()})
                return fail(), std::wstring();
            value += static_cast<wchar_t>(code);
        }
        return value;
    }
    std::optional<std::wstring> optionalText() {
        return flag() ? std::optional(text()) : std::nullopt;
    }

    /// Returns `value` if all of the payload was valid.
    template <class Value>
    std::optional<Value> complete(Value value) const {
        return valid && rest.empty() ? std::optional(std::move(value)) : std::nullopt;
    }

  private:
    std::uint64_t fail() {
        valid = false;
        rest = {};
        return 0;
    }

    std::string_view rest;
    bool valid = true;
};

/// Returns whether the child itself can report the verdict.
bool isOfChild(Kit::ImportVerdict verdict) {
    using enum Kit::ImportVerdict;
    switch (verdict) {
    case imported:
    case notTaken:
    case gaveNothing:
    case notPersistent:
    case unknownClass:
    case notStored:
    case threw:
    case programAborted:
    case crashed:
    case aborted:
    case outOfMemory:
    case answerTooLong:
    case guardFailed: return true;
    default: return false;
    }
}

} // namespace

bool hasReply(ControllerFunction function) {
    switch (function) {
    case ControllerFunction::warning:
    case ControllerFunction::progress:
    case ControllerFunction::error:
    case ControllerFunction::findFile: return true;
    default: return false;
    }
}

std::string encode(const ImportTask& task) {
    Writer writer;
    writer.data(task.recordedList);
    writer.text(task.searchPath);
    writer.data(task.locale);
    writer.text(task.fileName);
    writer.text(task.builderName);
    writer.number(task.refused, 8);
    writer.number(task.answer, 8);
    writer.flag(task.progressShown);
    writer.flag(task.statusShown);
    writer.flag(task.errorShown);
    return writer.frame(ImportKind::task);
}

std::optional<ImportTask> decodeTask(std::string_view payload) {
    Reader reader(payload);
    ImportTask task;
    task.recordedList = reader.data();
    task.searchPath = reader.text();
    task.locale = reader.data();
    task.fileName = reader.text();
    task.builderName = reader.text();
    task.refused = reader.number(8);
    task.answer = reader.number(8);
    task.progressShown = reader.flag();
    task.statusShown = reader.flag();
    task.errorShown = reader.flag();
    return reader.complete(std::move(task));
}

std::string encode(const ControllerReply& reply) {
    Writer writer;
    writer.flag(reply.go);
    writer.text(reply.file);
    return writer.frame(ImportKind::reply);
}

std::optional<ControllerReply> decodeReply(std::string_view payload) {
    Reader reader(payload);
    ControllerReply reply;
    reply.go = reader.flag();
    reply.file = reader.text();
    return reader.complete(std::move(reply));
}

std::string encode(const ImportConfinement& confinement) {
    Writer writer;
    writer.flag(confinement.files);
    writer.flag(confinement.network);
    writer.flag(confinement.processes);
    return writer.frame(ImportKind::confined);
}

std::optional<ImportConfinement> decodeConfinement(std::string_view payload) {
    Reader reader(payload);
    ImportConfinement confinement;
    confinement.files = reader.flag();
    confinement.network = reader.flag();
    confinement.processes = reader.flag();
    return reader.complete(confinement);
}

std::string encodeActivity(const std::wstring& activity) {
    Writer writer;
    writer.text(activity);
    return writer.frame(ImportKind::stage);
}

std::optional<std::wstring> decodeActivity(std::string_view payload) {
    Reader reader(payload);
    std::wstring activity = reader.text();
    return reader.complete(std::move(activity));
}

std::string encode(const ControllerCall& call) {
    Writer writer;
    writer.number(static_cast<std::uint64_t>(call.function), 1);
    writer.number(static_cast<std::uint32_t>(call.code), 4);
    writer.number(std::bit_cast<std::uint32_t>(call.fraction), 4);
    writer.text(call.text);
    writer.text(call.searchPath);
    writer.text(call.fallbackSearchPath);
    return writer.frame(ImportKind::call);
}

std::optional<ControllerCall> decodeCall(std::string_view payload) {
    Reader reader(payload);
    ControllerCall call;
    const std::uint64_t function = reader.number(1);
    if (function > static_cast<std::uint64_t>(ControllerFunction::findFile))
        return std::nullopt;
    call.function = static_cast<ControllerFunction>(function);
    call.code = static_cast<int>(reader.word());
    call.fraction = std::bit_cast<float>(reader.word());
    call.text = reader.text();
    call.searchPath = reader.optionalText();
    call.fallbackSearchPath = reader.optionalText();
    return reader.complete(std::move(call));
}

std::string encodePiece(std::string_view bytes) {
    return frameOf(static_cast<unsigned char>(ImportKind::object), bytes);
}

std::string encode(const ImportOutcome& outcome) {
    Writer writer;
    writer.number(static_cast<std::uint64_t>(outcome.verdict), 1);
    writer.text(outcome.detail);
    return writer.frame(ImportKind::outcome);
}

std::optional<ImportOutcome> decodeOutcome(std::string_view payload) {
    Reader reader(payload);
    ImportOutcome outcome;
    outcome.verdict = static_cast<Kit::ImportVerdict>(reader.number(1));
    outcome.detail = reader.text();
    return isOfChild(outcome.verdict) ? reader.complete(std::move(outcome)) : std::nullopt;
}

} // namespace Mz::Tools
