// SPDX-License-Identifier: BSL-1.0
// Tests how an import reports progress, and how it stops or fails in the middle.
#include "meshTestSupport.h"

#include <algorithm>
#include <sstream>

using namespace Mz;
using namespace Meshes;

namespace {

constexpr std::size_t block = 0x10000;

/// Returns an OBJ file of many blocks.
std::string largeFile() {
    std::string data;
    for (int count = 0; count < 40000; ++count)
        data += "v " + std::to_string(count) + " 0.5 -1.25\n";
    return data + "f 1 2 3\n";
}

/// A medium that throws after the first `readable` bytes.
class FailingBuffer final : public std::streambuf {
  public:
    FailingBuffer(std::string text, std::size_t readable)
        : content(std::move(text)), readable(readable) {}

  protected:
    std::streamsize xsgetn(char* to, std::streamsize count) override {
        const auto wanted = std::min(static_cast<std::size_t>(count), content.size() - position);
        if (position + wanted > readable)
            throw std::runtime_error("the medium failed");
        content.copy(to, wanted, position);
        position += wanted;
        return static_cast<std::streamsize>(wanted);
    }
    int_type underflow() override { return traits_type::eof(); }
    pos_type seekoff(off_type offset, std::ios_base::seekdir from,
                     std::ios_base::openmode) override {
        const std::size_t base = from == std::ios_base::beg   ? 0
                                 : from == std::ios_base::cur ? position
                                                              : content.size();
        position = base + static_cast<std::size_t>(offset);
        return static_cast<off_type>(position);
    }
    pos_type seekpos(pos_type to, std::ios_base::openmode mode) override {
        return seekoff(static_cast<off_type>(to), std::ios_base::beg, mode);
    }

  private:
    std::string content;
    std::size_t readable;
    std::size_t position = 0;
};

QrRef<QrCastable> importFrom(std::istream& stream) {
    QrInBuffer buffer(&stream);
    return meshImporter()->import(&buffer, L"large.obj", nullptr);
}

} // namespace

TEST(MeshProgress, GrowsToOneBlockByBlock) {
    RecordingController controller;
    const std::string data = largeFile();
    std::istringstream stream(data);
    EXPECT_TRUE(importFrom(stream));
    ASSERT_GE(controller.fractions.size(), data.size() / block);
    EXPECT_LE(controller.fractions.size(), data.size() / block + 4);
    EXPECT_TRUE(std::ranges::is_sorted(controller.fractions));
    EXPECT_EQ(controller.fractions.front(), 0.0F);
    EXPECT_EQ(controller.fractions.back(), 1.0F);
    EXPECT_NEAR(controller.fractions[1],
                static_cast<double>(block) / static_cast<double>(data.size()), 1e-6);
}

TEST(MeshProgress, IsNotReportedWhereNobodySeesIt) {
    RecordingController controller;
    controller.progressShown = false;
    std::istringstream stream(largeFile());
    EXPECT_TRUE(importFrom(stream));
    EXPECT_TRUE(controller.fractions.empty());
    EXPECT_GT(controller.questions, 3);
}

TEST(MeshProgress, StopsTheImportWhenRefused) {
    RecordingController controller;
    controller.refuseAfter = 3;
    std::istringstream stream(largeFile());
    EXPECT_FALSE(importFrom(stream));
    EXPECT_EQ(controller.fractions.size(), 3U);
    EXPECT_EQ(stream.tellg(), std::streampos(2 * block));
    EXPECT_TRUE(controller.errors.empty());
}

TEST(MeshProgress, StopsTheImportWhenInterrupted) {
    RecordingController controller;
    controller.interruptAfter = 4;
    std::istringstream stream(largeFile());
    EXPECT_FALSE(importFrom(stream));
    EXPECT_EQ(controller.questions, 5);
    EXPECT_EQ(stream.tellg(), std::streampos(4 * block));
    EXPECT_TRUE(controller.errors.empty());
}

TEST(MeshProgress, IsNotMissedWithoutAController) {
    QrProcessControl* const installed = QrGetSystemProcessController();
    QrSetSystemProcessController(nullptr);
    std::istringstream stream(largeFile());
    EXPECT_TRUE(importFrom(stream));
    std::istringstream damaged("f 1 2 3\n");
    EXPECT_FALSE(importFrom(damaged));
    QrSetSystemProcessController(installed);
}

TEST(MeshReading, TurnsAFailingMediumIntoAnError) {
    RecordingController controller;
    FailingBuffer content(largeFile(), 3 * block);
    std::istream stream(&content);
    EXPECT_FALSE(importFrom(stream));
    EXPECT_EQ(controller.errors, std::vector<std::wstring>{L"large.obj: Error reading stream."});
}
