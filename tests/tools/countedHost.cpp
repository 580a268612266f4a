// SPDX-License-Identifier: BSL-1.0
/// A host program whose allocations and system calls are counted.
///
///     countedHost none
///     countedHost start LIST PATH
///     countedHost scan LIST PATH
///
/// Starts with a recorded list, or scans; prints the number of allocations, and of the libraries
/// that have a record.
#include "components/componentKit/hostKit.h"
#include "components/componentTools/scan.h"
#include "tests/support/testSystem.h"

#include <atomic>
#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <string>

namespace {

std::atomic<long> allocations{0};

} // namespace

// The libraries call these operators, too.
void* operator new(std::size_t size) {
    ++allocations;
    if (void* const memory = std::malloc(size ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept {
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}

namespace {

class Counter final : public Mz::QrEnumerator<Mz::QrCPtr<Mz::QrBuilderDescription>> {
  public:
    Action process(Mz::QrCPtr<Mz::QrBuilderDescription>) override {
        ++count;
        return Continue;
    }
    std::size_t count = 0;
};

std::size_t start(const std::filesystem::path& list, const std::filesystem::path& path) {
    Mz::Kit::readList(list);
    Mz::QrGetComponentManager()->initialize(Mz::Test::searchPathOf(path).c_str());
    Counter counter;
    Mz::QrGetComponentManager()->enumerateBuilders(counter);
    return counter.count;
}

std::size_t scan(const std::filesystem::path& list, const std::filesystem::path& path) {
    Mz::Tools::ScanOptions options;
    options.folders = {path};
    options.list = list;
    return Mz::Tools::scan(options).libraries.size();
}

} // namespace

int main(int count, char** arguments) {
    std::setlocale(LC_ALL, "");
    const std::string work = count > 1 ? arguments[1] : "none";
    const long before = allocations;
    std::size_t recorded = 0;
    if (work == "start" && count == 4)
        recorded = start(arguments[2], arguments[3]);
    else if (work == "scan" && count == 4)
        recorded = scan(arguments[2], arguments[3]);
    const long after = allocations;
    std::printf("%ld allocations, %zu recorded\n", after - before, recorded);
}
