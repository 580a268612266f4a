// SPDX-License-Identifier: BSL-1.0
/// What the rules of builders and of stored objects see, call by call.
#include "tests/checks/obedientLibrary.h"

#include "components/componentManager/exceptions.h"
#include "components/componentTools/checking/checkObjects.h"
#include "tests/support/temporaryDirectory.h"

#include <atomic>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using ::testing::StartsWith;

namespace {

class BuilderRules : public ObedientLibrary {
  protected:
    BuilderRules() { description.builders = {&builder}; }

    ScriptedBuilder builder;
};

TEST_F(BuilderRules, ExpectOnePrincipalObject) {
    class Lost final : public ScriptedObject {
      public:
        const QrCastable* getCastable() const override { return constant; }
        QrCastable* getCastable() override { return principal; }
        const QrCastable* constant = this;
        QrCastable* principal = this;
    } lost, other;
    builder.create = [&] { return QrRef<QrCastable>(static_cast<QrPersistant*>(&lost)); };
    EXPECT_THAT(check("castable-consistent"), IsEmpty());
    const auto expectFault = [&] {
        EXPECT_THAT(check("castable-consistent"),
                    ElementsAre(StartsWith("castable-consistent: the object: getCastable does not "
                                           "always return the same object. ")));
    };
    lost.principal = nullptr;
    expectFault();
    lost.principal = &other;
    expectFault();
    lost.constant = &other;
    other.principal = &lost;
    other.constant = &lost;
    expectFault();
}

TEST_F(BuilderRules, ExpectThePrincipalObjectOfEachView) {
    class View final : public ScriptedObject {
      public:
        const QrCastable* getCastable() const override { return constant; }
        QrCastable* getCastable() override { return principal; }
        const QrCastable* constant = nullptr;
        QrCastable* principal = nullptr;
    } view;
    class Viewed final : public ScriptedObject {
      public:
        explicit Viewed(QrCastable& object) : seen(object) {}
        QrCastable* getInterface(const QrUid& wanted) override {
            return wanted == QrPersistant::uid ? &seen : nullptr;
        }

      private:
        QrCastable& seen;
    } object(view);
    ScriptedObject other;
    builder.create = [&] { return object.getCastable(); };
    const auto expectFault = [&](QrCastable* principal, const QrCastable* constant, bool fault) {
        view.principal = principal;
        view.constant = constant;
        const std::vector<std::string> found = check("castable-consistent");
        EXPECT_THAT(found, SizeIs(fault));
        for (const std::string& sentence : found)
            EXPECT_THAT(sentence, HasSubstr("does not return the principal object"));
    };
    expectFault(&object, &object, false);
    expectFault(nullptr, nullptr, true);
    expectFault(&object, &other, true);
    expectFault(&other, &other, true);
}

TEST_F(BuilderRules, CompareTheAnswersAboutAnInterface) {
    class Promising final : public ScriptedObject {
      public:
        bool hasInterface(const QrUid& wanted) const override {
            return wanted == QrImportBuilder::uid || ScriptedObject::hasInterface(wanted);
        }
    } promising;
    builder.create = [&] { return promising.getCastable(); };
    EXPECT_THAT(check("interfaces-agree"),
                ElementsAre("interfaces-agree: the object: hasInterface(AD148682-719A11D1-A3BB0060-"
                            "9707609D) returns true, but getInterface returns null. Let both "
                            "answer from one list of interfaces."));
}

TEST_F(BuilderRules, AskForTwoObjectsBeforeTheyJudgeTheirEnd) {
    int objects = 0;
    ScriptedObject object;
    builder.create = [&] { return ++objects == 2 ? nullptr : object.getCastable(); };
    EXPECT_THAT(check("object-destroyed"), IsEmpty()) << "the second is null";
    EXPECT_THAT(check("object-destroyed"), IsEmpty()) << "both are one object";
    EXPECT_EQ(objects, 4);
}

TEST_F(BuilderRules, LetABuilderReturnAnother) {
    class Deputy final
        : public Kit::SelfDescribing<
              QrCastRef<QrCastMulti<Deputy, QrComponentBuilder, QrBuilderDescription>>> {
      public:
        explicit Deputy(ScriptedBuilder& other)
            : SelfDescribing({.uid = Kit::BuilderUid::atRunTime(scriptedUid(1)),
                              .name = L"scripted",
                              .label = L"Scripted"}),
              deputy(other) {}
        QrRef<QrCastable> createObject() override { return nullptr; }
        QrRefPtr<QrComponentBuilder> getBuilder() override { return &deputy; }

      private:
        ScriptedBuilder& deputy;
    };
    Deputy counted(builder);
    counted.newReference();
    description.builders = {&counted};
    EXPECT_THAT(check("builder-itself"), IsEmpty());
}

TEST_F(BuilderRules, FindObjectsThatMissForSomeThreads) {
    std::atomic<int> objects{0};
    ScriptedObject object;
    builder.create = [&] { return ++objects % 2 ? object.getCastable() : nullptr; };
    task.threadSafe = true;
    EXPECT_THAT(check("surroundings-threads"),
                ElementsAre("surroundings-threads: createObject fails when 8 threads call it at a "
                            "time. Guard what the builder shares, or do not declare the library "
                            "thread-safe."));
    const int before = objects;
    avoid(L"createObject", placeOf(1));
    EXPECT_THAT(check("surroundings-threads"), IsEmpty());
    avoid(L"createBuilder", placeOf(1));
    EXPECT_THAT(check("surroundings-threads"), IsEmpty());
    EXPECT_EQ(objects, before);
}

/// An object that stores another one.
class Link final : public ScriptedObject {
  public:
    void write(QrStream& stream) override { stream << next; }
    void read(QrStream& stream) override {
        const QrRef<QrCastable> inner = stream.readObject(nullptr, nullptr, nullptr);
        next = inner.get();
    }
    QrCastable* next = nullptr;
};

class ObjectRules : public BuilderRules {
  protected:
    ObjectRules() {
        builder.create = [this] {
            links.push_back(std::make_unique<Link>());
            return links.back()->getCastable();
        };
    }

