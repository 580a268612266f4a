// SPDX-License-Identifier: BSL-1.0
// Reads any content with any format, in several locales.
//
// Input: the locale, the length of the format, the format, the content.
#include "fuzz/locales.h"
#include "fuzz/reading.h"

#include <algorithm>
#include <array>
#include <vector>

namespace {

using namespace Mz;

constexpr std::size_t maximumDirectives = 8;

/// The target of a directive. It has room for any value, and for a text of the content's length.
using Place = std::vector<unsigned char>;

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Fuzz::Input input(data, size);
    Fuzz::chooseLocale(input.byte());
    const std::string_view characters = input.take(input.byte());
    const std::string_view content = input.rest();
    std::wstring format(characters.size(), L'\0');
    std::ranges::transform(characters, format.begin(),
                           [](char c) { return static_cast<unsigned char>(c); });
    if (std::ranges::count(format, L'%') > static_cast<std::ptrdiff_t>(maximumDirectives))
        return 0; // More directives than targets.

    Fuzz::expectSameReading<Fuzz::BaseStream>(content, [&](QrStream& stream, QrBufferedIO&,
                                                           std::string& told) {
        std::array<Place, maximumDirectives> p;
        p.fill(Place((content.size() + 2) * sizeof(wchar_t) + sizeof(double), 0x5A));
        const int assigned =
            stream.formattedRead(format.c_str(), p[0].data(), p[1].data(), p[2].data(), p[3].data(),
                                 p[4].data(), p[5].data(), p[6].data(), p[7].data());
        told += std::to_string(assigned);
        for (const Place& place : p)
            told.append(place.begin(), place.end());
        return std::string();
    });
    return 0;
}
