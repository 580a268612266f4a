// SPDX-License-Identifier: BSL-1.0
/// Implements the base importer by three enumerators of the component manager's builders.
///
/// The enumerators share a base that selects the import builders of one builder name. Selection and
/// use happen in one enumeration, without a list of candidates: a builder's library is loaded only
/// when the enumeration reaches it, and no library after the deciding one is loaded.
#include "components/componentManager/importer.h"
#include "components/componentManager/nativeText.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/importing/inputFile.h"
#include "components/componentManager/processControl.h"

#include <cstddef>
#include <iosfwd>
#include <utility>

namespace Mz {

QrImporter::~QrImporter() = default;

void QrImporter::forceVtblInstantiation() {}

QrRef<QrCastable> QrImporter::import(const wchar_t* path, const wchar_t* search,
                                     bool& found) const {
    found = true;
    return import(path, search);
}

namespace {

QrPtr<QrComponentManager> componentManager() {
    return QrPtr<QrComponentManager>::adopt(safeCast<QrComponentManager>(QrGetComponentManager()));
}

/// Selects the import builders of one importer from all builders of the manager.
class BaseImportEnumerator : public QrEnumerator<const QrImportBuilder*>,
                             public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    explicit BaseImportEnumerator(const wchar_t* name) : builderName(textOrEmpty(name)) {}

    using QrEnumerator<const QrImportBuilder*>::process;

    Action process(QrCPtr<QrBuilderDescription> item) override {
        const auto description =
            QrCPtr<QrBuilderDescription>::adopt(safeCast<QrBuilderDescription>(item.get()));
        if (textOrEmpty(description->getName()) != builderName)
            return Continue;
        const QrCRefPtr<QrComponentBuilder> builder = description->getBuilder();
        const QrCPtr<QrImportBuilder> importBuilder = queryCast<QrImportBuilder>(builder.get());
        return importBuilder ? process(importBuilder.get()) : Continue;
    }

    Action finished() override { return Continue; }

  private:
    std::wstring builderName;
};

/// Passes the import builders to the enumerator of the caller.
class ObjectEnumerator final : public BaseImportEnumerator {
  public:
    ObjectEnumerator(const wchar_t* builderName, QrEnumerator<QrCPtr<QrImportBuilder>>& caller)
        : BaseImportEnumerator(builderName), caller(caller) {}

    using BaseImportEnumerator::process;
    Action process(const QrImportBuilder* builder) override { return caller.process(builder); }
    Action finished() override { return caller.finished(); }

  private:
    QrEnumerator<QrCPtr<QrImportBuilder>>& caller;
};

/// Appends one entry per import builder to the filter text.
class FiletypesEnumerator final : public BaseImportEnumerator {
  public:
    FiletypesEnumerator(const wchar_t* builderName, std::wstring& fileTypes)
        : BaseImportEnumerator(builderName), fileTypes(fileTypes) {}

    using BaseImportEnumerator::process;
    Action process(const QrImportBuilder* builder) override {
        const auto description =
            QrCPtr<QrBuilderDescription>::adopt(safeCast<QrBuilderDescription>(builder));
        fileTypes.append(textOrEmpty(description->getLabel())).append(L"|");
        ExtensionsEnumerator extensions(fileTypes);
        builder->enumerateExtensions(extensions);
        fileTypes.append(L"|");
        return Continue;
    }

  private:
    class ExtensionsEnumerator final : public QrEnumerator<const wchar_t*> {
      public:
        explicit ExtensionsEnumerator(std::wstring& fileTypes) : fileTypes(fileTypes) {}

        Action process(const wchar_t* extension) override {
            fileTypes.append(first ? L"*." : L";*.").append(textOrEmpty(extension));
            first = false;
            return Continue;
        }

      private:
        std::wstring& fileTypes;
        bool first = true;
    };

    std::wstring& fileTypes;
};

/// Imports the data through the first import builder that accepts it.
class ImportEnumerator final : public BaseImportEnumerator {
  public:
    ImportEnumerator(const wchar_t* builderName, QrBufferedIO& io, const wchar_t* path,
                     const wchar_t* hint, bool byExtension)
        : BaseImportEnumerator(builderName), io(io), path(path), hint(hint),
          byExtension(byExtension) {}

