// SPDX-License-Identifier: BSL-1.0
/// Does work that a process can measure only once: mzBenchmarkStart WORK FOLDER
///
/// Runs the work on the libraries of the folder and prints the processor time in seconds and the
/// number of libraries found. The works:
///   initialize   initialises the component manager; counts builders
///   load         the limit: loads each library, looks up its entry point and calls it
///   readTables   the limit for libraries without entry point: lists the folder, gets the status of
///                each file and reads its symbol table
///   record       writes the manager's records to a hidden file in the folder; counts builders
///   initializeRecorded
///                reads that file and initialises the component manager; counts builders; fails if
///                a library was loaded
///   readList     the limit for that: lists the folder, gets the status of each file, reads
///                that file and adds every builder to a map
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <dirent.h>
#include <dlfcn.h>
#include <elf.h>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <list>
#include <map>
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <unordered_map>
#include <vector>

using namespace Mz;

namespace {

/// Returns the processor time of this process, which other processes do not affect.
double processorTime() {
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

int report(double begin, double end, long count) {
    std::printf("%.9f %ld\n", end - begin, count);
    return 0;
}

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
    const double begin = processorTime();
    QrGetComponentManager()->initialize(searchPath.c_str());
    const double end = processorTime();
    return report(begin, end, countBuilders());
}

/// Returns the files of the folder in the order in which the manager loads them.
std::vector<std::string> filesOf(const std::filesystem::path& folder) {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        files.push_back(entry.path().string());
    std::sort(files.begin(), files.end());
    return files;
}

int load(const std::filesystem::path& folder) {
    const std::vector<std::string> files = filesOf(folder);
    long count = 0;
    const double begin = processorTime();
    for (const std::string& file : files) {
        void* const library = ::dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
        if (!library)
            continue;
        void* const entryPoint = ::dlsym(library, "QrGetComponentDescription");
        if (entryPoint && reinterpret_cast<QrGetComponentDescriptionFunction*>(entryPoint)())
            ++count;
    }
    return report(begin, processorTime(), count);
}

/// The position of a library's symbol table in its file.
struct TablePlace {
    off_t offset = 0;
    std::size_t size = 0;
};

TablePlace symbolTableOf(const std::string& file) {
    std::ifstream stream(file, std::ios::binary);
    const std::string content(std::istreambuf_iterator<char>(stream), {});
    Elf64_Ehdr header{};
    if (content.size() < sizeof header)
        return {};
    std::memcpy(&header, content.data(), sizeof header);
    for (std::size_t index = 0; index < header.e_shnum; ++index) {
        Elf64_Shdr section{};
        const std::size_t offset = header.e_shoff + index * sizeof section;
        if (offset + sizeof section > content.size())
            break;
        std::memcpy(&section, content.data() + offset, sizeof section);
        if (section.sh_type == SHT_DYNSYM)
            return {static_cast<off_t>(section.sh_offset), section.sh_size};
    }
    return {};
}

int readTables(const std::filesystem::path& folder) {
    // All files are copies of one file, so the position is the same. It is determined before the
    // measurement.
    const std::vector<std::string> known = filesOf(folder);
    const TablePlace place = known.empty() ? TablePlace() : symbolTableOf(known.front());
    std::vector<char> table(place.size);
    long count = 0;
    const double begin = processorTime();
    DIR* const listing = ::opendir(folder.c_str());
    while (const dirent* entry = listing ? ::readdir(listing) : nullptr) {
        struct stat status;
        if (entry->d_name[0] == '.' || ::fstatat(::dirfd(listing), entry->d_name, &status, 0) != 0)
            continue;
        const int file = ::openat(::dirfd(listing), entry->d_name, O_RDONLY | O_CLOEXEC);
        const ssize_t got = ::pread(file, table.data(), table.size(), place.offset);
        ::close(file);
        if (got > 0 && static_cast<std::size_t>(got) == place.size)
            ++count;
    }
    if (listing)
        ::closedir(listing);
    return report(begin, processorTime(), count);
}

std::filesystem::path listIn(const std::filesystem::path& folder) {
    return folder / ".recorded"; // Hidden, so not a candidate.
}

QrPtr<QrPersistant> records() {
    return QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
}

int record(const std::filesystem::path& folder) {
    QrGetComponentManager()->initialize(folder.wstring().c_str());
    std::ofstream file(listIn(folder), std::ios::binary);
    QrOutBuffer buffer(&file);
    QrBinaryStream stream(&buffer);
    records()->write(stream);
    return file.flush() ? report(0, 0, countBuilders()) : 1;
}

/// Returns whether this process has mapped a file of the folder.
bool loadedFrom(const std::filesystem::path& folder) {
    std::ifstream maps("/proc/self/maps");
    const std::string content(std::istreambuf_iterator<char>(maps), {});
    return content.find(folder.string()) != std::string::npos;
}

int initializeRecorded(const std::filesystem::path& folder) {
    const std::wstring searchPath = folder.wstring();
    const double begin = processorTime();
    {
        std::ifstream file(listIn(folder), std::ios::binary);
        QrInBuffer buffer(&file);
        QrBinaryStream stream(&buffer);
        records()->read(stream);
    }
    QrGetComponentManager()->initialize(searchPath.c_str());
    const double end = processorTime();
    return loadedFrom(folder) ? 1 : report(begin, end, countBuilders());
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

  private:
    std::string content;
    std::size_t at = 0;
};

struct Record {
    std::wstring directory, fileName, name, label, text;
    std::uint32_t time = 0;
    QrUid uid{};
};

struct UidHash {
    std::size_t operator()(const QrUid& uid) const { return uid.w0; }
};

int readList(const std::filesystem::path& folder) {
    const double begin = processorTime();
    long files = 0;
    DIR* const listing = ::opendir(folder.c_str());
    while (const dirent* entry = listing ? ::readdir(listing) : nullptr) {
        struct stat status;
        if (entry->d_name[0] != '.' && ::fstatat(::dirfd(listing), entry->d_name, &status, 0) == 0)
            ++files;
    }
    if (listing)
        ::closedir(listing);
    ListReader reader(listIn(folder));
    std::list<Record> read;
    std::unordered_map<QrUid, Record*, UidHash> byUid;
    for (std::uint32_t count = reader.word(); count > 0; --count) {
        Record& record = read.emplace_back();
        record.directory = reader.text();
        record.fileName = reader.text();
        record.time = reader.word();
        reader.skip(sizeof(int64));
        for (std::uint32_t builders = reader.word(); builders > 0; --builders) {
            record.uid = {reader.word(), reader.word(), reader.word(), reader.word()};
            record.name = reader.text();
            record.label = reader.text();
            record.text = reader.text();
            reader.skip(1 + sizeof(std::uint32_t));
            byUid[record.uid] = &record;
        }
    }
    const long known = static_cast<long>(byUid.size());
    return report(begin, processorTime(), std::min(files, known));
}

using Work = int (*)(const std::filesystem::path&);

const std::map<std::string, Work> works = {
    {"initialize", initialize},
    {"initializeRecorded", initializeRecorded},
    {"load", load},
    {"readList", readList},
    {"readTables", readTables},
    {"record", record},
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
