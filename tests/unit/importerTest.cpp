// SPDX-License-Identifier: BSL-1.0
// Tests the importer: file types, the enumeration of import builders, the choice of a builder for
// data and for files, and importers that override parts of it.
#include "components/componentManager/processControl.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/unit/importTestObjects.h"
#include "tests/unit/openFiles.h"

#include <gtest/gtest.h>

#include <optional>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;

namespace {

constexpr QrUid uidOf(std::uint32_t number) {
    return {0x7D2E0100 + number, 0x33B14C5A, 0x9A40C6D1, 0x20F7E8B3};
}

class Importer : public testing::Test {
  protected:
    ~Importer() override {
        QrSetSystemProcessController(standard);
        EXPECT_EQ(ImportedObject::alive, 0);
    }

    /// Adds an import builder as the last one in the manager's order.
    TestImportBuilder& add(const wchar_t* label, std::vector<const wchar_t*> extensions,
                           const wchar_t* name = L"test") {
        const QrUid uid = uidOf(number++);
        QrPtr<TestImportBuilder> builder(new TestImportBuilder(
            {.uid = Kit::BuilderUid::atRunTime(uid), .name = name, .label = label},
            std::move(extensions), calls));
        library.add(uid, name, builder->getCastable());
        return *builder;
    }

    /// Adds an import builder that can import everything.
    TestImportBuilder& addWilling(const wchar_t* label, std::vector<const wchar_t*> extensions) {
        TestImportBuilder& builder = add(label, std::move(extensions));
        builder.onCanImport = [](QrBufferedIO&) { return true; };
        return builder;
    }

    void addOther(const wchar_t* name, const QrRef<QrCastable>& builder) {
        library.add(uidOf(number++), name, builder);
    }

    QrRef<QrCastable> importText(const wchar_t* path, const wchar_t* search = nullptr) {
        std::istringstream stream("content");
        QrInBuffer io(&stream);
        return importer.import(QrPtr<QrBufferedIO>(&io), path, search);
    }

    QrProcessControl* const standard = QrGetSystemProcessController();
    Calls calls;
    TestLibrary library;
    TestImporter importer;

  private:
    std::uint32_t number = 0;
};

// ---- File types -----------------------------------------------------------------------------

std::wstring upToSecondNul(const wchar_t* text) {
    const std::wstring first(text);
    EXPECT_EQ(text[first.size() + 1], L'\0') << "the list ends with two NULs";
    return first;
}

TEST_F(Importer, ListsItsFileTypes) {
    add(L"A", {L"a", L"b"});
    add(L"B", {L"c"});
    const wchar_t* const types = importer.getFileTypes();
    EXPECT_EQ(upToSecondNul(types), L"A|*.a;*.b|B|*.c|");
    EXPECT_EQ(std::wstring(types, 18), std::wstring(L"A|*.a;*.b|B|*.c|\0\0", 18));
}

TEST_F(Importer, ListsABuilderWithoutExtensions) {
    add(L"A", {});
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"A||");
}

TEST_F(Importer, ListsTextsAsTheyAre) {
    add(L"", {L"", L"tar.gz", nullptr});
    add(L"A|B;*", {L"OBJ"});
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"|*.;*.tar.gz;*.|A|B;*|*.OBJ|");
}

TEST_F(Importer, ListsNothingButANulWithoutBuildersAndKeepsThat) {
    const wchar_t* const types = importer.getFileTypes();
    EXPECT_EQ(upToSecondNul(types), L"");
    add(L"A", {L"a"});
    EXPECT_EQ(importer.getFileTypes(), types) << "the list is built once";
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"");
    EXPECT_EQ(calls, Calls{});
}

TEST_F(Importer, BuildsTheFileTypesOnce) {
    add(L"A", {L"a"});
    const wchar_t* const types = importer.getFileTypes();
    add(L"B", {L"b"});
    EXPECT_EQ(importer.getFileTypes(), types);
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"A|*.a|");
    EXPECT_EQ(calls, Calls{L"A extensions"});
    TestImporter second;
    EXPECT_EQ(upToSecondNul(second.getFileTypes()), L"A|*.a|B|*.b|");
}

