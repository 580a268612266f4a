// SPDX-License-Identifier: BSL-1.0
/// Compares the interfaces with which a component was compiled with those of its host.
#pragma once

#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/inspecting/interfaceTables.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace Mz::Tools {

/// Returns the verdict `otherInterface`, with the first difference, if an interface that both have
/// is not the same; else `std::nullopt`. Interfaces are the same if they have the same uid.
std::optional<Finding> interfaceDifference(const std::vector<InterfaceTable>& component,
                                           const std::vector<InterfaceTable>& host);

/// The interfaces of a host: of its program and its libMZcomponentManager, which are those of this
/// process, and of the programs and libraries `hosts`. The files are read once, when the first
/// component with fingerprints is compared. Functions may be called by several threads at once.
class HostInterfaces {
  public:
    explicit HostInterfaces(std::vector<std::filesystem::path> hosts) : files(std::move(hosts)) {}
    HostInterfaces(const HostInterfaces&) = delete;
    HostInterfaces& operator=(const HostInterfaces&) = delete;

    /// Returns the files that a component is compared with.
    static std::vector<std::filesystem::path>
    filesOf(const std::vector<std::filesystem::path>& hosts);

    /// Returns `interfaceDifference` of the component and the first file from which it differs.
    /// \param component  the file of a component
    std::optional<Finding> difference(const std::filesystem::path& component) const;
    std::optional<Finding> difference(FileBytes& component) const;

  private:
    /// \param content  the sections of a component with its fingerprints
    std::optional<Finding> differenceOf(const std::string& content) const;
    void read() const;
    bool differsFromNone(std::string_view table) const;

    std::vector<std::filesystem::path> files;
    mutable std::once_flag isRead;
    mutable std::vector<std::vector<InterfaceTable>> tables; ///< of each file
    /// The bytes of those tables that differ from none. Most components contain many of them.
    mutable std::set<std::string, std::less<>> known;
};

/// Returns the same for the file of a component. It is compared with the program and the
/// libMZcomponentManager of this process, and with the programs and libraries `hosts`.
std::optional<Finding> interfaceDifference(const std::filesystem::path& component,
                                           const std::vector<std::filesystem::path>& hosts);

} // namespace Mz::Tools
