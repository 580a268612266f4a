// SPDX-License-Identifier: BSL-1.0
/// The rules, each with the function that checks it.
#pragma once

#include "components/componentTools/checking/checkContext.h"

#include <vector>

namespace Mz::Tools {

/// Where a rule is checked.
enum class RuleProcess {
    main,   ///< in the process that checks most rules
    apart,  ///< in another process, which keeps nothing of the library between rules
    parent, ///< in the process that wants to know: by reading the file or comparing processes
    always, ///< by the guard around every call
};

struct RuleEntry {
    CheckRule facts;
    RuleProcess process;
    void (*check)(CheckContext&) = nullptr; ///< null unless the process is `main` or `apart`
    bool needed = false; ///< without it no later rule of the process can be checked
};

/// Returns all rules. Those of one process are checked in this order.
const std::vector<RuleEntry>& ruleEntries();

/// Returns the rule with that identifier. It must exist.
const RuleEntry& ruleEntry(std::string_view id);

/// The functions that check one rule each.
namespace Rules {
void loads(CheckContext& context);
void unloads(CheckContext& context);
void exports(CheckContext& context);
void reloads(CheckContext& context);
void leavesNothing(CheckContext& context);

void answers(CheckContext& context);
void descriptionCounted(CheckContext& context);
void descriptionStable(CheckContext& context);
void enumerationObeys(CheckContext& context);
void countTrue(CheckContext& context);
void textsNotNull(CheckContext& context);
void libraryLabel(CheckContext& context);
void uidsNotNil(CheckContext& context);
void uidsUnique(CheckContext& context);
void uidsExact(CheckContext& context);

void buildersMade(CheckContext& context);
void builderInterfaces(CheckContext& context);
void builderItself(CheckContext& context);
void interfacesAgree(CheckContext& context);
void castableConsistent(CheckContext& context);
void referencesBalanced(CheckContext& context);
void objectsDestroyed(CheckContext& context);
void objectsGrowth(CheckContext& context);

void classUid(CheckContext& context);
void roundTrip(CheckContext& context);
void inPieces(CheckContext& context);
void truncated(CheckContext& context);
void freedAfterFailure(CheckContext& context);
void damagedObjects(CheckContext& context);

void extensionForm(CheckContext& context);
void extensionCase(CheckContext& context);
void importLabel(CheckContext& context);
void canImportSurvives(CheckContext& context);
void canImportRestores(CheckContext& context);
void importSurvives(CheckContext& context);
void inputReleased(CheckContext& context);
void importReports(CheckContext& context);
void progressInside(CheckContext& context);
void importStops(CheckContext& context);

void fromThreads(CheckContext& context);
void failingAllocations(CheckContext& context);
void ownTests(CheckContext& context);
} // namespace Rules

} // namespace Mz::Tools