TEST_F(Importer, KeepsNoFileTypesThatAnExceptionInterrupted) {
    add(L"A", {L"a"});
    TestImportBuilder& broken = add(L"B", {L"b"});
    broken.onExtensions = [](QrEnumerator<const wchar_t*>& e) -> QrEnum::Action {
        e.process(L"half");
        throw 42;
    };
    EXPECT_THROW(importer.getFileTypes(), int);
    broken.onExtensions = nullptr;
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"A|*.a|B|*.b|");
}

TEST_F(Importer, IgnoresTheResultOfAnExtensionWalkInTheFileTypes) {
    add(L"A", {}).onExtensions = [](QrEnumerator<const wchar_t*>& e) {
        EXPECT_EQ(e.process(L"x"), QrEnum::Continue);
        EXPECT_EQ(e.process(L"y"), QrEnum::Continue);
        EXPECT_EQ(e.finished(), QrEnum::Continue);
        return QrEnum::Fail;
    };
    add(L"B", {L"b"});
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"A|*.x;*.y|B|*.b|");
}

TEST_F(Importer, ListsItsOwnImportBuildersOnly) {
    add(L"A", {L"a"});
    add(L"other", {L"o"}, L"Test");
    add(L"longer", {L"o"}, L"test ");
    add(L"none", {L"o"}, L"");
    addOther(L"test", nullptr);
    addOther(L"test", QrPtr<PlainBuilder>(new PlainBuilder({.uid = uidOf(999)}))->getCastable());
    add(L"B", {L"b"});
    EXPECT_EQ(upToSecondNul(importer.getFileTypes()), L"A|*.a|B|*.b|");
}

/// An import builder without a builder description.
class Undescribed final
    : public QrCastRef<QrCastHeap<QrCastMulti<Undescribed, QrComponentBuilder, QrImportBuilder>>> {
  public:
    QrRef<QrCastable> createObject() override { return nullptr; }
    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        return e.finished();
    }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return QrPtr<ImportedObject>(new ImportedObject(L"undescribed"));
    }
};

TEST_F(Importer, CannotListABuilderThatDoesNotDescribeItselfButImportsWithIt) {
    addOther(L"test", QrPtr<Undescribed>(new Undescribed)->getCastable());
    EXPECT_THROW(importer.getFileTypes(), QrComponentManagerEx::ExBadCast);
    EXPECT_EQ(makerOf(importText(L"x.y")), L"undescribed");
}

// ---- Enumeration ----------------------------------------------------------------------------

class Collector : public QrEnumerator<QrCPtr<QrImportBuilder>> {
  public:
    Action process(QrCPtr<QrImportBuilder> builder) override {
        seen.push_back(queryCast<QrBuilderDescription>(builder.get())->getLabel());
        return verdict;
    }
    Action finished() override {
        ++finishes;
        return end;
    }
    Action verdict = Continue;
    Action end = Continue;
    int finishes = 0;
    std::vector<std::wstring> seen;
};

TEST_F(Importer, EnumeratesItsBuildersInOrderAndFinishes) {
    add(L"A", {});
    add(L"other", {}, L"other");
    add(L"B", {});
    Collector collector;
    collector.end = static_cast<QrEnum::Action>(9);
    EXPECT_EQ(importer.enumerateObjects(collector), 9);
    EXPECT_EQ(collector.seen, (std::vector<std::wstring>{L"A", L"B"}));
    EXPECT_EQ(collector.finishes, 1);
}

TEST_F(Importer, StopsItsEnumerationWithTheCallersValue) {
    add(L"A", {});
    add(L"B", {});
    for (const int verdict : {1, 2, 77, -5}) {
        Collector collector;
        collector.verdict = static_cast<QrEnum::Action>(verdict);
        EXPECT_EQ(static_cast<int>(importer.enumerateObjects(collector)), verdict);
        EXPECT_EQ(collector.seen, std::vector<std::wstring>{L"A"});
        EXPECT_EQ(collector.finishes, 0);
    }
}

