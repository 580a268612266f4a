// SPDX-License-Identifier: BSL-1.0
/// Reads the list in the manager's format (`recordFormat.h`) and with its stream class, but checks
/// everything that the manager trusts. Counts in the file are not used to allocate memory, because
/// a damaged file may contain any number.
#include "components/componentTools/recordedList.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/recordFormat.h"
#include "components/componentTools/records/openPatiently.h"
#include "components/componentTools/records/readRecords.h"
#include "components/componentTools/records/replaceChanged.h"
#include "components/componentTools/records/verdictsFile.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <cstdint>
#include <exception>
#include <fstream>
#include <new>
#include <optional>
#include <sstream>
#include <stdexcept>
#include <vector>

namespace Mz::Tools {

namespace {

/// Reads a list and validates every value. The functions for fields are those of a codec.
class ListReader {
  public:
    explicit ListReader(std::istream& input) : buffer(&input), stream(&buffer) {}

    /// \throws std::exception at the first invalid value
    RecordedLibraries read() {
        RecordedLibraries libraries;
        int count = 0;
        stream >> count;
        if (count < 0)
            throw std::runtime_error("a negative count");
        for (; count > 0; --count)
            libraries.push_back(readLibrary());
        if (buffer.read() != -1)
            throw std::runtime_error("bytes after the end");
        return libraries;
    }

    std::int64_t position() { return buffer.tell(); }

    template <class Value>
    void value(Value& field) {
        stream >> field;
    }

    /// The only value with a sign is the size.
    void value(int64& field) {
        stream >> field;
        if (field < 0)
            throw std::runtime_error("a negative size");
    }

    void text(std::wstring& field) {
        stream >> field;
        if (field.find(L'\0') != std::wstring::npos)
            throw std::runtime_error("a text with a NUL");
    }

    /// Reads a normalised name. It may contain a backslash, which is an ordinary character in file
    /// names on Linux.
    void name(std::wstring& field) {
        text(field);
        if (field.empty() || field.find(L'/') != std::wstring::npos ||
            platform::lowerCase(field) != field)
            throw std::runtime_error("a name that is not in its normal form");
    }

    void flag(bool& field) {
        unsigned char stored = 0;
        stream >> stored;
        if (stored > 1)
            throw std::runtime_error("a flag that is neither true nor false");
        field = stored != 0;
    }

  private:
    RecordedLibrary readLibrary() {
        RecordedLibrary library;
        library.position = position();
        int64 size = 0;
        unsigned int count = 0;
        detail::codeLibrary(*this, library.directory, library.fileName, library.time, size, count);
        library.size = size;
        // Read one by one: the count may be wrong.
        for (; count > 0; --count) {
            RecordedBuilder& builder = library.builders.emplace_back();
            builder.position = position();
            detail::codeBuilder(*this, builder);
        }
        std::reverse(library.builders.begin(), library.builders.end());
        return library;
    }

    QrInBuffer buffer;
    QrBinaryStream stream;
};

void write(QrStream& stream, const RecordedLibraries& libraries) {
    stream.write(static_cast<int>(libraries.size()), 1);
    for (const RecordedLibrary& library : libraries)
        detail::writeRecord(stream, library.directory, library.fileName, library.time, library.size,
                            library.builders);
}

} // namespace

RecordedLibraries readRecords(std::istream& stream) {
    return ListReader(stream).read();
}

ListReading readRecordedList(const std::filesystem::path& file) {
    ListReading reading;
    std::ifstream input;
    if (!openPatiently(input, file)) {
        if (!isMissing(file)) {
            reading.state = ListReading::State::rejected;
            reading.reason = L"it cannot be read";
        }
        return reading;
    }
    reading.state = ListReading::State::rejected;
    ListReader reader(input);
    try {
        reading.libraries = reader.read();
        reading.state = ListReading::State::good;
        reading.reason.clear();
        readVerdicts(verdictsFileOf(file), reading.libraries);
    } catch (const std::bad_alloc&) {
        throw; // The list is not at fault.
    } catch (const std::exception& failure) {
        input.clear();
        const std::string what = failure.what();
        reading.reason = L"byte " + std::to_wstring(reader.position()) + L": " +
                         std::wstring(what.begin(), what.end());
    }
    return reading;
}

void writeRecordedList(std::ostream& output, const RecordedLibraries& libraries) {
    QrOutBuffer buffer(&output);
    QrBinaryStream stream(&buffer);
    write(stream, libraries);
}

void writeRecordedList(const std::filesystem::path& file, const RecordedLibraries& libraries) {
    std::ostringstream content;
    writeRecordedList(content, libraries);
    replaceChanged(file, content.view());
}

std::filesystem::path verdictsFileOf(const std::filesystem::path& list) {
    std::filesystem::path file = list;
    file += ".verdicts.json";
    return file;
}

bool isCarried(const std::wstring& text) {
    const std::optional<std::string> bytes = toNarrow(text);
    // Compare after a round trip, because some locales substitute a similar character.
    return bytes && text.find(L'\0') == std::wstring::npos && toWide(*bytes) == text;
}

} // namespace Mz::Tools
