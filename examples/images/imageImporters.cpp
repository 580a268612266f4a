// SPDX-License-Identifier: BSL-1.0
/// The component: three import builders over one decoder. Each recognises its own format, so that a
/// host can list and label them, and all report errors alike.
#include "decoding.h"
#include "signatures.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/nativeText.h"

#include <exception>
#include <initializer_list>
#include <new>
#include <utility>

using namespace Mz;

namespace {

class ImportedImage final : public Kit::Object<ImportedImage, Image> {
  public:
    explicit ImportedImage(DecodedImage image) : decoded(std::move(image)) {}
    std::size_t width() const override { return decoded.width; }
    std::size_t height() const override { return decoded.height; }
    std::span<const Pixel> pixels() const override { return decoded.pixels; }

  private:
    DecodedImage decoded;
};

/// An import builder of images that `recognise` accepts.
class ImageImporter final : public Kit::ImportBuilder<ImageImporter> {
  public:
    using Recognise = bool(QrBufferedIO&);

    ImageImporter(const Kit::BuilderInfo& info, std::initializer_list<const wchar_t*> extensions,
                  Recognise* test)
        : ImportBuilder(info, extensions), recognise(test) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return recognise(*io);
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t*) const override {
        QrProcessControl* const controller = QrGetProcessController();
        std::wstring reason;
        try {
            return new ImportedImage(decodeImage(*io, controller));
        } catch (const ImageInterrupted&) {
            return nullptr;
        } catch (const std::bad_alloc&) {
            reason = L"there is not enough memory for this image";
        } catch (const std::exception& failure) { // of the decoder or the stream
            reason = displayText(failure.what());
        }
        if (controller)
            controller->error(0, (std::wstring(textOrEmpty(path)) + L": " + reason).c_str());
        return nullptr;
    }

  private:
    Recognise* recognise;
};

using Extensions = std::initializer_list<const wchar_t*>;

template <class... Names>
Kit::OwnedBuilder importerOf(const Kit::BuilderInfo& info, ImageImporter::Recognise* test,
                             Names... extensions) {
    return Kit::builder<ImageImporter>(info, Extensions{extensions...}, test);
}

} // namespace

MZ_COMPONENT(L"Images", L"Reads PNG, JPEG and BMP files",
             importerOf({.uid = "B3970E02-7A6C-11EF-97D8-5A1C40E2F68B"_uid,
                         .name = IMAGE_BUILDERS,
                         .label = L"PNG images"},
                        isPng, L"png"),
             importerOf({.uid = "B3970E03-7A6C-11EF-97D8-5A1C40E2F68B"_uid,
                         .name = IMAGE_BUILDERS,
                         .label = L"JPEG images"},
                        isJpeg, L"jpg", L"jpeg"),
             importerOf({.uid = "B3970E04-7A6C-11EF-97D8-5A1C40E2F68B"_uid,
                         .name = IMAGE_BUILDERS,
                         .label = L"BMP images"},
                        isBmp, L"bmp"))
