// SPDX-License-Identifier: BSL-1.0
// Tests the post-load list: order, transfer, changes during the notifications, a million entries,
// and the lists of streams.
#include "tests/streams/recordingIO.h"
#include "tests/streams/support.h"

#include <gmock/gmock.h>

#include <deque>
#include <functional>
#include <memory>

namespace {

using namespace Mz::Test;
using Mz::QrPersistant;
using Mz::QrPostLoadList;
using Mz::QrRef;
using Mz::QrStream;
using Mz::QrTextStream;
using testing::ElementsAre;
using testing::IsEmpty;

/// The names of the objects in the order of their notification.
using Journal = std::vector<int>;

/// A counted object that records its notification and its destruction.
class Told final
    : public Mz::QrCastRef<Mz::QrCastHeap<Mz::QrCastImpl<Told, QrPersistant, const Told&>>> {
  public:
    Told(Journal& journal, int name) : toldOnes(journal), ownName(name) { ++alive; }
    ~Told() override {
        --alive;
        if (whenEnded)
            whenEnded();
    }
    Told(const Told&) = delete;
    Told& operator=(const Told&) = delete;

    const Mz::QrUid* getClassUid() const override { return &uid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override {}
    void read(QrStream&) override {}
    void loadFinished() override {
        toldOnes.push_back(ownName);
        if (whenTold)
            whenTold();
    }

    std::function<void()> whenTold;
    std::function<void()> whenEnded;
    static inline int alive = 0;

  private:
    Journal& toldOnes;
    int ownName;
};

class PostLoad : public testing::Test {
  protected:
    QrRef<Told> object(int name) { return new Told(journal, name); }
    void append(QrPostLoadList& list, int name) { list.postLoad(object(name).get()); }
    void TearDown() override { EXPECT_EQ(Told::alive, 0) << "objects were leaked"; }

    Journal journal;
};

TEST_F(PostLoad, ObjectsAreToldInOrderAndDropped) {
    QrPostLoadList list;
    append(list, 1);
    append(list, 2);
    append(list, 3);
    EXPECT_EQ(Told::alive, 3);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
    EXPECT_EQ(Told::alive, 0);
    list.loadFinished();
    EXPECT_EQ(journal.size(), 3U);
}

TEST_F(PostLoad, AnObjectThatWasAppendedTwiceIsToldTwice) {
    QrPostLoadList list;
    const QrRef<Told> twice = object(1);
    list.postLoad(twice.get());
    append(list, 2);
    list.postLoad(twice.get());
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 1));
}

TEST_F(PostLoad, NullIsPassedOver) {
    QrPostLoadList list;
    list.postLoad(nullptr);
    append(list, 1);
    list.postLoad(nullptr);
    list.postLoad(nullptr);
    append(list, 2);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
}

TEST_F(PostLoad, ADestroyedListDropsItsObjectsWithoutTellingThem) {
    {
        QrPostLoadList list;
        append(list, 1);
        append(list, 2);
    }
    EXPECT_THAT(journal, IsEmpty());
    EXPECT_EQ(Told::alive, 0);
}

TEST_F(PostLoad, ObjectsAppendedWhileOthersAreToldAreToldInTheSameRun) {
    QrPostLoadList list;
    const QrRef<Told> first = object(1);
    first->whenTold = [&] { append(list, 3); };
    const QrRef<Told> last = object(2);
    last->whenTold = [&] { append(list, 4); };
    list.postLoad(first.get());
    list.postLoad(last.get());
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3, 4));
    append(list, 5);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3, 4, 5));
}

TEST_F(PostLoad, AnObjectAppendedByTheEndOfTheLastOneIsTold) {
    QrPostLoadList list;
    {
        const QrRef<Told> last = object(1);
        last->whenEnded = [&] { append(list, 2); };
        list.postLoad(last.get());
    }
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
    append(list, 3);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, AnExceptionLeavesTheObjectAndThoseBehindIt) {
    QrPostLoadList list;
    append(list, 1);
    const QrRef<Told> failing = object(2);
    failing->whenTold = [] { throw 5; };
    list.postLoad(failing.get());
    append(list, 3);
    EXPECT_THROW(list.loadFinished(), int);
    EXPECT_THAT(journal, ElementsAre(1, 2));
    EXPECT_THROW(list.loadFinished(), int);
    append(list, 4);
    failing->whenTold = nullptr;
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 2, 2, 3, 4));
}

TEST_F(PostLoad, AListToldWhileItIsBeingToldTellsEachObjectOnce) {
    QrPostLoadList list;
    const QrRef<Told> first = object(1);
    first->whenTold = [&] { list.loadFinished(); };
    list.postLoad(first.get());
    append(list, 2);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
}

TEST_F(PostLoad, TransferAppendsInOrderAndEmptiesTheList) {
    QrPostLoadList from;
    QrPostLoadList to;
    append(to, 1);
    append(from, 2);
    append(from, 3);
    from.transfer(to);
    from.loadFinished();
    EXPECT_THAT(journal, IsEmpty());
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, TransferOfAnEmptyListOrToItselfChangesNothing) {
    QrPostLoadList empty;
    QrPostLoadList list;
    append(list, 1);
    empty.transfer(list);
    list.transfer(list);
    append(list, 2);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
    empty.transfer(empty);
    empty.loadFinished();
}

