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
    for (const std::size_t field : {20U, 24U})
        EXPECT_EQ(damageWith(field, 0x1000000), L"the table of exports makes no sense") << field;
    for (const std::size_t field : {28U, 32U, 36U})
        EXPECT_EQ(damageWith(field, 0xFF0000), L"the table of exports makes no sense") << field;
}

template <class T>
void put(std::string& bytes, std::size_t offset, T value) {
    std::memcpy(bytes.data() + offset, &value, sizeof value);
}

// Offsets in the libraries of images.cpp.
constexpr std::size_t elfMachine = 18, elfSymbolTag = 0x240, elfHashTag = 0x250, elfHash = 0x1C0,
                      peMachine = 0x44, peOptional = 0x58, peData = 0x400;

TEST_P(Image, NamesItsExports) {
    const auto names = [&](const std::string& bytes) {
        return exportedNames(folder.write("image", bytes));
    };
    EXPECT_THAT(names(whole()), ElementsAre(entryPointName));
    EXPECT_THAT(names(whole({.stamp = Mz::ComponentStamp MZ_STAMP_VALUE})),
                ::testing::UnorderedElementsAre(entryPointName, stampName));
    EXPECT_THAT(names("neither format"), ::testing::IsEmpty());
    EXPECT_THAT(names("M"), ::testing::IsEmpty());
}

TEST(ElfImage, NamesItsExportsByEitherHashTable) {
    const TemporaryDirectory folder;
    std::string bytes = elfLibrary({});
    put<std::uint64_t>(bytes, elfHashTag, 4); // DT_HASH, whose second number counts the symbols
    put<std::uint32_t>(bytes, elfHash + 4, 2);
    EXPECT_THAT(exportedNames(folder.write("image", bytes)), ElementsAre(entryPointName));
    bytes = elfLibrary({});
    put<std::uint64_t>(bytes, elfSymbolTag, 0x70000000); // No table of symbols.
    EXPECT_THAT(exportedNames(folder.write("image", bytes)), ::testing::IsEmpty());
    EXPECT_THAT(wantedSymbols(folder.write("image", bytes)), ::testing::IsEmpty());
}

TEST(PeImage, WithoutExportsHasNoNames) {
    const TemporaryDirectory folder;
    std::string bytes = peLibrary({});
    put<std::uint32_t>(bytes, peOptional + 112, 0);
    EXPECT_THAT(exportedNames(folder.write("image", bytes)), ::testing::IsEmpty());
    bytes = peLibrary({});
    put<std::uint32_t>(bytes, peData + 0x2C, 0x9000); // The only name leads out of the file.
    EXPECT_THAT(exportedNames(folder.write("image", bytes)), ::testing::IsEmpty());
}

TEST(PeImage, WithFewerDirectoriesHasOnlyThese) {
    const TemporaryDirectory folder;
    std::string bytes = peLibrary({});
    put<std::uint32_t>(bytes, peOptional + 108, 1);
    const LibraryImage image = readLibraryImage(folder.write("image", bytes));
    EXPECT_EQ(image.damage, L"");
    EXPECT_EQ(image.entryPoint, LibraryImage::EntryPoint::function);
    EXPECT_THAT(image.needed, ::testing::IsEmpty());
}

TEST(PeImage, WhoseNameIsCutOffByTheEndOfItsSectionIsDamaged) {
    const TemporaryDirectory folder;
    std::string bytes = peLibrary({});
    const std::string_view begin = std::string_view(entryPointName).substr(0, 8);
    bytes.replace(peData + 0x1F8, begin.size(), begin);
    put<std::uint32_t>(bytes, peData + 0x2C, 0x21F8);
    EXPECT_EQ(readLibraryImage(folder.write("image", bytes)).damage,
              L"the table of exports makes no sense");
    // Another name is another name before its end.
    bytes[peData + 0x1F8] = 'R';
    const LibraryImage other = readLibraryImage(folder.write("image", bytes));
    EXPECT_EQ(other.damage, L"");
    EXPECT_EQ(other.entryPoint, LibraryImage::EntryPoint::absent);
}

/// Returns what is said of a library for another machine, whose number is at `offset`.
std::wstring processorOf(std::string library, std::size_t offset, std::uint16_t machine) {
    const TemporaryDirectory folder;
    put(library, offset, machine);
    return readLibraryImage(folder.write("image", library)).otherProcessor;
}

