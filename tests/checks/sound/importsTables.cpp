// SPDX-License-Identifier: BSL-1.0
/// Imports tables of numbers, with several extensions, progress, interruption and messages.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/processControl.h"

#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Table final : public Kit::Object<Table, Thing> {
  public:
    explicit Table(int sum) : sum(sum) {}
    int value() const override { return sum; }

  private:
    int sum;
};

bool isOfTable(int byte) {
    return (byte >= '0' && byte <= '9') || byte == ',' || byte == ';' || byte == '\t' ||
           byte == '\r' || byte == '\n';
}

class TableImporter final : public Kit::ImportBuilder<TableImporter> {
  public:
    static constexpr QrUid builderUid = soundUid(3);

    TableImporter()
        : ImportBuilder({.uid = builderUid, .name = L"table", .label = L"Tables"},
                        {L"csv", L"CSV", L"tsv", L"table"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return isOfTable(io->read());
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        QrProcessControl* const controller = QrGetProcessController();
        int sum = 0, position = 0;
        for (int byte = 0; (byte = io->read()) >= 0; ++position) {
            if (!isOfTable(byte)) {
                const std::wstring where = std::to_wstring(position);
                controller->error(1, (L"byte " + where + L" is of no table").c_str());
                return nullptr;
            }
            sum = (sum + byte) % 10'000;
            const bool asks = position % 1024 == 0;
            const float done = 1.0f - 1.0f / static_cast<float>(1 + position);
            if (asks && (controller->isInterrupted() || !controller->progress(done, L"reading")))
                return nullptr;
        }
        return new Table(sum);
    }
};

} // namespace

MZ_COMPONENT(L"Tables", L"Imports tables of numbers", Kit::builder<TableImporter>())
