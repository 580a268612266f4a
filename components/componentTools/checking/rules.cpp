// SPDX-License-Identifier: BSL-1.0
/// The table of rules. Whatever is said of a rule anywhere comes from here: the command line and
/// its reports read the table, and a test compares the documentation with it.
#include "components/componentTools/checking/rules.h"

#include <algorithm>

namespace Mz::Tools {

namespace {

using enum RuleProcess;

constexpr Grade note = Grade::note, warning = Grade::warning, error = Grade::error;

constexpr const char* description = "description";
constexpr const char* builders = "builders";
constexpr const char* persistent = "persistent objects";
constexpr const char* imports = "import builders";
constexpr const char* library = "library";
constexpr const char* surroundings = "surroundings";
constexpr const char* own = "tests of its own";

std::vector<RuleEntry> makeEntries() {
    return {
        {{"description-answers", description, error,
          L"The entry point returns a description, which enumerates its builders.",
          L"Hosts call the entry point and enumerateBuilders once to record a library. If one of "
          L"them fails, the library has no builders. Describe constants, and do nothing that can "
          L"fail."},
         main,
         Rules::answers,
         true},
        {{"description-counted", description, error,
          L"The entry point returns a static description, or a counted one without a reference.",
          L"Hosts take one reference and release it. A counted description that is static is "
          L"destroyed by that release; one that is returned with a reference is never destroyed. "
          L"Use MZ_COMPONENT, or an uncounted static object."},
         apart,
         Rules::descriptionCounted,
         true},
        {{"description-stable", description, error, L"The description says the same at every call.",
          L"Hosts store what the library says when they record it, and show that for years. Let "
          L"the texts and the list of builders be constant."},
         main,
         Rules::descriptionStable},
        {{"description-enumerates", description, error,
          L"enumerateBuilders ends when process asks it to, and calls finished once.",
          L"The caller of an enumeration decides when it ends, and gets back what its last "
          L"callback returned. Return a result of process that is not Continue at once, else the "
          L"result of finished."},
         main,
         Rules::enumerationObeys},
        {{"description-count", description, warning,
          L"getBuilderCount is the number of builders that enumerateBuilders passes.",
          L"Hosts use the number as a hint, for example for a progress bar."},
         main,
         Rules::countTrue},
        {{"description-texts", description, warning, L"No text of the description is null.",
          L"The component manager takes null for an empty text, but other hosts may not. Return "
          L"L\"\"."},
         main,
         Rules::textsNotNull},
        {{"description-label", description, note, L"The library has a label.",
          L"Hosts that list their plug-ins show the label of each; without one, people see a file "
          L"name. The first argument of MZ_COMPONENT is the label."},
         main,
         Rules::libraryLabel},
        {{"uid-not-nil", description, error, L"No builder has the uid of four zero words.",
          L"A nil uid is one that was forgotten, and all forgotten ones are the same. "
          L"`mzcomponents uid` prints a new one."},
         main,
         Rules::uidsNotNil},
        {{"uid-unique", description, error, L"Each builder of the library has a uid of its own.",
          L"Hosts find builders by their uids. Of two builders with one uid they find one."},
         main,
         Rules::uidsUnique},
        {{"uid-free", description, error,
          L"No other library of the search path has a builder with the same uid.",
          L"Hosts find one of the two builders only: that of the library that comes last. Make a "
          L"new uid for each new builder, also if its source was copied. This rule is checked if "
          L"several libraries are checked together."},
         parent,
         nullptr},

        {{"builder-made", builders, error,
          L"createBuilder returns a QrComponentBuilder for each builder that is described.",
          L"Hosts ask for builders that the library described when it was recorded."},
         main,
         Rules::buildersMade},
        {{"builder-interfaces", builders, error,
          L"A builder is the one that was asked for, and has the interfaces of its kind.",
          L"An import builder needs QrBuilderDescription, too: importers ask it for its label. "
          L"Kit::ImportBuilder has all of them."},
         main,
         Rules::builderInterfaces},
        {{"builder-itself", builders, error,
          L"getBuilder of a builder returns a builder, with one new reference.",
          L"Hosts release the reference that they get. One too few destroys the builder early, "
          L"one too many never."},
         main,
         Rules::builderItself},
        {{"interfaces-agree", builders, error,
          L"getInterface and hasInterface agree for every uid, in every view of an object.",
          L"Hosts ask hasInterface to decide whether a cast will succeed. Derive the class from "
          L"the cast templates, which answer both from one list."},
         main,
         Rules::interfacesAgree},
        {{"castable-consistent", builders, error,
          L"getCastable returns the same principal object from every interface.",
          L"Hosts compare principal objects to find out whether two interfaces belong to one "
          L"object."},
         main,
         Rules::castableConsistent},
        {{"references-balanced", builders, error,
          L"getInterface takes one reference, hasInterface none, and the counts are true.",
          L"A reference that is not taken destroys the object while a host uses it. One that is "
          L"taken twice keeps it forever. The rule uses the results of newReference and release."},
         main,
         Rules::referencesBalanced},
        {{"object-destroyed", builders, error, L"The last release of a new object destroys it.",
          L"createObject returns one reference, and the caller owns it. Nothing else destroys a "
          L"new object."},
         main,
         Rules::objectsDestroyed},
        {{"object-growth", builders, error,
          L"Making and releasing an object a hundred times leaves no memory behind.",
          L"A host may make millions of objects. What an object allocates must be free when it is "
          L"destroyed."},
         main,
         Rules::objectsGrowth},
        {{"exceptions-allowed", builders, error,
          L"Only exceptions of streams, std::bad_alloc and the controller's abort leave a library.",
          L"Hosts know no other exceptions of a library. Catch others where they arise, report "
          L"them to the process controller, and return null. The rule watches all calls."},
         always,
         nullptr},

        {{"persistant-class", persistent, error,
          L"The class uid of an object that stores itself is that of a builder.",
          L"A stored object is read back by the builder of its class uid. Without one it can be "
          L"written and never read. A builder of another library counts if both libraries are "
          L"checked together, by --path for example. Reading such an object is not checked."},
         main,
         Rules::classUid},
        {{"persistant-roundtrip", persistent, error,
          L"An object that was written and read writes the same bytes again.",
          L"Else a part of its state is lost, or read in another order than it is written. The "
          L"rule checks new objects in binary and in text form and, with --sample, imported ones."},
         main,
         Rules::roundTrip},
        {{"persistant-truncated", persistent, error, L"Reading data that is cut off throws.",
          L"Files are cut off when a disk is full or a transfer breaks. An object that accepts "
          L"half of its data shows something that nobody saved. Read with >>, which throws, or "
          L"check the counts that read returns."},
         main,
         Rules::truncated},
        {{"persistant-frees", persistent, error,
          L"Reading data that is cut off leaves no memory behind.",
          L"Hold what read allocates in objects that free it when an exception passes."},
         main,
         Rules::freedAfterFailure},
        {{"persistant-damaged", persistent, error,
          L"Reading changed data neither crashes nor hangs.",
          L"Trust no number of the data: let lists grow as their elements arrive. --seed and "
          L"--fuzz change the data in more ways."},
         main,
         Rules::damagedObjects},
        {{"persistant-pieces", persistent, warning,
          L"An object can be read from input that comes in pieces and has no positions.",
          L"Pipes and compressed files supply input this way. Read values in their order, and do "
          L"not use seek or tell of the buffered IO."},
         main,
         Rules::inPieces},

        {{"extension-form", imports, error,
          L"Extensions have no dot, no wildcard and no separator.",
          L"Importers compare extensions with what follows the last dot of a name, and put \"*.\" "
          L"before them in file dialogs."},
         main,
         Rules::extensionForm},
        {{"extension-case", imports, warning,
          L"An extension with capital letters is listed in lower case, too.",
          L"Importers compare extensions exactly, and most files have lower-case extensions."},
         main,
         Rules::extensionCase},
        {{"import-label", imports, note, L"An import builder has a label.",
          L"Importers show it in the list of file types, where a builder without one is an empty "
          L"line. Set .label of the builder, for example to L\"PNG images\"."},
         main,
         Rules::importLabel},
        {{"canimport-survives", imports, error,
          L"canImport returns for every input: empty, random, cut off, or of another format.",
          L"An importer asks every builder about a file until one accepts it, so canImport sees "
          L"mostly files of other formats. Read a few bytes, and trust none of them."},
         main,
         Rules::canImportSurvives},
        {{"canimport-restores", imports, error,
          L"canImport changes nothing but the position of the input.",
          L"The caller restores the position and goes on with other builders. It cannot restore "
          L"the locale, the folder or the process controller."},
         main,
         Rules::canImportRestores},
        {{"import-survives", imports, error,
          L"import returns null or an object, or throws, for every input.",
          L"Users open damaged and hostile files. Check each count and offset before it is used. "
          L"With --sample, the rule reads changed forms of real files, and with --fuzz more of "
          L"them."},
         main,
         Rules::importSurvives},
        {{"import-releases", imports, error, L"Neither canImport nor import keeps the input.",
          L"The input is destroyed after the call. An object that needs the data later copies it."},
         main,
         Rules::inputReleased},
        {{"import-reports", imports, warning,
          L"import tells the process controller why it returns null.",
          L"Else the user sees that nothing happens, and no reason. The rule uses input that "
          L"canImport accepts."},
         main,
         Rules::importReports},
        {{"import-progress", imports, error, L"The progress of import is between 0 and 1.",
          L"Controllers draw it as a bar. Beware of a division by a size of zero."},
         main,
         Rules::progressInside},
        {{"import-stops", imports, error, L"import stops when the user interrupts it.",
          L"It ends soon after isInterrupted returned true, or progress or warning returned "
          L"false. The rule uses the inputs of the other rules; give it a large --sample."},
         main,
         Rules::importStops},

        {{"library-is-component", library, error,
          L"The file is a component library for this system.",
          L"Only a file that exports the entry point, and whose dependencies are found, is ever "
          L"loaded. The command `mzcomponents explain` tells more."},
         parent,
         nullptr},
        {{"library-loads", library, error, L"The library loads within the time limit.",
          L"Its initialisers run in the host before anything else. Do there as little as "
          L"possible."},
         main,
         Rules::loads,
         true},
        {{"library-unloads", library, warning, L"The library can be unloaded.",
          L"Hosts that replace a library while they run need that. Unique symbols of the compiler "
          L"and libraries that load themselves prevent it."},
         main,
         Rules::unloads},
        {{"library-leaves", library, error,
          L"When its objects are gone and it is unloaded, no thread and no open file is left.",
          L"A thread that runs in a library that is no longer there crashes the host."},
         apart,
         Rules::leavesNothing},
        {{"library-reloads", library, error,
          L"Loading and unloading the library a hundred times leaves no memory behind.",
          L"What static objects, initialisers and the description allocate must be freed when the "
          L"library is unloaded."},
         apart,
         Rules::reloads},
        {{"library-exports", library, warning,
          L"The library exports its entry point and nothing else.",
          L"Names of two libraries can clash: the second one then calls the first one's function. "
          L"Compile with hidden visibility. Weak symbols, of templates for example, do not count."},
         main,
         Rules::exports},
        {{"library-host", library, error, L"The library needs nothing of the program of its host.",
          L"A library that uses functions of a program can be loaded by that program only."},
         parent,
         nullptr},

        {{"surroundings-locale", surroundings, error,
          L"The library answers the same under a locale with a decimal comma.",
          L"Hosts set the locale of their users. Write and read numbers by the streams of the "
          L"library, which do not depend on it."},
         parent,
         nullptr},
        {{"surroundings-folder", surroundings, error,
          L"The library answers the same in another working folder.",
          L"The folder is wherever the user started the program. Find files beside the library or "
          L"by findFile of the process controller."},
         parent,
         nullptr},
        {{"surroundings-input", surroundings, error,
          L"The library answers the same without standard input.",
          L"Programs with windows and services have none."},
         parent,
         nullptr},
        {{"surroundings-memory", surroundings, error,
          L"The library answers the same whatever memory contained before.",
          L"Two processes whose new memory and stack have different contents must get equal "
          L"answers and bytes. A difference is a variable that was not initialised, or a pointer "
          L"that was written."},
         parent,
         nullptr},
        {{"surroundings-threads", surroundings, error,
          L"A library that says so can be used by several threads.",
          L"Eight threads make objects at a time. The rule is checked with --thread-safe only."},
         main,
         Rules::fromThreads},
        {{"uid-exact", surroundings, error, L"A uid that is almost right gives null.",
          L"createBuilder must compare all four words: uids of one family differ in one of them."},
         main,
         Rules::uidsExact},
        {{"allocation-failure", surroundings, error,
          L"An allocation that fails gives an exception or null, not a crash.",
          L"The rule lets each allocation of a call fail, one after the other. noexcept functions "
          L"and destructors that allocate end the process. It is checked on Linux only."},
         main,
         Rules::failingAllocations},

        {{"own-tests", own, error, L"The tests that the library brings along succeed.",
          L"A library adds tests by MZ_COMPONENT_TESTS of the component kit "
          L"(`componentKit/componentTest.h`)."},
         main,
         Rules::ownTests},
    };
}

std::vector<const CheckRule*> makeRules() {
    std::vector<const CheckRule*> rules;
    for (const RuleEntry& entry : ruleEntries())
        rules.push_back(&entry.facts);
    return rules;
}

} // namespace

const std::vector<RuleEntry>& ruleEntries() {
    static const std::vector<RuleEntry> entries = makeEntries();
    return entries;
}

const RuleEntry& ruleEntry(std::string_view id) {
    return *std::find_if(ruleEntries().begin(), ruleEntries().end(),
                         [&](const RuleEntry& entry) { return entry.facts.id == id; });
}

const std::vector<const CheckRule*>& checkRules() {
    static const std::vector<const CheckRule*> rules = makeRules();
    return rules;
}

const CheckRule* findCheckRule(std::string_view id) {
    for (const CheckRule* rule : checkRules())
        if (rule->id == id)
            return rule;
    return nullptr;
}

const char* nameOf(Grade grade) {
    switch (grade) {
    case Grade::note: return "note";
    case Grade::warning: return "warning";
    default: return "error";
    }
}

} // namespace Mz::Tools
