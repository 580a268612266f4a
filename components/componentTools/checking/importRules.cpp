// SPDX-License-Identifier: BSL-1.0
/// The rules of import builders.
///
/// Two rules look for crashes: they call `canImport` and `import` with every input. The others
/// repeat these calls and observe one thing each. Calls that crashed are not repeated.
#include "components/componentTools/checking/rules.h"

#include "components/componentTools/checking/checkController.h"
#include "components/componentTools/checking/importing.h"
#include "components/componentTools/platform/resources.h"

#include <algorithm>
#include <cwctype>
#include <optional>

namespace Mz::Tools::Rules {

namespace {

/// Calls `use` with each import builder and each input.
template <class Use>
void forEachTry(CheckContext& context, const char* rule, Use use) {
    const CheckTask& task = context.task();
    const CheckInputs inputs(task.seed, task.samples);
    for (const ImportingBuilder& importing : importBuilders(context))
        forEachNumber(task, inputs.fixedCount(), [&](std::size_t number) {
            const CheckInput input = inputs.at(number);
            ImportTry attempt(importing, input, number, rule);
            use(importing, attempt);
        });
}

/// Like `forEachTry`, for the fixed inputs only, and only until `use` returns true for a builder.
template <class Use>
void forEachBuilder(CheckContext& context, const char* rule, Use use) {
    const CheckTask& task = context.task();
    const CheckInputs inputs(task.seed, task.samples);
    for (const ImportingBuilder& importing : importBuilders(context)) {
        const std::size_t first = task.input >= 0 ? static_cast<std::size_t>(task.input) : 0;
        const std::size_t end = task.input >= 0 ? first + 1 : inputs.fixedCount();
        for (std::size_t number = first; number < end; ++number) {
            const CheckInput input = inputs.at(number);
            ImportTry attempt(importing, input, number, rule);
            if (use(importing, attempt))
                break;
        }
    }
}

std::wstring lower(std::wstring text) {
    std::transform(text.begin(), text.end(), text.begin(), [](wchar_t character) {
        return static_cast<wchar_t>(std::towlower(static_cast<std::wint_t>(character)));
    });
    return text;
}

} // namespace

void extensionForm(CheckContext& context) {
    for (const ImportingBuilder& importing : importBuilders(context))
        for (const auto& extension :
             extensionsOf(context, *importing.described, *importing.builder)) {
            const std::wstring& place = importing.described->place;
            if (!extension || extension->empty())
                context.report(place, L"an extension is null or empty. Enumerate what follows "
                                      L"the dot of a file's name.");
            else if (extension->find_first_of(L".*?/\\:|; ") != std::wstring::npos)
                context.report(place, L"the extension \"" + *extension +
                                          L"\" contains a character that does not belong there. "
                                          L"Enumerate it without dot and wildcard, like \"obj\".");
        }
}

void extensionCase(CheckContext& context) {
    for (const ImportingBuilder& importing : importBuilders(context)) {
        const auto extensions = extensionsOf(context, *importing.described, *importing.builder);
        for (const auto& extension : extensions) {
            if (!extension)
                continue;
            const std::wstring lowered = lower(*extension);
            // A lower-case extension is its own.
            const bool present =
                std::any_of(extensions.begin(), extensions.end(),
                            [&](auto& other) { return other && *other == lowered; });
            if (!present)
                context.report(importing.described->place,
                               L"the extension \"" + *extension +
                                   L"\" has no lower-case form, and importers compare extensions "
                                   L"exactly. Enumerate \"" +
                                   lowered + L"\" too.");
        }
    }
}

void importLabel(CheckContext& context) {
    for (const ImportingBuilder& importing : importBuilders(context)) {
        const DescribedBuilder& described = *importing.described;
        context.attempt(L"the texts of the description", described.place, [&] {
            const wchar_t* const label = described.description->getLabel();
            if (label && !*label) // Null is the finding of another rule.
                context.report(described.place, L"its label is empty, and so is its line in the "
                                                L"list of file types. Name the files that it "
                                                L"reads.");
        });
    }
}

void canImportSurvives(CheckContext& context) {
    forEachTry(context, "canimport-survives", [&](const ImportingBuilder&, ImportTry& attempt) {
        CheckController controller;
        attempt.canImport(context);
    });
}

void canImportRestores(CheckContext& context) {
    forEachBuilder(context, "canimport-restores",
                   [&](const ImportingBuilder& importing, ImportTry& attempt) {
                       CheckController controller;
                       const std::wstring before = System::processSettings();
                       attempt.canImport(context);
                       std::wstring fault;
                       if (System::processSettings() != before)
                           fault = L"changes the settings of the process (" + before + L" to " +
                                   System::processSettings() + L")";
                       else if (QrGetThreadProcessController() != &controller)
                           fault = L"changes the process controller of the thread";
                       else if (!attempt.restore())
                           fault = L"leaves the input where its position cannot be restored";
                       if (!fault.empty())
                           context.report(importing.described->place,
                                          L"canImport " + fault + L", with " + attempt.detail() +
                                              L". Only read from the input.",
                                          attempt.reproduce(context));
                       return !fault.empty();
                   });
}

void importSurvives(CheckContext& context) {
    forEachTry(context, "import-survives", [&](const ImportingBuilder&, ImportTry& attempt) {
        CheckController controller;
        attempt.import(context);
    });
}

void inputReleased(CheckContext& context) {
    forEachBuilder(
        context, "import-releases", [&](const ImportingBuilder& importing, ImportTry& attempt) {
            CheckController controller;
            const wchar_t* function = L"canImport";
            attempt.canImport(context);
            if (!attempt.isKept()) {
                function = L"import";
                attempt.import(context);
            }
            if (attempt.isKept())
                context.report(importing.described->place,
                               std::wstring(function) + L" keeps a reference to the input, with " +
                                   attempt.detail() +
                                   L". The input is destroyed after the call. Read what is needed, "
                                   L"and release it.",
                               attempt.reproduce(context));
            return attempt.isKept();
        });
}

void importReports(CheckContext& context) {
    forEachBuilder(
        context, "import-reports", [&](const ImportingBuilder& importing, ImportTry& attempt) {
            CheckController controller;
            if (context.isAvoided(L"import", importing.described->place) ||
                !attempt.canImport(context) || attempt.import(context) ||
                !context.lastException().empty() || controller.messages > 0)
                return false;
            context.report(importing.described->place,
                           L"import returns null without a message for " + attempt.detail() +
                               L", which canImport accepts. Report the reason to the process "
                               L"controller.",
                           attempt.reproduce(context));
            return true;
        });
}

void progressInside(CheckContext& context) {
    forEachBuilder(context, "import-progress",
                   [&](const ImportingBuilder& importing, ImportTry& attempt) {
                       CheckController controller;
                       attempt.import(context);
                       if (controller.outside)
                           context.report(importing.described->place,
                                          L"import reports the progress " +
                                              std::to_wstring(controller.outsideValue) + L" for " +
                                              attempt.detail() +
                                              L". Report the fraction that is done, 0 to 1.",
                                          attempt.reproduce(context));
                       return controller.outside;
                   });
}

void importStops(CheckContext& context) {
    // Work may need a few steps to notice, and may report its end.
    constexpr int tolerated = 3;
    forEachBuilder(
        context, "import-stops", [&](const ImportingBuilder& importing, ImportTry& attempt) {
            CheckController controller(true);
            const bool imported = attempt.import(context);
            const bool goesOn = controller.questions > tolerated;
            if (goesOn)
                context.report(importing.described->place,
                               L"import was told to stop, and asked " +
                                   std::to_wstring(controller.questions - 1) + L" times more" +
                                   (imported ? L" until it was complete" : L"") + L", for " +
                                   attempt.detail() +
                                   L". Return null when isInterrupted returns true, or progress "
                                   L"or warning returns false.",
                               attempt.reproduce(context));
            return goesOn;
        });
}

} // namespace Mz::Tools::Rules