TEST_F(Importer, EnumeratesNothingOfAManagerThatIsNotInitialised) {
    add(L"A", {L"a"});
    TestLibrary::manager().initialised = false;
    Collector collector;
    EXPECT_EQ(importer.enumerateObjects(collector), QrEnum::Continue);
    EXPECT_EQ(collector.finishes, 1);
    EXPECT_FALSE(importText(L"x.a"));
}

// ---- Imports from a buffer ------------------------------------------------------------------

TEST_F(Importer, AsksByExtensionFirst) {
    addWilling(L"A", {L"a"});
    addWilling(L"B", {L"x", L"b"});
    EXPECT_EQ(makerOf(importText(L"file.b")), L"B");
    EXPECT_EQ(calls, (Calls{L"A extensions", L"B extensions", L"B can [file.b] []",
                            L"B import [file.b] []"}));
}

TEST_F(Importer, AsksEverybodyByContentWhenNoExtensionMatches) {
    add(L"A", {L"a"});
    addWilling(L"B", {L"b"});
    EXPECT_EQ(makerOf(importText(L"file.c")), L"B");
    EXPECT_EQ(calls, (Calls{L"A extensions", L"B extensions", L"A can [file.c] []",
                            L"B can [file.c] []", L"B import [file.c] []"}));
}

TEST_F(Importer, AsksThoseWhoRefusedByExtensionAgainByContent) {
    TestImportBuilder& fussy = add(L"A", {L"a"});
    int asked = 0;
    fussy.onCanImport = [&](QrBufferedIO&) { return ++asked == 2; };
    EXPECT_EQ(makerOf(importText(L"file.a")), L"A");
    EXPECT_EQ(asked, 2);
}

TEST_F(Importer, TakesTheFirstInTheManagersOrder) {
    addWilling(L"A", {L"a"});
    addWilling(L"B", {L"a"});
    EXPECT_EQ(makerOf(importText(L"file.a")), L"A");
    calls.clear();
    EXPECT_EQ(makerOf(importText(L"file.z")), L"A");
}

TEST_F(Importer, ComparesExtensionsWithTheirCase) {
    addWilling(L"A", {L"obj"});
    EXPECT_EQ(makerOf(importText(L"model.OBJ")), L"A");
    EXPECT_EQ(calls, (Calls{L"A extensions", L"A can [model.OBJ] []", L"A import [model.OBJ] []"}))
        << "chosen by the content";
    calls.clear();
    addWilling(L"B", {L"OBJ"});
    EXPECT_EQ(makerOf(importText(L"model.OBJ")), L"B") << "chosen by the extension";
}

struct ExtensionCase {
    const wchar_t* path;
    const wchar_t* extension;
};

TEST_F(Importer, TakesAllAfterTheLastDotWhereverItIs) {
    for (const auto& [path, extension] : {ExtensionCase{L"a.b.c", L"c"},
                                          {L"folder.d/file", L"d/file"},
                                          {L"file.", L""},
                                          {L"file", L""},
                                          {L".hidden", L"hidden"},
                                          {L"c:\\x.y\\z", L"y\\z"},
                                          {L"..", L""}}) {
        TestLibrary ownLibrary;
        Calls ownCalls;
        const QrPtr<TestImportBuilder> builder(
            new TestImportBuilder({.uid = uidOf(500), .name = L"extension", .label = L"A"},
                                  {L"no", extension}, ownCalls));
        builder->onCanImport = [](QrBufferedIO&) { return true; };
        ownLibrary.add(uidOf(500), L"extension", builder->getCastable());
        importer.name = L"extension";
        EXPECT_EQ(makerOf(importText(path)), L"A");
        EXPECT_EQ(ownCalls.size(), 3u) << "found by its extension: " << extension;
        EXPECT_EQ(ownCalls[0], L"A extensions");
    }
}