TEST(ElfImage, NamesTheProcessor) {
    EXPECT_EQ(processorOf(elfLibrary({}), elfMachine, 3), L"x86, 32 bits");
    EXPECT_EQ(processorOf(elfLibrary({}), elfMachine, 40), L"ARM, 32 bits");
    EXPECT_EQ(processorOf(elfLibrary({}), elfMachine, 243), L"RISC-V");
    EXPECT_EQ(processorOf(elfLibrary({}), elfMachine, 4711), L"number 4711");
}

TEST(PeImage, NamesTheProcessor) {
    EXPECT_EQ(processorOf(peLibrary({}), peMachine, 0x14C), L"x86, 32 bits");
    EXPECT_EQ(processorOf(peLibrary({}), peMachine, 0x1C4), L"ARM, 32 bits");
    EXPECT_EQ(processorOf(peLibrary({}), peMachine, 0xAA64), L"ARM, 64 bits");
    EXPECT_EQ(processorOf(peLibrary({}), peMachine, 0x8664), L"");
    EXPECT_EQ(processorOf(peLibrary({}), peMachine, 4711), L"number 4711");
}

TEST(PeImage, TellsWhetherItHasTheManifestOfALibrary) {
    const TemporaryDirectory folder;
    constexpr std::uint32_t deeper = 0x80000000, noneOfThem = 77;
    struct Resources {
        std::uint32_t address = 0x2140, type = 24, offset = deeper | 0x18, id = 2;
        std::uint16_t count = 1;
    };
    const auto hasManifest = [&](const Resources& resources) {
        std::string bytes = peLibrary({});
        put(bytes, peOptional + 128, resources.address);
        put<std::uint16_t>(bytes, peData + 0x140 + 14, resources.count);
        put(bytes, peData + 0x150, resources.type);
        put(bytes, peData + 0x154, resources.offset);
        put<std::uint16_t>(bytes, peData + 0x158 + 14, 1);
        put(bytes, peData + 0x168, resources.id);
        const LibraryImage image = readLibraryImage(folder.write("image", bytes));
        EXPECT_EQ(image.damage, L"");
        return image.hasManifest;
    };
    EXPECT_TRUE(hasManifest({}));
    EXPECT_FALSE(hasManifest({.address = 0}));
    EXPECT_FALSE(hasManifest({.address = 0x9000}));
    EXPECT_FALSE(hasManifest({.type = 16}));
    EXPECT_FALSE(hasManifest({.offset = 0x18})); // a resource, not a table
    EXPECT_FALSE(hasManifest({.id = 1}));        // the manifest of a program
    EXPECT_FALSE(hasManifest({.count = 0}));
    EXPECT_FALSE(hasManifest({.type = noneOfThem, .count = 0xFFFF})); // ends with the section
}

TEST(PeImage, HasTheContentOfLongSectionsUpToALimit) {
    const TemporaryDirectory folder;
    const auto dataOf = [&](std::uint32_t size) {
        std::string bytes = peLibrary({});
        bytes.resize(peData + size);
        for (std::size_t index = peData + 0x200; index < bytes.size(); ++index)
            bytes[index] = static_cast<char>(index % 251);
        put(bytes, peOptional + 56, 0x2000 + size);
        const std::size_t section = peOptional + 112 + 16 * 8 + 40;
        put(bytes, section + 8, size);
        put(bytes, section + 16, size);
        const std::string content = sectionsOf(folder.write("image", bytes), ".data");
        return content.empty()                   ? std::string("nothing")
               : content == bytes.substr(peData) ? std::string("all")
                                                 : "something else";
    };
    EXPECT_EQ(dataOf(0x200), "all");
    EXPECT_EQ(dataOf(0x21000), "all");
    EXPECT_EQ(dataOf(std::uint32_t{mostSectionBytes}), "all");
    EXPECT_EQ(dataOf(std::uint32_t{mostSectionBytes} + 0x200), "nothing");
    EXPECT_EQ(sectionsOf(folder.write("image", "neither format"), ".data"), "");
}

