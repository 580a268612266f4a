// SPDX-License-Identifier: BSL-1.0
/// The rules of the description. Each function asks the library anew, so that the rules do not
/// depend on one another.
#include "components/componentTools/checking/rules.h"

#include "components/componentManager/nativeText.h"
#include "components/componentTools/uidText.h"

#include <algorithm>
#include <array>
#include <set>
#include <tuple>

namespace Mz::Tools::Rules {

namespace {

using Words = std::tuple<std::uint32_t, std::uint32_t, std::uint32_t, std::uint32_t>;

Words wordsOf(const QrUid& uid) {
    return {uid.w0, uid.w1, uid.w2, uid.w3};
}

/// One answer of a description, with its name.
using Answers = std::vector<std::pair<std::wstring, std::wstring>>;

void add(Answers& answers, const std::wstring& name, const wchar_t* text) {
    std::wstring& answer = answers.emplace_back(name, L"null").second;
    if (text)
        answer.assign(L"\"").append(text).append(L"\"");
}

void addBuilder(Answers& answers, std::size_t index, const QrBuilderDescription& item) {
    const std::wstring builder = L" of builder " + std::to_wstring(index + 1);
    answers.emplace_back(L"getUid" + builder, textOf(item.getUid()));
    add(answers, L"getName" + builder, item.getName());
    add(answers, L"getLabel" + builder, item.getLabel());
    add(answers, L"getText" + builder, item.getText());
    answers.emplace_back(L"getNumber" + builder, std::to_wstring(item.getNumber()));
    answers.emplace_back(L"getFlag" + builder, item.getFlag() ? L"true" : L"false");
}

/// Returns everything that the description says, in the order of the manager's calls.
Answers answersOf(QrComponentDescription& description) {
    Answers answers;
    answers.emplace_back(L"getComponentValue", std::to_wstring(description.getComponentValue()));
    add(answers, L"getComponentText", description.getComponentText());
    add(answers, L"getComponentLabel", description.getComponentLabel());
    answers.emplace_back(L"getBuilderCount", std::to_wstring(description.getBuilderCount()));
    DescriptionCollector collector;
    description.enumerateBuilders(collector);
    answers.emplace_back(L"enumerateBuilders", std::to_wstring(collector.items.size()));
    for (std::size_t index = 0; index < collector.items.size(); ++index)
        addBuilder(answers, index, *collector.items[index]);
    return answers;
}

/// Returns the first difference as a sentence; empty if there is none. The number of builders is an
/// answer before theirs.
std::wstring difference(const Answers& first, const Answers& later) {
    for (std::size_t index = 0; index < std::min(first.size(), later.size()); ++index)
        if (first[index] != later[index])
            return first[index].first + L" answers " + first[index].second + L" first and " +
                   later[index].second + L" later";
    return {};
}

/// Ends an enumeration at its first element, with a result of its own.
class StoppingEnumerator final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    explicit StoppingEnumerator(Action action) : result(action) {}
    Action process(QrCPtr<QrBuilderDescription>) override {
        ++calls;
        return result;
    }
    Action finished() override {
        ++finishes;
        return Continue;
    }
    int calls = 0, finishes = 0;

  private:
    Action result;
};

/// Continues to the end, and then has a result of its own.
class LastWordEnumerator final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    static constexpr Action lastWord = static_cast<Action>(77);
    Action process(QrCPtr<QrBuilderDescription>) override { return Continue; }
    Action finished() override {
        ++finishes;
        return lastWord;
    }
    int finishes = 0;
};

} // namespace

