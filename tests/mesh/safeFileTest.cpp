// Saving that never loses the file that was there.
#include "examples/mesh/saving/safeFile.h"
#include "examples/mesh/saving/objectFile.h"
#include "examples/mesh/saving/recordedList.h"
#include "examples/mesh/system/system.h"
#include "tests/mesh/fullMedium.h"
#include "tests/support/temporaryDirectory.h"

#include "components/componentManager/componentImp.h"
#include "components/objectIO/objectIO.h"

#include <gmock/gmock.h>

using namespace Mz;
using namespace Meshes;
using Mz::Test::TemporaryDirectory;

namespace {

class SafeFile : public testing::Test {
  protected:
    static void put(const std::filesystem::path& path, std::string_view content) {
        saveSafely(path, [&](std::ostream& out) { out << content; });
    }

    std::string content() const { return contentOf(file); }
    static std::string contentOf(const std::filesystem::path& path) {
        std::ifstream stream(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    std::size_t filesInFolder() const {
        const std::filesystem::directory_iterator entries(folder.path());
        return static_cast<std::size_t>(std::distance(begin(entries), end(entries)));
    }

    TemporaryDirectory folder;
    const std::filesystem::path file = folder.path() / "file with spaces.bin";
};

TEST_F(SafeFile, IsWritten) {
    put(file, std::string_view("a\n\0b\r", 5));
    EXPECT_EQ(content(), std::string_view("a\n\0b\r", 5));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, TakesThePlaceOfTheOldOne) {
    put(file, std::string(100000, 'x'));
    put(file, "short");
    EXPECT_EQ(content(), "short");
    put(file, "");
    EXPECT_EQ(content(), "");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, LeavesTheOldOneUntilAllIsWritten) {
    put(file, "old");
    saveSafely(file, [&](std::ostream& out) {
        out << "new" << std::flush;
        EXPECT_EQ(content(), "old");
        EXPECT_EQ(filesInFolder(), 2U);
    });
    EXPECT_EQ(content(), "new");
}

TEST_F(SafeFile, KeepsTheOldOneWhenWritingThrows) {
    put(file, "old");
    const auto fails = [](std::ostream& out) {
        out << "half";
        throw std::runtime_error("in the middle");
    };
    EXPECT_THROW(saveSafely(file, fails), std::runtime_error);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
    const std::filesystem::path other = folder.path() / "other";
    EXPECT_THROW(saveSafely(other, fails), std::runtime_error);
    EXPECT_FALSE(std::filesystem::exists(other));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, KeepsTheOldOneWhenTheStreamFails) {
    put(file, "old");
    EXPECT_THROW(saveSafely(file,
                            [](std::ostream& out) {
                                out << "half";
                                out.setstate(std::ios::badbit);
                            }),
                 QrStreamEx::ExWriteError);
    EXPECT_THROW(saveSafely(file, [](std::ostream& out) { out.setstate(std::ios::failbit); }),
                 QrStreamEx::ExWriteError);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, KeepsTheOldOneWhenTheMediumIsFull) {
    put(file, "old");
    const auto fill = [](std::size_t size) {
        return [size](std::ostream& out) {
            out.write(std::string(size, 'x').data(), static_cast<std::streamsize>(size));
        };
    };
    const FullMedium full(1000);
    if (!FullMedium::isSupported())
        GTEST_SKIP() << "this system cannot be made to run full";
    saveSafely(file, fill(1000));
    EXPECT_EQ(content().size(), 1000U);
    // Whether it shows when the data is written or only at the end, when the rest of it is.
    for (const std::size_t size : {1001U, 5000U, 100000U}) {
        EXPECT_THROW(saveSafely(file, fill(size)), QrStreamEx::ExWriteError) << size;
        EXPECT_EQ(content(), std::string(1000, 'x'));
        EXPECT_EQ(filesInFolder(), 1U);
    }
}

TEST_F(SafeFile, IsRefusedWithTheReasonWhereNoFileCanBe) {
    const std::filesystem::path impossible[] = {folder.path() / "no folder" / "file",
                                                unwritableFolder() / "file"};
    for (const std::filesystem::path& path : impossible) {
        bool called = false;
        try {
            saveSafely(path, [&](std::ostream&) { called = true; });
            FAIL() << path;
        } catch (const QrStreamEx::ExWriteOpen& failure) {
            EXPECT_THAT(failure.getReason(),
                        testing::StartsWith(path.string() + ": Error opening output stream\n"));
        }
        EXPECT_FALSE(called);
    }
}

TEST_F(SafeFile, IsRefusedInPlaceOfAFolder) {
    std::filesystem::create_directory(file);
    EXPECT_THROW(put(file, "x"), QrStreamEx::ExWriteOpen);
    EXPECT_TRUE(std::filesystem::is_directory(file));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, MayStandInTheCurrentFolder) {
    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(folder.path());
    put("relative", "x");
    put("relative", "yy");
    std::filesystem::current_path(before);
    EXPECT_EQ(contentOf(folder.path() / "relative"), "yy");
}

TEST_F(SafeFile, KeepsSymbolicLinksAndPermissions) {
    if (!hasLinksAndPermissions())
        GTEST_SKIP() << "not on this system";
    const std::filesystem::path link = folder.path() / "link";
    put(file, "old");
    std::filesystem::permissions(file, std::filesystem::perms(0640));
    std::filesystem::create_symlink(file.filename(), link);
    put(link, "new");
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_EQ(content(), "new");
    EXPECT_EQ(std::filesystem::status(file).permissions(), std::filesystem::perms(0640));
}

TEST_F(SafeFile, OfAnObjectThatCannotBeWrittenKeepsTheOldOne) {
    class Failing final : public QrCastImpl<Failing, QrPersistant> {
        const QrUid* getClassUid() const override { return &uid; }
        unsigned int getVersion() const override { return 1; }
        void write(QrStream& stream) override { stream << 1 << std::wstring(1, L'\0'); }
        void read(QrStream&) override {}
    } failing;
    put(file, "old");
    for (const Form form : {Form::Binary, Form::Text})
        EXPECT_THROW(saveObject(file, failing, form), QrStreamEx::ExWriteError);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(SafeFile, OfObjectsHoldsOneAndNothingBehindIt) {
    EXPECT_THROW(loadObject(file, nullptr, Form::Binary), QrStreamEx::ExReadOpen);
    EXPECT_THROW(loadObject(folder.path(), nullptr, Form::Binary), QrStreamEx::ExReadOpen);
    put(file, "0 1162822218\n");
    EXPECT_FALSE(loadObject(file, nullptr, Form::Text));
    put(file, "0 1162822218\n0");
    EXPECT_THROW(loadObject(file, nullptr, Form::Text), QrStreamEx::ExReadObject);
    put(file, std::string_view("\0\0\0\0EOBJ", 8));
    EXPECT_FALSE(loadObject(file, nullptr, Form::Binary));
    put(file, std::string_view("\0\0\0\0EOBJ\n", 9));
    EXPECT_THROW(loadObject(file, nullptr, Form::Binary), QrStreamEx::ExReadObject);
}

TEST_F(SafeFile, OfTheRecordedListIsWrittenAndReadByTheManager) {
    const std::filesystem::path components = MZ_BUILD_PATH L"/components/mesh";
    EXPECT_FALSE(readRecordedList(file));
    put(file, "");
    EXPECT_THROW(readRecordedList(file), QrStreamEx::ExReadObject);
    put(file, std::string_view("\0\0\0\1\0", 5));
    EXPECT_THROW(readRecordedList(file), QrStreamEx::ExReadError);
    EXPECT_EQ(system::mappedLibraries(components), 0U);
    QrGetComponentManager()->initialize(components.wstring().c_str());
    EXPECT_EQ(system::mappedLibraries(components), 6U);
    writeRecordedList(file);
    EXPECT_GT(content().size(), 500U);
    // A manager that is initialised reads nothing more.
    EXPECT_TRUE(readRecordedList(file));
    put(file, "");
    EXPECT_TRUE(readRecordedList(file));
}

} // namespace
