// SPDX-License-Identifier: BSL-1.0
// Values through streams on what users have in place of memory: a file, a stream buffer of the
// host, and the IO of whole objects.
#include "comparisons.h"
#include "measure.h"
#include "streamValues.h"
#include "temporaryFile.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"

#include <fstream>
#include <istream>
#include <ostream>
#include <sstream>
#include <streambuf>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

namespace {

// ---- Files ----------------------------------------------------------------------------------

/// Returns the binary form of `values`.
template <class T>
std::string bytesOf(std::vector<T> values) {
    for (T& value : values)
        unswap(value);
    return {reinterpret_cast<const char*>(values.data()), sizeof(T) * values.size()};
}

/// Repeats `work` on a file from its beginning. At the end checks the content.
template <class T, class Work>
void writeFile(benchmark::State& state, const Work& work) {
    const std::vector<T> values = randomValues<T>(arrayCount);
    const TemporaryFile file;
    std::ofstream out(file.path(), std::ios::binary);
    for (auto iteration : state) {
        static_cast<void>(iteration);
        out.seekp(0);
        work(out, values);
        out.flush();
    }
    std::ostringstream content;
    content << std::ifstream(file.path(), std::ios::binary).rdbuf();
    if (content.str() != bytesOf(values))
        state.SkipWithError("something else was written");
}

template <class T>
void writeArrayToFile(benchmark::State& state) {
    writeFile<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        QrOutBuffer io(&out);
        QrBinaryStream stream(&io);
        stream.write(values.front(), arrayCount);
    });
}

template <class T>
void writeArrayToFileByHand(benchmark::State& state) {
    std::vector<decltype(swapped(T()))> block(arrayCount);
    writeFile<T>(state, [&](std::ostream& out, const std::vector<T>& values) {
        for (std::size_t index = 0; index < values.size(); ++index)
            block[index] = swapped(values[index]);
        out.write(reinterpret_cast<const char*>(block.data()),
                  static_cast<std::streamsize>(sizeof(T) * block.size()));
    });
}

/// Repeats `work` on a file from its beginning. At the end checks the values that it read.
template <class T, class Work>
void readFile(benchmark::State& state, const Work& work) {
    const std::vector<T> expected = randomValues<T>(arrayCount);
    const TemporaryFile file;
    std::ofstream(file.path(), std::ios::binary) << bytesOf(expected);
    std::ifstream in(file.path(), std::ios::binary);
    std::vector<T> values(expected.size());
    for (auto iteration : state) {
        static_cast<void>(iteration);
        in.seekg(0);
        work(in, values);
    }
    if (values != expected)
        state.SkipWithError("something else was read");
}

template <class T>
void readArrayFromFile(benchmark::State& state) {
    readFile<T>(state, [](std::istream& in, std::vector<T>& values) {
        QrInBuffer io(&in);
        QrBinaryStream stream(&io);
        stream.read(values.front(), arrayCount);
    });
}

template <class T>
void readArrayFromFileByHand(benchmark::State& state) {
    readFile<T>(state, [](std::istream& in, std::vector<T>& values) {
        in.read(reinterpret_cast<char*>(values.data()),
                static_cast<std::streamsize>(sizeof(T) * values.size()));
        for (T& value : values)
            unswap(value);
    });
}

template <class T>
void addFile(RatioTable& table, const std::string& type) {
    table.add({"file/" + type + "ArrayWrite", "binary array of " + type + " to a file",
               "byte swap loop, one ostream::write", 1.3},
              writeArrayToFile<T>, writeArrayToFileByHand<T>);
    table.add({"file/" + type + "ArrayRead", "binary array of " + type + " from a file",
               "byte swap loop, one istream::read", 1.3},
              readArrayFromFile<T>, readArrayFromFileByHand<T>);
}

// ---- A buffer of the host -------------------------------------------------------------------

/// The memory of a host, as the buffer of a standard stream.
class HostBuffer final : public std::streambuf {
  public:
    explicit HostBuffer(std::string bytes) : memory(std::move(bytes)) { rewind(); }

    void rewind() {
        setp(memory.data(), memory.data() + memory.size());
        setg(memory.data(), memory.data(), memory.data() + memory.size());
    }
    const std::string& bytes() const { return memory; }

  private:
    std::string memory;
};

