// SPDX-License-Identifier: BSL-1.0
/// A host of the mesh components: lists them, imports files through them, and saves and loads the
/// results. It uses each part of the library that a host needs: the recorded list, an importer, a
/// process controller, objects in files. Its output is the same on every system, so that a script
/// can compare it.
///
///     meshHost [OPTION...] [FILE...]
///
///     --components FOLDER  where the components are; by default beside the program's folder
///     --progress           shows the progress of reading
///     --list FILE          starts with the recorded list in FILE, if it exists, and writes a new
///                          one; prints how many component libraries are loaded
///     --save FOLDER        saves each mesh, and a scene of all, to files in FOLDER, and loads them
///     --draw FOLDER        draws each mesh to an SVG file in FOLDER
///     --load FOLDER        loads the files that were saved in FOLDER
///
/// The exit status is 0 if every file was imported, saved and loaded, else 1.
#include "console/console.h"
#include "host/description.h"
#include "host/drawing.h"
#include "host/savedFiles.h"
#include "mesh.h"
#include "saving/recordedList.h"
#include "system/system.h"

#include "components/componentKit/hostKit.h"
#include "components/componentManager/componentImp.h"
#include "components/componentTools/console.h"
#include "components/componentTools/consoleText.h"

#include <algorithm>
#include <cstddef>
#include <exception>
#include <filesystem>
#include <iostream>
#include <iterator>
#include <optional>
#include <string>
#include <utility>
#include <vector>

using namespace Mz;
using namespace Meshes;
using Tools::ConsoleController;

namespace {

struct Options {
    std::filesystem::path components;
    std::filesystem::path list;
    std::filesystem::path saveFolder;
    std::filesystem::path loadFolder;
    std::filesystem::path drawFolder;
    bool showProgress = false;
    std::vector<std::filesystem::path> files;
};

Options parseOptions(const std::vector<std::string>& arguments) {
    Options options;
    const std::pair<const char*, std::filesystem::path*> paths[] = {
        {"--components", &options.components},
        {"--list", &options.list},
        {"--save", &options.saveFolder},
        {"--load", &options.loadFolder},
        {"--draw", &options.drawFolder}};
    for (std::size_t index = 0; index < arguments.size(); ++index) {
        const auto named = std::ranges::find(
            paths, arguments[index], &std::pair<const char*, std::filesystem::path*>::first);
        if (arguments[index] == "--progress")
            options.showProgress = true;
        else if (named != std::end(paths) && index + 1 < arguments.size())
            *named->second = Tools::pathOf(arguments[++index]);
        else
            options.files.push_back(Tools::pathOf(arguments[index]));
    }
    if (options.components.empty())
        options.components = Kit::programFolder() / ".." / "components" / "mesh";
    return options;
}

class BuilderLister final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        std::cout << "  " << console::outputText(builder->getName()) << ": "
                  << console::outputText(builder->getLabel());
        // The recorded list does not contain the label of the library: it is empty after a start
        // with the list.
        if (builder->getComponentLabel()[0] != L'\0')
            std::cout << ", from " << console::outputText(builder->getComponentLabel());
        std::cout << '\n';
        return Continue;
    }
};

/// Prints how many component libraries this process has loaded.
void printLoaded(const Options& options, const char* when) {
    if (options.list.empty())
        return;
    const std::size_t count = system::mappedLibraries(options.components);
    std::cout << when << ": " << counted(count, "component library is", "component libraries are")
              << " loaded" << std::endl;
}

/// Writes the manager's list. Without it the next start takes longer.
void saveList(const Options& options, ConsoleController& controller) {
    try {
        writeRecordedList(options.list);
    } catch (const QrStreamEx& failure) {
        controller.error(0, displayText(failure.getReason()).c_str()); // It names the file.
    }
}