TEST(PeImage, HasNoSectionsBehindADamagedHeader) {
    const TemporaryDirectory folder;
    const auto sizeWith = [&](std::size_t offset, std::uint16_t value) {
        std::string bytes = peLibrary({});
        put(bytes, offset, value);
        return sectionsOf(folder.write("image", bytes), ".data").size();
    };
    EXPECT_EQ(sizeWith(peMachine, 0x8664), 0x200u);
    EXPECT_EQ(sizeWith(peMachine, 0xAA64), 0u);
    EXPECT_EQ(sizeWith(peMachine - 4, 0), 0u);                           // no signature
    EXPECT_EQ(sizeWith(peOptional + 112 + 16 * 8 + 40 + 20, 0x7FF), 0u); // outside of a sector
}

TEST(PeImage, WhoseSymbolsAreNotAllThereIsDamaged) {
    const TemporaryDirectory folder;
    const auto damageWith = [&](std::uint32_t symbols, std::uint32_t size) {
        std::string bytes = peLibrary({});
        put(bytes, peMachine + 8, symbols);
        put<std::uint32_t>(bytes, peMachine + 12, 1);
        if (symbols + 22 <= bytes.size())
            put(bytes, symbols + 18, size); // The size of the texts follows the only symbol.
        return readLibraryImage(folder.write("image", bytes)).damage;
    };
    EXPECT_EQ(damageWith(peData + 0x180, 0x20), L"");
    EXPECT_EQ(damageWith(peData + 0x180, 0x2000), L"the end is missing");
    EXPECT_EQ(damageWith(peData + 0x200, 0), L"the end is missing");
}

TEST(PeImage, WhoseFunctionOrNamesAreNowhereHasNoEntryPoint) {
    const TemporaryDirectory folder;
    std::string bytes = peLibrary({});
    put<std::uint32_t>(bytes, peData + 0x28, 0x9000);
    EXPECT_EQ(readLibraryImage(folder.write("image", bytes)).entryPoint,
              LibraryImage::EntryPoint::noFunction);
    bytes = peLibrary({});
    put<std::uint32_t>(bytes, peData + 0x2C, 0x2280); // Mapped, but not in the file.
    EXPECT_EQ(readLibraryImage(folder.write("image", bytes)).damage,
              L"the table of exports makes no sense");
    bytes = peLibrary({});
    put<std::uint32_t>(bytes, peData + 32, 0x9000); // The table of names.
    EXPECT_THAT(exportedNames(folder.write("image", bytes)), ::testing::IsEmpty());
}

TEST(PeImage, NeedsNoMoreLibrariesThanCanBe) {
    const TemporaryDirectory folder;
    constexpr std::uint32_t most = 1024, added = 0x200, entry = 20;
    constexpr std::uint32_t size = added + (most + 1) * entry;
    std::string bytes = peLibrary({});
    bytes.resize(peData + size);
    put(bytes, peOptional + 56, 0x2000 + size);
    const std::size_t section = peOptional + 112 + 16 * 8 + 40;
    put(bytes, section + 8, size);
    put(bytes, section + 16, size);
    put(bytes, peOptional + 120, 0x2000 + added);
    for (std::uint32_t index = 0; index <= most; ++index)
        put<std::uint32_t>(bytes, peData + added + index * entry + 12, 0x2100);
    const LibraryImage image = readLibraryImage(folder.write("image", bytes));
    EXPECT_EQ(image.damage, L"");
    EXPECT_EQ(image.needed, std::vector<std::string>(most, "first.lib"));
}

TEST(FileBytes, HoldTextsUpToALimit) {
    const TemporaryDirectory folder;
    const std::string longest(4095, 'x'), nul(1, '\0');
    FileBytes good(folder.write("good", longest + nul)), bad(folder.write("bad", longest + "xx"));
    FileBytes tooLong(folder.write("tooLong", longest + "x" + nul));
    EXPECT_EQ(good.text(0), longest);
    EXPECT_EQ(good.text(4000), longest.substr(4000));
    EXPECT_EQ(tooLong.text(0), std::nullopt);
    EXPECT_EQ(bad.text(0), std::nullopt);
    EXPECT_EQ(bad.text(4095), std::nullopt);
    EXPECT_EQ(bad.text(5000), std::nullopt);
}

TEST(FileBytes, AreReadWholeOrNotAtAll) {
    const TemporaryDirectory folder;
    FileBytes bytes(folder.write("file", "content"));
    std::string target(7, '\0');
    EXPECT_TRUE(bytes.readLong(0, target.data(), 7));
    EXPECT_EQ(target, "content");
    EXPECT_FALSE(bytes.readLong(1, target.data(), 7));
    EXPECT_FALSE(bytes.readLong(8, target.data(), 0));
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