TEST_F(PostLoad, AfterATransferTheNextObjectGoesBehindTheMovedOne) {
    QrPostLoadList from;
    QrPostLoadList to;
    append(from, 1);
    from.transfer(to);
    QrPostLoadList third;
    append(third, 3);
    third.transfer(to);
    // 2 goes directly after 1. The entry after 1 is kept.
    append(from, 2);
    from.loadFinished();
    EXPECT_THAT(journal, IsEmpty());
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, TheTargetOfATransferStillAppendsBehindItsOwnLastObject) {
    QrPostLoadList from;
    QrPostLoadList to;
    append(to, 1);
    append(from, 3);
    from.transfer(to);
    append(to, 2);
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, AnEmptyTargetAppendsAtTheEndOfWhatItWasGiven) {
    QrPostLoadList from;
    QrPostLoadList to;
    append(from, 1);
    append(from, 2);
    from.transfer(to);
    append(to, 3);
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, OnceTheMovedObjectWasToldAppendingStartsAfresh) {
    QrPostLoadList from;
    QrPostLoadList to;
    append(from, 1);
    from.transfer(to);
    to.loadFinished();
    append(from, 2);
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1));
    from.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
}

TEST_F(PostLoad, OnceTheOtherListIsGoneAppendingStartsAfresh) {
    QrPostLoadList from;
    append(from, 1);
    {
        QrPostLoadList to;
        from.transfer(to);
    }
    append(from, 2);
    from.loadFinished();
    EXPECT_THAT(journal, ElementsAre(2));
}

TEST_F(PostLoad, AListMovedAwayWhileItIsBeingToldIsToldByItsNewOwner) {
    QrPostLoadList from;
    QrPostLoadList to;
    const QrRef<Told> mover = object(1);
    mover->whenTold = [&] { from.transfer(to); };
    from.postLoad(mover.get());
    append(from, 2);
    from.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1));
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2));
}

TEST_F(PostLoad, AListMovedAwayAndToldWhileItIsBeingToldTellsEachObjectOnce) {
    QrPostLoadList from;
    QrPostLoadList to;
    const QrRef<Told> mover = object(1);
    mover->whenTold = [&] {
        from.transfer(to);
        to.loadFinished();
    };
    from.postLoad(mover.get());
    append(from, 2);
    append(from, 3);
    from.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoad, AnObjectThatThrowsAfterItsListWasMovedStaysInTheOther) {
    QrPostLoadList from;
    QrPostLoadList to;
    const QrRef<Told> mover = object(1);
    mover->whenTold = [&] {
        from.transfer(to);
        throw 5;
    };
    from.postLoad(mover.get());
    append(from, 2);
    EXPECT_THROW(from.loadFinished(), int);
    mover->whenTold = nullptr;
    to.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 1, 2));
}

/// The number of entries. Destroying them recursively would overflow any stack.
constexpr int many = 1'000'000;

TEST_F(PostLoad, AMillionEntriesAreDroppedOneByOne) {
    const QrRef<Told> one = object(1);
    {
        QrPostLoadList list;
        for (int count = 0; count < many; ++count)
            list.postLoad(one.get());
    }
    EXPECT_THAT(journal, IsEmpty());
}

TEST_F(PostLoad, AMillionEntriesAreToldAndDroppedOneByOne) {
    const QrRef<Told> one = object(1);
    QrPostLoadList list;
    for (int count = 0; count < many; ++count)
        list.postLoad(one.get());
    list.loadFinished();
    EXPECT_EQ(journal.size(), static_cast<std::size_t>(many));
}

TEST_F(PostLoad, AMillionEntriesMovedAwayWhileTheFirstIsToldAreDroppedOneByOne) {
    const QrRef<Told> one = object(1);
    QrPostLoadList from;
    auto to = std::make_unique<QrPostLoadList>();
    const QrRef<Told> mover = object(0);
    mover->whenTold = [&] {
        from.transfer(*to);
        to->loadFinished();
        to.reset();
    };
    from.postLoad(mover.get());
    for (int count = 0; count < many; ++count)
        from.postLoad(one.get());
    from.loadFinished();
    EXPECT_EQ(journal.size(), static_cast<std::size_t>(many) + 1);
}

// ---- Through streams ------------------------------------------------------------------------

/// A stream on an IO that creates objects for the test.
class PostLoadOfStream : public PostLoad {
  protected:
    /// Lets `readObject` create an object and run `reading` in place of its `read`.
    QrRef<Mz::QrCastable> load(QrStream& stream, int name, std::function<void(Told&)> reading) {
        pending.push_back({name, std::move(reading)});
        return stream.readObject(nullptr, nullptr, nullptr);
    }

    void SetUp() override {
        io.onReadObject = [this](QrStream&) -> QrRef<Mz::QrCastable> {
            const Job job = std::move(pending.front());
            pending.pop_front();
            const QrRef<Told> made = object(job.name);
            job.reading(*made);
            return made;
        };
    }

