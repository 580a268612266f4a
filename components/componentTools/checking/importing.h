// SPDX-License-Identifier: BSL-1.0
/// Tries import builders on input.
#pragma once

#include "components/componentTools/checking/checkContext.h"
#include "components/componentTools/checking/inputs.h"

#include "components/componentManager/importBuilder.h"

#include <filesystem>
#include <functional>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

namespace Mz::Tools {

/// An import builder of the library.
struct ImportingBuilder {
    const DescribedBuilder* described;
    QrPtr<QrImportBuilder> builder;
    std::wstring extension; ///< the first that it enumerates; may be empty
};

/// Returns the import builders of the library.
std::vector<ImportingBuilder> importBuilders(CheckContext& context);

/// Returns the extensions that the builder enumerates. A null extension is returned as null.
std::vector<std::unique_ptr<std::wstring>>
extensionsOf(CheckContext& context, const DescribedBuilder& described, QrImportBuilder& builder);

/// Restores the working folder and the locale, so that no call finds what an earlier one changed.
class KeptSettings {
  public:
    KeptSettings();
    ~KeptSettings();
    KeptSettings(const KeptSettings&) = delete;
    KeptSettings& operator=(const KeptSettings&) = delete;

  private:
    std::filesystem::path folder;
    std::string locale;
};

/// One input, supplied to one builder. The input counts its references.
class ImportTry {
  public:
    ImportTry(const ImportingBuilder& builder, const CheckInput& input, std::size_t number,
              const char* rule = nullptr);
    ~ImportTry();
    ImportTry(const ImportTry&) = delete;
    ImportTry& operator=(const ImportTry&) = delete;

    /// Returns the result of `canImport`; false if it throws. Does not restore the position.
    bool canImport(CheckContext& context);
    /// Returns whether the position can be restored, and restores it, as importers do.
    bool restore();
    /// Calls `import` with the position restored. Returns whether it returned an object.
    bool import(CheckContext& context);

    /// Calls `canImport` and, if it accepts the input, `import`, without the guard of a context.
    void importUnguarded();

    const QrRef<QrCastable>& object() const { return imported; }
    /// Returns whether the builder took references to the input and kept them.
    bool isKept() const;
    /// Returns the input for messages.
    const std::wstring& detail() const { return name; }
    /// Returns the value that repeats this try.
    std::string reproduce(const CheckContext& context) const;

  private:
    KeptSettings settings;
    const ImportingBuilder& importing;
    std::size_t number;
    const char* rule;
    std::wstring name, path;
    std::istringstream stream;
    QrPtr<QrBufferedIO> io;
    QrRef<QrCastable> imported;
};

/// Returns the value of `CheckOptions::reproduce` for one input.
std::string reproduction(const char* rule, const DescribedBuilder& described, std::size_t number,
                         const CheckTask& task);

/// Calls `use` with the number of each input of the task: `count` inputs, then random ones until
/// the time is over; or the one input that the task names.
void forEachNumber(const CheckTask& task, std::size_t count,
                   const std::function<void(std::size_t)>& use);

} // namespace Mz::Tools