TEST_F(Importer, MatchesAFileWithoutADotToAnEmptyExtensionOnly) {
    addWilling(L"A", {L"file"});
    addWilling(L"B", {L"b", L""});
    EXPECT_EQ(makerOf(importText(L"file")), L"B");
}

TEST_F(Importer, SkipsExtensionsForAnEmptyPathInBothRounds) {
    add(L"A", {L""});
    EXPECT_FALSE(importText(L""));
    EXPECT_EQ(calls, (Calls{L"A can [] []", L"A can [] []"}));
}

TEST_F(Importer, SkipsTheFirstRoundForANullPath) {
    addWilling(L"A", {L"a"});
    EXPECT_EQ(makerOf(importText(nullptr)), L"A");
    EXPECT_EQ(calls, (Calls{L"A can [] []", L"A import [] []"}));
}

TEST_F(Importer, GivesBuildersThePathTwiceWhenThereIsASearchPath) {
    addWilling(L"A", {L"a"});
    EXPECT_TRUE(importText(L"file.a", L"some;where"));
    EXPECT_EQ(calls,
              (Calls{L"A extensions", L"A can [file.a] [file.a]", L"A import [file.a] [file.a]"}));
    calls.clear();
    EXPECT_TRUE(importText(L"file.a", L""));
    EXPECT_EQ(calls[1], L"A can [file.a] [file.a]");
}

TEST_F(Importer, EndsAtABuilderThatClaimsTheDataButYieldsNothing) {
    addWilling(L"A", {L"a"}).onImport = [](QrBufferedIO&) { return false; };
    addWilling(L"B", {L"a"});
    EXPECT_FALSE(importText(L"file.a"));
    EXPECT_EQ(calls, (Calls{L"A extensions", L"A can [file.a] []", L"A import [file.a] []"}));
    calls.clear();
    EXPECT_FALSE(importText(nullptr));
    EXPECT_EQ(calls, (Calls{L"A can [] []", L"A import [] []"}));
}

TEST_F(Importer, EndsAtFailFromAnExtensionWalk) {
    add(L"A", {}).onExtensions = [](QrEnumerator<const wchar_t*>&) { return QrEnum::Fail; };
    addWilling(L"B", {L"b"});
    EXPECT_FALSE(importText(L"file.b"));
    EXPECT_EQ(calls, Calls{L"A extensions"});
}

TEST_F(Importer, GoesOnToTheSecondRoundAfterAnyOtherResultOfAnExtensionWalk) {
    add(L"A", {}).onExtensions = [](QrEnumerator<const wchar_t*>&) {
        return static_cast<QrEnum::Action>(7);
    };
    addWilling(L"B", {L"b"});
    EXPECT_EQ(makerOf(importText(L"file.b")), L"B");
    EXPECT_EQ(calls, (Calls{L"A extensions", L"A can [file.b] []", L"B can [file.b] []",
                            L"B import [file.b] []"}))
        << "an unknown result ends the first round";
}

TEST_F(Importer, TakesStopFromAnExtensionWalkForAMatch) {
    addWilling(L"A", {}).onExtensions = [](QrEnumerator<const wchar_t*>&) { return QrEnum::Stop; };
    EXPECT_EQ(makerOf(importText(L"file.b")), L"A");
    EXPECT_EQ(calls[1], L"A can [file.b] []");
}

TEST_F(Importer, IsNullWhenNobodyTakesTheData) {
    add(L"A", {L"a"});
    EXPECT_FALSE(importText(L"file.a"));
    EXPECT_EQ(calls, (Calls{L"A extensions", L"A can [file.a] []", L"A can [file.a] []"}));
    importer.name = L"nobody";
    EXPECT_FALSE(importText(L"file.a"));
}

