// SPDX-License-Identifier: BSL-1.0
// Reads values of all types, single and in arrays, from all kinds of stream, in several locales.
//
// Input: the kind of stream and the locale, the number of steps, the steps, the content.
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"
#include "fuzz/locales.h"
#include "fuzz/reading.h"

#include <array>
#include <memory>

namespace {

using namespace Mz;

std::string bytesOf(const void* data, std::size_t size) {
    return {static_cast<const char*>(data), size};
}

template <class T>
void readSingle(QrStream& stream, std::string& told) {
    T value{};
    stream >> value;
    told += bytesOf(&value, sizeof value);
}

template <class T>
void readCounted(QrStream& stream, std::string& told, int count) {
    std::array<T, 20> values{};
    const int came = stream.read(values[0], count);
    told += std::to_string(came) + ":";
    if (came > 0)
        told += bytesOf(values.data(), static_cast<std::size_t>(came) * sizeof(T));
}

std::string narrow(const std::wstring& text) {
    return bytesOf(text.data(), text.size() * sizeof(wchar_t));
}

template <>
void readSingle<std::wstring>(QrStream& stream, std::string& told) {
    std::wstring text;
    stream >> text;
    told += narrow(text);
}

template <>
void readCounted<std::wstring>(QrStream& stream, std::string& told, int count) {
    std::array<std::wstring, 20> texts;
    told += std::to_string(stream.read(texts[0], count)) + ":";
    for (const std::wstring& text : texts)
        told += narrow(text) + ";";
}

/// Reads one value, or with bit 4 of `step` an array of up to 18 values.
template <class T>
void readValues(QrStream& stream, std::string& told, unsigned int step) {
    if (step & 0x10)
        readCounted<T>(stream, told, static_cast<int>(step >> 4) + static_cast<int>(step % 5) - 1);
    else
        readSingle<T>(stream, told);
}

/// Uses the IO as other code may do between two values.
void disturb(QrBufferedIO& io, QrStream& stream, std::string& told, unsigned int step) {
    switch (step >> 4 & 7) {
    case 0: told += std::to_string(io.read()); break;
    case 1: told += std::to_string(io.tell()); break;
    case 2: told += std::to_string(io.seek(step >> 3, 0)); break;
    case 3: io.skipWhiteSpace(3); break;
    case 4: io.ungetc('7'); break;
    case 5: told += std::to_string(stream.computeLineNb()); break;
    case 6: told += std::to_string(io.canSeek()); break;
    default: io.ungetc(L'-'); break;
    }
}

void take(QrStream& stream, QrBufferedIO& io, std::string& told, unsigned int step) {
    switch (step & 15) {
    case 0: return readValues<unsigned long long>(stream, told, step);
    case 1: return readValues<int64>(stream, told, step);
    case 2: return readValues<std::wstring>(stream, told, step);
    case 3: return readValues<double>(stream, told, step);
    case 4: return readValues<float>(stream, told, step);
    case 5: return readValues<bool>(stream, told, step);
    case 6: return readValues<unsigned long>(stream, told, step);
    case 7: return readValues<long>(stream, told, step);
    case 8: return readValues<unsigned int>(stream, told, step);
    case 9: return readValues<int>(stream, told, step);
    case 10: return readValues<unsigned short>(stream, told, step);
    case 11: return readValues<short>(stream, told, step);
    case 12: return readValues<unsigned char>(stream, told, step);
    case 13: return readValues<wchar_t>(stream, told, step);
    case 14: return readValues<char>(stream, told, step);
    default: return disturb(io, stream, told, step);
    }
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Fuzz::Input input(data, size);
    const unsigned int kind = input.byte();
    Fuzz::chooseLocale(kind / 3);
    const std::string_view steps = input.take(input.byte() % 32);
    const std::string_view content = input.rest();
    const auto work = [&](QrStream& stream, QrBufferedIO& io, std::string& told) {
        for (const char step : steps) {
            // After a step that fails, the next step continues.
            told += Fuzz::outcomeOf([&] {
                take(stream, io, told, static_cast<unsigned char>(step));
                return std::string("; ");
            });
        }
        return std::string();
    };
    switch (kind % 3) {
    case 0: Fuzz::expectSameReading<QrBinaryStream>(content, work); break;
    case 1: Fuzz::expectSameReading<QrTextStream>(content, work); break;
    default: Fuzz::expectSameReading<Fuzz::BaseStream>(content, work); break;
    }
    return 0;
}
