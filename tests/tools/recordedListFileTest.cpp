// SPDX-License-Identifier: BSL-1.0
// Tests the tools' reader and writer of recorded lists: golden bytes, damage, and replacing the
// file.
#include "components/componentTools/uidText.h"
#include "tests/tools/toolsFixture.h"

#include "components/componentManager/exceptions.h"
#include "components/componentManager/utf8.h"

#include <clocale>
#include <thread>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

RecordedLibraries sample() {
    return {{L"\\a\\b", L"one.so", 1700000000u, 123456789012, {}},
            {L"c:\\x",
             L"two.dll",
             0xFFFFFFFF,
             0,
             {{{1, 2, 3, 4}, L"Name", L"Label", L"Text", 7, true},
              {{5, 6, 7, 8}, L"", L"", L"", 0xFFFFFFFF, false}}}};
}

class RecordedListFile : public ToolsTest {
  protected:
    std::filesystem::path file() const { return folder.path() / "list"; }

    ListReading readBytes(const std::string& bytes) {
        return readRecordedList(folder.write("list", bytes));
    }
};

bool same(const RecordedLibraries& a, const RecordedLibraries& b) {
    const auto sameBuilder = [](const RecordedBuilder& x, const RecordedBuilder& y) {
        return x.uid == y.uid && x.name == y.name && x.label == y.label && x.text == y.text &&
               x.number == y.number && x.flag == y.flag;
    };
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [&](const RecordedLibrary& x, const RecordedLibrary& y) {
                          return x.directory == y.directory && x.fileName == y.fileName &&
                                 x.time == y.time && x.size == y.size &&
                                 std::equal(x.builders.begin(), x.builders.end(),
                                            y.builders.begin(), y.builders.end(), sameBuilder);
                      });
}

TEST_F(RecordedListFile, ComesBackAsItWasWritten) {
    writeRecordedList(file(), sample());
    const ListReading reading = readRecordedList(file());
    EXPECT_EQ(reading.state, ListReading::State::good);
    EXPECT_TRUE(same(reading.libraries, sample()));
    EXPECT_EQ(reading.libraries[0].position, 4);
}

TEST_F(RecordedListFile, IsReplacedOnlyIfItChanges) {
    RecordedLibraries libraries = sample();
    writeRecordedList(file(), libraries);
    const auto before = std::filesystem::file_time_type::clock::now() - std::chrono::hours(1);
    std::filesystem::last_write_time(file(), before);
    const auto written = std::filesystem::last_write_time(file());
    writeRecordedList(file(), libraries);
    EXPECT_EQ(std::filesystem::last_write_time(file()), written);
    ++libraries[1].builders[0].uid.w3; // The size of the file stays.
    writeRecordedList(file(), libraries);
    EXPECT_TRUE(same(readRecordedList(file()).libraries, libraries));
    EXPECT_NE(std::filesystem::last_write_time(file()), written);
}

TEST_F(RecordedListFile, HasTheManagersOwnBytes) {
    writeRecordedList(file(),
                      {{L"\\a", L"b", 0x01020304, 5, {{{1, 2, 3, 4}, L"n", L"", L"", 9, true}}}});
    const std::string expected("\0\0\0\1"
                               "\0\0\0\2\\a"
                               "\0\0\0\1b"
                               "\1\2\3\4"
                               "\0\0\0\0\0\0\0\5"
                               "\0\0\0\1",
                               4 + 6 + 5 + 4 + 8 + 4);
    const std::string content = contentOf(file());
    EXPECT_EQ(content.substr(0, expected.size()), expected);
    const std::string tail("\0\0\0\1n\0\0\0\0\0\0\0\0\1\0\0\0\11", 18);
    EXPECT_EQ(content.size(), expected.size() + 16 + tail.size());
    EXPECT_TRUE(content.ends_with(tail));
}

TEST_F(RecordedListFile, MissingIsNotRejected) {
    EXPECT_EQ(readRecordedList(file()).state, ListReading::State::missing);
}

TEST_F(RecordedListFile, CutOffAnywhereIsRejectedWhole) {
    writeRecordedList(file(), sample());
    const std::string content = contentOf(file());
    for (std::size_t size = 0; size < content.size(); ++size) {
        const ListReading reading = readBytes(content.substr(0, size));
        ASSERT_EQ(reading.state, ListReading::State::rejected) << size;
        ASSERT_TRUE(reading.libraries.empty()) << size;
        ASSERT_FALSE(reading.reason.empty());
    }
    EXPECT_EQ(readBytes(content + '\0').state, ListReading::State::rejected);
}