void answers(CheckContext& context) {
    QrGetComponentDescriptionFunction* const entry = context.entryPoint();
    if (!entry) {
        context.report({}, L"the entry point is not a function of this library. Define "
                           L"QrGetComponentDescription in the library itself.");
        return;
    }
    QrComponentDescription* const description = context.description();
    if (!context.descriptionFailure().empty())
        return context.report({}, context.descriptionFailure() +
                                      L". Hosts drop all builders of the library. Describe "
                                      L"constants, and do nothing that can fail.");
    if (!description)
        context.report({}, L"the entry point returns null or an object without "
                           L"QrComponentDescription. Return the description of the library.");
    if (!description)
        return;
    DescriptionCollector collector;
    context.attempt(L"enumerateBuilders", {}, [&] { description->enumerateBuilders(collector); });
    if (collector.wrong)
        context.report({},
                       L"enumerateBuilders passes " + std::to_wstring(collector.wrong) +
                           (collector.wrong == 1 ? L" element that is" : L" elements that are") +
                           L" null or without QrBuilderDescription. Hosts drop all its "
                           L"builders. Pass one description for each builder.");
    for (const DescribedBuilder& builder : context.builders())
        context.messages().builder({builder.uid, builder.name});
}

namespace {

/// Returns the exception of a call as a finding; empty if the call was skipped.
std::wstring thrownBy(const CheckContext& context, const wchar_t* call, const wchar_t* remedy) {
    const std::wstring& exception = context.lastException();
    if (exception.empty())
        return {};
    return call + (L" throws: " + exception + L". ") + remedy;
}

/// Calls the entry point a few times, as several hosts would. Returns what is wrong with the
/// references; empty if nothing is.
std::wstring referenceFault(CheckContext& context, QrGetComponentDescriptionFunction* entry) {
    ReferenceCount first;
    for (int round = 0; round < 3; ++round) {
        QrCastable *object = nullptr, *next = nullptr;
        if (!context.attempt(L"the entry point", {}, [&] {
                object = entry();
                next = entry();
            }))
            return thrownBy(context, L"the entry point", L"Return a description at every call.");
        if (!object || !next)
            return {};
        ReferenceCount count;
        const bool same = next == object;
        if (!context.attempt(L"the release of the description", {}, [&] {
                const QrPtr<QrCastable> kept(object), again(next);
                count = countOf(*again);
                count.value -= same ? 2 : 1; // Those of `kept` and `again`.
            }))
            return thrownBy(context, L"the release of the description", L"Let no release throw.");
        if (round == 0)
            first = count;
        // The classes from which the object is derived are all that is left of it.
        if (count.counted != first.counted)
            return L"the last release destroys the description, but the entry point returns it "
                   L"again. Return an uncounted static object, or a new one at each call.";
        if (count.counted && count.value > (same ? first.value : 0))
            return L"each call of the entry point leaves a reference that nobody releases. Return "
                   L"a new object without a reference, or one that the library owns, without "
                   L"taking a reference for the caller.";
    }
    return {};
}

} // namespace

void descriptionCounted(CheckContext& context) {
    // Not held: the rules after this one unload the library.
    std::wstring loaderError;
    const platform::Module module = context.load(loaderError);
    QrGetComponentDescriptionFunction* const entry =
        module ? CheckContext::entryPointOf(module) : nullptr;
    std::wstring fault;
    if (entry)
        fault = referenceFault(context, entry);
    if (!fault.empty())
        context.report({}, fault);
    context.attempt(L"unloading the library", {}, [&] { platform::unloadLibrary(module); });
}

void descriptionStable(CheckContext& context) {
    QrGetComponentDescriptionFunction* const entry = context.entryPoint();
    QrComponentDescription* const description = context.description();
    if (!entry || !description)
        return;
    std::wstring found;
    context.attempt(L"enumerateBuilders", {}, [&] {
        const Answers first = answersOf(*description);
        found = difference(first, answersOf(*description));
        if (!found.empty())
            return;
        QrPtr<QrCastable> other = entry();
        QrPtr<QrComponentDescription> later = queryCast<QrComponentDescription>(other.get());
        if (later)
            found = difference(first, answersOf(*later));
        else
            found = L"the entry point returns null later";
        static_cast<void>(other.detach());
        static_cast<void>(later.detach());
    });
    if (!found.empty())
        context.report({}, found + L". Describe the same at every call: hosts store the first "
                                   L"answers.");
}

