// SPDX-License-Identifier: BSL-1.0
/// Does work that a process can measure only once: mzBenchmarkStart WORK FOLDER
///
/// Runs the work on the libraries of the folder and prints the time in seconds, the number of
/// libraries found, and the memory (`Measurement`). The works:
///   initialize   initialises the component manager; counts builders
///   load         the limit: loads each library, looks up its entry point and calls it
///   readTables   the limit for libraries without entry point: lists the folder, gets the status of
///                each file, and reads a block at its beginning and one in its symbol table
///   record       writes the manager's records to a file in a folder below it; counts builders
///   recordMany   writes a list to the same file in which each library has ten more builders
///   initializeRecorded
///                reads that file and initialises the component manager; counts builders; fails if
///                a library was loaded
///   readList     the limit for that: lists the folder, gets the status of each file, reads
///                that file and adds every builder to a map
#include "byHand.h"
#include "freshResult.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <list>
#include <map>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

using namespace Mz;
using namespace Mz::Benchmarks;

namespace {

class Counter final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription>) override {
        ++count;
        return Continue;
    }

    long count = 0;
};

long countBuilders() {
    Counter counter;
    QrGetComponentManager()->enumerateBuilders(counter);
    return counter.count;
}

int initialize(const std::filesystem::path& folder) {
    const std::wstring searchPath = folder.wstring();
    const Measurement measurement;
    QrGetComponentManager()->initialize(searchPath.c_str());
    const double end = measuredTime();
    return measurement.print(end, countBuilders());
}

int load(const std::filesystem::path& folder) {
    const std::vector<std::string> names = filesOf(folder);
    const std::vector<std::filesystem::path> files(names.begin(), names.end());
    long count = 0;
    const Measurement measurement;
    for (const std::filesystem::path& file : files) {
        void* const library = openLibrary(file);
        if (!library)
            continue;
        void* const entryPoint = functionOf(library, "QrGetComponentDescription");
        if (entryPoint && reinterpret_cast<QrGetComponentDescriptionFunction*>(entryPoint)())
            ++count;
    }
    return measurement.print(measuredTime(), count);
}

int readTables(const std::filesystem::path& folder) {
    // All files are copies of one file, so the position is the same. It is determined before the
    // measurement.
    const std::vector<std::string> known = filesOf(folder);
    const std::uint64_t table = known.empty() ? 0 : nameTableOf(known.front());
    const Measurement measurement;
    const long count = readBlocksOfEach(folder, table);
    return measurement.print(measuredTime(), count);
}

std::filesystem::path listIn(const std::filesystem::path& folder) {
    return folder / ".recorded" / "list"; // Folders are no candidates.
}

QrPtr<QrPersistant> records() {
    return QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
}

int record(const std::filesystem::path& folder) {
    const Measurement measurement;
    QrGetComponentManager()->initialize(folder.wstring().c_str());
    std::filesystem::create_directory(listIn(folder).parent_path());
    std::ofstream file(listIn(folder), std::ios::binary);
    QrOutBuffer buffer(&file);
    QrBinaryStream stream(&buffer);
    records()->write(stream);
    return file.flush() ? measurement.print(measuredTime(), countBuilders()) : 1;
}

int initializeRecorded(const std::filesystem::path& folder) {
    const std::wstring searchPath = folder.wstring();
    const Measurement measurement;
    {
        std::ifstream file(listIn(folder), std::ios::binary);
        QrInBuffer buffer(&file);
        QrBinaryStream stream(&buffer);
        records()->read(stream);
    }
    QrGetComponentManager()->initialize(searchPath.c_str());
    const double end = measuredTime();
    return loadedFrom(folder) ? 1 : measurement.print(end, countBuilders());
}

/// Reads a recorded list without the library.
class ListReader {
  public:
    explicit ListReader(const std::filesystem::path& file) {
        std::ifstream stream(file, std::ios::binary | std::ios::ate);
        content.resize(static_cast<std::size_t>(stream.tellg()));
        stream.seekg(0).read(content.data(), static_cast<std::streamsize>(content.size()));
    }

