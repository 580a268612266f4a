// SPDX-License-Identifier: BSL-1.0
// Tests a start that reads the recorded list of an earlier start: which libraries it loads.
#include "tests/streams/support.h"

#include "components/componentManager/manager/componentImpPrivate.h"
#include "tests/streams/components/recordedUids.h"
#include "tests/support/temporaryDirectory.h"

#include <gmock/gmock.h>

#include <filesystem>
#include <fstream>

namespace {

using namespace Mz::Test;
using Mz::ComponentLibrary;
using Mz::ComponentManager;
using Mz::QrBinaryStream;
using Mz::QrPersistant;
using Mz::QrPtr;
using testing::ElementsAre;

/// A folder with two component libraries and another file, and the recorded list of a first start.
class RecordedStart : public testing::Test {
  protected:
    void SetUp() override {
        for (const auto& entry :
             std::filesystem::directory_iterator(MZ_BUILD_PATH L"/components/recordedLists"))
            std::filesystem::copy_file(entry.path(), folder.path() / entry.path().filename());
        folder.write("zreadme.txt", "no library");
        ComponentManager manager;
        manager.initialize(folder.text().c_str());
        ASSERT_EQ(manager.libraries.size(), 3U);
        EXPECT_EQ(loaded(manager), 2);
        list = written<QrBinaryStream>(
            [&](Mz::QrStream& stream) { companion(manager)->write(stream); });
    }

    static QrPtr<QrPersistant> companion(ComponentManager& manager) {
        return QrPtr<QrPersistant>::adopt(
            Mz::safeCast<QrPersistant>(static_cast<Mz::QrComponentManager*>(&manager)));
    }

    /// Reads the first `length` bytes of the list and initialises `manager`.
    void start(ComponentManager& manager, std::size_t length = std::string::npos) {
        Reading<QrBinaryStream> in(list.substr(0, length));
        if (length >= list.size())
            companion(manager)->read(in.stream);
        else
            EXPECT_ANY_THROW(companion(manager)->read(in.stream));
        manager.initialize(folder.text().c_str());
    }

    static int loaded(const ComponentManager& manager) {
        int count = 0;
        for (const ComponentLibrary& library : manager.libraries)
            count += library.module ? 1 : 0;
        return count;
    }

    /// Returns the names of all builders in the order of the enumeration, then the libraries' texts
    /// if there are any.
    static std::vector<std::wstring> names(ComponentManager& manager) {
        struct Names final : Mz::QrEnumerator<Mz::QrCPtr<Mz::QrBuilderDescription>> {
            Action process(Mz::QrCPtr<Mz::QrBuilderDescription> item) override {
                found.push_back(item->getName());
                labels += item->getComponentLabel();
                labels += item->getComponentText();
                return Continue;
            }
            std::vector<std::wstring> found;
            std::wstring labels;
        } names;
        manager.enumerateBuilders(names);
        if (!names.labels.empty())
            names.found.push_back(names.labels);
        return names.found;
    }

    static ComponentLibrary& library(ComponentManager& manager, std::wstring_view prefix) {
        for (ComponentLibrary& library : manager.libraries)
            if (library.fileName.view().starts_with(prefix))
                return library;
        throw std::runtime_error("no such library");
    }

    TemporaryDirectory folder;
    std::string list;
};

TEST_F(RecordedStart, OfUnchangedFilesLoadsNothing) {
    ComponentManager manager;
    start(manager);
    EXPECT_EQ(manager.libraries.size(), 3U);
    EXPECT_EQ(loaded(manager), 0);
    // The list does not store the libraries' texts, so only names follow.
    EXPECT_THAT(names(manager), ElementsAre(L"alpha", L"beta", L"gamma"));
    EXPECT_EQ(loaded(manager), 0);
    const ComponentManager::Builder& alpha = library(manager, L"recordedfirst").builders[0];
    EXPECT_EQ(alpha.uid, recordedAlpha);
    EXPECT_EQ(alpha.label, L"Alpha");
    EXPECT_EQ(alpha.text, L"The first of two");
    EXPECT_EQ(alpha.number, 4000000000U);
    EXPECT_TRUE(alpha.flag);
}

TEST_F(RecordedStart, FirstUseLoadsExactlyOneLibrary) {
    ComponentManager manager;
    start(manager);
    EXPECT_TRUE(manager.createObject(recordedGamma));
    EXPECT_EQ(loaded(manager), 1);
    EXPECT_NE(library(manager, L"recordedsecond").module, nullptr);
    EXPECT_TRUE(manager.createObject(recordedGamma));
    EXPECT_EQ(loaded(manager), 1);
    // A lazy load does not read the texts either.
    EXPECT_THAT(names(manager), ElementsAre(L"alpha", L"beta", L"gamma"));
}

TEST_F(RecordedStart, IsWrittenAsItWasRead) {
    ComponentManager manager;
    start(manager);
    EXPECT_EQ(
        written<QrBinaryStream>([&](Mz::QrStream& stream) { companion(manager)->write(stream); }),
        list);
}

TEST_F(RecordedStart, ReadsAChangedLibraryAfresh) {
    const std::filesystem::path changed = [&] {
        for (const auto& entry : std::filesystem::directory_iterator(folder.path()))
            if (entry.path().filename().string().starts_with("recordedFirst"))
                return entry.path();
        return std::filesystem::path();
    }();
    // A byte after the end of the file changes its size but not the library.
    std::ofstream(changed, std::ios::binary | std::ios::app).put('\0');
    ComponentManager manager;
    start(manager);
    EXPECT_EQ(loaded(manager), 1);
    EXPECT_NE(library(manager, L"recordedfirst").module, nullptr);
    EXPECT_EQ(library(manager, L"recordedfirst").componentText1, L"First label");
    EXPECT_EQ(manager.libraries.size(), 3U);
    EXPECT_TRUE(manager.createObject(recordedBeta));
    EXPECT_TRUE(manager.createObject(recordedGamma));
}

TEST_F(RecordedStart, ForgetsALibraryWhoseFileIsGone) {
    for (const auto& entry : std::filesystem::directory_iterator(folder.path()))
        if (entry.path().filename().string().starts_with("recordedSecond")) {
            std::filesystem::remove(entry.path());
            break;
        }
    ComponentManager manager;
    start(manager);
    EXPECT_EQ(loaded(manager), 0);
    EXPECT_THAT(names(manager), ElementsAre(L"alpha", L"beta"));
    EXPECT_FALSE(manager.getBuilder(recordedGamma));
}

TEST_F(RecordedStart, ReadsTheLibrariesThatACutListLostAfresh) {
    for (std::size_t length = 0; length < list.size(); length += 7) {
        SCOPED_TRACE(length);
        ComponentManager manager;
        start(manager, length);
        EXPECT_EQ(manager.libraries.size(), 3U);
        EXPECT_TRUE(manager.getBuilder(recordedAlpha));
        EXPECT_TRUE(manager.getBuilder(recordedBeta));
        EXPECT_TRUE(manager.getBuilder(recordedGamma));
    }
}

} // namespace