    template <class Use>
    auto inContext(Use use) {
        task.file = file();
        CheckSender sender([](const std::string&) {});
        CheckContext context(task, sender);
        return use(context);
    }

    /// Stores the object. Returns nothing if that throws.
    std::optional<std::string> bytesOf(QrPersistant& object) {
        return inContext([&](CheckContext& context) {
            return writtenBytes(context, L"place", object, StoredForm::binary);
        });
    }

    bool isRead(const std::string& bytes, Supply supply = Supply::whole) {
        Link first;
        return inContext([&](CheckContext& context) {
            return readBytes(context, L"place", first, StoredForm::binary, bytes, supply);
        });
    }

    std::vector<std::unique_ptr<Link>> links;
};

TEST_F(ObjectRules, StoreTwoHundredObjectsInsideOneAnother) {
    std::vector<Link> chain(202);
    const auto connect = [&](std::size_t count) -> QrPersistant& {
        for (std::size_t index = 0; index < count; ++index)
            chain[index].next = index + 1 < count ? chain[index + 1].getCastable() : nullptr;
        return chain[0];
    };
    const std::string alone = bytesOf(connect(1)).value();
    const std::string two = bytesOf(connect(2)).value();
    EXPECT_TRUE(bytesOf(connect(201)));
    EXPECT_FALSE(bytesOf(connect(202)));
    // Each level writes the same bytes before the next.
    const std::string level = two.substr(0, two.size() - alone.size());
    const auto levels = [&](int count) {
        std::string bytes;
        for (int index = 0; index < count; ++index)
            bytes += level;
        return bytes + alone;
    };
    EXPECT_EQ(levels(1), two);
    EXPECT_TRUE(isRead(levels(200)));
    EXPECT_FALSE(isRead(levels(201)));
    links.clear();
}

TEST_F(ObjectRules, ReadOnlyObjectsThatTheLibraryMakes) {
    Link outer, inner;
    outer.next = inner.getCastable();
    const std::string bytes = bytesOf(outer).value();
    EXPECT_TRUE(isRead(bytes));
    EXPECT_TRUE(isRead(bytes, Supply::pieces));
    EXPECT_FALSE(isRead(bytes.substr(0, bytes.size() - 1), Supply::pieces)) << "it is cut";
    std::string later = bytes;
    later[3] = 2; // The number of an object that was not stored before.
    EXPECT_FALSE(isRead(later));
    builder.create = [] { return nullptr; };
    EXPECT_FALSE(isRead(bytes)) << "no object";
    description.builders.clear();
    EXPECT_FALSE(isRead(bytes)) << "no such builder";
    class Refusing final : public ScriptedDescription {
      public:
        QrRef<QrCastable> createBuilder(const QrUid&) override { return nullptr; }
    } refusing;
    refusing.builders = {&builder};
    describe = [&] { return &refusing; };
    EXPECT_FALSE(isRead(bytes)) << "the builder is described, but not made";
}

TEST_F(ObjectRules, WriteOnlyObjectsWithAClass) {
    class Classless final : public ScriptedObject {
      public:
        const QrUid* getClassUid() const override { return nullptr; }
    } classless;
    ScriptedBuilder plain;
    Link outer;
    EXPECT_TRUE(bytesOf(outer));
    outer.next = classless.getCastable();
    EXPECT_FALSE(bytesOf(outer));
    outer.next = plain.getCastable();
    EXPECT_FALSE(bytesOf(outer)) << "it does not store itself";
}

TEST_F(ObjectRules, NameAClassWithoutABuilderOnce) {
    class Pair final : public ScriptedObject {
      public:
        void write(QrStream& stream) override {
            stream << static_cast<const QrCastable*>(&first)
                   << static_cast<const QrCastable*>(&second);
        }
        ScriptedObject first, second;
    } pair;
    pair.first.classUid = pair.second.classUid = scriptedUid(7);
    builder.create = [&] { return pair.getCastable(); };
    const CheckReport report = reportOf("persistant-class");
    ASSERT_EQ(report.findings.size(), 1u);
    EXPECT_EQ(report.findings[0].missingClass, scriptedUid(7));
    EXPECT_THAT(toUtf8(report.findings[0].sentence),
                HasSubstr("of objects that its objects contain"));
}

/// An object that fails as the test says.
class Failing final : public ScriptedObject {
  public:
    void write(QrStream& stream) override {
        ++writes;
        if (writeFails && writeFails())
            throw std::runtime_error("not written");
        stream << (counts ? writes : number);
    }
    void read(QrStream& stream) override {
        ScriptedObject::read(stream);
        if (readFails)
            throw std::runtime_error("not read");
    }
    std::function<bool()> writeFails;
    bool readFails = false, counts = false;
    int writes = 0;
};

TEST_F(ObjectRules, LeaveUnexpectedExceptionsToTheirRule) {
    Failing failing;
    builder.create = [&] { return failing.getCastable(); };
    EXPECT_THAT(check("persistant-roundtrip"), IsEmpty());
    failing.readFails = true;
    EXPECT_THAT(check("persistant-roundtrip"),
                ElementsAre(StartsWith("exceptions-allowed: read throws ")));
    EXPECT_THAT(check("persistant-pieces"),
                ElementsAre(StartsWith("exceptions-allowed: read throws ")));
    failing.readFails = false;
    failing.writeFails = [] { return true; };
    EXPECT_THAT(check("persistant-roundtrip"),
                ElementsAre(StartsWith("exceptions-allowed: write throws ")));
    failing.writes = 0;
    failing.writeFails = [&] { return failing.writes == 3; }; // The copy, after it was read.
    EXPECT_THAT(check("persistant-roundtrip"),
                ElementsAre(StartsWith("exceptions-allowed: write throws ")));
}

TEST_F(ObjectRules, CompareWhatACopyWrites) {
    Failing counting;
    counting.counts = true;
    builder.create = [&] { return counting.getCastable(); };
    EXPECT_THAT(check("persistant-roundtrip"),
                ElementsAre(StartsWith("persistant-roundtrip: an object that was written and read "
                                       "writes other bytes in binary form (4 bytes, then 4)"),
                            HasSubstr("in text form")));
    EXPECT_THAT(check("persistant-pieces"),
                ElementsAre(StartsWith("persistant-pieces: read fails on input that comes in "
                                       "pieces")));
}

TEST_F(ObjectRules, BearABuilderThatMakesNoMoreObjects) {
    ScriptedObject object;
    int left = 0;
    builder.create = [&] { return left-- > 0 ? object.getCastable() : nullptr; };
    for (const char* rule : {"persistant-roundtrip", "persistant-pieces", "persistant-truncated",
                             "persistant-frees", "persistant-damaged"})
        for (const int objects : {0, 1, 2, 3}) {
            left = objects;
            EXPECT_THAT(check(rule), IsEmpty()) << rule << " with " << objects;
        }
}

TEST_F(ObjectRules, StoreWhatAnImporterMakesOfASample) {
    const TemporaryDirectory folder;
    task.samples = {folder.write("a.scripted", "a"), folder.write("b.scripted", "b"),
                    folder.write("c.scripted", "c")};
    ScriptedObject object;
    ScriptedImporter importer;
    importer.accept = [](QrPtr<QrBufferedIO> io) { return io->read() != 'a'; };
    importer.make = [&](QrPtr<QrBufferedIO> io) {
        return io->read() == 'b' ? nullptr : object.getCastable();
    };
    description.builders = {&importer};
    class Other final : public ScriptedObject {
      public:
        void read(QrStream& stream) override {
            ScriptedObject::read(stream);
            throw QrStreamEx::ExReadError("objectRulesTest", __LINE__, "too new");
        }
    } other;
    EXPECT_THAT(check("persistant-roundtrip"), IsEmpty()) << "the importer makes no copies";
    importer.create = [&] { return other.getCastable(); };
    const CheckReport report = reportOf("persistant-roundtrip");
    std::vector<std::wstring> places;
    for (const CheckFinding& finding : report.findings)
        if (finding.place.find(L"imported") != std::wstring::npos)
            places.push_back(finding.place);
    EXPECT_THAT(places, ElementsAre(placeOf(1) + L", imported from c.scripted",
                                    placeOf(1) + L", imported from c.scripted"));
}

TEST_F(ObjectRules, LeaveObjectsThatAlwaysLeakToTheirRule) {
    if (!MZ_COUNTS_MEMORY)
        GTEST_SKIP() << "the sanitizers have a heap of their own";
    class Leaking final : public ScriptedObject {
      public:
        explicit Leaking(bool ofFailures) : onlyOfFailures(ofFailures) {}
        void read(QrStream& stream) override {
            leaked.push_back(std::make_unique<std::string>(1000, 'x'));
            ScriptedObject::read(stream);
            if (onlyOfFailures)
                leaked.clear();
        }
        std::vector<std::unique_ptr<std::string>> leaked;
        bool onlyOfFailures;
    };
    Leaking always(false), failing(true);
    builder.create = [&] { return failing.getCastable(); };
    EXPECT_THAT(check("persistant-frees"), ElementsAre(StartsWith("persistant-frees: each read")));
    builder.create = [&] { return always.getCastable(); };
    EXPECT_THAT(check("persistant-frees"), IsEmpty());
}

} // namespace
