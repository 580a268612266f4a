// SPDX-License-Identifier: BSL-1.0
/// The result of an import under a policy: the object, who read it, and who did not, and why (see
/// `importFile.h`).
///
/// \since 0.2
#pragma once

#include "components/componentManager/castable.h"
#include "components/componentManager/reference.h"
#include "components/componentManager/uid.h"

#include <algorithm>
#include <string>
#include <vector>

namespace Mz::Kit {

/// How an import ended.
enum class ImportEnd {
    imported,  ///< there is an object
    notFound,  ///< the process controller found no such file
    notOpened, ///< the file cannot be opened
    tooLarge,  ///< the input exceeds the byte limit
    timeOver,  ///< the time limit was over
    failed,    ///< a builder accepted the input, but made no object of it
    declined   ///< no builder accepted the input
};

/// What one import builder did.
enum class BuilderAnswer {
    notAsked,          ///< the import ended before it was asked
    denied,            ///< the policy does not permit it
    notLoaded,         ///< its library could not be loaded, or it is not an import builder
    declinedByName,    ///< it does not list the extension
    declinedByContent, ///< its `canImport` returned false
    failedToAnswer,    ///< it threw an exception or reported a failure when it was asked
    failed,            ///< it accepted the input, but made no object of it
    took               ///< it made the object
};

/// One import builder of the family and its answer.
struct BuilderReport {
    QrUid uid{};                                    ///< identity of the builder, for a policy
    std::wstring label;                             ///< label of the builder, for people
    BuilderAnswer answer = BuilderAnswer::notAsked; ///< what it did
    /// The errors that the builder reported, or the reason of its exception; empty if there are
    /// none.
    std::wstring reason;
};

/// One companion file for which a builder asked.
struct CompanionReport {
    std::wstring name;   ///< name for which the builder asked
    std::wstring found;  ///< name of the file; empty if the builder was given none
    std::wstring reason; ///< why the builder was given none, if the policy is the reason
};

/// The result of an import under a policy.
struct ImportResult {
    ImportEnd end = ImportEnd::declined; ///< how the import ended

    /// The imported object; null unless `end` is `imported`. Release it before the component
    /// manager is destroyed.
    QrRef<QrCastable> object;

    /// The name of the input, as the caller passed it.
    std::wstring name;
    /// The name of the file that was read; empty if none was found or the input is not a file.
    std::wstring file;

    /// All import builders of the family, in the order of the component manager. Empty if the input
    /// was rejected before builders were looked up (`notFound`, `notOpened`).
    std::vector<BuilderReport> builders;

    /// The companion files for which builders asked, in order.
    std::vector<CompanionReport> companions;

    /// Returns whether there is an object.
    explicit operator bool() const { return end == ImportEnd::imported; }

    /// Returns the builder that accepted the input (`took` or `failed`), or null. Valid as long as
    /// `builders` does not change.
    const BuilderReport* decider() const {
        const auto found = std::find_if(builders.begin(), builders.end(), [](const auto& builder) {
            return builder.answer == BuilderAnswer::took || builder.answer == BuilderAnswer::failed;
        });
        return found == builders.end() ? nullptr : &*found;
    }
};

/// Returns `end` as text for people, without a full stop.
inline const wchar_t* describe(ImportEnd end) {
    switch (end) {
    case ImportEnd::imported: return L"imported";
    case ImportEnd::notFound: return L"there is no such file";
    case ImportEnd::notOpened: return L"the file cannot be opened";
    case ImportEnd::tooLarge: return L"larger than the policy permits";
    case ImportEnd::timeOver: return L"the import took longer than the policy permits";
    case ImportEnd::failed: return L"the builder that accepted it made no object";
    case ImportEnd::declined: break;
    }
    return L"no builder accepted it";
}

/// Returns `answer` as text for people, without a full stop.
inline const wchar_t* describe(BuilderAnswer answer) {
    switch (answer) {
    case BuilderAnswer::notAsked: return L"not asked";
    case BuilderAnswer::denied: return L"not asked: the policy denies it";
    case BuilderAnswer::notLoaded: return L"not asked: it could not be loaded";
    case BuilderAnswer::declinedByName: return L"declined by name";
    case BuilderAnswer::declinedByContent: return L"declined by content";
    case BuilderAnswer::failedToAnswer: return L"failed when it was asked";
    case BuilderAnswer::failed: return L"accepted it, but made no object";
    case BuilderAnswer::took: break;
    }
    return L"took it";
}

/// Returns the whole result as lines for people: the input and how its import ended, each builder,
/// and each companion file. The last line has no line end.
inline std::wstring describe(const ImportResult& result) {
    std::wstring text = result.name + L": " + describe(result.end);
    const auto reason = [](const std::wstring& why) { return why.empty() ? L"" : L": " + why; };
    for (const BuilderReport& builder : result.builders)
        text += L"\n  " + builder.label + L": " + describe(builder.answer) + reason(builder.reason);
    for (const CompanionReport& companion : result.companions)
        text +=
            L"\n  companion " + companion.name + L": " +
            (companion.found.empty() ? L"not found" + reason(companion.reason) : companion.found);
    return text;
}

} // namespace Mz::Kit