/// Initialises the manager, with its recorded list if there is one.
void start(const Options& options, ConsoleController& controller) {
    bool listed = false;
    try {
        listed = !options.list.empty() && readRecordedList(options.list);
    } catch (const QrStreamEx&) {
        const std::wstring name = displayName(options.list);
        controller.warning(0, (name + L": damaged; the rest is read from the libraries").c_str());
    }
    QrGetComponentManager()->initialize(Kit::searchPath(options.components).c_str());
    printLoaded(options, listed ? "After a start with the recorded list"
                                : "After a start without a recorded list");
    if (!options.list.empty())
        saveList(options, controller);
}

QrPtr<Mesh> importMesh(const MeshImporter& importer, ConsoleController& controller,
                       const std::filesystem::path& file) {
    const std::wstring name = Kit::wideName(file);
    const int errorsBefore = controller.errorCount();
    bool found = false;
    const QrRef<QrCastable> object = importer.import(name.c_str(), nullptr, found);
    const QrPtr<Mesh> mesh = queryCast<Mesh>(object.get());
    if (mesh)
        describe(console::outputText(name), *mesh);
    else if (!found)
        controller.error(0, (name + L": there is no such file").c_str());
    else if (controller.errorCount() == errorsBefore) // The builder has reported nothing.
        controller.error(0, (name + L": no builder takes this file").c_str());
    return mesh;
}

/// Draws the mesh, as file number `number`, in the folder of drawings.
void drawMesh(const Options& options, const Mesh& mesh, const std::filesystem::path& file,
              int number) {
    std::filesystem::create_directories(options.drawFolder);
    std::filesystem::path name = std::to_string(number) + "-";
    name += file.filename();
    name += ".svg";
    draw(mesh, options.drawFolder / name);
}

/// Calls `work`. Reports an exception as an error that names the file or folder `path`.
template <class Work>
void attempt(ConsoleController& controller, const std::filesystem::path& path, Work&& work) {
    try {
        work();
    } catch (const std::exception& failure) {
        controller.error(0, (displayName(path) + L": " + displayText(failure.what())).c_str());
    }
}

void importAll(const Options& options, ConsoleController& controller,
               const MeshImporter& importer) {
    std::optional<SavedFiles> saved;
    if (!options.saveFolder.empty())
        attempt(controller, options.saveFolder, [&] { saved.emplace(options.saveFolder); });
    int meshes = 0;
    for (const std::filesystem::path& file : options.files)
        attempt(controller, file, [&] {
            const QrPtr<Mesh> mesh = importMesh(importer, controller, file);
            if (mesh && saved)
                saved->save(file, mesh);
            if (mesh && !options.drawFolder.empty())
                drawMesh(options, *mesh, file, ++meshes);
        });
    if (saved)
        attempt(controller, options.saveFolder, [&] { saved->saveScene(); });
    if (!options.loadFolder.empty())
        attempt(controller, options.loadFolder, [&] {
            for (const std::filesystem::path& file : savedFiles(options.loadFolder))
                attempt(controller, file.filename(), [&] { loadSavedFile(file); });
        });
}

void run(const Options& options, ConsoleController& controller) {
    start(options, controller);
    std::cout << "Builders:\n";
    BuilderLister lister;
    QrGetComponentManager()->enumerateBuilders(lister);

    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(meshImporterBuilderUid);
    const QrPtr<MeshImporter> importer = queryCast<MeshImporter>(object.get());
    if (!importer) {
        const std::wstring folder = Kit::searchPath(options.components);
        controller.error(0, (folder + L": no mesh importer is there").c_str());
        return;
    }
    printLoaded(options, "After the first object was made");
    std::cout << "File types: " << console::outputText(importer->getFileTypes()) << std::endl;
    importAll(options, controller, *importer);
}

} // namespace

int main(int argc, char** argv) {
    console::useBinaryOutput();
    const Options options = parseOptions(Tools::argumentsOfProcess(argc, argv));
    ConsoleController controller;
    controller.showProgress(options.showProgress);
    QrProcessControl* const previous = QrGetSystemProcessController();
    QrSetSystemProcessController(&controller);
    attempt(controller, options.components, [&] { run(options, controller); });
    if (!std::cout.flush())
        controller.error(0, L"the output could not be written");
    QrSetSystemProcessController(previous);
    return controller.errorCount() == 0 ? 0 : 1;
}
