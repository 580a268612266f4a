// SPDX-License-Identifier: BSL-1.0
/// Compares the positions in the reasons of failures, which are counted, with those of an IO that
/// asks its medium after each read.
#pragma once

#include "tests/objects/support.h"

#include <exception>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <type_traits>
#include <vector>

namespace Mz::Test {

/// Counts nothing: a seek makes the IO ask for its position again. Streams take no short way past
/// a derived class.
class Asking final : public QrObjectInBuffer {
  public:
    using QrObjectInBuffer::QrObjectInBuffer;

    int read(void* data, int size) override {
        const int got = QrObjectInBuffer::read(data, size);
        ask();
        return got;
    }
    int read() override {
        const int byte = QrObjectInBuffer::read();
        ask();
        return byte;
    }

  private:
    // After a short read the position cannot be asked for, but was known.
    void ask() {
        if (inner().canSeek())
            seek(0, 1);
    }
};

/// A file that reads like those of the standard library.
class ForeignFile final : public std::filebuf {};

template <class Stream>
class Place : public ObjectsOn<Stream> {
  protected:
    /// Returns objects that contain others, with values of all forms between them.
    static std::string randomObjects(std::mt19937& engine) {
        const std::wstring letters = L"idbeoidbeoICBWICBW";
        Saving<Stream> out;
        for (int count = 0; count < 3; ++count) {
            const QrPtr<Node> around = Objects::make(holderUid);
            for (int links = 0; links < 3; ++links) {
                const QrPtr<Node> spelled = Objects::make(spelledUid);
                for (int length = 0; length < 6; ++length)
                    spelled->name += letters[engine() % usable];
                around->links.push_back(spelled);
                around->links.push_back(Objects::node(links, {spelled}));
            }
            out.stream << 5 << around.get();
        }
        return out.bytes();
    }

    /// Returns the bytes without their end, or with another one at some place.
    static std::string damaged(std::string bytes, bool cut, std::mt19937& engine) {
        const std::size_t at = engine() % bytes.size();
        if (cut)
            bytes.resize(at);
        else if (std::is_same_v<Stream, QrBinaryStream>)
            bytes[at] = static_cast<char>(engine());
        else
            bytes[at] = "0123456789 \n-x"[engine() % 14];
        return bytes;
    }

    template <class IO>
    static std::string outcome(const std::string& bytes) {
        std::istringstream source(bytes);
        return outcome<IO>(source);
    }

    /// Reads all objects from a place in a file, of which the stream holds `held` bytes at a time.
    /// Asks where each of them begins if `Buffer` is no class of the standard library.
    template <class IO, class Buffer>
    static std::string outcome(const std::filesystem::path& file, std::streamoff begin,
                               std::size_t held) {
        std::vector<char> memory(held);
        Buffer buffer;
        buffer.pubsetbuf(memory.data(), static_cast<std::streamsize>(held));
        buffer.open(file, std::ios::in | std::ios::binary);
        std::istream source(&buffer);
        source.seekg(begin);
        return outcome<IO>(source);
    }

    /// Compares the outcomes of counting and asking, and returns whether there is a position.
    static bool tellsTheSame(const std::filesystem::path& file, std::streamoff begin,
                             std::size_t held) {
        const std::string counted = outcome<QrObjectInBuffer, std::filebuf>(file, begin, held);
        const std::string asked = outcome<Asking, ForeignFile>(file, begin, held);
        EXPECT_EQ(counted, asked) << held;
        return counted.find(": byte ") != std::string::npos;
    }

    /// Reads all objects. Returns the number of those that could be read, and why the next could
    /// not.
    template <class IO>
    static std::string outcome(std::istream& source) {
        QrInBuffer buffer(&source);
        IO objects(&buffer);
        Stream stream(&objects);
        for (int count = 0;; ++count)
            try {
                int number = 0;
                stream >> number;
                unlink(queryCast<Node>(stream.readObject(nullptr, nullptr, nullptr).get()));
            } catch (const ExBase& failure) {
                return std::to_string(count) + ": " + failure.getReason();
            } catch (const std::exception& failure) { // Of a builder.
                return std::to_string(count) + ": " + failure.what();
            }
    }

  private:
    /// Text carries no array of characters.
    static constexpr unsigned int usable = std::is_same_v<Stream, QrTextStream> ? 10 : 18;
};

} // namespace Mz::Test
