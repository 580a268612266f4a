// SPDX-License-Identifier: BSL-1.0
// Tests that saving never loses the existing file.
#include "examples/mesh/saving/objectFile.h"
#include "examples/mesh/saving/recordedList.h"
#include "examples/mesh/system/system.h"
#include "tests/unit/replaceFileFixture.h"

#include "components/componentManager/componentImp.h"
#include "components/objectIO/objectIO.h"

using namespace Mz;
using namespace Meshes;

namespace {

using SavedFile = Mz::Test::ReplaceFile;

TEST_F(SavedFile, OfAnObjectThatCannotBeWrittenKeepsTheOldOne) {
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

TEST_F(SavedFile, OfObjectsHoldsOneAndNothingBehindIt) {
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

TEST_F(SavedFile, OfTheRecordedListIsWrittenAndReadByTheManager) {
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
    // An initialised manager reads no list.
    EXPECT_TRUE(readRecordedList(file));
    put(file, "");
    EXPECT_TRUE(readRecordedList(file));
}

} // namespace
