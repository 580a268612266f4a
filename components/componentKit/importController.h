// SPDX-License-Identifier: BSL-1.0
/// The process controller during an import under a policy.
///
/// It passes every call on to the host's controller, and adds three things: it keeps the errors
/// that a builder reports, for the result; it interrupts the builder when the time is over; and it
/// finds companion files by the policy.
///
/// For `importFile.h`; hosts do not need this class.
///
/// \since 0.2
#pragma once

#include "components/base/assertions.h"
#include "components/componentKit/importInput.h"
#include "components/componentKit/importPolicy.h"
#include "components/componentKit/importResult.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>
#include <vector>

namespace Mz::Kit::detail {

/// Returns the name of the file `name` in the folder of `file`; empty if `file` has no native name.
inline std::wstring besideName(const std::wstring& file, const std::wstring& name) {
    const std::optional<std::filesystem::path> path = toNativePath(file);
    if (!path)
        return {};
    const std::filesystem::path folder = path->has_parent_path() ? path->parent_path() : ".";
    // A root needs no separator: "/", and on Windows "C:", whose current folder is meant.
    return toWideName(folder).value_or(L".") + (folder.has_filename() ? L"/" : L"") + name;
}

/// Returns whether `name` is relative and has no element "..", so that it does not lead out of the
/// folder to which it is appended. The rules are those of all systems together: on Windows ".. " is
/// "..", too, and a colon begins the name of a stream or follows a drive.
inline bool staysBelow(std::wstring_view name) {
    if (name.empty() || name.find(L':') != std::wstring_view::npos)
        return false;
    for (std::size_t begin = 0; begin <= name.size();) {
        const std::size_t end = std::min(name.find_first_of(L"/\\", begin), name.size());
        const std::wstring_view element = name.substr(begin, end - begin);
        const bool dots = element.find_first_not_of(L". ") == std::wstring_view::npos;
        if ((dots && element.size() > 1) || (element.empty() && begin == 0))
            return false;
        begin = end + 1;
    }
    return true;
}

/// The process controller of the thread during one import.
class ImportController final : public QrCastImpl<ImportController, QrProcessControl> {
  public:
    /// \param host  controller of the host; may be null, and must outlive this one
    /// \param inputFile  name of the file that is imported; empty if the input is not a file
    ImportController(QrProcessControl* host, const ImportPolicy& importPolicy,
                     ImportLimits& importLimits, const std::wstring& inputFile,
                     std::vector<CompanionReport>& companionReports)
        : next(host), policy(importPolicy), limits(importLimits), file(inputFile),
          companions(companionReports) {}

    /// Returns the errors that were reported since the last call, separated by "; ".
    std::wstring takeErrors() { return std::exchange(errors, {}); }

    /// Returns whether the work was aborted through the controller.
    bool wasAborted() const { return aborted; }

    /// Also returns the interfaces of the host's controller: components may know one of them.
    QrCastable* getInterface(const QrUid& wanted) override {
        if (wanted == QrProcessControl::uid || !next)
            return QrCastImpl::getInterface(wanted);
        return next->getInterface(wanted);
    }
    bool hasInterface(const QrUid& wanted) const override {
        return wanted == QrProcessControl::uid || (next && next->hasInterface(wanted));
    }

    void* getContext() override { return next ? next->getContext() : nullptr; }
    void message(int code, const wchar_t* text) override {
        if (next)
            next->message(code, text);
    }
    bool isInterrupted() override { return limits.timeIsOver() || (next && next->isInterrupted()); }
    bool warning(int code, const wchar_t* text) override {
        const bool goesOn = !next || next->warning(code, text);
        return goesOn && !limits.timeIsOver();
    }
    bool isProgressShown() override { return next && next->isProgressShown(); }
    bool progress(float fraction, const wchar_t* text) override {
        const bool goesOn = !next || next->progress(fraction, text);
        return goesOn && !limits.timeIsOver();
    }
    bool isStatusShown() override { return next && next->isStatusShown(); }
    void status(const wchar_t* text) override {
        if (next)
            next->status(text);
    }
    bool error(int code, const wchar_t* text) override {
        errors.append(errors.empty() ? L"" : L"; ").append(textOrEmpty(text));
        return next && next->error(code, text);
    }
    bool isErrorShown() override { return !next || next->isErrorShown(); }
    void log(int code, const wchar_t* text) override {
        if (next)
            next->log(code, text);
    }
    [[noreturn]] void abort(int code, const wchar_t* text) override {
        aborted = true;
        if (next)
            next->abort(code, text);
        Assertions::throwProgramAborted("components/componentKit/importController", __LINE__);
    }

    std::wstring findFile(const wchar_t* name, const wchar_t* search,
                          const wchar_t* fallback) override {
        CompanionReport report{textOrEmpty(name), {}, {}};
        report.found = find(report, search, fallback);
        if (!report.found.empty() && isTooLarge(report.found)) {
            report.found.clear();
            report.reason = L"larger than the policy permits";
        }
        companions.push_back(report);
        return companions.back().found;
    }

  private:
    std::wstring find(CompanionReport& report, const wchar_t* search,
                      const wchar_t* fallback) const {
        if (policy.companions == Companions::none) {
            report.reason = L"the policy permits no companion files";
            return {};
        }
        const bool below = staysBelow(report.name);
        if (below && !file.empty() && next) {
            // With the folder in the name and without search paths, there is one place to look.
            const std::wstring beside = besideName(file, report.name);
            std::wstring found = next->findFile(beside.c_str(), nullptr, nullptr);
            if (!found.empty())
                return found;
        }
        if (policy.companions == Companions::anywhere)
            return next ? next->findFile(report.name.c_str(), search, fallback) : std::wstring();
        if (!below)
            report.reason = L"the policy permits only files beside the input";
        return {};
    }

    bool isTooLarge(const std::wstring& found) {
        const std::optional<std::filesystem::path> path = toNativePath(found);
        std::error_code unknown;
        const std::uintmax_t size = path ? std::filesystem::file_size(*path, unknown) : 0;
        return path && !unknown && limits.isTooLarge(size, false);
    }

    QrProcessControl* next;
    const ImportPolicy& policy;
    ImportLimits& limits;
    const std::wstring& file;
    std::vector<CompanionReport>& companions;
    std::wstring errors;
    bool aborted = false;
};

} // namespace Mz::Kit::detail