TEST_F(Importer, RestoresThePositionBetweenBuilders) {
    std::vector<int64> positions;
    const auto reads = [&](auto&& read) {
        return [&positions, read](QrBufferedIO& io) {
            positions.push_back(io.tell());
            read(io);
            return false;
        };
    };
    char block[100];
    add(L"A", {}).onCanImport = reads([](QrBufferedIO& io) { io.read(); });
    add(L"B", {}).onCanImport = reads([&](QrBufferedIO& io) { io.read(block, 100); });
    add(L"C", {}).onCanImport = reads([](QrBufferedIO& io) { io.seek(0, 0); });
    add(L"D", {}).onCanImport = reads([&](QrBufferedIO& io) {
        io.read(block, 100);
        io.ungetc('x');
    });
    add(L"E", {}).onCanImport =
        reads([](QrBufferedIO& io) { EXPECT_THROW(io.seek(1000, 0), QrStreamEx::ExReadError); });
    add(L"F", {}).onCanImport = reads([](QrBufferedIO& io) {
        while (io.read() != -1) {
        }
    });
    addWilling(L"G", {}).onImport = [&](QrBufferedIO& io) {
        positions.push_back(io.tell());
        return io.read() == 'n';
    };
    std::istringstream stream("content");
    QrInBuffer io(&stream);
    io.seek(2, 0);
    EXPECT_EQ(makerOf(importer.import(QrPtr<QrBufferedIO>(&io), nullptr, nullptr)), L"G");
    EXPECT_EQ(positions, (std::vector<int64>(7, 2)));
    EXPECT_EQ(io.tell(), 3) << "the import leaves the position";
}

/// Logs the calls that use its position, and throws in the first seeks to a position.
class Positioned final : public QrInBuffer {
  public:
    Positioned(std::istream* stream, Calls& log, int refusals)
        : QrInBuffer(stream), log(log), refusals(refusals) {}

    int64 seek(int64 offset, int origin) override {
        log.push_back(L"seek " + std::to_wstring(offset) + L" " + std::to_wstring(origin));
        if (origin == 0 && refusals-- > 0)
            throw QrStreamEx::ExReadError("tests/unit/importerTest", __LINE__);
        return QrInBuffer::seek(offset, origin);
    }
    int64 tell() const override {
        log.emplace_back(L"tell");
        return QrInBuffer::tell();
    }
    int read() override {
        log.emplace_back(L"read");
        return QrInBuffer::read();
    }

  private:
    Calls& log;
    int refusals;
};

TEST_F(Importer, AsksAnIOForNothingButItsPositions) {
    add(L"A", {});
    for (const int refusals : {0, 1}) {
        std::istringstream stream("content");
        stream.seekg(3);
        Calls log;
        Positioned io(&stream, log, refusals);
        EXPECT_FALSE(importer.import(QrPtr<QrBufferedIO>(&io), nullptr, nullptr));
        Calls expected{L"seek 0 1", L"tell", L"seek 3 0", L"tell"};
        if (refusals)
            expected = {L"seek 0 1", L"tell", L"seek 3 0", L"read", L"seek 3 0", L"tell"};
        EXPECT_EQ(log, expected);
    }
}

TEST_F(Importer, PassesOnThatAPositionIsLost) {
    add(L"A", {});
    std::istringstream stream("content");
    Calls log;
    Positioned io(&stream, log, 2);
    EXPECT_THROW(importer.import(QrPtr<QrBufferedIO>(&io), nullptr, nullptr),
                 QrStreamEx::ExReadError);
}

TEST_F(Importer, RestoresThePositionBeforeTheSameBuildersImport) {
    char block[100];
    TestImportBuilder& builder = add(L"A", {});
    builder.onCanImport = [&](QrBufferedIO& io) { return io.read(block, 100) == 7; };
    builder.onImport = [](QrBufferedIO& io) { return io.tell() == 0 && io.read() == 'c'; };
    EXPECT_EQ(makerOf(importText(nullptr)), L"A");
}

class Untellable : public std::streambuf {
  protected:
    int_type underflow() override { return 'x'; }
};

