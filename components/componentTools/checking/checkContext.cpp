// SPDX-License-Identifier: BSL-1.0
/// References that the context keeps are never released: a library that counts wrongly would crash
/// in rules that have nothing to do with it. The library stays loaded for the same reason.
#include "components/componentTools/checking/checkContext.h"

#include "components/base/assertions.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/exceptionText.h"
#include "components/componentTools/uidText.h"

#include <algorithm>
#include <iterator>
#include <new>

namespace Mz::Tools {

CheckContext::CheckContext(const CheckTask& task, CheckSender& messages)
    : work(task), sender(messages) {}

void CheckContext::begin(const CheckRule& rule) {
    current = &rule;
    found = false;
    sender.rule(rule.id);
}

void CheckContext::report(const std::wstring& place, const std::wstring& sentence,
                          const std::string& reproduce) {
    found = true;
    sender.finding({current, place, sentence, reproduce, {}});
}

void CheckContext::reportMissingClass(const std::wstring& place, const std::wstring& sentence,
                                      const QrUid& missingClass) {
    found = true;
    sender.finding({current, place, sentence, {}, missingClass});
}

bool CheckContext::isAvoided(const wchar_t* what, const std::wstring& place) const {
    return work.avoided.contains(toUtf8(what + (L" " + place)));
}

bool CheckContext::attempt(const std::wstring& what, const std::wstring& place,
                           const std::function<void()>& call, const std::wstring& detail,
                           const std::string& reproduce) {
    exception.clear();
    streamException = false;
    const std::string key = toUtf8(what + L" " + place);
    if (work.avoided.contains(key))
        return false;
    sender.activity({key, what, place, detail, reproduce});
    if (prepare)
        prepare();
    try {
        call();
        return true;
    } catch (const QrStreamEx&) {
        exception = exceptionText();
        streamException = true;
    } catch (const std::bad_alloc&) {
        exception = L"std::bad_alloc";
    } catch (const Assertions::ExProgramAborted&) {
        exception = exceptionText();
    } catch (...) {
        exception = exceptionText();
        if (!place.empty())
            noteException(what, place);
    }
    return false;
}

void CheckContext::noteException(const std::wstring& what, const std::wstring& place) {
    const std::wstring sentence =
        what + L" throws an exception that hosts do not expect: " + exception +
        L". Catch it, report it to the process controller and return null, or throw an exception "
        L"of QrStreamEx.";
    if (std::find(reported.begin(), reported.end(), place + sentence) != reported.end())
        return;
    reported.push_back(place + sentence);
    sender.finding({findCheckRule("exceptions-allowed"), place, sentence, {}, {}});
}

platform::Module CheckContext::load(std::wstring& loaderError) {
    platform::Module module = nullptr;
    attempt(L"loading the library", {},
            [&] { module = platform::loadLibrary(work.file.native()); });
    if (module)
        return module;
    loaderError = System::caughtFault();
    if (loaderError.empty())
        loaderError = System::loaderError(work.file);
    return nullptr;
}

QrGetComponentDescriptionFunction* CheckContext::entryPointOf(platform::Module module) {
    return reinterpret_cast<QrGetComponentDescriptionFunction*>(
        platform::findSymbol(module, entryPointName));
}

QrGetComponentDescriptionFunction* CheckContext::entryPoint() {
    std::wstring ignored;
    if (!held)
        library = load(ignored);
    held = true;
    return library ? entryPointOf(library) : nullptr;
}

void* CheckContext::function(const char* name) {
    return entryPoint() ? platform::findSymbol(library, name) : nullptr;
}

QrComponentDescription* CheckContext::description() {
    if (!described)
        describe();
    return kept;
}

const std::vector<DescribedBuilder>& CheckContext::builders() {
    if (!described)
        describe();
    return checked;
}

void CheckContext::describe() {
    described = true;
    QrGetComponentDescriptionFunction* const entry = entryPoint();
    if (!entry)
        return;
    DescriptionCollector collector;
    const auto call = [&](const wchar_t* what, const std::function<void()>& action) {
        attempt(what, {}, action);
        if (failure.empty() && !exception.empty())
            failure = what + std::wstring(L" throws: ") + exception;
    };
    call(L"the entry point", [&] {
        QrPtr<QrCastable> object = entry();
        kept = queryCast<QrComponentDescription>(object.get()).detach();
        static_cast<void>(object.detach());
    });
    if (!kept)
        return;
    call(L"the description", [&] {
        static_cast<void>(kept->getComponentValue());
        static_cast<void>(kept->getComponentText());
        static_cast<void>(kept->getComponentLabel());
        static_cast<void>(kept->getBuilderCount());
    });
    call(L"enumerateBuilders", [&] { kept->enumerateBuilders(collector); });
    for (const auto& item : collector.items)
        call(L"the description of a builder", [&] {
            DescribedBuilder builder;
            builder.index = all.size();
            builder.uid = item->getUid();
            builder.name = textOrEmpty(item->getName());
            builder.place = placeOf(builder.name, builder.uid);
            builder.description = item;
            static_cast<void>(QrCPtr<QrBuilderDescription>(item).detach());
            all.push_back(std::move(builder));
        });
    std::copy_if(
        all.begin(), all.end(), std::back_inserter(checked), [&](const DescribedBuilder& builder) {
            return work.builder < 0 || builder.index == static_cast<std::size_t>(work.builder);
        });
}

QrPtr<QrComponentBuilder> CheckContext::builder(const DescribedBuilder& described) {
    QrPtr<QrComponentBuilder> builder;
    if (description())
        attempt(L"createBuilder", described.place, [&] {
            const QrRef<QrCastable> made = kept->createBuilder(described.uid);
            builder = queryCast<QrComponentBuilder>(made.get());
        });
    return builder;
}

QrRef<QrCastable> CheckContext::object(const DescribedBuilder& described) {
    const QrPtr<QrComponentBuilder> made = builder(described);
    return made ? object(described, *made) : nullptr;
}

QrRef<QrCastable> CheckContext::object(const DescribedBuilder& described,
                                       QrComponentBuilder& builder) {
    QrRef<QrCastable> object;
    attempt(L"createObject", described.place, [&] { object = builder.createObject(); });
    return object;
}

const DescribedBuilder* CheckContext::describedAs(const QrUid& uid) {
    if (!described)
        describe();
    for (const DescribedBuilder& known : all)
        if (known.uid == uid)
            return &known;
    return nullptr;
}

DescriptionCollector::Action DescriptionCollector::process(QrCPtr<QrBuilderDescription> item) {
    // The library may have converted another interface to this pointer, so cast it once more.
    const QrCPtr<QrBuilderDescription> description =
        queryCast<QrBuilderDescription>(static_cast<const QrCastable*>(item.get()));
    if (description)
        items.push_back(description);
    else
        ++wrong;
    return Continue;
}

DescriptionCollector::Action DescriptionCollector::finished() {
    ++finishes;
    return Continue;
}

std::wstring placeOf(const std::wstring& name, const QrUid& uid) {
    return L"builder \"" + name + L"\" (" + textOf(uid) + L")";
}

ReferenceCount countOf(QrCastable& object) {
    const long first = object.newReference();
    const long second = object.newReference();
    const long third = object.release();
    const long last = object.release();
    ReferenceCount count;
    count.counted = second != first;
    count.value = count.counted ? first : 1;
    count.valid = count.counted ? second == first + 1 && third == first && last == first - 1
                                : first == 1 && third == 1 && last == 1;
    return count;
}

} // namespace Mz::Tools
