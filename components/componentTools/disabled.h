// SPDX-License-Identifier: BSL-1.0
/// Switches components off and on, for all hosts that read a recorded list.
///
/// A component that is switched off is recorded without builders, so that a host that reads the
/// list does not load it. The choice is stored beside the list, in the file `verdictsFileOf(list)`.
/// `scan` keeps it when the component's file changes or disappears for a while. A host that reads
/// the list without a scan loads a component whose file has changed, as it loads every changed
/// file.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// A component that the user switched off.
struct DisabledComponent {
    std::wstring directory; ///< normalised, as in the recorded list
    std::wstring fileName;  ///< normalised, as in the recorded list
    std::wstring reason;    ///< for people; may be empty
};

/// All components that are switched off in a list, in the order in which they were.
using DisabledComponents = std::vector<DisabledComponent>;

/// The result of switching a component.
struct SwitchResult {
    /// Whether the component is in another state now.
    bool changed = false;
    /// Why nothing was written, as a sentence that names the file; empty if all is well.
    std::wstring problem;
};

/// Returns the components that are switched off in the list.
///
/// The list itself is not read. A missing or invalid file beside it counts as empty.
/// \throws std::bad_alloc only
MZ_COMPONENT_TOOLS_API DisabledComponents disabledComponents(const std::filesystem::path& list);

/// Switches off the component in `file`, and records it without builders.
///
/// If it is switched off already, only the reason is replaced. If there is no list, one is created
/// that contains this component only. Do not run it concurrently with `enableComponent` for the
/// same list: the last one wins.
///
/// \param file  the component; it need not exist if the list has it
/// \param list  the recorded list
/// \param reason  for people, shown by `explain`; may be empty
/// \return the result; nothing was written if it has a problem, such as a damaged list
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError with the file's name, if the list or
///     the file beside it cannot be written
MZ_COMPONENT_TOOLS_API SwitchResult disableComponent(const std::filesystem::path& file,
                                                     const std::filesystem::path& list,
                                                     const std::wstring& reason = {});

/// Switches on the component in `file`, which need not exist. Its record is removed, so that the
/// next scan examines it, and the next start of a host loads it.
///
/// If it is not switched off, nothing is written, and `changed` is false.
///
/// \param file  the component
/// \param list  the recorded list
/// \return the result; nothing was written if it has a problem, such as a damaged list
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError with the file's name, if the list or
///     the file beside it cannot be written
MZ_COMPONENT_TOOLS_API SwitchResult enableComponent(const std::filesystem::path& file,
                                                    const std::filesystem::path& list);

} // namespace Mz::Tools
