// SPDX-License-Identifier: BSL-1.0
/// The stamp in a library's file: which bytes are one, and which stamps fit this program.
#include "tests/tools/images.h"

#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "tests/support/temporaryDirectory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;

namespace {

constexpr ComponentStamp own MZ_STAMP_VALUE;

class StampInFile : public ::testing::TestWithParam<ImageFormat> {
  protected:
    bool elf() const { return GetParam() == ImageFormat::elf; }
    ImagePlaces places() const { return elf() ? elfPlaces : pePlaces; }

    LibraryImage read(const ImageTraits& traits) const { return readBytes(bytesOf(traits)); }

    std::string bytesOf(const ImageTraits& traits) const {
        return elf() ? elfLibrary(traits) : peLibrary(traits);
    }

    /// Reads an image that must be a sound component library, whatever its stamp is.
    LibraryImage readBytes(const std::string& bytes) const {
        LibraryImage image = readLibraryImage(folder.write("image", bytes));
        EXPECT_EQ(image.damage, L"");
        EXPECT_EQ(image.entryPoint, LibraryImage::EntryPoint::function);
        return image;
    }

    TemporaryDirectory folder;
};

TEST_P(StampInFile, IsReadAsItIs) {
    ComponentStamp stamp = own;
    stamp.soVersion = 0x01020304;
    stamp.version[1] = 0xFFFF;
    const auto read = this->read({.stamp = stamp}).stamp;
    ASSERT_TRUE(read);
    EXPECT_EQ(std::memcmp(&*read, &stamp, sizeof stamp), 0);
}

TEST_P(StampInFile, MayBeAbsent) {
    EXPECT_FALSE(read({}).stamp);
    EXPECT_FALSE(read({.stamp = own, .stampName = "MzComponentStamq"}).stamp);
    EXPECT_FALSE(read({.stamp = own, .stampName = "MzComponentStamp2"}).stamp);
}

TEST_P(StampInFile, CountsOnlyInALibraryWithTheEntryPoint) {
    const auto image = readLibraryImage(
        folder.write("image", bytesOf({.entryPoint = "QrGetComponentDescriptioN", .stamp = own})));
    EXPECT_FALSE(image.stamp);
}

TEST_P(StampInFile, OutsideOfTheFileIsNone) {
    const std::uint64_t last = places().fileEnd - sizeof own;
    EXPECT_FALSE(read({.stamp = own, .stampAddress = last}).stamp) << "no magic number there";
    for (const std::uint64_t address :
         {last + 1, places().fileEnd - 1, places().fileEnd, places().memoryEnd - sizeof own,
          places().memoryEnd - 1, places().memoryEnd, std::uint64_t{0x7FFFFFFF},
          std::uint64_t{0xFFFFFFFF}})
        EXPECT_FALSE(read({.stamp = own, .stampAddress = address}).stamp) << address;
    if (!elf())
        return; // Addresses have 32 bits.
    for (const std::uint64_t address : {~std::uint64_t{0}, ~std::uint64_t{0} - sizeof own,
                                        std::uint64_t{1} << 63, std::uint64_t{1} << 32})
        EXPECT_FALSE(read({.stamp = own, .stampAddress = address}).stamp) << address;
}

TEST_P(StampInFile, InWhatIsNotMappedIsNone) {
    // Something may follow what is mapped from the file. Memory has zeros there.
    for (const std::size_t outside : {std::size_t{1}, sizeof own / 2, sizeof own}) {
        const std::uint64_t address = places().fileEnd - sizeof own + outside;
        std::string bytes = bytesOf({.stamp = own, .stampAddress = address});
        bytes.resize(bytes.size() + outside);
        std::memcpy(bytes.data() + bytes.size() - sizeof own, &own, sizeof own);
        EXPECT_FALSE(readBytes(bytes).stamp) << outside;
    }
}

TEST_P(StampInFile, AtTheVeryEndOfTheFileIsRead) {
    // Nothing else is there: the readers need no table of sections, but the file must reach it.
    const ImageTraits traits{.stamp = own, .stampAddress = places().fileEnd - sizeof own};
    std::string bytes = bytesOf(traits);
    std::memcpy(bytes.data() + bytes.size() - sizeof own, &own, sizeof own);
    EXPECT_TRUE(readBytes(bytes).stamp);
}

TEST_P(StampInFile, OfAnotherFormIsNone) {
    const auto isRead = [&](auto change) {
        ComponentStamp stamp = own;
        change(stamp);
        return read({.stamp = stamp}).stamp.has_value();
    };
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { stamp.magic[0] = 'm'; }));
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { stamp.magic[7] = '!'; }));
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { stamp.layout = 0; }));
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { stamp.layout = 2; }));
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { stamp.size = 0; }));
    EXPECT_FALSE(isRead([](ComponentStamp& stamp) { --stamp.size; }));
    // One with more fields at its end.
    EXPECT_TRUE(isRead([](ComponentStamp& stamp) { stamp.size += 4; }));
    EXPECT_TRUE(isRead([](ComponentStamp& stamp) { stamp.reserved[1] = 1; }));
}