    std::uint32_t word() {
        std::uint32_t value;
        std::memcpy(&value, content.data() + at, sizeof value);
        at += sizeof value;
        return __builtin_bswap32(value);
    }
    std::wstring text() {
        const std::size_t length = word();
        std::wstring value(content.data() + at, content.data() + at + length);
        at += length;
        return value;
    }
    void skip(std::size_t size) { at += size; }
    bool atEnd() const { return at >= content.size(); }

    /// Returns what was read since `begin`, a former `position`.
    std::string_view since(std::size_t begin) const {
        return std::string_view(content).substr(begin, at - begin);
    }
    std::size_t position() const { return at; }

  private:
    std::string content;
    std::size_t at = 0;
};

struct Record {
    std::wstring directory, fileName, name, label, text;
    std::uint32_t time = 0;
    QrUid uid{};
};

/// Reads the part of a library, up to its builders. Returns the number of builders.
std::uint32_t readLibrary(ListReader& reader, Record& record) {
    record.directory = reader.text();
    record.fileName = reader.text();
    record.time = reader.word();
    reader.skip(sizeof(int64));
    return reader.word();
}

void readBuilder(ListReader& reader, Record& record) {
    record.uid = {reader.word(), reader.word(), reader.word(), reader.word()};
    record.name = reader.text();
    record.label = reader.text();
    record.text = reader.text();
    reader.skip(1 + sizeof(std::uint32_t));
}

struct UidHash {
    std::size_t operator()(const QrUid& uid) const { return uid.w0; }
};

int readList(const std::filesystem::path& folder) {
    const Measurement measurement;
    const long files = statusOfEach(folder);
    ListReader reader(listIn(folder));
    std::list<Record> read;
    std::unordered_map<QrUid, Record*, UidHash> byUid;
    for (std::uint32_t count = reader.word(); count > 0; --count) {
        Record& record = read.emplace_back();
        for (std::uint32_t builders = readLibrary(reader, record); builders > 0; --builders) {
            readBuilder(reader, record);
            byUid[record.uid] = &record;
        }
    }
    const long known = static_cast<long>(byUid.size());
    return measurement.print(measuredTime(), std::min(files, known));
}

void appendWord(std::string& bytes, std::uint32_t word) {
    word = __builtin_bswap32(word);
    bytes.append(reinterpret_cast<const char*>(&word), sizeof word);
}

/// Repeats the builder of each record with other uids.
int recordMany(const std::filesystem::path& folder) {
    constexpr std::uint32_t copies = 11;
    if (record(folder) != 0)
        return 1;
    ListReader reader(listIn(folder));
    const std::uint32_t libraries = reader.word();
    std::string list(reader.since(0));
    for (std::uint32_t library = 0; library < libraries; ++library) {
        Record record;
        const std::size_t begin = reader.position();
        if (readLibrary(reader, record) != 1)
            return 1;
        list += reader.since(begin);
        list.resize(list.size() - sizeof(std::uint32_t));
        appendWord(list, copies);
        const std::size_t builder = reader.position();
        readBuilder(reader, record);
        const std::string bytes(reader.since(builder));
        for (std::uint32_t copy = 0; copy < copies; ++copy) {
            appendWord(list, record.uid.w0 + copy * libraries);
            list += bytes.substr(sizeof(std::uint32_t));
        }
    }
    std::ofstream file(listIn(folder), std::ios::binary);
    return reader.atEnd() && file.write(list.data(), static_cast<std::streamsize>(list.size())) ? 0
                                                                                                : 1;
}

using Work = int (*)(const std::filesystem::path&);

const std::map<std::string, Work> works = {
    {"initialize", initialize},
    {"initializeRecorded", initializeRecorded},
    {"load", load},
    {"readList", readList},
    {"readTables", readTables},
    {"record", record},
    {"recordMany", recordMany},
};

} // namespace

int main(int argc, char** argv) {
    const auto work = argc == 3 ? works.find(argv[1]) : works.end();
    if (work != works.end())
        return work->second(argv[2]);
    std::fprintf(stderr, "usage: mzBenchmarkStart WORK FOLDER\n");
    for (const auto& [name, unused] : works)
        std::fprintf(stderr, "  %s\n", name.c_str());
    return 2;
}
