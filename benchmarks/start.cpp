/// What can be measured only once in a process: mzBenchmarkStart WORK FOLDER
///
/// Does the work on the libraries of the folder and writes the processor time that it took, in
/// seconds, and how many libraries it found. The works:
///   initialize   starts the component manager; counts builders
///   load         the limit: opens each library, looks its entry point up and calls it
///   readTables   the limit for libraries without entry point: lists the folder, asks for the
///                status of each file and reads its symbol table
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
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

using namespace Mz;

namespace {

/// The processor time of this process. Unlike the time of day it leaves out what others take.
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

int initialize(const std::filesystem::path& folder) {
    const std::wstring searchPath = folder.wstring();
    const double begin = processorTime();
    QrGetComponentManager()->initialize(searchPath.c_str());
    const double end = processorTime();
    Counter counter;
    QrGetComponentManager()->enumerateBuilders(counter);
    return report(begin, end, counter.count);
}

/// The files of the folder in the order in which the manager loads them.
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

/// Where the symbol table of a library stands in its file.
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
    // The files are copies of one, so the place is the same in all and known beforehand.
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

} // namespace

int main(int argc, char** argv) {
    const std::string work = argc == 3 ? argv[1] : "";
    if (work == "initialize")
        return initialize(argv[2]);
    if (work == "load")
        return load(argv[2]);
    if (work == "readTables")
        return readTables(argv[2]);
    std::fprintf(stderr, "usage: mzBenchmarkStart initialize|load|readTables FOLDER\n");
    return 2;
}
