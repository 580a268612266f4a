// SPDX-License-Identifier: BSL-1.0
/// The commands that use components: types, import, graph. Each creates a `Host` first. An
/// exception from one component does not stop the work with the others.
#include "components/componentTools/consoleText.h"
#include "components/componentTools/uidText.h"
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/host.h"
#include "tools/mzcomponents/inputFile.h"
#include "tools/mzcomponents/output.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/graph.h"
#include "components/componentTools/guardedImport.h"
#include "components/objectIO/objectIO.h"

#include <algorithm>
#include <filesystem>
#include <optional>
#include <sstream>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

namespace Mz::Commands {

namespace {

/// An importer through the builders with a given name.
class FamilyImporter final : public QrCastImpl<FamilyImporter, QrBaseImporter> {
  public:
    explicit FamilyImporter(std::wstring builderName) : name(std::move(builderName)) {}
    const wchar_t* getBuilderName() const override { return name.c_str(); }

  private:
    std::wstring name;
};

/// Returns a name in quotes, for messages.
std::wstring quoted(const wchar_t* name) {
    return L"\"" + std::wstring(name) + L"\"";
}

/// Returns the distinct names of all import builders. Those that read the file's extension come
/// first.
std::vector<std::wstring> familiesFor(const Host& host, const std::filesystem::path& file) {
    std::vector<std::wstring> reading, others;
    const std::wstring name = Tools::displayName(file);
    const std::wstring extension = name.substr(name.rfind(L'.') + 1);
    for (const QrCPtr<QrBuilderDescription>& builder : host.builders()) {
        const Activity activity(quoted(builder->getName()) + L" was asked what it imports");
        const QrCPtr<QrImportBuilder> importer = importBuilder(*builder);
        if (!importer)
            continue;
        const auto extensions = extensionsOf(*importer);
        const bool reads =
            std::find(extensions.begin(), extensions.end(), extension) != extensions.end();
        (reads ? reading : others).emplace_back(builder->getName());
    }
    reading.insert(reading.end(), others.begin(), others.end());
    std::vector<std::wstring> families;
    for (const std::wstring& family : reading)
        if (std::find(families.begin(), families.end(), family) == families.end())
            families.push_back(family);
    return families;
}

struct Imported {
    QrRef<QrCastable> object;
    std::wstring
        family; ///< the name of the builders that imported it; of a guarded import, the label
    std::wstring reason; ///< why there is no object
    std::string verdict; ///< of a guarded import; else empty
};

/// Tries the families in order until one succeeds. If none does, the reason is the first exception.
Imported importThrough(const std::vector<std::wstring>& families, const std::wstring& name) {
    Imported imported;
    for (const std::wstring& family : families) {
        const Activity activity(quoted(family.c_str()) + L" imported " + name);
        try {
            bool found = false;
            imported.object = FamilyImporter(family).import(name.c_str(), nullptr, found);
        } catch (...) {
            if (imported.reason.empty())
                imported.reason = exceptionText();
        }
        if (imported.object) {
            imported.family = family;
            return imported;
        }
    }
    if (imported.reason.empty())
        imported.reason = L"no builder imports this file";
    return imported;
}

Imported importFile(const Host& host, const std::filesystem::path& file) {
    Imported imported;
    imported.reason = obstacleTo(file);
    if (!imported.reason.empty())
        return imported;
    const std::optional<std::wstring> name = toWideName(file);
    if (name && Tools::isCarried(*name))
        return importThrough(familiesFor(host, file), *name);
    imported.reason =
        L"the file's name has no form in the current locale, so no component can open "
        L"it; rename it, or choose a locale that has its characters";
    return imported;
}

/// Imports the file in a child process. The limits are those of a probe.
Imported importGuarded(const std::filesystem::path& file, const ProbeArguments& probe) {
    Kit::ImportLimits limits;
    limits.time = probe.options().timeLimit;
    limits.memory = probe.options().memoryLimit;
    const Kit::GuardedImport guarded = Kit::importGuarded(file, limits);
    Imported imported;
    imported.object = guarded.object;
    imported.verdict = nameOf(guarded.verdict);
    if (guarded)
        imported.family = guarded.detail;
    else
        imported.reason = guarded.reason();
    return imported;
}

std::wstring describe(const QrCastable* object) {
    try {
        const auto persistant = queryCast<QrPersistant>(const_cast<QrCastable*>(object));
        if (!persistant)
            return L"an object that cannot be stored";
        return L"class " + Tools::textOf(*persistant->getClassUid()) + L", version " +
               std::to_wstring(persistant->getVersion());
    } catch (...) {
        return L"an object whose class is unknown, because it throws";
    }
}

Json jsonOf(const std::filesystem::path& file, const Imported& imported) {
    const bool good = static_cast<bool>(imported.object);
    Json result{{"file", utf8(Tools::displayName(file))},
                {"imported", good},
                {"builderName", good ? utf8(imported.family) : ""},
                {"object", utf8(good ? describe(imported.object.get()) : imported.reason)}};
    if (!imported.verdict.empty()) {
        result["verdict"] = imported.verdict;
        result["builderLabel"] = std::exchange(result["builderName"], "");
    }
    return result;
}

/// Writes a failure to standard error. Writes a success to standard output, if `success` is set.
void tell(Host& host, const std::filesystem::path& file, const Imported& imported, bool success) {
    const std::wstring name = shown(file);
    if (!imported.object)
        host.console().error(0, (name + L": " + imported.reason).c_str());
    else if (success)
        printLine(name + L": imported through \"" + imported.family + L"\": " +
                  describe(imported.object.get()));
}

/// Stores the objects one after the other. The file is written completely or not at all.
void save(const std::vector<QrRef<QrCastable>>& objects, const std::filesystem::path& file) {
    const Activity activity(L"its objects were stored");
    std::ostringstream content;
    QrOutBuffer bytes(&content);
    {
        QrObjectOutBuffer whole(&bytes);
        QrBinaryStream stream(&whole);
        for (const QrRef<QrCastable>& object : objects)
            stream << object.get();
    }
    replaceFile(file, content.view());
}

/// Returns whether the file is one of the others, under any name.
bool isOneOf(const std::filesystem::path& file, const std::vector<std::string>& others) {
    std::error_code ignored;
    return std::any_of(others.begin(), others.end(), [&](const std::string& other) {
        return std::filesystem::equivalent(file, Tools::pathOf(other), ignored);
    });
}

/// Returns the builders whose objects are importers, and their import builders.
std::vector<Tools::GraphImporter> importersOf(const Host& host) {
    std::vector<Tools::GraphImporter> importers;
    for (const QrCPtr<QrBuilderDescription>& builder : host.builders()) {
        const Activity activity(quoted(builder->getName()) + L" made an object");
        try {
            const QrRef<QrCastable> object =
                QrGetComponentManager()->createObject(builder->getUid());
            if (const auto importer = queryCast<QrImporter>(object.get()))
                importers.push_back({builder->getUid(), importer->getBuilderName()});
        } catch (...) {
            continue; // The library threw instead of creating an object.
        }
    }
    return importers;
}

Json jsonOf(const Host& host, const std::vector<Tools::GraphImporter>& importers) {
    Json libraries = Json::array(), used = Json::array();
    for (const Tools::RecordedLibrary& library : host.libraries()) {
        if (library.builders.empty())
            continue;
        libraries.push_back(Commands::jsonOf(library));
        // Offsets apply only to the file from which a list was read.
        libraries.back().erase("position");
        for (Json& builder : libraries.back()["builders"])
            builder.erase("position");
    }
    for (const Tools::GraphImporter& importer : importers)
        used.push_back({{"uid", utf8(Tools::textOf(importer.uid))},
                        {"importsThrough", utf8(importer.builderName)}});
    return {{"libraries", libraries}, {"importers", used}};
}

} // namespace

int types(const Common& common, const ProbeArguments& probe) {
    Host host(common, probe);
    if (host.interrupted())
        return exitFailure;
    Json all = Json::array();
    for (const QrCPtr<QrBuilderDescription>& builder : host.builders()) {
        const Activity activity(quoted(builder->getName()) + L" was asked what it imports");
        const QrCPtr<QrImportBuilder> importer = importBuilder(*builder);
        if (!importer)
            continue;
        std::wstring patterns;
        Json extensions = Json::array();
        for (const std::wstring& extension : extensionsOf(*importer)) {
            patterns += (patterns.empty() ? L"*." : L";*.") + extension;
            extensions.push_back(utf8(extension));
        }
        if (common.json)
            all.push_back({{"name", utf8(builder->getName())},
                           {"label", utf8(builder->getLabel())},
                           {"extensions", extensions},
                           {"uid", utf8(Tools::textOf(builder->getUid()))}});
        else
            printLine(padded(builder->getName(), 20) + L"  " + padded(patterns, 16) + L"  " +
                      builder->getLabel());
    }
    if (common.json)
        printJson({{"types", all}});
    return host.status();
}

int importFiles(const Common& common, const ImportArguments& arguments,
                const ProbeArguments& probe) {
    if (!arguments.save.empty() && isOneOf(Tools::pathOf(arguments.save), arguments.files)) {
        printError(toWide(arguments.save) +
                   L": this file is one of those to import. Choose another name for the result");
        return exitUsage;
    }
    Host host(common, probe);
    if (host.interrupted())
        return exitFailure;
    std::vector<QrRef<QrCastable>> objects;
    Json files = Json::array();
    for (const std::string& argument : arguments.files) {
        const std::filesystem::path file = Tools::pathOf(argument);
        const Imported imported =
            arguments.guarded ? importGuarded(file, probe) : importFile(host, file);
        host.console().clearLine();
        if (imported.object)
            objects.push_back(imported.object);
        if (common.json)
            files.push_back(jsonOf(file, imported));
        tell(host, file, imported, !common.json);
    }
    if (common.json)
        printJson({{"files", files}});
    if (objects.size() < arguments.files.size())
        return exitFailure;
    if (!arguments.save.empty())
        save(objects, Tools::pathOf(arguments.save));
    return host.status();
}

int graph(const Common& common, const GraphArguments& arguments, const ProbeArguments& probe) {
    Host host(common, probe);
    if (host.interrupted())
        return exitFailure;
    const std::vector<Tools::GraphImporter> importers = importersOf(host);
    const std::string dot = Tools::dotOf(host.libraries(), importers);
    if (common.json) {
        printJson(jsonOf(host, importers));
    } else if (arguments.output.empty() && arguments.svg.empty()) {
        results() << dot;
    }
    if (!arguments.output.empty())
        replaceFile(Tools::pathOf(arguments.output), dot);
    std::wstring why;
    if (!arguments.svg.empty() && !Tools::drawSvg(dot, Tools::pathOf(arguments.svg), why)) {
        host.console().error(0, why.c_str());
        return exitFailure;
    }
    return host.status();
}

} // namespace Mz::Commands
