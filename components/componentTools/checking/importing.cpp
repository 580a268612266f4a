// SPDX-License-Identifier: BSL-1.0
/// The input is counted, unlike `QrInBuffer`, so that a builder that keeps it is found.
#include "components/componentTools/checking/importing.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/exceptions.h"

#include <chrono>
#include <clocale>

namespace Mz::Tools {

namespace {

class CountedInput final : public QrCastRef<QrCastHeap<QrInBuffer>> {
  public:
    using QrCastRef<QrCastHeap<QrInBuffer>>::QrCastRef;
};

class ExtensionCollector final : public QrEnumerator<const wchar_t*> {
  public:
    Action process(const wchar_t* extension) override {
        extensions.push_back(extension ? std::make_unique<std::wstring>(extension) : nullptr);
        return Continue;
    }
    std::vector<std::unique_ptr<std::wstring>> extensions;
};

} // namespace

std::vector<std::unique_ptr<std::wstring>>
extensionsOf(CheckContext& context, const DescribedBuilder& described, QrImportBuilder& builder) {
    ExtensionCollector collector;
    context.attempt(L"enumerateExtensions", described.place,
                    [&] { builder.enumerateExtensions(collector); });
    return std::move(collector.extensions);
}

std::vector<ImportingBuilder> importBuilders(CheckContext& context) {
    std::vector<ImportingBuilder> result;
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        QrPtr<QrImportBuilder> importing;
        if (builder)
            context.attempt(L"the interfaces of the builder", described.place,
                            [&] { importing = queryCast<QrImportBuilder>(builder.get()); });
        if (!importing)
            continue;
        std::wstring extension;
        for (const auto& known : extensionsOf(context, described, *importing))
            if (known && extension.empty())
                extension = *known;
        result.push_back({&described, importing, extension});
    }
    return result;
}

KeptSettings::KeptSettings() : locale(std::setlocale(LC_ALL, nullptr)) {
    std::error_code ignored;
    folder = std::filesystem::current_path(ignored);
}

KeptSettings::~KeptSettings() {
    std::error_code ignored;
    if (std::filesystem::current_path(ignored) != folder)
        std::filesystem::current_path(folder, ignored);
    if (std::setlocale(LC_ALL, nullptr) != locale)
        std::setlocale(LC_ALL, locale.c_str());
}

ImportTry::ImportTry(const ImportingBuilder& builder, const CheckInput& input, std::size_t index,
                     const char* checkedRule)
    : importing(builder), number(index), rule(checkedRule),
      name(L"input " + std::to_wstring(index) + L" (" + input.name + L")"),
      path(L"check." + builder.extension), stream(input.bytes), io(new CountedInput(&stream)) {}

ImportTry::~ImportTry() {
    // A builder that kept the input may use it later, when the stream is gone.
    if (isKept())
        static_cast<void>(io.detach());
}

std::string ImportTry::reproduce(const CheckContext& context) const {
    return rule ? reproduction(rule, *importing.described, number, context.task()) : "";
}

bool ImportTry::canImport(CheckContext& context) {
    bool result = false;
    context.attempt(
        L"canImport", importing.described->place,
        [&] { result = importing.builder->canImport(io, path.c_str(), L""); }, name,
        reproduce(context));
    return result;
}

bool ImportTry::restore() {
    const auto atStart = [&] {
        try {
            return io->seek(0, 0) == 0;
        } catch (const QrStreamEx&) {
            return false;
        }
    };
    if (atStart())
        return true;
    try {
        io->read(); // Ends the state after a block read that reached the end.
    } catch (const QrStreamEx&) {
        return false; // The builder broke the stream.
    }
    return atStart();
}

bool ImportTry::import(CheckContext& context) {
    restore();
    context.attempt(
        L"import", importing.described->place,
        [&] { imported = importing.builder->import(io, path.c_str(), L""); }, name,
        reproduce(context));
    return static_cast<bool>(imported);
}

void ImportTry::importUnguarded() {
    if (!importing.builder->canImport(io, path.c_str(), L""))
        return;
    restore();
    static_cast<void>(importing.builder->import(io, path.c_str(), L""));
}

bool ImportTry::isKept() const {
    return countOf(*io).value > 1;
}

std::string reproduction(const char* rule, const DescribedBuilder& described, std::size_t number,
                         const CheckTask& task) {
    return std::string(rule) + ":" + std::to_string(described.index) + ":" +
           std::to_string(number) + ":" + std::to_string(task.seed);
}

void forEachNumber(const CheckTask& task, std::size_t count,
                   const std::function<void(std::size_t)>& use) {
    if (task.input >= 0)
        return use(static_cast<std::size_t>(task.input));
    const auto end =
        std::chrono::steady_clock::now() + std::chrono::milliseconds(task.fuzzMilliseconds);
    std::size_t number = 0;
    for (; number < count; ++number)
        use(number);
    while (std::chrono::steady_clock::now() < end)
        use(number++);
}

} // namespace Mz::Tools
