// SPDX-License-Identifier: BSL-1.0
/// Imports under a policy, with a result that says which builder did what, and why.
///
///     Mz::Kit::ImportPolicy policy;
///     policy.byteLimit = 50'000'000;
///     const Mz::Kit::ImportResult result = Mz::Kit::importFile(L"mesh", "model.obj", policy);
///     if (!result)
///         std::cerr << Mz::toNarrow(Mz::Kit::describe(result), '?') << '\n';
///
/// The builders, their order and the way in which one is chosen are those of
/// `QrBaseImporter::import`, with three exceptions. A builder that the policy denies is not loaded.
/// Each builder is asked once. A builder that throws when it is asked counts as one that declines,
/// and one that throws when it imports as one that makes no object.
///
/// The manager's builders are enumerated here, and not by the importer: its enumeration loads the
/// library of each builder before a policy can see it.
///
/// \since 0.2
#pragma once

#include "components/componentKit/controller.h"
#include "components/componentKit/importController.h"
#include "components/componentKit/importInput.h"
#include "components/componentKit/importPolicy.h"
#include "components/componentKit/importResult.h"
#include "components/componentKit/manager.h"
#include "components/componentKit/names.h"
#include "components/componentManager/importer.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cxxabi.h>
#include <exception>
#include <filesystem>
#include <fstream>
#include <istream>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>
#include <vector>

namespace Mz::Kit {

/// The import builders of one builder name, for the functions below. An importer or the name itself
/// converts to it. It must not outlive either.
class ImportFamily {
  public:
    /// Takes the builder name; not null.
    ImportFamily(const wchar_t* builderName) : name(builderName) {}
    /// Takes the builder name of an importer.
    ImportFamily(const QrImporter& importer) : name(importer.getBuilderName()) {}
    /// Takes the builder name and the default search path of an importer.
    ImportFamily(const QrBaseImporter& importer)
        : name(importer.getBuilderName()), search(importer.getDefaultSearch()) {}

    /// Returns the builder name.
    const wchar_t* builderName() const { return textOrEmpty(name); }
    /// Returns the directories to search after those of the caller, separated by ';', or null.
    const wchar_t* defaultSearch() const { return search; }

  private:
    const wchar_t* name;
    const wchar_t* search = nullptr;
};

namespace detail {

/// Returns the reason of the exception that is being handled, for people.
inline std::wstring reasonOfException() {
    try {
        throw;
    } catch (const ExBase& failure) {
        return displayText(failure.getReason());
    } catch (const std::exception& failure) {
        return displayText(failure.what());
    } catch (...) {
        return L"an exception of an unknown type";
    }
}

/// One import: asks the builders of the family in turn, and notes their answers in the result.
class ImportWalk {
  public:
    /// \param bytes  stream on `LimitedInput`, positioned at its start
    ImportWalk(ImportResult& importResult, std::istream& bytes, const std::wstring& builderHint,
               ImportController& importController, ImportLimits& importLimits)
        : result(importResult), stream(bytes), io(&bytes), hint(builderHint),
          controller(importController), limits(importLimits) {}

    void run(const ImportFamily& family, const ImportPolicy& policy) {
        list(family, policy);
        if (limits.firstExceeded() == ImportLimits::Exceeded::none)
            askAll(policy.byContent);
        // A builder may take a limit for the end of the input, and return half an object.
        switch (limits.firstExceeded()) {
        case ImportLimits::Exceeded::bytes: end(ImportEnd::tooLarge); break;
        case ImportLimits::Exceeded::time: end(ImportEnd::timeOver); break;
        case ImportLimits::Exceeded::none: break;
        }
    }

  private:
    /// Lists the builders of the family, without loading any.
    void list(const ImportFamily& family, const ImportPolicy& policy) {
        forEachBuilder([&](const QrBuilderDescription& builder) {
            if (std::wstring_view(textOrEmpty(builder.getName())) != family.builderName())
                return;
            const std::wstring label = textOrEmpty(builder.getLabel());
            result.builders.push_back(
                {builder.getUid(),
                 label.empty() ? L"(no label)" : label,
                 policy.allows(builder.getUid()) ? BuilderAnswer::notAsked : BuilderAnswer::denied,
                 {}});
            builders.push_back({QrCPtr<QrBuilderDescription>(&builder), nullptr, nullptr});
        });
    }

    /// Asks the builders that list the extension, and then the others if `byContent`.
    void askAll(bool byContent) {
        for (const bool named : {true, false})
            for (std::size_t index = 0; index < builders.size() && (named || byContent); ++index)
                if (isNext(index, named) && ask(index))
                    return;
    }

