// SPDX-License-Identifier: BSL-1.0
/// Random numbers come from `std::mt19937` without the standard distributions, whose results differ
/// between libraries: the same seed must give the same input on every platform.
#include "components/componentTools/checking/inputs.h"

#include "components/componentManager/nativeText.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <random>

namespace Mz::Tools {

namespace {

using Random = std::mt19937;

/// Returns a number below `limit`, which must not be 0.
std::size_t below(Random& random, std::size_t limit) {
    return random() % limit;
}

std::string randomBytes(Random& random, std::size_t size) {
    std::string bytes(size, '\0');
    for (char& byte : bytes)
        byte = static_cast<char>(random() & 255);
    return bytes;
}

template <std::size_t size>
std::string literal(const char (&bytes)[size]) {
    return std::string(bytes, size - 1);
}

/// The beginnings of files of well-known formats. None is complete.
std::vector<CheckInput> foreignInputs() {
    return {
        {L"PNG header",
         literal("\x89PNG\r\n\x1A\n\0\0\0\rIHDR\xFF\xFF\xFF\xFF\0\0\0\1\10\6\0\0\0")},
        {L"JPEG header", literal("\xFF\xD8\xFF\xE0\0\x10JFIF\0\1\1\0\0\1\0\1\0\0")},
        {L"GIF header", literal("GIF89a\xFF\xFF\xFF\xFF\xF7\0\0")},
        {L"BMP header", literal("BM\xFF\xFF\xFF\x7F\0\0\0\0\66\0\0\0\x28\0\0\0\xFF\xFF\xFF\x7F")},
        {L"TIFF header", literal("II*\0\xFF\xFF\xFF\x7F")},
        {L"ZIP header", literal("PK\3\4\x14\0\0\0\10\0\0\0\0\0\0\0\0\0\xFF\xFF\xFF\x7F")},
        {L"gzip header", literal("\x1F\x8B\10\0\0\0\0\0\0\3")},
        {L"RIFF header", literal("RIFF\xFF\xFF\xFF\x7FWAVEfmt \x10\0\0\0")},
        {L"ELF header", literal("\177ELF\2\1\1\0\0\0\0\0\0\0\0\0\3\0>\0\1\0\0\0")},
        {L"DOS header", literal("MZ\x90\0\3\0\0\0\4\0\0\0\xFF\xFF\0\0")},
        {L"PDF header", "%PDF-1.7\n%\xE2\xE3\xCF\xD3\n1 0 obj\n<< /Length 999999999 >>\n"},
        {L"XML", "<?xml version=\"1.0\"?>\n<a b='c'><!-- --><d>&#x10FFFF;</d>\n"},
        {L"JSON", "{\"a\": [1, -2.5e308, null, {\"b\": \"\\u0000\"}"},
        {L"key and value", "[section]\nkey = value\n= \nkey\n[\n"},
        {L"table", "1,2,3\n\"a,\"\"b\"\n,,,,,\n;\t;\n"},
        {L"UTF-16 text", literal("\xFF\xFEt\0e\0x\0t\0\0\xD8\n\0")},
        {L"UTF-8 mark", "\xEF\xBB\xBF"
                        "text\n"},
        {L"numbers",
         "0 -0 1 -1 4294967296 -9223372036854775809 1e999 nan inf 0x10 1.5.5 99999999999999999\n"},
        {L"count that is too large", "4000000000\n1 2 3\n"},
        {L"count that is negative", "-1\n1 2 3\n"},
    };
}

std::vector<CheckInput> plainInputs(Random& random) {
    return {
        {L"empty", ""},
        {L"one zero byte", std::string(1, '\0')},
        {L"one line end", "\n"},
        {L"one letter", "a"},
        {L"64 zero bytes", std::string(64, '\0')},
        {L"64 bytes 0xFF", std::string(64, '\xFF')},
        {L"long line", std::string(70'000, 'a')},
        {L"many line ends", std::string(5'000, '\n')},
        {L"brackets", std::string(20'000, '[')},
        {L"4 random bytes", randomBytes(random, 4)},
        {L"64 random bytes", randomBytes(random, 64)},
        {L"4096 random bytes", randomBytes(random, 4096)},
    };
}

} // namespace

CheckInputs::CheckInputs(std::uint32_t start, const std::vector<std::filesystem::path>& samples)
    : seed(start) {
    for (const std::filesystem::path& sample : samples) {
        std::ifstream file(sample, std::ios::binary);
        std::string bytes(std::istreambuf_iterator<char>(file), {});
        if (file)
            fixed.push_back({displayName(sample.filename()), std::move(bytes), true});
    }
    sampleCount = fixed.size();
    for (std::size_t index = 0; index < sampleCount; ++index)
        for (const std::size_t eighths : {1u, 4u, 7u}) {
            const CheckInput& whole = fixed[index];
            fixed.push_back({whole.name + L", the first " + std::to_wstring(eighths) + L"/8",
                             whole.bytes.substr(0, whole.bytes.size() * eighths / 8), false});
        }
    Random random(seed);
    for (CheckInput& input : plainInputs(random))
        fixed.push_back(std::move(input));
    for (CheckInput& input : foreignInputs())
        fixed.push_back(std::move(input));
}

CheckInput CheckInputs::at(std::size_t number) const {
    if (number < fixed.size())
        return fixed[number];
    // Samples are changed more often than other input: they reach further into a reader.
    Random random(seed ^ static_cast<std::uint32_t>(number) * 2654435761u);
    const bool ofSample = sampleCount > 0 && random() % 4 != 0;
    const CheckInput& source = fixed[below(random, ofSample ? sampleCount : fixed.size())];
    return {source.name + L", change " + std::to_wstring(number),
            changedBytes(source.bytes, seed, number), false};
}

std::string changedBytes(std::string bytes, std::uint32_t seed, std::size_t number) {
    Random random(seed + static_cast<std::uint32_t>(number));
    for (std::size_t changes = 1 + below(random, 4); changes > 0; --changes) {
        const std::size_t at = below(random, bytes.size() + 1);
        const std::size_t length = std::min(below(random, 16), bytes.size() - at);
        switch (random() % 6) {
        case 0: // One bit.
            if (at < bytes.size())
                bytes[at] = static_cast<char>(bytes[at] ^ 1 << random() % 8);
            break;
        case 1: bytes.insert(at, randomBytes(random, 1 + below(random, 8))); break;
        case 2: bytes.erase(at, length); break;
        case 3: bytes.insert(at, bytes.substr(at, length)); break;
        case 4: bytes.resize(at); break;
        default: // A number that is likely to be a count.
            bytes.replace(at, std::min<std::size_t>(4, bytes.size() - at),
                          random() % 2 ? "\xFF\xFF\xFF\xFF" : "\x7F\xFF\xFF\xFF");
            break;
        }
    }
    return bytes;
}

} // namespace Mz::Tools
