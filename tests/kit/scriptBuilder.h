// SPDX-License-Identifier: BSL-1.0
/// The import builder of the test components. Header-only, because two components have it.
#pragma once

#include "tests/kit/importers.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <initializer_list>
#include <stdexcept>
#include <string>
#include <string_view>

namespace Mz::Test {

class ImportedWords final : public Kit::Object<ImportedWords, Words> {
  public:
    explicit ImportedWords(std::wstring text) : content(std::move(text)) {}
    const std::wstring& words() const override { return content; }

  private:
    std::wstring content;
};

/// Obeys the script in the input. See `obey` for what a script can say.
class ScriptBuilder final : public Kit::ImportBuilder<ScriptBuilder> {
  public:
    ScriptBuilder(const Kit::BuilderInfo& info, char builderLetter, const wchar_t* extension)
        : ImportBuilder(info, {extension}), letter(builderLetter) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        const std::string action = actionIn(allOf(*io));
        if (action == "canThrow")
            throw std::runtime_error("broken question");
        if (action == "canThrowNumber")
            throw 42;
        if (action == "canReread")
            reread(*io);
        if (action == "canBlock") { // Reads beyond the end, and leaves the stream there.
            char block[4096];
            io->seek(0, 0);
            io->read(block, sizeof block);
            return false;
        }
        return !action.empty();
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t* hint) const override {
        const std::string action = actionIn(allOf(*io));
        const std::size_t space = action.find(' ');
        return obey(action.substr(0, space), action.substr(space + 1), *io, path, hint);
    }

  private:
    QrRef<QrCastable> obey(const std::string& verb, const std::string& rest, QrBufferedIO& io,
                           const wchar_t* path, const wchar_t* hint) const {
        QrProcessControl& controller = *QrGetProcessController();
        if (verb == "error") // Two errors, and no object.
            controller.error(0, L"line 1: bad"), controller.error(0, L"line 2: worse");
        else if (verb == "throw")
            throw std::runtime_error("broken import");
        else if (verb == "abort")
            controller.abort(0, L"stop all");
        else if (verb == "wait") // until it is interrupted
            while (!controller.isInterrupted()) {
            }
        else if (verb == "warn")
            while (controller.warning(0, L"still here")) {
            }
        else if (verb == "progress") { // as wait, but returns what it has
            while (controller.progress(0.5F, L"")) {
            }
            return made(L"half");
        } else if (verb == "reread")
            reread(io);
        else if (verb == "find") // a companion file, whose name is the rest
            return made(controller.findFile(displayText(rest).c_str(), nullptr, nullptr));
        else if (verb == "texts")
            return made(std::wstring(path) + L"|" + hint);
        else if (verb == "take")
            return made(std::wstring(1, static_cast<wchar_t>(letter)));
        return nullptr;
    }

    static QrRef<QrCastable> made(std::wstring text) { return new ImportedWords(std::move(text)); }

    /// Reads the input again and again, until that throws.
    static void reread(QrBufferedIO& io) {
        for (;;) {
            io.seek(0, 0);
            io.read();
        }
    }

    /// Returns the input, or its first part if it cannot be read to its end.
    static std::string allOf(QrBufferedIO& io) {
        std::string all;
        try {
            for (int byte = io.read(); byte >= 0; byte = io.read())
                all += static_cast<char>(byte);
        } catch (const QrStreamEx::ExReadError&) {
        }
        return all;
    }

    /// Returns what the script says for this builder; empty if that is nothing.
    std::string actionIn(const std::string& script) const {
        const std::size_t begin = (';' + script).find(std::string{';', letter, '='});
        if (begin == std::string::npos)
            return {};
        const std::size_t action = begin + 2;
        return script.substr(action, script.find(';', action) - action);
    }

    char letter;
};

} // namespace Mz::Test