INSTANTIATE_TEST_SUITE_P(Formats, StampInFile, ::testing::Values(ImageFormat::elf, ImageFormat::pe),
                         [](const auto& format) {
                             return format.param == ImageFormat::elf ? "Elf" : "Pe";
                         });

class StampSymbol : public ::testing::Test {
  protected:
    bool isRead(const std::string& bytes) const {
        return readLibraryImage(folder.write("image", bytes)).stamp.has_value();
    }

    TemporaryDirectory folder;
};

TEST_F(StampSymbol, IsExportedDataOfTheElfFile) {
    const auto withSymbol = [&](unsigned char type, std::uint16_t section) {
        return isRead(elfLibrary({.stamp = own, .stampType = type, .stampSection = section}));
    };
    EXPECT_TRUE(withSymbol(0x11, 1));       // global object
    EXPECT_TRUE(withSymbol(0x21, 1));       // weak object
    EXPECT_TRUE(withSymbol(0x10, 1));       // without type, as in assembly
    EXPECT_FALSE(withSymbol(0x01, 1));      // local
    EXPECT_FALSE(withSymbol(0x12, 1));      // function
    EXPECT_FALSE(withSymbol(0x16, 1));      // thread-local
    EXPECT_FALSE(withSymbol(0x11, 0));      // undefined
    EXPECT_FALSE(withSymbol(0x11, 0xFFF1)); // absolute value
    EXPECT_FALSE(withSymbol(0x11, 0xFFF2)); // common
}

TEST_F(StampSymbol, IsNoForwarderOfThePeFile) {
    // An address in the export directory is the name of another library's symbol. The directory,
    // made longer, contains the stamp.
    std::string bytes = peLibrary({.stamp = own});
    EXPECT_TRUE(isRead(bytes));
    const std::uint32_t longer = 0x180;
    std::memcpy(bytes.data() + 0xCC, &longer, sizeof longer);
    EXPECT_FALSE(isRead(bytes));
}

TEST_F(StampSymbol, ThatLeadsNowhereIsNoDamageOfThePeFile) {
    // Its ordinal has no address. The system looks only for the entry point and does not notice.
    std::string bytes = peLibrary({.stamp = own});
    const std::uint16_t nowhere = 0xFFFF;
    std::memcpy(bytes.data() + 0x47C, &nowhere, sizeof nowhere);
    const LibraryImage image = readLibraryImage(folder.write("image", bytes));
    EXPECT_FALSE(image.stamp);
    EXPECT_EQ(image.damage, L"");
    EXPECT_EQ(image.entryPoint, LibraryImage::EntryPoint::function);
}

// ---- Which stamps fit
// ----------------------------------------------------------------------------

template <class Change>
std::optional<Finding> judged(Change change) {
    ComponentStamp stamp = own;
    change(stamp);
    return abiDifference(stamp);
}

TEST(Stamp, OfThisBuildFits) {
    EXPECT_FALSE(abiDifference(own));
    EXPECT_FALSE(abiDifference(LibraryImage()));
}

