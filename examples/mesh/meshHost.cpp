// Lists the mesh components, and imports files through them.
//
//   meshHost [--components FOLDER] [--progress] [FILE...]
//
// Ends with 0 when every file was imported, else with 1.

#include "console/console.h"
#include "console/consoleController.h"
#include "mesh.h"

#include "components/componentManager/componentImp.h"

#include <charconv>
#include <exception>
#include <iostream>

using namespace Mz;
using namespace Meshes;

namespace {

struct Options {
    std::filesystem::path components;
    bool showProgress = false;
    std::vector<std::filesystem::path> files;
};

Options parseOptions(const std::vector<std::filesystem::path>& arguments) {
    Options options;
    for (std::size_t index = 0; index < arguments.size(); ++index) {
        if (arguments[index] == "--progress")
            options.showProgress = true;
        else if (arguments[index] == "--components" && index + 1 < arguments.size())
            options.components = arguments[++index];
        else
            options.files.push_back(arguments[index]);
    }
    if (options.components.empty())
        options.components = console::programFolder() / ".." / "components" / "mesh";
    return options;
}

/// The manager wants full names, without "." and "..".
std::wstring searchPath(const std::filesystem::path& folder) {
    return console::wideName(std::filesystem::absolute(folder).lexically_normal());
}

class BuilderLister final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        std::cout << "  " << console::outputText(builder->getName()) << ": "
                  << console::outputText(builder->getLabel()) << ", from "
                  << console::outputText(builder->getComponentLabel()) << '\n';
        return Continue;
    }
};

/// With the fewest digits that are read as that very number again, the same on every system.
void writeNumber(float number) {
    char text[32];
    std::cout << std::string_view(text, std::to_chars(text, text + sizeof text, number).ptr);
}

void writePoint(const Mesh::Point& point) {
    std::cout << '(';
    writeNumber(point.x);
    std::cout << ", ";
    writeNumber(point.y);
    std::cout << ", ";
    writeNumber(point.z);
    std::cout << ')';
}

void describe(const std::string& name, const Mesh& mesh) {
    const Mesh::Box box = mesh.bounds();
    std::cout << name << ": " << console::outputText(mesh.formatLabel()) << ", "
              << mesh.vertexCount() << " vertices, " << mesh.faceCount() << " faces, box ";
    writePoint(box.low);
    std::cout << " to ";
    writePoint(box.high);
    std::cout << std::endl;
}

bool importFile(const MeshImporter& importer, ConsoleController& controller,
                const std::filesystem::path& file) {
    const std::wstring name = console::wideName(file);
    const int errorsBefore = controller.errorCount();
    const auto fail = [&](const std::wstring& reason) {
        controller.error(0, (name + L": " + reason).c_str());
        return false;
    };
    try {
        bool found = false;
        const QrRef<QrCastable> object = importer.import(name.c_str(), nullptr, found);
        if (const QrPtr<Mesh> mesh = queryCast<Mesh>(object.get())) {
            describe(console::outputText(name), *mesh);
            return true;
        }
        if (!found)
            return fail(L"there is no such file");
        // A builder that took the file and failed has told why.
        return controller.errorCount() == errorsBefore && fail(L"no builder takes this file");
    } catch (const std::exception& failure) {
        const std::string reason = failure.what();
        return fail(std::wstring(reason.begin(), reason.end()));
    }
}

bool run(const Options& options, ConsoleController& controller) {
    QrGetComponentManager()->initialize(searchPath(options.components).c_str());
    std::cout << "Builders:\n";
    BuilderLister lister;
    QrGetComponentManager()->enumerateBuilders(lister);

    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(meshImporterBuilderUid);
    const QrPtr<MeshImporter> importer = queryCast<MeshImporter>(object.get());
    if (!importer) {
        const std::wstring folder = searchPath(options.components);
        controller.error(0, (folder + L": no mesh importer is there").c_str());
        return false;
    }
    std::cout << "File types: " << console::outputText(importer->getFileTypes()) << std::endl;
    bool allImported = true;
    for (const std::filesystem::path& file : options.files)
        allImported = importFile(*importer, controller, file) && allImported;
    return allImported;
}

} // namespace

int main(int argc, char** argv) {
    console::useBinaryOutput();
    const Options options = parseOptions(console::arguments(argc, argv));
    ConsoleController controller(options.showProgress);
    return run(options, controller) ? 0 : 1;
}
