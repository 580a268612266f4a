// SPDX-License-Identifier: BSL-1.0
/// What the rules work with: the library, its description and its builders, and a guard around each
/// call into the library.
#pragma once

#include "components/componentTools/checking/checkMessages.h"

#include "components/componentManager/componentImp.h"
#include "components/platform/platform.h"

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// A described builder.
struct DescribedBuilder {
    std::size_t index = 0;
    QrUid uid{};
    std::wstring name;
    std::wstring place; ///< name and uid, for findings
    QrCPtr<QrBuilderDescription> description;
};

/// The library that is checked, in the process that checks it.
///
/// Each call into the library goes through `attempt`, so that the parent process knows what the
/// library was doing when the process ended, and so that no exception reaches a rule.
class CheckContext {
  public:
    CheckContext(const CheckTask& task, CheckSender& sender);
    CheckContext(const CheckContext&) = delete;
    CheckContext& operator=(const CheckContext&) = delete;

    const CheckTask& task() const { return work; }

    /// Starts a rule: its findings follow.
    void begin(const CheckRule& rule);

    /// Reports a finding of the rule that is being checked.
    void report(const std::wstring& place, const std::wstring& sentence,
                const std::string& reproduce = {});

    /// Calls the library.
    ///
    /// A call that ended an earlier process is skipped. An exception that hosts do not expect
    /// becomes a finding of the rule `exceptions-allowed`, unless it is one of the description;
    /// every exception ends here.
    /// \param what       the function that is called, for messages
    /// \param place      the builder, or empty
    /// \param detail     the input, or empty; does not identify the call
    /// \return whether the call returned
    bool attempt(const std::wstring& what, const std::wstring& place,
                 const std::function<void()>& call, const std::wstring& detail = {},
                 const std::string& reproduce = {});

    /// Sets what `attempt` does between its message to the parent process and the call.
    void beforeCalls(std::function<void()> work) { prepare = std::move(work); }

    /// Returns the text of the exception that ended the last `attempt`; empty if none did.
    const std::wstring& lastException() const { return exception; }
    /// Returns whether a call ended an earlier process, so that it must not be repeated.
    bool isAvoided(const wchar_t* what, const std::wstring& place) const;

    /// Reports that a class of stored objects has no builder in this library.
    void reportMissingClass(const std::wstring& place, const std::wstring& sentence,
                            const QrUid& missingClass);

    /// Returns whether that exception was one of a stream.
    bool lastWasStreamException() const { return streamException; }

    /// Loads the library. Returns null, and sets `loaderError`, if that fails. Unload it.
    platform::Module load(std::wstring& loaderError);

    /// Returns the entry point of a loaded library, or null.
    static QrGetComponentDescriptionFunction* entryPointOf(platform::Module module);

    /// Loads the library for the rest of this process, unless that was done before.
    QrGetComponentDescriptionFunction* entryPoint();

    /// Returns why the library could not describe itself: the text of an exception, or empty.
    const std::wstring& descriptionFailure() const { return failure; }

    /// Returns whether the rule that is being checked has a finding.
    bool hasFinding() const { return found; }

    /// Returns an exported function of the library, or null.
    void* function(const char* name);

    /// Returns the description, which is kept for the rest of this process; null if there is none.
    QrComponentDescription* description();

    /// Returns the builders that the description enumerates; only one if the task names one.
    const std::vector<DescribedBuilder>& builders();

    /// Return what the library makes; null if it fails.
    QrPtr<QrComponentBuilder> builder(const DescribedBuilder& described);
    QrRef<QrCastable> object(const DescribedBuilder& described);
    QrRef<QrCastable> object(const DescribedBuilder& described, QrComponentBuilder& builder);

    /// Returns the described builder with that uid, or null. Also finds those that the task
    /// excludes, because objects may contain theirs.
    const DescribedBuilder* describedAs(const QrUid& uid);

    CheckSender& messages() { return sender; }

  private:
    void noteException(const std::wstring& what, const std::wstring& place);
    void describe();

    const CheckTask& work;
    CheckSender& sender;
    const CheckRule* current = nullptr;
    std::function<void()> prepare;
    std::wstring exception, failure;
    bool streamException = false;
    std::vector<std::wstring> reported; ///< unexpected exceptions, each once
    bool held = false, described = false, found = false;
    platform::Module library = nullptr;
    QrComponentDescription* kept = nullptr;
    std::vector<DescribedBuilder> all;     ///< what the description enumerates
    std::vector<DescribedBuilder> checked; ///< those that the task wants
};

/// Collects what a description enumerates. Elements that are not descriptions of builders are
/// counted and dropped.
class DescriptionCollector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override;
    Action finished() override;

    std::vector<QrCPtr<QrBuilderDescription>> items;
    std::size_t wrong = 0;    ///< elements that are null or of another interface
    std::size_t finishes = 0; ///< calls of `finished`
};

/// Returns a builder for findings: its name, and its uid in parentheses.
std::wstring placeOf(const std::wstring& name, const QrUid& uid);

/// Returns the number of references of an object, by the results of `newReference` and `release`.
struct ReferenceCount {
    bool counted = false; ///< the object counts references
    bool valid = true;    ///< the two functions agree
    long value = 0;       ///< the number of references, if it counts
};
ReferenceCount countOf(QrCastable& object);

} // namespace Mz::Tools