TEST_F(Importer, IsNullForDataWithoutAPositionAndAsksNobody) {
    addWilling(L"A", {L"a"});
    addWilling(L"B", {L"a"});
    Untellable medium;
    std::istream stream(&medium);
    QrInBuffer io(&stream);
    EXPECT_FALSE(importer.import(QrPtr<QrBufferedIO>(&io), L"file.a", nullptr));
    EXPECT_EQ(calls, Calls{L"A extensions"});
    calls.clear();
    EXPECT_FALSE(importer.import(QrPtr<QrBufferedIO>(&io), nullptr, nullptr));
    EXPECT_EQ(calls, Calls{});
}

TEST_F(Importer, DemandsABuffer) {
    addWilling(L"A", {L"a"});
    EXPECT_THROW(importer.import(QrPtr<QrBufferedIO>(), L"file.a", nullptr),
                 QrComponentManagerEx::ExBadCast);
    EXPECT_EQ(calls, Calls{});
}

TEST_F(Importer, LetsExceptionsOfBuildersThrough) {
    TestImportBuilder& builder = addWilling(L"A", {L"a"});
    builder.onImport = [](QrBufferedIO&) -> bool { throw 42; };
    EXPECT_THROW(importText(L"file.a"), int);
    builder.onCanImport = [](QrBufferedIO&) -> bool { throw 4.2; };
    EXPECT_THROW(importText(L"file.a"), double);
    builder.onExtensions = [](QrEnumerator<const wchar_t*>&) -> QrEnum::Action { throw 'x'; };
    EXPECT_THROW(importText(L"file.a"), char);
}

TEST_F(Importer, GivesTheObjectWithOneReference) {
    addWilling(L"A", {L"a"});
    const QrRef<QrCastable> object = importText(L"file.a");
    EXPECT_EQ(ImportedObject::alive, 1);
    EXPECT_EQ(object->newReference(), 1);
    EXPECT_EQ(object->release(), 0);
}

// ---- Imports of a named file ----------------------------------------------------------------

class FileImporter : public Importer {
  protected:
    FileImporter() {
        std::filesystem::create_directory(directory.path() / "more");
        file = directory.write("data.a", "first");
        directory.write("more/extra.a", "second");
    }
    TemporaryDirectory directory;
    std::filesystem::path file;
    const std::wstring folder = directory.text();
    const std::wstring more = folder + L"/more";
};

TEST_F(FileImporter, FindsTheFileAndGivesBuildersThePathAsTheCallerGaveIt) {
    TestImportBuilder& builder = addWilling(L"A", {L"a"});
    builder.onImport = [&](QrBufferedIO& io) {
        EXPECT_TRUE(isOpen(file));
        return io.read() == 'f';
    };
    bool found = false;
    const QrRef<QrCastable> object = importer.import(L"data.a", folder.c_str(), found);
    EXPECT_EQ(makerOf(object), L"A");
    EXPECT_TRUE(found);
    EXPECT_FALSE(isOpen(file));
    EXPECT_EQ(calls,
              (Calls{L"A extensions", L"A can [data.a] [data.a]", L"A import [data.a] [data.a]"}));
}

TEST_F(FileImporter, TellsAMissingFileFromOneThatNobodyReads) {
    add(L"A", {L"a"});
    bool found = true;
    EXPECT_FALSE(importer.import(L"missing.a", folder.c_str(), found));
    EXPECT_FALSE(found);
    EXPECT_EQ(calls, Calls{});
    EXPECT_FALSE(importer.import(L"data.a", folder.c_str(), found));
    EXPECT_TRUE(found);
    EXPECT_EQ(calls.size(), 3u);
}

TEST_F(FileImporter, TakesAFullNameWithoutASearchPath) {
    addWilling(L"A", {L"a"});
    const std::wstring full = file.wstring();
    bool found = false;
    EXPECT_EQ(makerOf(importer.import(full.c_str(), nullptr, found)), L"A");
    EXPECT_TRUE(found);
    EXPECT_EQ(calls[1], L"A can [" + full + L"] []");
}

