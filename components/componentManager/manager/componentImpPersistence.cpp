// SPDX-License-Identifier: BSL-1.0
/// Writes and reads the recorded list, in the format of `recordFormat.h`. A list may come from a
/// damaged file, so counts in it only end loops: records are created one by one as they are read,
/// and a record that cannot be read completely is reset, so that its file is recorded anew.
#include "components/componentManager/manager/componentImpPrivate.h"

#include "components/componentManager/recordFormat.h"
#include "components/componentManager/stream.h"

#include <array>
#include <cstddef>
#include <list>
#include <string>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/componentImp";

constexpr QrUid classUid{0x0C3F6A00, 0xADC511D1, 0x988AFC24, 0x07C10E27};

/// Reads the fields of records. A text that equals the one at the same place of the record before
/// is shared with it: the libraries of a folder have one directory, and the builders of an importer
/// have one name.
class RecordReader {
  public:
    explicit RecordReader(QrStream& stream) : stream(stream) {}

    template <class Value>
    void value(Value& field) {
        stream >> field;
    }
    void flag(bool& field) { stream >> field; }
    void name(SharedText& field) { field = read(names[nameCount++ % names.size()]); }
    void text(SharedText& field) { field = read(texts[textCount++ % texts.size()]); }

  private:
    /// Throws if the text contains a NUL. No name or path contains one. A NUL that is read as a
    /// character is not consumed, so it would fill a text of any claimed length, and a small file
    /// could claim many long texts.
    ///
    /// \param last  the text that was read at this place before; receives this one
    const SharedText& read(SharedText& last) {
        characters.clear();
        stream >> characters;
        if (characters.find(L'\0') != std::wstring::npos)
            throw QrStreamEx::ExReadError(source, __LINE__);
        if (last != characters)
            last = characters;
        return last;
    }

    QrStream& stream;
    std::wstring characters;
    std::array<SharedText, 2> names; ///< of the last library
    std::array<SharedText, 3> texts; ///< of the last builder
    std::size_t nameCount = 0;
    std::size_t textCount = 0;
};

void readLibrary(RecordReader& reader, ComponentLibrary& library) {
    unsigned int count = 0;
    detail::codeLibrary(reader, library.directory, library.fileName, library.fileTime,
                        library.fileSize, count);
    // The count may be wrong, so nothing is reserved.
    for (; count > 0; --count) {
        ComponentManager::Builder& builder = library.builders.emplace_back();
        builder.library = &library;
        detail::codeBuilder(reader, builder);
    }
    library.builders.reverse();
}

} // namespace

void ComponentManager::writeRecords(QrStream& stream) {
    if (!initialised)
        return;
    stream.write(static_cast<int>(libraries.size()), 1);
    for (const ComponentLibrary& library : libraries)
        detail::writeRecord(stream, library.directory, library.fileName, library.fileTime,
                            library.fileSize, library.builders);
}

void ComponentManager::readRecords(QrStream& stream) {
    if (initialised || initialising)
        return;
    int count = 0;
    if (stream.read(count, 1) == 0) {
        // A fixed line, because callers and logs rely on it. It is not a line of this file.
        constexpr int reportedLine = 1260;
        throw QrStreamEx::ExReadObject(source, reportedLine);
    }
    if (count < 0)
        throw QrStreamEx::ExReadError(source, __LINE__);
    RecordReader reader(stream);
    for (; count > 0; --count) {
        ComponentLibrary& library = libraries.emplace_back(*this);
        try {
            readLibrary(reader, library);
        } catch (...) {
            // An incomplete record must not count as the state of the file.
            library.fileTime = 0;
            library.fileSize = 0;
            library.builders.clear();
            throw;
        }
    }
}

ComponentManagerPersistant::ComponentManagerPersistant(ComponentManager* manager)
    : QrTempObject(manager) {}

ComponentManagerPersistant::~ComponentManagerPersistant() = default;

const QrUid* ComponentManagerPersistant::getClassUid() const {
    return &classUid;
}

unsigned int ComponentManagerPersistant::getVersion() const {
    return 1;
}

void ComponentManagerPersistant::write(QrStream& stream) {
    owner()->writeRecords(stream);
}

void ComponentManagerPersistant::read(QrStream& stream) {
    owner()->readRecords(stream);
}

} // namespace Mz