void enumerationObeys(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!description || context.builders().empty())
        return;
    constexpr auto own = static_cast<QrEnum::Action>(42);
    StoppingEnumerator stopping(own);
    LastWordEnumerator lastWord;
    QrEnum::Action stopped{}, ended{};
    if (!context.attempt(L"enumerateBuilders", {}, [&] {
            stopped = description->enumerateBuilders(stopping);
            ended = description->enumerateBuilders(lastWord);
        }))
        return;
    if (stopping.calls != 1 || stopping.finishes != 0 || stopped != own)
        context.report({}, L"enumerateBuilders does not stop when process asks it to. Return the "
                           L"result of process at once if it is not Continue.");
    else if (lastWord.finishes != 1 || ended != LastWordEnumerator::lastWord)
        context.report({}, L"enumerateBuilders does not end with finished. Call it once after the "
                           L"last element and return its result.");
}

void countTrue(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!description)
        return;
    unsigned int announced = 0;
    DescriptionCollector collector;
    if (!context.attempt(L"getBuilderCount", {}, [&] {
            announced = description->getBuilderCount();
            description->enumerateBuilders(collector);
        }))
        return;
    const std::size_t passed = collector.items.size() + collector.wrong;
    if (announced != passed)
        context.report({}, L"getBuilderCount returns " + std::to_wstring(announced) +
                               L", but enumerateBuilders passes " + std::to_wstring(passed) +
                               (passed == 1 ? L" builder" : L" builders") +
                               L". Return the number of builders.");
}

void textsNotNull(CheckContext& context) {
    const auto check = [&](const std::wstring& place, const wchar_t* name, const wchar_t* text) {
        if (!text)
            context.report(place, name + std::wstring(L" returns null. Return an empty text."));
    };
    QrComponentDescription* const description = context.description();
    if (!description)
        return;
    context.attempt(L"the texts of the description", {}, [&] {
        check({}, L"getComponentLabel", description->getComponentLabel());
        check({}, L"getComponentText", description->getComponentText());
    });
    for (const DescribedBuilder& builder : context.builders())
        context.attempt(L"the texts of the description", builder.place, [&] {
            check(builder.place, L"getName", builder.description->getName());
            check(builder.place, L"getLabel", builder.description->getLabel());
            check(builder.place, L"getText", builder.description->getText());
        });
}

void libraryLabel(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!description)
        return;
    context.attempt(L"the texts of the description", {}, [&] {
        const wchar_t* const label = description->getComponentLabel();
        if (label && !*label) // Null is the finding of another rule.
            context.report({}, L"its label is empty. Name the library for people.");
    });
}

void uidsNotNil(CheckContext& context) {
    for (const DescribedBuilder& builder : context.builders())
        if (builder.uid == QrUid{})
            context.report(builder.place, L"its uid is nil. `mzcomponents uid` prints a new one.");
}

void uidsUnique(CheckContext& context) {
    std::set<Words> known, told;
    for (const DescribedBuilder& builder : context.builders())
        if (!known.insert(wordsOf(builder.uid)).second && told.insert(wordsOf(builder.uid)).second)
            context.report(builder.place, L"another builder of this library has the same uid, so "
                                          L"that hosts find only one of them. Give each its own.");
}

void uidsExact(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!description)
        return;
    std::set<Words> known;
    for (const DescribedBuilder& builder : context.builders())
        known.insert(wordsOf(builder.uid));
    for (const DescribedBuilder& builder : context.builders()) {
        const std::array<std::uint32_t QrUid::*, 4> words{&QrUid::w0, &QrUid::w1, &QrUid::w2,
                                                          &QrUid::w3};
        for (const auto word : words) {
            QrUid almost = builder.uid;
            almost.*word ^= 1;
            if (known.contains(wordsOf(almost)))
                continue;
            QrPtr<QrComponentBuilder> made;
            context.attempt(L"createBuilder", builder.place, [&] {
                const auto object = description->createBuilder(almost);
                made = queryCast<QrComponentBuilder>(object.get());
            });
            if (!made)
                continue;
            context.report(builder.place, L"createBuilder returns a builder for the uid " +
                                              textOf(almost) +
                                              L", which the library does not describe. Compare "
                                              L"all four words, and return null for others.");
            break;
        }
    }
}

} // namespace Mz::Tools::Rules