TEST_F(RecordedListFile, WithAnyByteChangedIsReadOrRejectedAndNothingElse) {
    writeRecordedList(file(), sample());
    const std::string content = contentOf(file());
    int rejected = 0;
    for (std::size_t place = 0; place < content.size(); ++place)
        for (const char value : {'\0', '\1', '\x7F', '\x80', '\xFF', '/', 'A'}) {
            std::string changed = content;
            changed[place] = value;
            rejected += readBytes(changed).state == ListReading::State::rejected;
        }
    EXPECT_GT(rejected, 100);
}

TEST_F(RecordedListFile, RejectsWhatIsForeign) {
    for (const std::string& foreign :
         {std::string("#!/bin/sh\necho hello\n"), std::string(1000, '\xFF'),
          std::string(1000, '\0'), contentOf(builtComponent(L"goodByHand")),
          std::string("{\"version\": 1}")})
        EXPECT_EQ(readBytes(foreign).state, ListReading::State::rejected);
    EXPECT_EQ(readRecordedList(folder.path()).state, ListReading::State::rejected);
}

TEST_F(RecordedListFile, RejectsNamesThatAreNotNormalised) {
    for (const wchar_t* name : {L"A", L"a/b", L""}) {
        writeRecordedList(file(), {{L"\\a", name, 1, 1, {}}});
        EXPECT_EQ(readRecordedList(file()).state, ListReading::State::rejected);
    }
}

TEST_F(RecordedListFile, AcceptsABackSlashInAFileName) {
    writeRecordedList(file(), {{L"\\a", L"a\\b.so", 1, 1, {}}});
    const ListReading reading = readRecordedList(file());
    ASSERT_EQ(reading.state, ListReading::State::good) << toUtf8(reading.reason);
    EXPECT_EQ(reading.libraries[0].fileName, L"a\\b.so");
}

TEST_F(RecordedListFile, WhatCannotBeWrittenLeavesTheOldFile) {
    std::setlocale(LC_ALL, "C");
    writeRecordedList(file(), sample());
    EXPECT_THROW(writeRecordedList(file(), {{L"\\\u4E2D", L"b", 1, 1, {}}}),
                 QrStreamEx::ExWriteError);
    EXPECT_TRUE(same(readRecordedList(file()).libraries, sample()));
    EXPECT_THROW(writeRecordedList(folder.path() / "no" / "list", {}), QrStreamEx::ExWriteOpen);
    EXPECT_THROW(writeRecordedList(folder.path(), {}), std::exception);
    int files = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder.path()))
        files += entry.is_regular_file();
    EXPECT_EQ(files, 1);
}

TEST_F(RecordedListFile, StaysBehindItsLinkWithItsPermissions) {
    namespace fs = std::filesystem;
    const fs::path link = folder.path() / "link";
    writeRecordedList(file(), {});
    fs::permissions(file(), fs::perms::owner_read | fs::perms::owner_write);
    const fs::perms before = fs::status(file()).permissions();
    std::error_code failure;
    fs::create_symlink("list", link, failure);
    writeRecordedList(failure ? file() : link, sample());
    EXPECT_TRUE(same(readRecordedList(file()).libraries, sample()));
    EXPECT_EQ(fs::status(file()).permissions(), before);
    EXPECT_EQ(fs::is_symlink(fs::symlink_status(link)), !failure);
    // Only files are replaced.
    EXPECT_THROW(writeRecordedList(folder.path(), {}), QrStreamEx::ExWriteOpen);
}

TEST_F(RecordedListFile, WrittenByManyAtOnceIsAlwaysOneOfThemWhole) {
    writeRecordedList(file(), {});
    std::vector<std::jthread> writers;
    for (unsigned int writer = 0; writer < 4; ++writer)
        writers.emplace_back([this, writer] {
            const RecordedLibraries list(500 * (writer + 1), {L"\\a", L"b", writer, 1, {}});
            for (int round = 0; round < 20; ++round)
                writeRecordedList(file(), list);
        });
    for (int round = 0; round < 50; ++round) {
        const ListReading reading = readRecordedList(file());
        ASSERT_EQ(reading.state, ListReading::State::good) << toUtf8(reading.reason);
        ASSERT_EQ(reading.libraries.size() % 500, 0u);
    }
}

TEST_F(RecordedListFile, TellsWhatTheLocaleCarries) {
    std::setlocale(LC_ALL, "C");
    EXPECT_TRUE(isCarried(L"plain \u00FF"));
    EXPECT_FALSE(isCarried(L"\u4E2D"));
    EXPECT_FALSE(isCarried(std::wstring(1, L'\0')));
}

TEST_F(RecordedListFile, ShowsIdentifiersInHexadecimal) {
    EXPECT_EQ(textOf({0x6E1B0A01, 0x4D1F11EF, 0x9C2A7B10, 0x5D3E8F41}),
              L"6E1B0A01-4D1F11EF-9C2A7B10-5D3E8F41");
}

} // namespace