    using BaseImportEnumerator::process;
    Action process(const QrImportBuilder* builder) override {
        if (byExtension && !path.empty()) {
            ExtensionsEnumerator extensions(extensionOfPath());
            const Action action = builder->enumerateExtensions(extensions);
            if (action != Stop)
                return action;
        }
        const int64 position = io.seek(0, 1);
        if (position == -1)
            return Fail;
        const bool accepted = builder->canImport(&io, path.c_str(), hint.c_str());
        restorePosition(position);
        if (!accepted)
            return Continue;
        object = builder->import(&io, path.c_str(), hint.c_str());
        return object ? Stop : Fail;
    }

    QrRef<QrCastable> object;

  private:
    class ExtensionsEnumerator final : public QrEnumerator<const wchar_t*> {
      public:
        explicit ExtensionsEnumerator(std::wstring wanted) : wanted(std::move(wanted)) {}
        Action process(const wchar_t* extension) override {
            return textOrEmpty(extension) == wanted ? Stop : Continue;
        }

      private:
        std::wstring wanted;
    };

    /// Returns the text after the last dot, even if that dot is part of a directory name.
    std::wstring extensionOfPath() const {
        const std::size_t dot = path.find_last_of(L'.');
        return dot == std::wstring::npos ? std::wstring() : path.substr(dot + 1);
    }

    void restorePosition(int64 position) {
        if (trySeek(position))
            return;
        // A block read that reached the end of input leaves the IO in a state in which every seek
        // fails. Reading a single byte ends that state.
        io.read();
        io.seek(position, 0);
    }

    bool trySeek(int64 position) {
        try {
            return io.seek(position, 0) != -1;
        } catch (const QrStreamEx::ExReadError&) {
            return false;
        }
    }

    QrBufferedIO& io;
    std::wstring path;
    std::wstring hint;
    bool byExtension;
};

} // namespace

QrBaseImporter::QrBaseImporter() = default;
QrBaseImporter::QrBaseImporter(const QrBaseImporter& other) = default;
QrBaseImporter& QrBaseImporter::operator=(const QrBaseImporter& other) = default;
QrBaseImporter::~QrBaseImporter() = default;

const wchar_t* QrBaseImporter::getDefaultSearch() const {
    return nullptr;
}

QrEnum::Action QrBaseImporter::enumerateObjects(QrEnumerator<QrCPtr<QrImportBuilder>>& e) const {
    ObjectEnumerator objects(getBuilderName(), e);
    return componentManager()->enumerateBuilders(objects);
}

const wchar_t* QrBaseImporter::getFileTypes() const {
    if (fileTypes.empty()) {
        // Composes a local text: if a builder throws, the cache stays empty.
        std::wstring text;
        FiletypesEnumerator builders(getBuilderName(), text);
        componentManager()->enumerateBuilders(builders);
        text.push_back(L'\0');
        fileTypes.swap(text);
    }
    return fileTypes.c_str();
}

QrRef<QrCastable> QrBaseImporter::import(const wchar_t* path, const wchar_t* search,
                                         bool& found) const {
    const auto controller =
        QrPtr<QrProcessControl>::adopt(safeCast<QrProcessControl>(QrGetProcessController()));
    const std::wstring name = controller->findFile(path, search, getDefaultSearch());
    found = !name.empty();
    std::ifstream stream;
    if (!openInputFile(stream, name.c_str()))
        return nullptr;
    QrInBuffer buffer(&stream);
    return import(QrPtr<QrBufferedIO>(&buffer), path, search);
}

QrRef<QrCastable> QrBaseImporter::import(const wchar_t* path, const wchar_t* search) const {
    bool ignored = false;
    return import(path, search, ignored);
}

QrRef<QrCastable> QrBaseImporter::import(QrPtr<QrBufferedIO> source, const wchar_t* path,
                                         const wchar_t* search) const {
    const QrPtr<QrComponentManager> manager = componentManager();
    const auto io = QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(source.get()));
    const wchar_t* pathText = textOrEmpty(path);
    const wchar_t* hint = search ? pathText : L"";
    if (path) {
        ImportEnumerator byExtension(getBuilderName(), *io, pathText, hint, true);
        const QrEnum::Action action = manager->enumerateBuilders(byExtension);
        if (action == QrEnum::Stop)
            return byExtension.object;
        if (action == QrEnum::Fail)
            return nullptr;
    }
    ImportEnumerator byContent(getBuilderName(), *io, pathText, hint, false);
    return manager->enumerateBuilders(byContent) == QrEnum::Stop ? byContent.object : nullptr;
}

} // namespace Mz
