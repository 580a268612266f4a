// SPDX-License-Identifier: BSL-1.0
/// The host: imports images and prints their sizes and mean colours.
#include "image.h"

#include "components/componentKit/hostKit.h"

#include <iostream>

using namespace Mz;

namespace {

/// Counts the errors that builders report. `Kit::Controller` has shown them already.
class Reporter final : public Kit::Controller {
  public:
    bool error(int code, const wchar_t* text) override {
        ++errors;
        return Controller::error(code, text);
    }

    int errors = 0;
};

void print(const char* name, const Image& image) {
    unsigned long long sums[3] = {};
    for (const Image::Pixel& pixel : image.pixels()) {
        sums[0] += pixel.red;
        sums[1] += pixel.green;
        sums[2] += pixel.blue;
    }
    std::cout << name << ": " << image.width() << " x " << image.height() << ", mean colour";
    for (const unsigned long long sum : sums)
        std::cout << ' ' << sum / image.pixels().size();
    std::cout << '\n';
}

} // namespace

int main(int argc, char** argv) {
    Kit::initialize(Kit::programFolder() / "components");
    Reporter reporter;
    const Kit::ControllerScope installed(reporter);
    const auto importer = Kit::newImporter<IMAGE_BUILDERS>();
    std::cout << "File types: " << toNarrow(importer->getFileTypes(), '?') << '\n';

    for (int index = 1; index < argc; ++index) {
        const std::wstring name = Kit::wideName(argv[index]);
        const int errorsBefore = reporter.errors;
        bool found = false;
        const auto object = importer->import(name.c_str(), nullptr, found);
        if (const auto image = queryCast<Image>(object.get()))
            print(argv[index], *image);
        else if (!found)
            reporter.error(0, (name + L": there is no such file").c_str());
        else if (reporter.errors == errorsBefore) // No builder has given a reason.
            reporter.error(0, (name + L": no builder reads this file").c_str());
    }
    return reporter.errors == 0 ? 0 : 1;
}