    struct Job {
        int name;
        std::function<void(Told&)> reading;
    };
    std::deque<Job> pending;
    RecordingIO io;
};

TEST_F(PostLoadOfStream, AnInnerObjectIsToldBeforeTheOneAroundIt) {
    QrTextStream stream(&io);
    load(stream, 1, [&](Told& outer) {
        stream.postLoad(&outer);
        load(stream, 2, [&](Told& inner) {
            load(stream, 3, [&](Told& innermost) { stream.postLoad(&innermost); });
            stream.postLoad(&inner);
        });
        load(stream, 4, [&](Told& inner) { stream.postLoad(&inner); });
        load(stream, 5, [](Told&) {});
    });
    load(stream, 6, [&](Told& next) { stream.postLoad(&next); });
    EXPECT_THAT(journal, IsEmpty());
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(3, 2, 4, 1, 6));
}

TEST_F(PostLoadOfStream, ASecondRequestReplacesTheFirst) {
    QrTextStream stream(&io);
    load(stream, 1, [&](Told& read) {
        stream.postLoad(&read);
        const QrRef<Told> other = object(2);
        stream.postLoad(other.get());
    });
    // The first object is destroyed: its last reference was released.
    EXPECT_EQ(Told::alive, 1);
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(2));
}

TEST_F(PostLoadOfStream, ARequestForNullTakesTheFirstBack) {
    QrTextStream stream(&io);
    load(stream, 1, [&](Told& read) {
        stream.postLoad(&read);
        stream.postLoad(nullptr);
    });
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    EXPECT_THAT(journal, IsEmpty());
}

TEST_F(PostLoadOfStream, TheResultIsTheObjectWithAReferenceOfItsOwn) {
    QrTextStream stream(&io);
    QrRef<Mz::QrCastable> read = load(stream, 1, [&](Told& made) { stream.postLoad(&made); });
    ASSERT_TRUE(read);
    EXPECT_EQ(Told::alive, 1);
    {
        QrPostLoadList list;
        stream.transfer(list);
        list.loadFinished();
    }
    EXPECT_EQ(Told::alive, 1);
    read.reset();
    EXPECT_EQ(Told::alive, 0);
}

TEST_F(PostLoadOfStream, OutsideAReadNobodyIsRemembered) {
    QrTextStream stream(&io);
    const QrRef<Told> outsider = object(1);
    stream.postLoad(outsider.get());
    load(stream, 2, [](Told&) {});
    stream.postLoad(outsider.get());
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    EXPECT_THAT(journal, IsEmpty());
}

TEST_F(PostLoadOfStream, AFailedReadAppendsNothingAndRestoresTheOuterObject) {
    QrTextStream stream(&io);
    load(stream, 1, [&](Told& outer) {
        EXPECT_THROW(load(stream, 2,
                          [&](Told& inner) {
                              stream.postLoad(&inner);
                              throw 5;
                          }),
                     int);
        stream.postLoad(&outer);
    });
    EXPECT_THROW(load(stream, 3,
                      [&](Told& failing) {
                          stream.postLoad(&failing);
                          throw 5;
                      }),
                 int);
    const QrRef<Told> outsider = object(4);
    stream.postLoad(outsider.get());
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1));
}

TEST_F(PostLoadOfStream, ADestroyedStreamTellsNobody) {
    {
        QrTextStream stream(&io);
        load(stream, 1, [&](Told& read) { stream.postLoad(&read); });
        EXPECT_EQ(Told::alive, 1);
    }
    EXPECT_EQ(Told::alive, 0);
    EXPECT_THAT(journal, IsEmpty());
}

TEST_F(PostLoadOfStream, ATransferEmptiesTheStreamAndLaterObjectsGoIntoTheTarget) {
    QrTextStream stream(&io);
    QrPostLoadList list;
    stream.transfer(list); // Still empty.
    append(list, 1);
    load(stream, 2, [&](Told& read) { stream.postLoad(&read); });
    stream.transfer(list);
    load(stream, 3, [&](Told& read) { stream.postLoad(&read); });
    // 3 is already in `list`, after 2, so nothing moves.
    QrPostLoadList other;
    stream.transfer(other);
    other.loadFinished();
    EXPECT_THAT(journal, IsEmpty());
    list.loadFinished();
    EXPECT_THAT(journal, ElementsAre(1, 2, 3));
}

TEST_F(PostLoadOfStream, TheLibrarysOwnBuffersRefuseObjects) {
    Reading<QrTextStream> in("");
    EXPECT_THROW(in.stream.readObject(nullptr, nullptr, nullptr), Mz::QrStreamEx::ExReadObjectImp);
    EXPECT_THROW(in.stream << static_cast<Mz::QrCastable*>(nullptr),
                 Mz::QrStreamEx::ExWriteObjectImp);
    Writing<QrTextStream> out;
    EXPECT_THROW(out.stream.readObject(nullptr, nullptr, nullptr), Mz::QrStreamEx::ExReadObjectImp);
    EXPECT_THROW(out.stream << static_cast<Mz::QrCastable*>(nullptr),
                 Mz::QrStreamEx::ExWriteObjectImp);
}

} // namespace
