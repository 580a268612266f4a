// SPDX-License-Identifier: BSL-1.0
// What the language and its libraries offer for casts and for values: dynamic_cast, the standard
// streams, printf and scanf.
#include "measure.h"
#include "peer.h"
#include "peers/registration.h"
#include "peers/values.h"

#include <cstdio>
#include <memory>

namespace Mz::Benchmarks {

namespace {

void castDynamically(benchmark::State& state) {
    const std::shared_ptr<SharedRoot> object = newSharedGauge();
    repeat(state, [&object] { opaque(dynamic_cast<SharedGauge*>(opaque(object.get()))); });
}

void castToAbsent(benchmark::State& state) {
    const std::shared_ptr<SharedRoot> object = newSharedGauge();
    repeat(state, [&object] { opaque(dynamic_cast<SharedAbsent*>(opaque(object.get()))); });
}

template <class T>
void write(benchmark::State& state) {
    writeTextOfPeer<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        out.precision(16);
        for (const T value : values)
            out << value << ' ';
    });
}

template <class T>
void read(benchmark::State& state) {
    readTextOfPeer<T>(state, [](std::istream& in, std::vector<T>& values) {
        for (T& value : values)
            in >> value;
    });
}

void print(std::FILE* file, int value) {
    std::fprintf(file, "%d ", value);
}

void print(std::FILE* file, double value) {
    std::fprintf(file, "%.16g ", value);
}

bool scan(std::FILE* file, int& value) {
    return std::fscanf(file, "%d", &value) == 1;
}

bool scan(std::FILE* file, double& value) {
    return std::fscanf(file, "%lf", &value) == 1;
}

/// A C stream on memory, closed by the destructor.
using File = std::unique_ptr<std::FILE, int (*)(std::FILE*)>;

template <class T>
void printAll(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(textCount);
    std::string text(std::size_t{32} * textCount, '\0');
    for (auto iteration : state) {
        static_cast<void>(iteration);
        const File file(::fmemopen(text.data(), text.size(), "w"), std::fclose);
        for (const T value : values)
            print(file.get(), value);
    }
    if (!isTextOfValues<T>(text))
        state.SkipWithError("something else was written");
}

template <class T>
void scanAll(benchmark::State& state) {
    std::string text = valuesIn<T, QrTextStream>(textCount);
    std::vector<T> values(textCount);
    for (auto iteration : state) {
        static_cast<void>(iteration);
        const File file(::fmemopen(text.data(), text.size(), "r"), std::fclose);
        for (T& value : values)
            if (!scan(file.get(), value))
                break;
    }
    if (values != textValues<T>())
        state.SkipWithError("something else was read");
}

/// Each swapped, as ours are, and through the stream instead of its buffer.
template <class T>
void writeBinary(benchmark::State& state) {
    writeBinaryOfPeer<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        for (const T value : values) {
            const auto bits = swapped(value);
            opaque(&out)->write(reinterpret_cast<const char*>(&bits), sizeof bits);
        }
    });
}

template <class T>
void readBinary(benchmark::State& state) {
    readBinaryOfPeer<T>(state, valuesIn<T, QrBinaryStream>(valueCount),
                        [](std::istream& in, std::vector<T>& values) {
                            for (T& value : values) {
                                opaque(&in)->read(reinterpret_cast<char*>(&value), sizeof value);
                                unswap(value);
                            }
                        });
}

template <class T>
void addValues(RatioTable& table, const std::string& type) {
    table.addPeer("text/" + type + "Write", "iostreams", write<T>);
    table.addPeer("text/" + type + "Write", "fprintf", printAll<T>);
    table.addPeer("text/" + type + "Read", "iostreams", read<T>);
    table.addPeer("text/" + type + "Read", "fscanf", scanAll<T>);
    table.addPeer("binary/" + type + "Write", "iostreams", writeBinary<T>);
    table.addPeer("binary/" + type + "Read", "iostreams", readBinary<T>);
}

void addPeer(RatioTable& table) {
    table.addPeer("cast/uncounted", "dynamic_cast", castDynamically);
    table.addPeer("cast/null", "dynamic_cast", castToAbsent);
    addValues<int>(table, "int");
    addValues<double>(table, "double");
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