TEST_F(FileImporter, SearchesItsDefaultAfterTheCallersPath) {
    TestImportBuilder& builder = addWilling(L"A", {L"a"});
    importer.defaultSearch = more;
    bool found = false;
    builder.onImport = [](QrBufferedIO& io) { return io.read() == 's'; };
    EXPECT_TRUE(importer.import(L"extra.a", folder.c_str(), found));
    EXPECT_TRUE(found);
    EXPECT_TRUE(importer.import(L"extra.a", nullptr, found));
    directory.write("more/data.a", "second");
    builder.onImport = [](QrBufferedIO& io) { return io.read() == 'f'; };
    EXPECT_TRUE(importer.import(L"data.a", folder.c_str(), found))
        << "the caller's search path comes first";
    EXPECT_FALSE(importer.import(L"missing.a", folder.c_str(), found));
    EXPECT_FALSE(found);
}

TEST_F(FileImporter, CanBeCopied) {
    importer.defaultSearch = more;
    const TestImporter copy(importer);
    EXPECT_EQ(copy.getDefaultSearch(), std::wstring(more));
    TestImporter assigned;
    assigned = importer;
    EXPECT_EQ(assigned.getDefaultSearch(), std::wstring(more));
}

TEST_F(FileImporter, HasNoDefaultSearchByItself) {
    EXPECT_EQ(importer.QrBaseImporter::getDefaultSearch(), nullptr);
}

TEST_F(FileImporter, ImportsAlsoForCallersWhoNeedNotKnow) {
    addWilling(L"A", {L"a"});
    const QrImporter& plain = importer;
    EXPECT_EQ(makerOf(plain.import(L"data.a", folder.c_str())), L"A");
    EXPECT_FALSE(plain.import(L"missing.a", folder.c_str()));
}

TEST_F(FileImporter, CountsNullAndEmptyNamesAsNotFound) {
    addWilling(L"A", {L""});
    bool found = true;
    EXPECT_FALSE(importer.import(static_cast<const wchar_t*>(nullptr), folder.c_str(), found));
    EXPECT_FALSE(found);
    found = true;
    EXPECT_FALSE(importer.import(L"", folder.c_str(), found));
    EXPECT_FALSE(found);
    EXPECT_EQ(calls, Calls{});
}

TEST_F(FileImporter, ClosesTheFileWhenABuilderThrows) {
    addWilling(L"A", {L"a"}).onImport = [](QrBufferedIO&) -> bool { throw 42; };
    bool found = false;
    EXPECT_THROW(importer.import(L"data.a", folder.c_str(), found), int);
    EXPECT_TRUE(found);
    EXPECT_FALSE(isOpen(file));
    std::filesystem::remove(file);
    EXPECT_FALSE(std::filesystem::exists(file));
}

TEST_F(FileImporter, DemandsAController) {
    addWilling(L"A", {L"a"});
    QrSetSystemProcessController(nullptr);
    bool found = false;
    EXPECT_THROW(importer.import(L"data.a", folder.c_str(), found),
                 QrComponentManagerEx::ExBadCast);
    EXPECT_THROW(importer.import(L"data.a", folder.c_str()), QrComponentManagerEx::ExBadCast);
    EXPECT_EQ(calls, Calls{});
}

/// A controller that finds what a test sets. With `isController` false its cast fails.
class Finder : public QrCastImpl<Finder, QrProcessControl> {
  public:
    QrCastable* getInterface(const QrUid& uid) override {
        return isController ? QrCastImpl::getInterface(uid) : nullptr;
    }
    long newReference() override { return ++references; }
    long release() override { return --references; }
    void* getContext() override { return nullptr; }
    void message(int, const wchar_t*) override {}
    bool isInterrupted() override { return false; }
    bool warning(int, const wchar_t*) override { return true; }
    bool isProgressShown() override { return false; }
    bool progress(float, const wchar_t*) override { return true; }
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override {}
    bool error(int, const wchar_t*) override { return false; }
    bool isErrorShown() override { return false; }
    void log(int, const wchar_t*) override {}
    [[noreturn]] void abort(int, const wchar_t*) override { throw 1; }
    std::wstring findFile(const wchar_t* name, const wchar_t* search,
                          const wchar_t* fallback) override {
        for (const wchar_t* text : {name, search, fallback})
            asked.push_back(text ? text : L"(null)");
        return found;
    }

