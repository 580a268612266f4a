// Saving that never loses the file that was there.
#include "examples/mesh/saving/objectFile.h"
#include "examples/mesh/saving/recordedList.h"
#include "examples/mesh/system/system.h"
#include "tests/mesh/safeFileFixture.h"
#include "tests/mesh/unwritableFolder.h"

#include "components/componentManager/componentImp.h"
#include "components/objectIO/objectIO.h"

using namespace Mz;
using namespace Meshes;

namespace {

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
