// SPDX-License-Identifier: BSL-1.0
/// Reads the list with the same stream class as the manager, but checks everything that the manager
/// trusts. Counts in the file are not used to allocate memory, because a damaged file may contain
/// any number.
#include "components/componentTools/recordedList.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/records/openPatiently.h"
#include "components/componentTools/records/verdictsFile.h"
#include "components/platform/characters.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace Mz::Tools {

namespace {

/// Reads a list and validates every value.
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

  private:
    RecordedLibrary readLibrary() {
        RecordedLibrary library;
        library.position = position();
        library.directory = readName();
        library.fileName = readName();
        int64 size = 0;
        unsigned int count = 0;
        stream >> library.time >> size >> count;
        if (size < 0)
            throw std::runtime_error("a negative size");
        library.size = size;
        // Read one by one: the count may be wrong. Builders are stored in reverse order.
        for (; count > 0; --count)
            library.builders.push_back(readBuilder());
        std::reverse(library.builders.begin(), library.builders.end());
        return library;
    }

    RecordedBuilder readBuilder() {
        RecordedBuilder builder;
        builder.position = position();
        stream >> builder.uid;
        builder.name = readText();
        builder.label = readText();
        builder.text = readText();
        unsigned char flag = 0;
        stream >> flag >> builder.number;
        if (flag > 1)
            throw std::runtime_error("a flag that is neither true nor false");
        builder.flag = flag != 0;
        return builder;
    }

    std::wstring readText() {
        std::wstring text;
        stream >> text;
        if (text.find(L'\0') != std::wstring::npos)
            throw std::runtime_error("a text with a NUL");
        return text;
    }

    /// Reads a normalised name. It may contain a backslash, which is an ordinary character in file
    /// names on Linux.
    std::wstring readName() {
        std::wstring name = readText();
        if (name.empty() || name.find(L'/') != std::wstring::npos ||
            platform::lowerCase(name) != name)
            throw std::runtime_error("a name that is not in its normal form");
        return name;
    }

    QrInBuffer buffer;
    QrBinaryStream stream;
};

void write(QrStream& stream, const RecordedLibraries& libraries) {
    stream.write(static_cast<int>(libraries.size()), 1);
    for (const RecordedLibrary& library : libraries) {
        stream << library.directory << library.fileName << library.time
               << static_cast<int64>(library.size)
               << static_cast<unsigned int>(library.builders.size());
        // In reverse order: this is the format of all existing lists.
        for (auto builder = library.builders.rbegin(); builder != library.builders.rend();
             ++builder) {
            stream << builder->uid;
            stream << builder->name << builder->label << builder->text << builder->flag
                   << builder->number;
        }
    }
}

} // namespace

ListReading readRecordedList(const std::filesystem::path& file) {
    ListReading reading;
    std::ifstream input;
    if (!openPatiently(input, file)) {
        if (platform::queryFile(file.native())) {
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
    replaceFile(file, content.view());
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
