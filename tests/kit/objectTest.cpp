// SPDX-License-Identifier: BSL-1.0
// Objects, uids as text and translations: the parts of the kit that need no component manager.
#include "components/componentKit/componentKit.h"
#include "tests/kit/shapes.h"

#include <gtest/gtest.h>

using namespace Mz;
using namespace Mz::Test;

namespace {

// The four words are the digits in order, in either grouping and case.
constexpr QrUid expected{0x6E1B0A01, 0x4D1F11EF, 0x9C2A7B10, 0x5D3E8F41};
static_assert("6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"_uid == expected);
static_assert("6e1b0a01-4d1f-11ef-9c2a-7b105d3e8f41"_uid == expected);
static_assert("6E1B0A01-4D1F11EF-9C2A7B10-5D3E8F41"_uid == expected);
static_assert("00000000-0000-0000-0000-00000000000f"_uid == QrUid{0, 0, 0, 15});
static_assert("F0000000-0000-0000-0000-000000000000"_uid == QrUid{0xF0000000, 0, 0, 0});

int alive = 0;

class Triangle final : public Kit::Object<Triangle, Shape> {
  public:
    Triangle() { ++alive; }
    ~Triangle() override { --alive; }
    int corners() const override { return 3; }
};

class BlueTriangle final : public Kit::Object<BlueTriangle, Shape, Coloured> {
  public:
    BlueTriangle() { ++alive; }
    ~BlueTriangle() override { --alive; }
    int corners() const override { return 3; }
    std::string colour() const override { return "blue"; }
};

TEST(KitObject, LivesUntilItsLastReferenceIsReleased) {
    QrPtr<Shape> shape(new Triangle);
    const QrPtr<Shape> other = shape;
    shape.reset();
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(other->corners(), 3);
    const_cast<QrPtr<Shape>&>(other).reset();
    EXPECT_EQ(alive, 0);
}

TEST(KitObject, AnswersForItsInterfacesOnly) {
    const QrPtr<Shape> plain(new Triangle);
    EXPECT_EQ(queryCast<Shape>(plain.get()), plain);
    EXPECT_FALSE(queryCast<Coloured>(plain.get()));

    const QrPtr<Shape> blue(new BlueTriangle);
    EXPECT_EQ(queryCast<Coloured>(blue.get())->colour(), "blue");
    EXPECT_EQ(queryCast<Shape>(queryCast<Coloured>(blue.get()).get()), blue);
    EXPECT_FALSE(queryCast<Sounding>(blue.get()));
    EXPECT_EQ(blue->getCastable(), blue.get()) << "The first interface is the principal object.";
}

TEST(KitObject, IsDeletedByDestroy) {
    Triangle* const triangle = new Triangle;
    EXPECT_EQ(alive, 1);
    triangle->destroy();
    EXPECT_EQ(alive, 0);
}

class Triangles final : public Kit::Builder<Triangles> {
  public:
    Triangles() : Kit::Builder<Triangles>({.uid = expected, .name = L"triangles"}) {}
    QrRef<QrCastable> createObject() override { return (new Triangle)->getCastable(); }
};

TEST(KitBuilder, IsItsOwnDescription) {
    Kit::ObjectBuilder<Triangle> plain({.uid = expected, .name = L"triangle"});
    const QrPtr<Triangles> counted(new Triangles);
    QrBuilderDescription* const descriptions[] = {&plain, counted.get()};
    const QrComponentBuilder* const builders[] = {&plain, counted.get()};
    for (std::size_t index = 0; index < std::size(builders); ++index) {
        const QrBuilderDescription& description = *descriptions[index];
        EXPECT_EQ(description.getUid(), expected);
        EXPECT_STREQ(description.getComponentLabel(), L"");
        EXPECT_STREQ(description.getComponentText(), L"");
        EXPECT_EQ(QrCPtr<QrComponentBuilder>(description.getBuilder()).get(), builders[index]);
        EXPECT_EQ(QrPtr<QrComponentBuilder>(descriptions[index]->getBuilder()).get(),
                  builders[index]);
    }
}

class Loud final : public QrCastImpl<Loud, Sounding> {
  public:
    int tone() const override { return 440; }
};

TEST(KitTranslation, SuppliesAnInterfaceWhileItLives) {
    const QrPtr<Shape> shape(new Triangle);
    Loud loud;
    {
        const Kit::Translation<Sounding> translation(*shape, loud);
        ASSERT_TRUE(queryCast<Sounding>(shape.get()));
        EXPECT_EQ(queryCast<Sounding>(shape.get())->tone(), 440);
        EXPECT_FALSE(queryCast<Coloured>(shape.get())) << "It was not asked for.";
    }
    EXPECT_FALSE(queryCast<Sounding>(shape.get()));
}

TEST(KitTranslation, KeepsCountedObjectsAlive) {
    const QrPtr<Shape> shape(new Triangle);
    QrPtr<BlueTriangle> blue(new BlueTriangle);
    auto translation =
        std::make_unique<Kit::Translation<Coloured, Sounding>>(*shape, *blue->getCastable());
    blue.reset();
    EXPECT_EQ(alive, 2);
    EXPECT_EQ(queryCast<Coloured>(shape.get())->colour(), "blue");
    EXPECT_FALSE(queryCast<Sounding>(shape.get())) << "The translator lacks it, too.";
    translation.reset();
    EXPECT_EQ(alive, 1);
}

TEST(KitImporter, HasItsNameAndAnswersForImporters) {
    const auto importer = Kit::newImporter<L"shape">();
    EXPECT_STREQ(importer->getBuilderName(), L"shape");
    EXPECT_TRUE(queryCast<QrImporter>(importer.get()));
}

} // namespace