TEST(Stamp, OfAnotherVersionFitsWhileTheNumberOfTheInterfaceIsTheSame) {
    EXPECT_FALSE(judged([](ComponentStamp& stamp) { ++stamp.version[0]; }));
    EXPECT_FALSE(judged([](ComponentStamp& stamp) { ++stamp.version[1]; }));
    EXPECT_FALSE(judged([](ComponentStamp& stamp) { stamp.version[1] = 0; }));
    EXPECT_FALSE(judged([](ComponentStamp& stamp) { ++stamp.version[2]; }));
    EXPECT_FALSE(judged([](ComponentStamp& stamp) { stamp.reserved[0] = 1; }));
}

TEST(Stamp, OfAnotherInterfaceNamesBothVersions) {
    const auto finding = judged([](ComponentStamp& stamp) {
        stamp.soVersion = 7;
        stamp.version[0] = 8;
        stamp.version[1] = 9;
        stamp.version[2] = 10;
    });
    ASSERT_TRUE(finding);
    EXPECT_EQ(finding->verdict, Verdict::otherAbi);
    EXPECT_EQ(finding->subject, L"SOVERSION 7 (version 8.9.10)");
    EXPECT_EQ(finding->words, L"SOVERSION " + std::to_wstring(MZ_SOVERSION) + L" (version " +
                                  std::to_wstring(MZ_VERSION_MAJOR) + L"." +
                                  std::to_wstring(MZ_VERSION_MINOR) + L"." +
                                  std::to_wstring(MZ_VERSION_PATCH) + L")");
    EXPECT_THAT(sentenceOf(*finding),
                AllOf(HasSubstr(finding->subject), HasSubstr(finding->words)));
    EXPECT_THAT(cureOf(*finding), HasSubstr(finding->words));
}

TEST(Stamp, OfAnotherAbiNamesOnlyWhatDiffers) {
    const auto strings =
        judged([](ComponentStamp& stamp) { stamp.stringAbi = StringAbi::libstdcxxOld; });
    ASSERT_TRUE(strings);
    EXPECT_EQ(strings->subject, L"libstdc++ with _GLIBCXX_USE_CXX11_ABI=0");
    EXPECT_THAT(strings->words, AllOf(HasSubstr(L"libstdc++"), Not(HasSubstr(L","))));
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.stringAbi = StringAbi::libcxx; })->subject,
              L"libc++");
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.cxxAbi = CxxAbi::microsoft; })->subject,
              L"the C++ ABI of MSVC");
    const auto debug = judged([](ComponentStamp& stamp) { stamp.containerDebug ^= 1; });
    ASSERT_TRUE(debug);
    EXPECT_THAT(debug->subject, HasSubstr(L"debug mode"));
    EXPECT_NE(debug->subject, debug->words);
    const auto wide = judged([](ComponentStamp& stamp) { stamp.wideCharSize ^= 6; });
    ASSERT_TRUE(wide);
    EXPECT_THAT(wide->subject, HasSubstr(L"wchar_t of "));
    EXPECT_NE(wide->subject, wide->words);
    const auto all = judged([](ComponentStamp& stamp) {
        stamp.soVersion += 1;
        stamp.wideCharSize ^= 6;
        stamp.cxxAbi = CxxAbi::microsoft;
        stamp.stringAbi = StringAbi::unknown;
        stamp.containerDebug ^= 1;
    });
    ASSERT_TRUE(all);
    EXPECT_EQ(std::count(all->subject.begin(), all->subject.end(), L','), 4);
    EXPECT_EQ(std::count(all->words.begin(), all->words.end(), L','), 4);
}

TEST(Stamp, WithAValueOfALaterVersionDoesNotFit) {
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.stringAbi = StringAbi{200}; })->subject,
              L"standard library number 200");
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.cxxAbi = CxxAbi{200}; })->subject,
              L"C++ ABI number 200");
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.cxxAbi = CxxAbi::unknown; })->subject,
              L"an unknown C++ ABI");
    EXPECT_EQ(judged([](ComponentStamp& stamp) { stamp.containerDebug = 200; })->subject,
              L"debug mode number 200");
}

} // namespace
