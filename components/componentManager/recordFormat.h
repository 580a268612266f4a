// SPDX-License-Identifier: BSL-1.0
/// What the component manager and libMZcomponentTools must do alike: how a description is copied
/// into a record, and how a record is stored in a recorded list.
///
/// For the libraries of this project. Applications read and write a list through the manager's
/// `QrPersistant` interface, or with `componentTools/recordedList.h`.
#pragma once

#include "components/componentManager/componentImp.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/stream.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace Mz::detail {

/// Reads what a component library says of itself. The order of the calls is fixed, because
/// components can observe it. The enumeration of the builders follows.
///
/// \param value, text, label  receive the description's; a null text becomes an empty one
/// \return the number of builders that the library announces, which may be wrong
/// \throws what the code of the library throws; the values read before are then set
template <class Text>
unsigned int copyDescription(QrComponentDescription& description, int64& value, Text& text,
                             Text& label) {
    value = description.getComponentValue();
    text = textOrEmpty(description.getComponentText());
    label = textOrEmpty(description.getComponentLabel());
    return description.getBuilderCount();
}

/// Copies the description of a builder. The order of the calls is fixed, because components can
/// observe it.
///
/// \param record  has the members `uid`, `name`, `label`, `text`, `number` and `flag`
/// \throws what the code of the library throws
template <class Record>
void copyDescription(const QrBuilderDescription& description, Record& record) {
    record.uid = description.getUid();
    record.name = textOrEmpty(description.getName());
    record.label = textOrEmpty(description.getLabel());
    record.text = textOrEmpty(description.getText());
    record.number = description.getNumber();
    record.flag = description.getFlag();
}

/// Passes the fields of a builder record to `codec`, in the order in which they are stored. All
/// existing lists depend on it.
///
/// \param codec  has the functions `value`, `text` and `flag`, each for a reference to a field
template <class Codec, class Builder>
void codeBuilder(Codec& codec, Builder& builder) {
    codec.value(builder.uid);
    codec.text(builder.name);
    codec.text(builder.label);
    codec.text(builder.text);
    codec.flag(builder.flag);
    codec.value(builder.number);
}

/// Passes the fields of a library record to `codec`, in the order in which they are stored. The
/// library's builders follow, last to first.
///
/// \param codec  has the functions of `codeBuilder`, and `name` for a normalised name
/// \param time   the file's, in seconds
/// \param size   the file's, in bytes
/// \param count  the number of builders; from a damaged list it may be any number
template <class Codec, class Name, class Time, class Size, class Count>
void codeLibrary(Codec& codec, Name& directory, Name& fileName, Time& time, Size& size,
                 Count& count) {
    codec.name(directory);
    codec.name(fileName);
    codec.value(time);
    codec.value(size);
    codec.value(count);
}

/// The codec that writes fields to a stream.
struct RecordWriter {
    QrStream& stream;

    template <class Value>
    void value(const Value& field) {
        stream << field;
    }
    template <class Text>
    void name(const Text& field) {
        text(field);
    }
    void text(const std::wstring& field) { stream << field; }
    void text(std::wstring_view field) { stream << std::wstring(field); }
    void flag(bool field) { stream << field; }
};

/// Writes a library record with its builders.
///
/// Its texts, and those of its builders, are of type `std::wstring` or convert to
/// `std::wstring_view`.
///
/// \param builders  an indexed sequence of builder records
/// \throws QrStreamEx::ExWriteError  if the stream fails
template <class Text, class Builders>
void writeRecord(QrStream& stream, const Text& directory, const Text& fileName, std::uint32_t time,
                 int64 size, const Builders& builders) {
    RecordWriter writer{stream};
    const auto count = static_cast<unsigned int>(builders.size());
    codeLibrary(writer, directory, fileName, time, size, count);
    for (std::size_t index = builders.size(); index-- > 0;)
        codeBuilder(writer, builders[index]);
}

} // namespace Mz::detail