    bool isController = true;
    std::wstring found;
    Calls asked;
    long references = 0;
};

TEST_F(FileImporter, AsksTheControllerOfItsThreadWithBothSearchPaths) {
    addWilling(L"A", {L"a"});
    Finder finder;
    finder.found = file.wstring();
    QrSetThreadProcessController(&finder);
    importer.defaultSearch = L"default";
    bool found = false;
    EXPECT_TRUE(importer.import(L"x.a", L"search", found));
    EXPECT_EQ(finder.asked, (Calls{L"x.a", L"search", L"default"}));
    EXPECT_EQ(calls[1], L"A can [x.a] [x.a]")
        << "the builder gets the caller's name, not the found path";
    importer.defaultSearch.clear();
    EXPECT_TRUE(importer.import(L"x.a", nullptr, found));
    EXPECT_EQ(finder.asked[4], L"(null)");
    EXPECT_EQ(finder.asked[5], L"(null)");
    EXPECT_EQ(finder.references, 0);
    finder.isController = false;
    EXPECT_THROW(importer.import(L"x.a", L"search", found), QrComponentManagerEx::ExBadCast);
    QrSetThreadProcessController(nullptr);
}

TEST_F(FileImporter, IsNullButFoundForAFileThatCannotBeOpened) {
    addWilling(L"A", {L"a"});
    Finder finder;
    QrSetSystemProcessController(&finder);
    for (const std::wstring& name : {folder, folder + L"/gone.a", folder + L"/gone/gone.a"}) {
        finder.found = name;
        bool found = false;
        EXPECT_FALSE(importer.import(L"x.a", nullptr, found));
        EXPECT_TRUE(found);
    }
    EXPECT_EQ(calls, Calls{});
    EXPECT_EQ(finder.references, 0);
}

TEST_F(FileImporter, GivesTheControllerBackWhenABuilderThrows) {
    addWilling(L"A", {L"a"}).onImport = [](QrBufferedIO&) -> bool { throw 42; };
    Finder finder;
    finder.found = file.wstring();
    QrSetSystemProcessController(&finder);
    bool found = false;
    EXPECT_THROW(importer.import(L"x.a", nullptr, found), int);
    EXPECT_EQ(finder.references, 0);
    EXPECT_FALSE(isOpen(file));
}

// ---- Classes that derive from the importer's interfaces --------------------------------------

class Overriding : public TestImporter {
  public:
    using TestImporter::import;
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t* search) const override {
        texts = {path ? path : L"(null)", search ? search : L"(null)"};
        first = io->read();
        return nullptr;
    }
    mutable Calls texts;
    mutable int first = 0;
};

TEST_F(FileImporter, ComesToAnOverriddenBufferForm) {
    const Overriding overriding;
    bool found = false;
    EXPECT_FALSE(overriding.import(L"data.a", folder.c_str(), found));
    EXPECT_TRUE(found);
    EXPECT_EQ(overriding.texts, (Calls{L"data.a", folder}));
    EXPECT_EQ(overriding.first, 'f');
}

class Simple : public QrCastImpl<Simple, QrImporter> {
  public:
    using QrImporter::import;
    const wchar_t* getBuilderName() const override { return L"simple"; }
    QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search) const override {
        texts = {path, search};
        return QrPtr<ImportedObject>(new ImportedObject(L"simple"));
    }
    mutable Calls texts;
};

TEST(ImporterInterface, SetsFoundAndLeavesAllElseToTheOtherForm) {
    const Simple simple;
    bool found = false;
    EXPECT_EQ(makerOf(simple.import(L"path", L"search", found)), L"simple");
    EXPECT_TRUE(found);
    EXPECT_EQ(simple.texts, (Calls{L"path", L"search"}));
}

} // namespace
