// SPDX-License-Identifier: BSL-1.0
/// Proves what the pages say of streams and locales, where no other test does.
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/textStream.h"
#include "tests/unit/locales.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Returns the bytes of the value in binary form.
template <class T>
std::string bytesOf(const T& value) {
    std::ostringstream out;
    QrOutBuffer buffer(&out);
    QrBinaryStream stream(&buffer);
    stream << value;
    return out.str();
}

TEST(DocumentedFacts, TypesOfCstdintHaveTheWidthOfTheTypeThatTheyName) {
    const std::size_t width = sizeof(long) == sizeof(std::int64_t) ? 4 : 8; // Linux : Windows
    EXPECT_EQ(bytesOf(std::int64_t{1}).size(), width);
    EXPECT_EQ(bytesOf(std::uint64_t{1}).size(), width);
    EXPECT_EQ(bytesOf(std::size_t{1}).size(), width);
    EXPECT_EQ(bytesOf(int64{1}).size(), 8U);
    EXPECT_EQ(bytesOf(1ULL).size(), 8U);
    EXPECT_EQ(bytesOf(1).size(), 4U);
    EXPECT_EQ(bytesOf(1U).size(), 4U);
}

TEST(DocumentedFacts, ReadingTakesHhForHAndLlForL) {
    std::istringstream in("513 4294967298");
    QrInBuffer buffer(&in);
    QrTextStream stream(&buffer);
    unsigned char bytes[4] = {0xA5, 0xA5, 0xA5, 0xA5};
    long number = 0;
    ASSERT_EQ(stream.formattedRead(L"%hhu %lld", bytes, &number), 2);
    EXPECT_EQ(bytes[0], 1);
    EXPECT_EQ(bytes[1], 2); // The second byte is written, too.
    EXPECT_EQ(bytes[2], 0xA5);
    EXPECT_EQ(number, 2); // 4294967298 is 2 in 32 bits.
}

TEST(DocumentedFacts, WritingTakesHhForOneByteAndLlFor64Bits) {
    std::ostringstream out;
    QrOutBuffer buffer(&out);
    QrTextStream stream(&buffer);
    stream.formattedWrite(L"%hhu %lld", 300, 4294967298LL);
    EXPECT_EQ(out.str(), "44 4294967298");
}

/// A character that the locale lacks is refused or, on Windows, replaced by a similar one. On both
/// systems `a` with a macron is a character that the single-byte locales lack.
TEST(DocumentedFacts, SingleByteLocalesOfWindowsWriteASimilarCharacter) {
    std::vector<std::string> written;
    for (const SingleByteLocale& locale : singleByteLocales()) {
        const LocaleGuard guard(locale.name);
        ASSERT_TRUE(guard);
        try {
            written.push_back(bytesOf(std::wstring(L"\u0101")).substr(4, 1));
        } catch (const QrStreamEx::ExWriteError&) {
            written.emplace_back("refused");
        }
    }
    const bool similar = sizeof(wchar_t) == 2; // Windows
    for (const std::string& one : written)
        EXPECT_EQ(one, similar ? "a" : "refused");
    EXPECT_FALSE(written.empty() && similar);
}

} // namespace