template <class T, class Work>
void writeHost(benchmark::State& state, const Work& work) {
    const std::vector<T> values = randomValues<T>(valueCount);
    HostBuffer buffer(std::string(sizeof(T) * values.size(), '\0'));
    std::ostream out(&buffer);
    for (auto iteration : state) {
        static_cast<void>(iteration);
        buffer.rewind();
        work(out, values);
    }
    if (buffer.bytes() != bytesOf(values))
        state.SkipWithError("something else was written");
}

template <class T>
void writeToHost(benchmark::State& state) {
    writeHost<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        QrOutBuffer io(&out);
        QrBinaryStream concrete(&io);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (const T value : values)
            *stream << value;
    });
}

template <class T>
void writeToHostByHand(benchmark::State& state) {
    writeHost<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        for (const T value : values) {
            const auto bits = swapped(value);
            opaque(&out)->write(reinterpret_cast<const char*>(&bits), sizeof bits);
        }
    });
}

template <class T, class Work>
void readHost(benchmark::State& state, const Work& work) {
    const std::vector<T> expected = randomValues<T>(valueCount);
    HostBuffer buffer(bytesOf(expected));
    std::istream in(&buffer);
    std::vector<T> values(expected.size());
    for (auto iteration : state) {
        static_cast<void>(iteration);
        buffer.rewind();
        work(in, values);
    }
    if (values != expected)
        state.SkipWithError("something else was read");
}

template <class T>
void readFromHost(benchmark::State& state) {
    readHost<T>(state, [](std::istream& in, std::vector<T>& values) {
        QrInBuffer io(&in);
        QrBinaryStream concrete(&io);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (T& value : values)
            *stream >> value;
    });
}

template <class T>
void readFromHostByHand(benchmark::State& state) {
    readHost<T>(state, [](std::istream& in, std::vector<T>& values) {
        for (T& value : values) {
            opaque(&in)->read(reinterpret_cast<char*>(&value), sizeof value);
            unswap(value);
        }
    });
}

template <class T>
void addHost(RatioTable& table, const std::string& type) {
    table.add({"host/" + type + "Write", "binary " + type + " by << to a buffer of the host",
               "ostream::write of each", 2},
              writeToHost<T>, writeToHostByHand<T>);
    table.add({"host/" + type + "Read", "binary " + type + " by >> from a buffer of the host",
               "istream::read of each", 2},
              readFromHost<T>, readFromHostByHand<T>);
}

// ---- The IO of whole objects ----------------------------------------------------------------

/// Writes the values as text to an `IO`, which may forward to a plain buffer.
template <class T, bool ThroughObjects>
void writeText(benchmark::State& state) {
    const std::vector<T> values = randomValues<T>(valueCount);
    std::ostringstream out;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        out.seekp(0);
        QrOutBuffer bytes(&out);
        QrObjectOutBuffer objects(&bytes);
        QrTextStream concrete(ThroughObjects ? static_cast<QrBufferedIO*>(&objects) : &bytes);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (const T value : values)
            *stream << value;
    }
    benchmark::DoNotOptimize(out);
}

template <class T, bool ThroughObjects>
void readText(benchmark::State& state) {
    const std::vector<T> expected = randomValues<T>(valueCount);
    std::stringstream content;
    content.precision(17);
    for (const T value : expected)
        content << value << ' ';
    std::vector<T> values(expected.size());
    for (auto iteration : state) {
        static_cast<void>(iteration);
        content.seekg(0);
        QrInBuffer bytes(&content);
        QrObjectInBuffer objects(&bytes);
        QrTextStream concrete(ThroughObjects ? static_cast<QrBufferedIO*>(&objects) : &bytes);
        QrStream* const stream = opaque<QrStream>(&concrete);
        for (T& value : values)
            *stream >> value;
    }
    if (values != expected)
        state.SkipWithError("something else was read");
}

template <class T>
void addObjects(RatioTable& table, const std::string& type) {
    table.add({"objects/" + type + "TextWrite", "text " + type + " by << through the IO of objects",
               "the same without it", 2},
              writeText<T, true>, writeText<T, false>);
    table.add({"objects/" + type + "TextRead", "text " + type + " by >> through the IO of objects",
               "the same without it", 1.5},
              readText<T, true>, readText<T, false>);
}

} // namespace

void addMediaComparisons(RatioTable& table) {
    addFile<int>(table, "int");
    addFile<double>(table, "double");
    addHost<int>(table, "int");
    addHost<double>(table, "double");
    addObjects<int>(table, "int");
    addObjects<double>(table, "double");
}

} // namespace Mz::Benchmarks
