// SPDX-License-Identifier: BSL-1.0
// Reads a recorded list as the tools read it from a file, and as a manager reads it from a stream.
#include "components/componentTools/recordedList.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/manager/componentImpPrivate.h"
#include "components/componentManager/textStream.h"
#include "fuzz/fuzz.h"

#include <sstream>

namespace {

using namespace Mz;

/// Reads the list into `manager`. Returns whether it is complete.
template <class Stream>
bool readInto(ComponentManager& manager, std::string_view content) {
    std::istringstream source{std::string(content)};
    QrInBuffer io(&source);
    Stream stream(&io);
    return Fuzz::outcomeOf([&] {
               manager.readRecords(stream);
               return std::string("whole");
           }) == "whole";
}

std::string written(const Tools::RecordedLibraries& libraries) {
    std::ostringstream sink;
    Tools::writeRecordedList(sink, libraries);
    return sink.str();
}

void expectSameBuilder(const Tools::RecordedBuilder& a, const ComponentManager::Builder& b) {
    Fuzz::expect(a.uid == b.uid && a.number == b.number && a.flag == b.flag, "the same values");
    Fuzz::expect(a.name == b.name && a.label == b.label && a.text == b.text, "the same texts");
}

void expectSameRecord(const Tools::RecordedLibrary& a, const ComponentLibrary& b) {
    Fuzz::expect(a.directory == b.directory && a.fileName == b.fileName, "the same names");
    Fuzz::expect(a.time == b.fileTime && a.size == b.fileSize, "the same time and size");
    Fuzz::expect(a.builders.size() == b.builders.size(), "as many builders");
    for (std::size_t index = 0; index < a.builders.size(); ++index)
        expectSameBuilder(a.builders[index], b.builders[index]);
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view content = Fuzz::Input(data, size).rest();
    ComponentManager fromText;
    readInto<QrTextStream>(fromText, content);
    ComponentManager manager;
    const bool whole = readInto<QrBinaryStream>(manager, content);

    const Fuzz::InputFile file(content);
    const Tools::ListReading reading = Tools::readRecordedList(file.path());
    // The tools also reject what a manager does not mind. A NUL would end a text in the manager.
    if (reading.reason.find(L"a text with a NUL") != std::wstring::npos)
        Fuzz::expect(!whole, "a manager accepts no NUL in a text");
    if (reading.state != Tools::ListReading::State::good)
        return 0;
    Fuzz::expect(whole, "a manager reads what the tools accept");
    Fuzz::expect(manager.libraries.size() == reading.libraries.size(), "as many libraries");
    auto library = manager.libraries.begin();
    for (const Tools::RecordedLibrary& record : reading.libraries)
        expectSameRecord(record, *library++);

    const std::string bytes = written(reading.libraries);
    const Fuzz::InputFile again(bytes);
    Fuzz::expectSame(written(Tools::readRecordedList(again.path()).libraries), bytes,
                     "what is written is read again");
    return 0;
}