    /// Returns whether the builder `index` is to be asked in this pass.
    bool isNext(std::size_t index, bool named) {
        BuilderReport& report = result.builders[index];
        if (!named)
            return report.answer == BuilderAnswer::declinedByName;
        if (report.answer == BuilderAnswer::denied || !load(index))
            return false;
        const bool listed = contained(
            report, false, [&] { return listsExtension(*builders[index].importing, report); });
        if (!listed && report.answer == BuilderAnswer::notAsked)
            report.answer = BuilderAnswer::declinedByName;
        return listed;
    }

    /// Loads the builder `index` and returns whether it is an import builder.
    bool load(std::size_t index) {
        BuilderReport& report = result.builders[index];
        Candidate& candidate = builders[index];
        contained(report, 0, [&] {
            candidate.builder = candidate.description->getBuilder();
            candidate.importing = queryCast<QrImportBuilder>(candidate.builder.get());
            return 0;
        });
        if (!candidate.importing)
            report.answer = BuilderAnswer::notLoaded;
        return bool(candidate.importing);
    }

    /// Asks the builder `index`, and lets it import if it accepts. Returns whether the import ends.
    bool ask(std::size_t index) {
        BuilderReport& report = result.builders[index];
        const QrImportBuilder& builder = *builders[index].importing;
        controller.takeErrors();
        const bool accepted = contained(report, false, [&] {
            return builder.canImport(&io, result.name.c_str(), hint.c_str());
        });
        rewind();
        if (limits.timeIsOver() || limits.firstExceeded() != ImportLimits::Exceeded::none) {
            report.answer = BuilderAnswer::failedToAnswer;
            return true;
        }
        if (!accepted) {
            if (report.answer != BuilderAnswer::failedToAnswer)
                report.answer = BuilderAnswer::declinedByContent;
            return false;
        }
        import(builder, report);
        return true;
    }

    void import(const QrImportBuilder& builder, BuilderReport& report) {
        controller.takeErrors();
        result.object = contained(report, QrRef<QrCastable>(), [&] {
            return builder.import(&io, result.name.c_str(), hint.c_str());
        });
        const std::wstring errors = controller.takeErrors();
        if (!errors.empty()) // They say more than the exception that may follow them.
            report.reason = errors;
        report.answer = result.object ? BuilderAnswer::took : BuilderAnswer::failed;
        result.end = result.object ? ImportEnd::imported : ImportEnd::failed;
    }

    /// Ends the import without an object.
    void end(ImportEnd why) {
        result.end = why;
        result.object = nullptr;
        for (BuilderReport& report : result.builders)
            if (report.answer == BuilderAnswer::took)
                report.answer = BuilderAnswer::failed;
    }

    /// Returns the result of `work`, or `otherwise` if it throws; the reason is noted then. Lets
    /// the exceptions of `QrProcessControl::abort` pass: the host has asked for them.
    template <class Result, class Work>
    Result contained(BuilderReport& report, Result otherwise, Work&& work) {
        try {
            return work();
        } catch (const abi::__forced_unwind&) { // The thread ends, which must not be prevented.
            throw;
        } catch (...) {
            if (controller.wasAborted())
                throw;
            report.answer = BuilderAnswer::failedToAnswer;
            report.reason = reasonOfException();
            return otherwise;
        }
    }

    /// Returns whether the builder lists the extension of the input.
    bool listsExtension(const QrImportBuilder& builder, BuilderReport& report) const {
        if (result.name.empty())
            return true; // Without a name, only the content decides.
        class Extensions final : public QrEnumerator<const wchar_t*> {
          public:
            explicit Extensions(std::wstring_view extension) : wanted(extension) {}
            Action process(const wchar_t* extension) override {
                return textOrEmpty(extension) == wanted ? Stop : Continue;
            }

          private:
            std::wstring_view wanted;
        };
        const std::size_t dot = result.name.find_last_of(L'.');
        Extensions extensions(dot == std::wstring::npos
                                  ? std::wstring_view()
                                  : std::wstring_view(result.name).substr(dot + 1));
        const QrEnum::Action action = builder.enumerateExtensions(extensions);
        if (action != QrEnum::Stop && action != QrEnum::Continue) {
            report.answer = BuilderAnswer::failedToAnswer;
            report.reason = L"its extensions cannot be listed";
        }
        return action == QrEnum::Stop;
    }

    /// Returns to the start, whatever state the builder left the stream in.
    void rewind() {
        stream.clear();
        stream.seekg(0);
    }

    /// A builder of the family. Its library is loaded when it is asked.
    struct Candidate {
        QrCPtr<QrBuilderDescription> description;
        QrCRefPtr<QrComponentBuilder> builder;
        QrCPtr<QrImportBuilder> importing;
    };

