// SPDX-License-Identifier: BSL-1.0
/// What keeps an image from being decoded: each limit, and the user. The images are bitmaps that
/// the tests make, because their size is then known to the byte. The import builders are linked to
/// this program, and called through their description.
#include "examples/images/decoding.h"

#include "components/componentKit/controller.h"
#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>
#include <string>

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription();

using namespace Mz;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

namespace {

std::string littleEndian(std::size_t number, int bytes) {
    std::string text;
    for (int byte = 0; byte < bytes; ++byte)
        text += static_cast<char>(number >> 8 * byte & 255);
    return text;
}

constexpr std::size_t headerSize = 54;

/// Returns a bitmap with 32 bits for each pixel, all of one colour.
std::string bitmap(std::size_t width, std::size_t height) {
    const std::size_t size = width * height * 4;
    std::string bytes = "BM" + littleEndian(headerSize + size, 4) + littleEndian(0, 4) +
                        littleEndian(headerSize, 4) + littleEndian(40, 4) + littleEndian(width, 4) +
                        littleEndian(height, 4) + littleEndian(1, 2) + littleEndian(32, 2) +
                        littleEndian(0, 4) + littleEndian(size, 4) + std::string(16, '\0');
    for (std::size_t pixel = 0; pixel < width * height; ++pixel)
        bytes += "\x10\x20\x30\xFF"; // blue, green, red, alpha
    return bytes;
}

DecodedImage decode(const std::string& bytes, const ImageLimits& limits = {},
                    QrProcessControl* controller = nullptr) {
    std::istringstream in(bytes);
    QrInBuffer buffer(&in);
    return decodeImage(buffer, controller, limits);
}

/// Returns why the image cannot be decoded; empty if it can.
std::string refusal(const std::string& bytes, const ImageLimits& limits = {}) {
    try {
        decode(bytes, limits);
        return "";
    } catch (const ImageError& failure) {
        return failure.what();
    }
}

/// Interrupts the work at one of its questions.
class Impatient final : public Kit::Controller {
  public:
    explicit Impatient(int question) : last(question) {}
    bool isInterrupted() override { return ++questions >= last; }
    void show(Kind, const wchar_t* text) override { texts.emplace_back(text); }

    int questions = 0;
    std::vector<std::wstring> texts;

  private:
    int last;
};

TEST(ImageDecoding, ReturnsThePixelsOfAnImageWithinTheLimits) {
    const DecodedImage image = decode(bitmap(3, 2));
    EXPECT_EQ(image.width, 3u);
    EXPECT_EQ(image.height, 2u);
    ASSERT_EQ(image.pixels.size(), 6u);
    EXPECT_EQ(image.pixels[5].red, 0x30);
    EXPECT_EQ(image.pixels[5].blue, 0x10);
}

TEST(ImageDecoding, LimitsTheSizeOfTheFile) {
    const std::string image = bitmap(10, 10);
    ImageLimits limits;
    limits.fileSize = image.size();
    EXPECT_EQ(refusal(image, limits), "");
    limits.fileSize = image.size() - 1;
    EXPECT_EQ(refusal(image, limits),
              "the file is larger than " + std::to_string(image.size() - 1) + " bytes");
}

TEST(ImageDecoding, ReadsNoMoreThanOnePortionBeyondTheLimitOfTheFile) {
    std::istringstream in(std::string(1'000'000, 'x'));
    QrInBuffer buffer(&in);
    ImageLimits limits;
    limits.fileSize = 1000;
    EXPECT_THROW(decodeImage(buffer, nullptr, limits), ImageError);
    EXPECT_GE(in.rdbuf()->in_avail(), 1'000'000 - 64 * 1024);
}

TEST(ImageDecoding, LimitsEachSide) {
    ImageLimits limits;
    limits.side = 20;
    EXPECT_EQ(refusal(bitmap(20, 1), limits), "");
    EXPECT_EQ(refusal(bitmap(1, 20), limits), "");
    EXPECT_EQ(refusal(bitmap(21, 1), limits), "the image is too large: 21 x 1 pixels");
    EXPECT_EQ(refusal(bitmap(1, 21), limits), "the image is too large: 1 x 21 pixels");
}

TEST(ImageDecoding, LimitsTheNumberOfPixels) {
    ImageLimits limits;
    limits.pixelCount = 100;
    EXPECT_EQ(refusal(bitmap(10, 10), limits), "");
    EXPECT_EQ(refusal(bitmap(20, 5), limits), "");
    EXPECT_EQ(refusal(bitmap(11, 10), limits), "the image is too large: 11 x 10 pixels");
}

TEST(ImageDecoding, HasLimitsOfItsOwnForWhatAHeaderClaims) {
    std::string claim = bitmap(1, 1);
    claim.replace(18, 8, littleEndian(16'384, 4) + littleEndian(1, 4));
    // Within the limits, so the decoder is asked, whatever it says of the missing pixels.
    EXPECT_THAT(refusal(claim), Not(HasSubstr("too large")));
    claim.replace(18, 8, littleEndian(16'385, 4) + littleEndian(1, 4));
    EXPECT_EQ(refusal(claim), "the image is too large: 16385 x 1 pixels");
    claim.replace(18, 8, littleEndian(16'384, 4) + littleEndian(4'097, 4));
    EXPECT_EQ(refusal(claim), "the image is too large: 16384 x 4097 pixels");
}

TEST(ImageDecoding, StopsAtTheFirstQuestionAndLater) {
    const std::string image = bitmap(200, 200); // several portions of 64 KiB
    Impatient never(1000);
    EXPECT_EQ(decode(image, {}, &never).pixels.size(), 40'000u);
    ASSERT_GE(never.questions, 3);
    for (int question = 1; question <= never.questions; ++question) {
        Impatient controller(question);
        EXPECT_THROW(decode(image, {}, &controller), ImageInterrupted) << question;
        EXPECT_EQ(controller.questions, question);
    }
}

/// Imports the bytes through the builder of bitmaps.
QrRef<QrCastable> import(const std::string& bytes, QrProcessControl& controller) {
    const Kit::ControllerScope installed(controller);
    const auto description = queryCast<QrComponentDescription>(QrGetComponentDescription());
    const auto made = description->createBuilder("B3970E04-7A6C-11EF-97D8-5A1C40E2F68B"_uid);
    std::istringstream in(bytes);
    QrInBuffer buffer(&in);
    return queryCast<QrImportBuilder>(made.get())->import(&buffer, L"image.bmp", nullptr);
}

TEST(ImageImport, OfAnImageThatCanBeDecodedReportsNothing) {
    Impatient controller(1000);
    EXPECT_TRUE(queryCast<Image>(import(bitmap(4, 4), controller).get()));
    EXPECT_THAT(controller.texts, IsEmpty());
}

TEST(ImageImport, ThatTheUserInterruptsIsNoFailure) {
    Impatient controller(2);
    EXPECT_FALSE(import(bitmap(200, 200), controller));
    EXPECT_THAT(controller.texts, IsEmpty());
}

TEST(ImageImport, BeyondALimitNamesTheFileAndTheLimit) {
    Impatient controller(1000);
    EXPECT_FALSE(import(bitmap(16'385, 1), controller));
    EXPECT_THAT(controller.texts,
                ElementsAre(L"image.bmp: the image is too large: 16385 x 1 pixels"));
}

} // namespace
