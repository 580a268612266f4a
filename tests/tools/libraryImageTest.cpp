// SPDX-License-Identifier: BSL-1.0
/// Tests the readers of both formats on every system, with valid and with damaged files.
#include "tests/tools/images.h"

#include "components/componentTools/images/libraryImage.h"
#include "components/platform/elfMachine.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/tools/toolsFixture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <random>

using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;

namespace {

class Image : public ::testing::TestWithParam<ImageFormat> {
  protected:
    std::string whole(ImageTraits traits = {}) const {
        return GetParam() == ImageFormat::elf ? elfLibrary(traits) : peLibrary(traits);
    }

    LibraryImage read(const std::string& bytes) {
        return readLibraryImage(folder.write("image", bytes));
    }

    TemporaryDirectory folder;
};

TEST_P(Image, IsReadWhole) {
    const LibraryImage image = read(whole());
    EXPECT_TRUE(image.readable);
    EXPECT_EQ(image.format, GetParam());
    EXPECT_EQ(image.kind, LibraryImage::Kind::library);
    EXPECT_EQ(image.damage, L"");
    EXPECT_EQ(image.otherProcessor, L"");
    EXPECT_EQ(image.entryPoint, LibraryImage::EntryPoint::function);
    EXPECT_THAT(image.needed, ElementsAre("first.lib", "second.lib"));
}

TEST_P(Image, TellsThatTheEntryPointIsAbsentOrNoFunction) {
    EXPECT_EQ(read(whole({.entryPoint = "QrGetComponentDescriptioN"})).entryPoint,
              LibraryImage::EntryPoint::absent);
    EXPECT_EQ(read(whole({.entryPoint = "QrGetComponentDescription2"})).entryPoint,
              LibraryImage::EntryPoint::absent);
    EXPECT_EQ(read(whole({.function = false})).entryPoint, LibraryImage::EntryPoint::noFunction);
}

TEST_P(Image, NamesAnotherProcessor) {
    const bool isArm = Mz::platform::nativeElfMachine == Mz::platform::elfAArch64;
    EXPECT_EQ(read(whole({.otherProcessor = true})).otherProcessor,
              isArm && GetParam() == ImageFormat::elf ? L"x86-64" : L"ARM, 64 bits");
}

TEST_P(Image, TellsAProgram) {
    EXPECT_EQ(read(whole({.program = true})).kind, LibraryImage::Kind::program);
}

TEST_P(Image, CutOffAnywhereIsDamagedOrNothing) {
    const std::string bytes = whole();
    for (std::size_t size = 0; size < bytes.size(); ++size) {
        const LibraryImage image = read(bytes.substr(0, size));
        ASSERT_NE(image.entryPoint, LibraryImage::EntryPoint::function) << size;
        ASSERT_TRUE(image.format == ImageFormat::none || !image.damage.empty()) << size;
    }
}

TEST_P(Image, DamagedInAnyWayIsReadInBoundedTime) {
    const std::string bytes = whole();
    std::mt19937 random(4711);
    int unlike = 0;
    for (int round = 0; round < 1000; ++round) {
        std::string damaged = bytes;
        for (std::size_t changes = random() % 4 + 1; changes > 0; --changes)
            damaged[random() % damaged.size()] = static_cast<char>(random() % 3 ? random() : 0xFF);
        const LibraryImage image = read(damaged);
        EXPECT_LE(image.needed.size(), 1024u);
        unlike += image.entryPoint != LibraryImage::EntryPoint::function;
    }
    EXPECT_GT(unlike, 0);
}

TEST(ElfImage, WhoseNamesHaveNoEndIsDamaged) {
    const std::string name = "QrGetComponentDescription";
    std::string bytes = elfLibrary({});
    const std::size_t end = bytes.find(name) + name.size(); // It is the last name of the table.
    EXPECT_EQ(bytes[end], '\0');
    bytes[end] = 'x';
    const TemporaryDirectory folder;
    const LibraryImage image = readLibraryImage(folder.write("image", bytes));
    EXPECT_EQ(image.damage, L"its table of names has no end");
    EXPECT_NE(image.entryPoint, LibraryImage::EntryPoint::function);
}

TEST(PeImage, WhoseExportsLeadNowhereIsDamaged) {
    const std::string whole = peLibrary({});
    const TemporaryDirectory folder;
    const auto damageWith = [&](std::size_t field, std::uint32_t value) {
        std::string bytes = whole;
        const std::size_t exports = bytes.find("QrGetComponentDescription") - 0x38;
        std::memcpy(bytes.data() + exports + field, &value, sizeof value);
        return readLibraryImage(folder.write("image", bytes)).damage;
    };
    EXPECT_EQ(damageWith(16, 1), L"");
    for (const std::size_t field : {20, 24})
        EXPECT_EQ(damageWith(field, 0x1000000), L"the table of exports makes no sense") << field;
    for (const std::size_t field : {28, 32, 36})
        EXPECT_EQ(damageWith(field, 0xFF0000), L"the table of exports makes no sense") << field;
}

INSTANTIATE_TEST_SUITE_P(Formats, Image, ::testing::Values(ImageFormat::elf, ImageFormat::pe),
                         [](const auto& format) {
                             return format.param == ImageFormat::elf ? "Elf" : "Pe";
                         });

TEST(LibrarySymbols, AreThoseThatOthersMustDefine) {
    const auto names = [](const std::filesystem::path& file) {
        const std::vector<std::string> wanted = wantedSymbols(file);
        return std::set<std::string>(wanted.begin(), wanted.end());
    };
    const std::filesystem::path component = builtComponent(L"takesFromHost");
    std::set<std::string> wanted = names(component);
    if (readLibraryImage(component).format != ImageFormat::elf) {
        EXPECT_TRUE(wanted.empty());
        return;
    }
    EXPECT_TRUE(wanted.contains("mzTestHostNumber"));
    // Symbols of the standard library have versions. The second symbol is weak and may be missing.
    EXPECT_FALSE(wanted.contains("__gxx_personality_v0"));
    EXPECT_FALSE(wanted.contains("__gmon_start__"));
    // A library does not need what it defines.
    EXPECT_FALSE(wanted.contains(entryPointName));

    std::set<std::string> defined{entryPointName, "mzTestHostNumber"};
    EXPECT_TRUE(removeDefined(component, defined));
    EXPECT_EQ(defined, std::set<std::string>{"mzTestHostNumber"});
    EXPECT_FALSE(removeDefined(component.parent_path() / "nothing", defined));
}

} // namespace