    ImportResult& result;
    std::istream& stream;
    QrInBuffer io;
    const std::wstring& hint;
    ImportController& controller;
    ImportLimits& limits;
    std::vector<Candidate> builders;
};

/// Imports the input of `source`. `result` has the name, and the file if the input is one.
inline void importInput(const ImportFamily& family, LimitedInput::Source source, std::uint64_t size,
                        const std::wstring& hint, const ImportPolicy& policy, ImportLimits& limits,
                        ImportResult& result) {
    limits.isTooLarge(size);
    LimitedInput input(std::move(source), size, limits);
    std::istream stream(&input);
    const std::wstring file = result.file;
    ImportController controller(QrGetProcessController(), policy, limits, file, result.companions);
    const ControllerScope installed(controller, ControllerScope::thread);
    ImportWalk(result, stream, hint, controller, limits).run(family, policy);
}

} // namespace detail

/// Imports the file `file` through the import builders of `family`, under `policy`.
///
/// The process controller of the thread finds the file, in `search` and then in the importer's
/// default search path, and receives all messages. During the import the thread has a controller
/// that passes everything on to it.
///
/// A builder that asks the controller for a companion file by a relative name is given the one in
/// the folder of the imported file first.
///
///     const auto result = Mz::Kit::importFile(L"mesh", "model.obj");
///
/// \param family  the importer, or the builder name
/// \param search  directories to search, separated by ';', or null
/// \return the object, or why there is none, and the answer of each builder
/// \throws QrComponentManagerEx::ExBadCast  if there is no process controller
/// \throws std::system_error  if the name is not valid text in this locale
/// \throws what `QrProcessControl::abort` throws, if a builder aborts the import. No other
///     exception of a builder
inline ImportResult importFile(const ImportFamily& family, const std::filesystem::path& file,
                               const ImportPolicy& policy = {}, const wchar_t* search = nullptr) {
    detail::ImportLimits limits(policy.byteLimit, policy.timeLimit);
    ImportResult result;
    result.name = wideName(file);
    const auto controller =
        QrPtr<QrProcessControl>::adopt(safeCast<QrProcessControl>(QrGetProcessController()));
    result.file = controller->findFile(result.name.c_str(), search, family.defaultSearch());
    result.end = result.file.empty() ? ImportEnd::notFound : ImportEnd::notOpened;
    const std::optional<std::filesystem::path> path = toNativePath(result.file);
    std::error_code unknown;
    if (result.file.empty() || !path || std::filesystem::is_directory(*path, unknown))
        return result;
    std::ifstream stream(*path, std::ios::binary);
    const std::streamoff size = stream.seekg(0, std::ios::end).tellg();
    if (!stream || size < 0)
        return result;
    result.end = ImportEnd::declined;
    const auto read = [&](std::uint64_t offset, std::span<char> block) {
        stream.clear();
        stream.seekg(static_cast<std::streamoff>(offset));
        stream.read(block.data(), static_cast<std::streamsize>(block.size()));
        if (stream.bad())
            throw std::ios_base::failure("the file cannot be read"); // for the stream above
        return static_cast<std::size_t>(stream.gcount());
    };
    detail::importInput(family, read, static_cast<std::uint64_t>(size),
                        search ? result.name : std::wstring(), policy, limits, result);
    return result;
}

/// Imports `bytes`, which are no file, through the import builders of `family`, under `policy`: an
/// entry of an archive, an answer of a server, or data of the clipboard.
///
/// The function is otherwise as `importFile`. The input has no folder, so companion files come from
/// the host's controller alone; with `Companions::beside` there are none. A host that has them in
/// the archive, too, overrides `findFile` in its controller, and returns the name of a copy.
///
/// \param bytes  the input, which must not change during the call
/// \param name  name of the input, of which builders take the extension; may be empty
inline ImportResult importFrom(const ImportFamily& family, std::span<const std::byte> bytes,
                               const std::wstring& name, const ImportPolicy& policy = {}) {
    detail::ImportLimits limits(policy.byteLimit, policy.timeLimit);
    ImportResult result;
    result.name = name;
    const auto read = [&](std::uint64_t offset, std::span<char> block) {
        const std::size_t from = std::min<std::uint64_t>(offset, bytes.size());
        const std::size_t count = std::min(block.size(), bytes.size() - from);
        std::copy_n(reinterpret_cast<const char*>(bytes.data()) + from, count, block.data());
        return count;
    };
    detail::importInput(family, read, bytes.size(), {}, policy, limits, result);
    return result;
}

/// Imports the bytes of a text, as the other overload.
inline ImportResult importFrom(const ImportFamily& family, std::string_view bytes,
                               const std::wstring& name, const ImportPolicy& policy = {}) {
    return importFrom(family, std::as_bytes(std::span(bytes)), name, policy);
}

} // namespace Mz::Kit
