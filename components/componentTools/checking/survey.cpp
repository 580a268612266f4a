// SPDX-License-Identifier: BSL-1.0
/// The surroundings are entered by the process itself, before the library is loaded, so that its
/// initialisers run in them, too.
#include "components/componentTools/checking/survey.h"

#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/checking/checkController.h"
#include "components/componentTools/checking/checkObjects.h"
#include "components/componentTools/checking/importing.h"
#include "components/componentTools/platform/resources.h"

#include <locale>

namespace Mz::Tools {

namespace {

/// The numbers of a locale with a decimal comma, for C++ streams.
class DecimalComma final : public std::numpunct<char> {
  protected:
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

/// Leaves the pattern on the part of the stack that the next calls use.
[[gnu::noinline]] void fillStack(unsigned char pattern) {
    volatile unsigned char area[32768];
    for (volatile unsigned char& byte : area)
        byte = pattern;
}

/// Fills the memory that the next call uses, in the heap and on the stack.
void fillMemory(CheckContext& context) {
    const auto pattern = static_cast<unsigned char>(context.task().memoryPattern);
    System::fillNewMemory(pattern);
    fillStack(pattern);
}

void surveyDescription(CheckContext& context, QrComponentDescription& description) {
    context.attempt(L"the description", {}, [&] {
        CheckSender& answers = context.messages();
        answers.answer(L"getComponentLabel", toUtf8(textOrEmpty(description.getComponentLabel())));
        answers.answer(L"getComponentText", toUtf8(textOrEmpty(description.getComponentText())));
        answers.answer(L"getComponentValue", std::to_string(description.getComponentValue()));
    });
    for (const DescribedBuilder& builder : context.builders())
        context.attempt(L"a builder's description", builder.place, [&] {
            const QrBuilderDescription& item = *builder.description;
            CheckSender& answers = context.messages();
            answers.answer(L"getLabel of the " + builder.place,
                           toUtf8(textOrEmpty(item.getLabel())));
            answers.answer(L"getText of the " + builder.place, toUtf8(textOrEmpty(item.getText())));
            answers.answer(L"getNumber of the " + builder.place, std::to_string(item.getNumber()));
            answers.answer(L"getFlag of the " + builder.place, item.getFlag() ? "true" : "false");
        });
}

void surveyObject(CheckContext& context, const std::wstring& name, const std::wstring& place,
                  const QrRef<QrCastable>& object) {
    context.messages().answer(name, object ? "an object" : "null");
    QrPtr<QrPersistant> stored;
    if (object)
        context.attempt(L"the interfaces of the object", place,
                        [&] { stored = queryCast<QrPersistant>(object.get()); });
    if (!stored)
        return;
    for (const StoredForm form : {StoredForm::binary, StoredForm::text})
        if (const auto bytes = writtenBytes(context, place, *stored, form))
            context.messages().answer(L"write of " + name +
                                          (form == StoredForm::binary ? L", binary" : L", text"),
                                      *bytes);
}

void surveyImports(CheckContext& context) {
    const CheckInputs inputs(context.task().seed, context.task().samples);
    for (const ImportingBuilder& importing : importBuilders(context))
        for (std::size_t number = 0; number < inputs.fixedCount(); ++number) {
            const CheckInput input = inputs.at(number);
            const std::wstring& place = importing.described->place;
            CheckController controller;
            ImportTry attempt(importing, input, number);
            const bool accepts = attempt.canImport(context);
            context.messages().answer(L"canImport of the " + place + L" with " + attempt.detail(),
                                      accepts ? "true" : "false");
            if (accepts) {
                attempt.import(context);
                surveyObject(context, L"import of the " + place + L" with " + attempt.detail(),
                             place, attempt.object());
            }
        }
}

} // namespace

void enterSurroundings(const CheckTask& task) {
    System::fillNewMemory(static_cast<unsigned char>(task.memoryPattern));
    if (task.otherLocale) {
        System::useDecimalComma();
        std::locale::global(std::locale(std::locale(), new DecimalComma));
    }
    std::error_code ignored;
    if (task.otherFolder)
        std::filesystem::current_path(std::filesystem::temp_directory_path(ignored).root_path(),
                                      ignored);
    if (task.noInput)
        System::closeStandardInput();
}

void survey(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!description)
        return;
    // After each message, which leaves memory behind that the call would find.
    context.beforeCalls([&context] { fillMemory(context); });
    surveyDescription(context, *description);
    for (const DescribedBuilder& described : context.builders())
        surveyObject(context, L"createObject of the " + described.place, described.place,
                     context.object(described));
    surveyImports(context);
}

} // namespace Mz::Tools
