// SPDX-License-Identifier: BSL-1.0
/// Compares the bytes in the pictures of the stream forms with those that the streams write.
#include "components/componentKit/object.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

using namespace Mz;

namespace {

/// Returns the texts that a picture sets in a typewriter face, in their order.
std::vector<std::string> typewrittenIn(const std::string& picture) {
    std::ifstream file(std::filesystem::path(MZ_SOURCE_PATH) / "docs/pictures" / picture);
    const std::string text{std::istreambuf_iterator<char>(file), {}};
    const std::regex face("<font face=\"Courier\">([^<]*)</font>");
    std::vector<std::string> result;
    for (std::sregex_iterator match(text.begin(), text.end(), face), end; match != end; ++match)
        result.push_back((*match)[1]);
    return result;
}

using Write = std::function<void(QrStream&)>;

/// Returns what a stream of that class writes.
template <class Stream>
std::string written(const std::vector<Write>& writes) {
    std::ostringstream out;
    QrOutBuffer buffer(&out);
    QrObjectOutBuffer objects(&buffer);
    Stream stream(&objects);
    for (const Write& write : writes)
        write(stream);
    return out.str();
}

/// Returns the bytes as hexadecimal digits with blanks between them.
std::string hexadecimal(const std::string& bytes) {
    static const char digits[] = "0123456789ABCDEF";
    std::string result;
    for (const char byte : bytes) {
        if (!result.empty())
            result += ' ';
        const auto value = static_cast<unsigned char>(byte);
        result += {digits[value >> 4], digits[value & 15]};
    }
    return result;
}

TEST(Picture, ShowsWhatTheStreamsWrite) {
    short shorts[] = {1, 2, -3};
    const std::vector<Write> writes = {[](QrStream& s) { s << 42; }, [](QrStream& s) { s << 0.5; },
                                       [](QrStream& s) { s << std::wstring(L"Zug"); },
                                       [](QrStream& s) { s << true; },
                                       [&](QrStream& s) { s.write(*shorts, 3); }};
    std::vector<std::string> expected;
    for (const Write& write : writes) {
        expected.push_back(hexadecimal(written<QrBinaryStream>({write})));
        expected.push_back(written<QrTextStream>({write}));
    }
    expected.push_back(written<QrTextStream>(writes));
    EXPECT_EQ(typewrittenIn("streamForms.dot"), expected);
}

constexpr QrUid gaugeUid{0x6E1B0A12, 0x4D1F11EF, 0x9C2A7B10, 0x5D3E8F41};

class StoredGauge final : public Kit::Object<StoredGauge, QrPersistant> {
  public:
    const QrUid* getClassUid() const override { return &gaugeUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << 42; }
    void read(QrStream&) override {}
};

TEST(Picture, ShowsHowAnObjectIsStored) {
    const QrPtr<QrPersistant> gauge(new StoredGauge);
    std::string shown;
    for (const std::string& bytes : typewrittenIn("objectForm.dot"))
        shown += (shown.empty() ? "" : " ") + bytes;
    EXPECT_EQ(shown, hexadecimal(written<QrBinaryStream>(
                         {[&](QrStream& s) { s << gauge.get() << gauge.get(); }})));
}

} // namespace
