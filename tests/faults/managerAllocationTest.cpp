// SPDX-License-Identifier: BSL-1.0
/// Tests the component manager while allocations fail. An operation either throws `std::bad_alloc`
/// or has a documented result, and the next call of it gives what it gives without failures.
#include "tests/faults/managerFaultFixture.h"
#include "tests/support/failingAllocations.h"

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsSupersetOf;

namespace {

class ManagerWithoutMemory : public ManagerFaultTest {};

TEST_F(ManagerWithoutMemory, IsInitialisedByTheNextCall) {
    const std::wstring path = searchPathOf(folder.path());
    const int failures = failEachAllocation([&](Attempt& attempt) {
        restart();
        const bool done = attempt.run([&] { manager->initialize(path.c_str()); });
        EXPECT_EQ(manager->initialised, done);
        if (done) {
            // A library whose description could not be recorded has no builders in this start. The
            // next one tries it again, with the list of this one.
            EXPECT_THAT(all, IsSupersetOf(names()));
            for (const ComponentLibrary& library : manager->libraries)
                EXPECT_TRUE(library.builders.size() != 1 || library.builders[0].name == L"gamma");
            restartWithList();
        } else {
            initialize();
        }
        EXPECT_EQ(names(), all);
        EXPECT_TRUE(manager->createObject(recordedBeta));
        EXPECT_TRUE(manager->createObject(recordedGamma));
    });
    EXPECT_GE(failures, leastFailures(40));
}

TEST_F(ManagerWithoutMemory, LosesNothingOfTheRecordedList) {
    const std::string recorded = listWithoutFirst();
    const std::wstring path = searchPathOf(folder.path());
    const int failures = failEachAllocation([&](Attempt& attempt) {
        restart();
        read(recorded);
        if (!attempt.run([&] { manager->initialize(path.c_str()); }))
            initialize();
        EXPECT_EQ(names(), Names{L"gamma"});
        EXPECT_FALSE(isLoaded(L"recorded"));
        EXPECT_EQ(list(), recorded);
    });
    EXPECT_GE(failures, leastFailures(40));
}

TEST_F(ManagerWithoutMemory, ReadsTheListUpToTheFailure) {
    const std::string recorded = wholeList();
    const int failures = failEachAllocation([&](Attempt& attempt) {
        restart();
        Reading<QrBinaryStream> in(recorded);
        const QrPtr<QrPersistant> companion = records(*manager);
        const bool done = attempt.run([&] { companion->read(in.stream); });
        EXPECT_EQ(done, !attempt.failed);
        initialize();
        EXPECT_EQ(names(), all);
        EXPECT_EQ(list(), recorded);
    });
    EXPECT_GE(failures, leastFailures(20));
}

/// A medium that allocates nothing.
class Block final : public std::streambuf {
  public:
    Block() { setp(bytes, bytes + sizeof bytes); }
    std::string_view content() const { return {bytes, static_cast<std::size_t>(pptr() - bytes)}; }

  private:
    char bytes[4096];
};

TEST_F(ManagerWithoutMemory, WritesTheListOrThrows) {
    initialize();
    const std::string recorded = list();
    failEachAllocation([&](Attempt& attempt) {
        Block block;
        std::ostream sink(&block);
        QrOutBuffer buffer(&sink);
        QrBinaryStream stream(&buffer);
        const QrPtr<QrPersistant> companion = records(*manager);
        EXPECT_TRUE(attempt.throwsOnFailure([&] { companion->write(stream); }));
        EXPECT_TRUE(std::string_view(recorded).starts_with(block.content()));
        EXPECT_EQ(block.content().size() == recorded.size(), !attempt.failed);
    });
}

TEST_F(ManagerWithoutMemory, CreatesTheObjectInTheNextCall) {
    const std::string recorded = wholeList();
    const int failures = failEachAllocation([&](Attempt& attempt) {
        restart();
        read(recorded);
        initialize();
        QrRef<QrCastable> builder, object;
        QrRefPtr<QrComponentBuilder> found;
        EXPECT_TRUE(attempt.throwsOnFailure([&] {
            found = manager->getBuilder(recordedBeta);
            object = manager->createObject(recordedGamma);
        }));
        EXPECT_EQ(names(), all);
        EXPECT_TRUE(manager->getBuilder(recordedBeta));
        EXPECT_TRUE(manager->createObject(recordedGamma));
        EXPECT_EQ(list(), recorded);
    });
    EXPECT_GE(failures, leastFailures(2));
}

TEST_F(ManagerWithoutMemory, RecordsAChangedLibraryWhollyOrNotAtAll) {
    const std::string recorded = wholeList();
    const std::filesystem::path changed = fileOf("recordedFirst");
    const auto before = std::filesystem::last_write_time(changed);
    const int failures = failEachAllocation([&](Attempt& attempt) {
        restart();
        read(recorded);
        std::filesystem::last_write_time(changed, before);
        initialize();
        std::filesystem::last_write_time(changed, before - std::chrono::hours(1));
        // The library is read again at the first use.
        attempt.run([&] { static_cast<void>(manager->getBuilder(recordedBeta)); });
        const Names now = names();
        EXPECT_TRUE(now == all || now == Names{L"gamma"});
        EXPECT_EQ(manager->getBuilder(recordedAlpha) != nullptr,
                  manager->getBuilder(recordedBeta) != nullptr);
        restartWithList();
        EXPECT_EQ(names(), all);
    });
    EXPECT_GE(failures, leastFailures(20));
}

} // namespace
