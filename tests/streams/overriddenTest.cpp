// SPDX-License-Identifier: BSL-1.0
// Tests that a derived stream that overrides the formatted functions receives every number, though
// the operators of QrTextStream itself do not call them.
#include "components/componentManager/bufferio.h"
#include "components/componentManager/textStream.h"

#include <gtest/gtest.h>

#include <cstdarg>
#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace Mz;

/// Writes and reads no number itself.
class Overriding final : public QrTextStream {
  public:
    using QrTextStream::QrTextStream;

    int formattedWrite(const wchar_t* format, ...) override {
        formats.emplace_back(format);
        return 0;
    }
    int formattedRead(const wchar_t* format, ...) override {
        formats.emplace_back(format);
        return 1;
    }

    std::vector<std::wstring> formats;
};

TEST(OverriddenStream, ReceivesEveryNumberThatIsWritten) {
    const std::string room(1000, '.');
    std::ostringstream sink(room); // Numbers are written in place where the buffer has room.
    QrOutBuffer buffer(&sink);
    Overriding stream(&buffer);
    stream << 1 << 2U << int64{3} << 4ULL << 5.0 << 6.0F << 7L << 8UL << short{9};
    EXPECT_EQ(stream.formats, (std::vector<std::wstring>{L"%d", L"%u", L"%I64d", L"%I64u", L"%.16g",
                                                         L"%.9g", L"%ld", L"%lu", L"%d"}));
    EXPECT_EQ(sink.str(), room);
}

TEST(OverriddenStream, ReceivesEveryNumberThatIsRead) {
    std::istringstream source("1 2 3 4 5 6 7 8 9 ");
    QrInBuffer buffer(&source);
    Overriding stream(&buffer);
    int i = -1;
    unsigned int u = 1;
    int64 i64 = -1;
    unsigned long long u64 = 1;
    double d = -1;
    float f = -1;
    stream >> i >> u >> i64 >> u64 >> d >> f;
    EXPECT_EQ(stream.formats,
              (std::vector<std::wstring>{L"%d", L"%u", L"%I64d", L"%I64u", L"%lg", L"%g"}));
    EXPECT_EQ(i, -1);
    EXPECT_EQ(source.tellg(), 0);
}

} // namespace
