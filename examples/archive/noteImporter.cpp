// SPDX-License-Identifier: BSL-1.0
/// The component: an import builder for notes. The first line of a note is "Note: " and its title.
/// A line "> NAME" quotes the text file NAME, for which the component asks the process controller.
/// It does not know whether the note, or the quoted file, comes from a folder or from an archive.
#include "note.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <sstream>
#include <string_view>
#include <utility>

using namespace Mz;

namespace {

constexpr std::string_view mark = "Note: ";

class ReadNote final : public Kit::Object<ReadNote, Note> {
  public:
    ReadNote(std::string noteTitle, std::string noteText)
        : heading(std::move(noteTitle)), content(std::move(noteText)) {}
    const std::string& title() const override { return heading; }
    const std::string& text() const override { return content; }

  private:
    std::string heading;
    std::string content;
};

/// Returns the rest of the input.
std::string textOf(QrBufferedIO& io) {
    std::string text;
    char block[4096];
    for (int count = 1; count > 0;) {
        count = io.read(block, sizeof block);
        text.append(block, static_cast<std::size_t>(count));
    }
    return text;
}

/// Returns the content of the file `name`, or a text that says that it is not there.
std::string quotation(const std::string& name, QrProcessControl* controller) {
    const std::wstring found =
        controller ? controller->findFile(displayText(name).c_str(), nullptr, nullptr) : L"";
    const std::optional<std::filesystem::path> file = toNativePath(found);
    if (found.empty() || !file)
        return "(" + name + " was not found)\n";
    std::ifstream in(*file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

class NoteImporter final : public Kit::ImportBuilder<NoteImporter> {
  public:
    static constexpr QrUid builderUid = "E7D09B02-2C64-4A3F-8D15-96B0F4C7A238"_uid;

    NoteImporter()
        : ImportBuilder({.uid = builderUid, .name = noteBuilders, .label = L"Notes"}, {L"note"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        char first[mark.size()];
        return io->read(first, sizeof first) == sizeof first &&
               std::string_view(first, sizeof first) == mark;
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        QrProcessControl* const controller = QrGetProcessController();
        try {
            std::istringstream in(textOf(*io));
            std::string title, text;
            std::getline(in, title);
            for (std::string line; std::getline(in, line);)
                text +=
                    line.starts_with("> ") ? quotation(line.substr(2), controller) : line + '\n';
            return new ReadNote(title.substr(mark.size()), std::move(text));
        } catch (const std::exception& failure) { // of the input or the memory
            if (controller)
                controller->error(0, displayText(failure.what()).c_str());
            return nullptr;
        }
    }
};

} // namespace

MZ_COMPONENT(L"Notes", L"Reads notes", Kit::builder<NoteImporter>())
