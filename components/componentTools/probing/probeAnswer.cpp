// SPDX-License-Identifier: BSL-1.0
/// Payloads use the binary stream, but texts are sent as character codes, so that the two processes
/// need not have the same locale.
#include "components/componentTools/probing/probeAnswer.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentTools/probing/frames.h"

#include <limits>
#include <sstream>
#include <stdexcept>

namespace Mz::Tools {

namespace {

enum class Kind : unsigned char { stage, fault, description };

/// Writes a text as character codes, independent of the locale.
void writeText(QrStream& stream, const std::wstring& text) {
    stream << static_cast<unsigned int>(text.size());
    for (const wchar_t character : text)
        stream << static_cast<unsigned int>(character);
}

std::wstring readText(QrStream& stream) {
    unsigned int size = 0;
    stream >> size;
    std::wstring text;
    for (; size > 0; --size) {
        unsigned int code = 0;
        stream >> code;
        if (code > static_cast<std::uint32_t>(std::numeric_limits<wchar_t>::max()))
            throw std::runtime_error("invalid character");
        text += static_cast<wchar_t>(code);
    }
    return text;
}

template <class Write>
std::string message(Kind kind, Write write) {
    std::ostringstream content;
    QrOutBuffer buffer(&content);
    QrBinaryStream body(&buffer);
    write(body);
    return frameOf(static_cast<unsigned char>(kind), content.str());
}

/// Reads one payload, which must not contain more than its message.
class PayloadReader {
  public:
    explicit PayloadReader(std::string_view payload)
        : content(std::string(payload)), buffer(&content), stream(&buffer) {}

    /// \throws std::exception if the payload is invalid
    void read(Kind kind, ProbeAnswer& answer) {
        switch (kind) {
        case Kind::stage: answer.stage = readStage(); break;
        case Kind::fault: answer.fault = readFault(); break;
        case Kind::description: answer.description = readDescription(); break;
        default: throw std::runtime_error("unknown kind of message");
        }
        if (buffer.read() != -1)
            throw std::runtime_error("bytes after the message");
    }

  private:
    Stage readStage() {
        unsigned char stage = 0;
        stream >> stage;
        if (stage > static_cast<unsigned char>(Stage::enumerating))
            throw std::runtime_error("unknown stage");
        return static_cast<Stage>(stage);
    }

    Finding readFault() {
        const std::wstring name = readText(stream);
        const auto verdict = verdictNamed(std::string(name.begin(), name.end()));
        if (!verdict)
            throw std::runtime_error("unknown verdict");
        Finding fault{*verdict, {}, {}};
        fault.subject = readText(stream);
        fault.words = readText(stream);
        return fault;
    }

    Description readDescription() {
        Description description;
        description.label = readText(stream);
        description.text = readText(stream);
        unsigned int count = 0;
        stream >> description.announced >> count;
        for (; count > 0; --count) {
            RecordedBuilder& builder = description.builders.emplace_back();
            stream >> builder.uid;
            builder.name = readText(stream);
            builder.label = readText(stream);
            builder.text = readText(stream);
            stream >> builder.number >> builder.flag;
        }
        return description;
    }

    std::istringstream content;
    QrInBuffer buffer;
    QrBinaryStream stream;
};

} // namespace

const wchar_t* nameOf(Stage stage) {
    switch (stage) {
    case Stage::loading: return L"its initialisers";
    case Stage::entryPoint: return L"its entry point";
    case Stage::describing: return L"its description";
    case Stage::enumerating: return L"enumerateBuilders";
    default: return L"the start of its process";
    }
}

std::string encodeStage(Stage stage) {
    return message(Kind::stage,
                   [&](QrStream& stream) { stream << static_cast<unsigned char>(stage); });
}

std::string encodeFault(Verdict verdict, const std::wstring& subject, const std::wstring& words) {
    return message(Kind::fault, [&](QrStream& stream) {
        const std::string name = nameOf(verdict);
        writeText(stream, std::wstring(name.begin(), name.end()));
        writeText(stream, subject);
        writeText(stream, words);
    });
}

std::string encodeDescription(const Description& description) {
    return message(Kind::description, [&](QrStream& stream) {
        writeText(stream, description.label);
        writeText(stream, description.text);
        stream << description.announced << static_cast<unsigned int>(description.builders.size());
        for (const RecordedBuilder& builder : description.builders) {
            stream << builder.uid;
            writeText(stream, builder.name);
            writeText(stream, builder.label);
            writeText(stream, builder.text);
            stream << builder.number << builder.flag;
        }
    });
}

ProbeAnswer decodeAnswer(std::string_view bytes) {
    ProbeAnswer answer;
    FrameReader frames(bytes);
    while (const std::optional<Frame> frame = frames.next()) {
        try {
            PayloadReader(frame->payload).read(static_cast<Kind>(frame->kind), answer);
            answer.anything = true;
        } catch (const std::runtime_error&) {
            answer.garbled = true;
            return answer;
        }
    }
    answer.garbled = frames.garbled();
    answer.cutOff = frames.cutOff();
    return answer;
}

} // namespace Mz::Tools
