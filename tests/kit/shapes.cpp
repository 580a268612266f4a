// SPDX-License-Identifier: BSL-1.0
/// A component that is made of every part that the kit has for components.
#include "tests/kit/shapes.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Square final : public Kit::Object<Square, Shape> {
  public:
    int corners() const override { return 4; }
};

class RedSquare final : public Kit::Object<RedSquare, Shape, Coloured> {
  public:
    int corners() const override { return 4; }
    std::string colour() const override { return "red"; }
};

class Polygon final : public Kit::Object<Polygon, Shape> {
  public:
    explicit Polygon(int number) : count(number) {}
    int corners() const override { return count; }

  private:
    int count;
};

/// Makes polygons with a number of corners that its constructor is given.
class PolygonBuilder final : public Kit::Builder<PolygonBuilder> {
  public:
    static constexpr QrUid builderUid = fiveUid;

    PolygonBuilder() : PolygonBuilder(builderUid, 5) {}
    PolygonBuilder(const QrUid& uid, int number)
        : Builder({.uid = Kit::BuilderUid::atRunTime(uid), .name = L"polygon"}), count(number) {}

    QrRef<QrCastable> createObject() override { return QrPtr<Polygon>(new Polygon(count)); }

  private:
    int count;
};

/// Imports files that begin with a digit, as polygons.
class Count final : public Kit::ImportBuilder<Count> {
  public:
    Count() : ImportBuilder({.uid = countUid, .name = L"shape", .label = L"Counts"}, {L"count"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        const int first = io->read();
        return first >= '0' && first <= '9';
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        return QrPtr<Polygon>(new Polygon(io->read() - '0'));
    }
};

} // namespace

MZ_COMPONENT(L"Shapes", L"For the tests of the kit",
             Kit::builderOf<Square>({.uid = squareUid, .name = L"shape", .number = 1}),
             Kit::builderOf<RedSquare>({.uid = redSquareUid, .name = L"shape", .number = 2}),
             Kit::builder<Count>(), Kit::builder<PolygonBuilder>(),
             Kit::builder<PolygonBuilder>("4B7D1016-62AC-11EF-9E0B-3C5F8A21D7E4"_uid, 6),
             Kit::builderOf<Kit::Importer<L"shape">>({.uid = importerUid, .name = L"importer"}))
