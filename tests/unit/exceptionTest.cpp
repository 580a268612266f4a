// SPDX-License-Identifier: BSL-1.0
// Tests every exception class: texts, positions, bases, clones, copies, and throwing across
// libraries.
#include "components/base/assertions.h"
#include "components/componentManager/cast.h"
#include "components/platform/platform.h"
#include "tests/support/failingAllocations.h"
#include "tests/unit/throwsEverything.h"

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <type_traits>
#include <typeinfo>

using namespace Mz;
using namespace Mz::Test;

namespace {

constexpr const char* file = "components/test/file";
constexpr int line = 321;
const std::string position = "components/test/file(321): ";

/// One exception class and constructor, with the expected reason.
struct Case {
    std::string title;
    std::string reason;
    const std::type_info* type;
    std::function<std::unique_ptr<ExBase>()> make;
    std::function<void()> raise;
    std::function<void()> check;
};

template <class Ex, class Scope, class... Names>
Case exceptionCase(const char* title, std::string reason, Names... names) {
    Case result{title, reason, &typeid(Ex), nullptr, nullptr, nullptr};
    result.make = [=] { return std::make_unique<Ex>(file, line, names...); };
    result.raise = [=] { throw Ex(file, line, names...); };
    result.check = [raise = result.raise, reason] {
        EXPECT_THROW(raise(), Ex);
        EXPECT_THROW(raise(), Scope);
        EXPECT_THROW(raise(), ExBase);
        EXPECT_THROW(raise(), std::runtime_error);
        EXPECT_THROW(raise(), std::exception);
        try {
            raise();
        } catch (const std::exception& caught) {
            EXPECT_EQ(caught.what(), reason);
            EXPECT_NE(dynamic_cast<const ExBase*>(&caught), nullptr);
        }
        try {
            raise();
        } catch (const std::runtime_error& caught) {
            EXPECT_STREQ(caught.std::runtime_error::what(), "");
        }
    };
    return result;
}

template <class Ex>
Case streamCase(const char* title, const char* reason) {
    return exceptionCase<Ex, QrStreamEx>(title, reason);
}
template <class Ex, class... Names>
Case streamCase(const char* title, const char* reason, Names... names) {
    return exceptionCase<Ex, QrStreamEx>(title, reason, names...);
}

std::vector<Case> cases() {
    using S = QrStreamEx;
    const char* const null = nullptr;
    const char* const n = "data.bin";
    const char* const m = "No such file";
    return {
        streamCase<S::ExBadSwapSize>("ExBadSwapSize", "Bad swap bytes size."),
        streamCase<S::ExRead>("ExRead", "Read on output stream."),
        streamCase<S::ExReadError>("ExReadError", "Error reading stream."),
        streamCase<S::ExReadError>("ExReadErrorNamed", "data.bin: Error reading stream.", n),
        streamCase<S::ExReadError>("ExReadErrorEmpty", ": Error reading stream.", ""),
        streamCase<S::ExReadError>("ExReadErrorNull", ": Error reading stream.", null),
        streamCase<S::ExReadObject>("ExReadObject", "Error loading object."),
        streamCase<S::ExReadObject>("ExReadObjectNamed", "data.bin: Error loading object.", n),
        streamCase<S::ExReadObject>("ExReadObjectNull", ": Error loading object.", null),
        streamCase<S::ExReadObjectImp>("ExReadObjectImp", "readObject not implemented."),
        streamCase<S::ExReadOpen>("ExReadOpen", "Error opening input stream."),
        streamCase<S::ExReadOpen>("ExReadOpenNamed", "data.bin: Error opening input stream.", n),
        streamCase<S::ExReadOpen>("ExReadOpenNull", ": Error opening input stream.", null),
        streamCase<S::ExReadOpen>("ExReadOpenTwoNames",
                                  "data.bin: Error opening input stream\nNo such file", n, m),
        streamCase<S::ExReadOpen>("ExReadOpenSecondNull", "data.bin: Error opening input stream\n",
                                  n, null),
        streamCase<S::ExReadOpen>("ExReadOpenBothNull", ": Error opening input stream\n", null,
                                  null),
        streamCase<S::ExWrite>("ExWrite", "Write on input stream."),
        streamCase<S::ExWriteError>("ExWriteError", "Error writing stream."),
        streamCase<S::ExWriteError>("ExWriteErrorNamed", "data.bin: Error writing stream.", n),
        streamCase<S::ExWriteError>("ExWriteErrorNull", ": Error writing stream.", null),
        streamCase<S::ExWriteError>("NamesAreNotTouched", " \"a: b\"\n. : Error writing stream.",
                                    " \"a: b\"\n. "),
        streamCase<S::ExWriteObject>("ExWriteObject", "Error storing object."),
        streamCase<S::ExWriteObject>("ExWriteObjectNamed", "data.bin: Error storing object.", n),
        streamCase<S::ExWriteObject>("ExWriteObjectNull", ": Error storing object.", null),
        streamCase<S::ExWriteObjectImp>("ExWriteObjectImp", "writeObject not implemented."),
        streamCase<S::ExWriteOpen>("ExWriteOpen", "Error opening output stream."),
        streamCase<S::ExWriteOpen>("ExWriteOpenNamed", "data.bin: Error opening output stream.", n),
        streamCase<S::ExWriteOpen>("ExWriteOpenNull", ": Error opening output stream.", null),
        streamCase<S::ExWriteOpen>("ExWriteOpenTwoNames",
                                   "data.bin: Error opening output stream\nNo such file", n, m),
        streamCase<S::ExWriteOpen>("ExWriteOpenFirstNull",
                                   ": Error opening output stream\nNo such file", null, m),
        exceptionCase<QrComponentManagerEx::ExBadCast, QrComponentManagerEx>(
            "ExBadCast", "Bad cast in QrCastable::safeCast"),
        exceptionCase<Assertions::ExProgramAborted, ExBase>("ExProgramAborted", "Program aborted."),
    };
}

class Exception : public testing::TestWithParam<Case> {};

TEST_P(Exception, SaysItsReasonByEveryName) {
    const auto exception = GetParam().make();
    EXPECT_EQ(exception->getReason(), GetParam().reason);
    EXPECT_EQ(exception->getDetailedReason(), position + GetParam().reason);
    const auto& standard = dynamic_cast<const std::exception&>(*exception);
    EXPECT_EQ(standard.what(), GetParam().reason);
    const ExBase& made = *exception;
    EXPECT_EQ(typeid(made), *GetParam().type);
}

TEST_P(Exception, IsCaughtByEveryBase) {
    GetParam().check();
}

TEST_P(Exception, ClonesItsDynamicTypeAndReasonDeeply) {
    auto exception = GetParam().make();
    const std::unique_ptr<ExBase> clone(exception->clone());
    ASSERT_TRUE(clone);
    const ExBase& copy = *clone;
    EXPECT_EQ(typeid(copy), *GetParam().type);
    exception.reset();
    EXPECT_EQ(clone->getReason(), GetParam().reason);
    EXPECT_EQ(clone->getDetailedReason(), position + GetParam().reason);
    EXPECT_EQ(dynamic_cast<const std::exception&>(*clone).what(), GetParam().reason);
    const std::unique_ptr<ExBase> second(clone->clone());
    EXPECT_EQ(second->getReason(), GetParam().reason);
}

INSTANTIATE_TEST_SUITE_P(All, Exception, testing::ValuesIn(cases()),
                         [](const auto& instance) { return instance.param.title; });

// ---- Constructors and bases -----------------------------------------------------------------

template <class Ex, bool named, bool twice>
constexpr bool hasConstructors =
    std::is_constructible_v<Ex, const char*, int>&&
            std::is_constructible_v<Ex, const char*, int, const char*> ==
        named&& std::is_constructible_v<Ex, const char*, int, const char*, const char*> == twice &&
    !std::is_default_constructible_v<Ex> && std::is_copy_constructible_v<Ex> &&
    std::is_base_of_v<std::runtime_error, Ex>;

static_assert(hasConstructors<QrStreamEx::ExBadSwapSize, false, false>);
static_assert(hasConstructors<QrStreamEx::ExRead, false, false>);
static_assert(hasConstructors<QrStreamEx::ExReadError, true, false>);
static_assert(hasConstructors<QrStreamEx::ExReadObject, true, false>);
static_assert(hasConstructors<QrStreamEx::ExReadObjectImp, false, false>);
static_assert(hasConstructors<QrStreamEx::ExReadOpen, true, true>);
static_assert(hasConstructors<QrStreamEx::ExWrite, false, false>);
static_assert(hasConstructors<QrStreamEx::ExWriteError, true, false>);
static_assert(hasConstructors<QrStreamEx::ExWriteObject, true, false>);
static_assert(hasConstructors<QrStreamEx::ExWriteObjectImp, false, false>);
static_assert(hasConstructors<QrStreamEx::ExWriteOpen, true, true>);
static_assert(hasConstructors<QrComponentManagerEx::ExBadCast, false, false>);

static_assert(!std::is_base_of_v<std::exception, ExBase>);
static_assert(std::is_abstract_v<ExBase>);
static_assert(std::is_abstract_v<QrStreamEx>);
static_assert(std::is_abstract_v<QrComponentManagerEx>);
static_assert(std::is_base_of_v<ExBase, QrStreamEx>);
static_assert(std::is_base_of_v<ExBase, QrComponentManagerEx>);
static_assert(!std::is_base_of_v<QrStreamEx, QrComponentManagerEx::ExBadCast>);
static_assert(sizeof(QrStreamEx) == sizeof(ExBase), "a scope class adds no data");

TEST(ExceptionLayout, StartsWithTheRuntimeError) {
    const QrStreamEx::ExRead exception(file, line);
    EXPECT_EQ(static_cast<const void*>(static_cast<const std::runtime_error*>(&exception)),
              static_cast<const void*>(&exception));
}

// ---- ExBase alone ---------------------------------------------------------------------------

class Bare : public ExBase {
  public:
    using ExBase::ExBase;
    using ExBase::setReason;
    ExBase* clone() const override { return new Bare(*this); }
};

TEST(ExBase, StartsWithoutAReason) {
    const Bare bare("components/x/y", 7);
    EXPECT_STREQ(bare.getReason(), "");
    EXPECT_STREQ(bare.getDetailedReason(), "components/x/y(7)");
}

TEST(ExBase, AssignsReasonAndPlaceInEachFamily) {
    QrStreamEx::ExReadError read("f", 1);
    const QrStreamEx::ExReadError otherRead("components/x/y", 7, "damaged");
    static_cast<QrStreamEx&>(read) = otherRead;
    EXPECT_STREQ(read.getDetailedReason(), otherRead.getDetailedReason());
    QrComponentManagerEx::ExBadCast cast("f", 1);
    const QrComponentManagerEx::ExBadCast otherCast("components/x/y", 8);
    static_cast<QrComponentManagerEx&>(cast) = otherCast;
    EXPECT_STREQ(cast.getDetailedReason(), otherCast.getDetailedReason());
}

TEST(ExBase, CopiesTheTextsItIsGiven) {
    std::string source = "components/x/y";
    std::string text = "first";
    Bare bare(source.c_str(), -1);
    bare.setReason(text.c_str());
    source.assign("overwritten!!!!!!");
    text.assign("overwritten!!!!!!");
    EXPECT_STREQ(bare.getReason(), "first");
    EXPECT_STREQ(bare.getDetailedReason(), "components/x/y(-1): first");
}

TEST(ExBase, TakesItsOwnTextAsANewReason) {
    Bare bare("f", 1);
    bare.setReason("a reason that is too long for a short string");
    bare.setReason(bare.getDetailedReason());
    EXPECT_STREQ(bare.getReason(), "f(1): a reason that is too long for a short string");
    EXPECT_STREQ(bare.getDetailedReason(),
                 "f(1): f(1): a reason that is too long for a short string");
}

TEST(ExBase, TakesNullForEmpty) {
    Bare bare(nullptr, 1);
    bare.setReason(nullptr);
    EXPECT_STREQ(bare.getReason(), "");
    EXPECT_STREQ(bare.getDetailedReason(), "(1): ");
}

TEST(ExBase, CopyAndOriginalAreIndependent) {
    Bare bare("f", 1);
    bare.setReason("one");
    Bare copy(bare);
    copy.setReason("two");
    EXPECT_STREQ(bare.getReason(), "one");
    bare = copy;
    copy.setReason("three");
    EXPECT_STREQ(bare.getReason(), "two");
    EXPECT_STREQ(bare.getDetailedReason(), "f(1): two");
}

TEST(Assertions, ThrowProgramAbortedWithThePosition) {
    try {
        Assertions::throwProgramAborted("components/a/b", 99);
    } catch (const ExBase& caught) {
        EXPECT_STREQ(caught.getReason(), "Program aborted.");
        EXPECT_STREQ(caught.getDetailedReason(), "components/a/b(99): Program aborted.");
        EXPECT_EQ(typeid(caught), typeid(Assertions::ExProgramAborted));
    }
    EXPECT_THROW(Assertions::throwProgramAborted("", 0), std::runtime_error);
}

// ---- Without memory -------------------------------------------------------------------------

/// Calls the template's `clone` directly: its body is compiled into this program, so that its
/// allocations can fail.
TEST(ExceptionClone, IsNullWithoutMemory) {
    const QrStreamEx::ExWriteOpen exception(file, line, "name", "second");
    using Clonable = QrConcreteException<QrStreamEx::ExWriteOpen, QrStreamEx>;
    int nulls = 0;
    for (int allowed = 0;; ++allowed) {
        const FailingAllocations failing(allowed);
        const std::unique_ptr<ExBase> clone(exception.Clonable::clone());
        if (clone)
            break;
        ++nulls;
        ASSERT_LT(allowed, 100);
    }
    EXPECT_GE(nulls, 1);
}

// ---- Across libraries -----------------------------------------------------------------------

class ForeignExceptions : public testing::Test {
  protected:
    void SetUp() override {
        const auto path = platform::toNative(THROWING_LIBRARY);
        ASSERT_TRUE(path);
        module = platform::loadLibrary(*path);
        ASSERT_NE(module, nullptr);
        raise = reinterpret_cast<ThrowFunction*>(platform::findSymbol(module, throwFunctionName));
        ASSERT_NE(raise, nullptr);
    }
    void TearDown() override { platform::unloadLibrary(module); }

    platform::Module module = nullptr;
    ThrowFunction* raise = nullptr;
};

TEST_F(ForeignExceptions, AreCaughtByTheirOwnClassHere) {
    EXPECT_THROW(raise(0), QrStreamEx::ExBadSwapSize);
    EXPECT_THROW(raise(1), QrStreamEx::ExRead);
    EXPECT_THROW(raise(2), QrStreamEx::ExReadError);
    EXPECT_THROW(raise(3), QrStreamEx::ExReadObject);
    EXPECT_THROW(raise(4), QrStreamEx::ExReadObjectImp);
    EXPECT_THROW(raise(5), QrStreamEx::ExReadOpen);
    EXPECT_THROW(raise(6), QrStreamEx::ExWrite);
    EXPECT_THROW(raise(7), QrStreamEx::ExWriteError);
    EXPECT_THROW(raise(8), QrStreamEx::ExWriteObject);
    EXPECT_THROW(raise(9), QrStreamEx::ExWriteObjectImp);
    EXPECT_THROW(raise(10), QrStreamEx::ExWriteOpen);
    EXPECT_THROW(raise(11), QrComponentManagerEx::ExBadCast);
    EXPECT_THROW(raise(12), Assertions::ExProgramAborted);
}

TEST_F(ForeignExceptions, AreCaughtByTheirBasesHere) {
    for (int which = 0; which <= 12; ++which) {
        EXPECT_THROW(raise(which), ExBase);
        EXPECT_THROW(raise(which), std::runtime_error);
        EXPECT_THROW(raise(which), std::exception);
        if (which < 11) {
            EXPECT_THROW(raise(which), QrStreamEx);
        }
    }
    EXPECT_THROW(raise(11), QrComponentManagerEx);
}

TEST_F(ForeignExceptions, SurviveAsAClone) {
    std::unique_ptr<ExBase> kept;
    try {
        raise(2);
    } catch (const ExBase& caught) {
        kept.reset(caught.clone());
    }
    ASSERT_TRUE(kept);
    EXPECT_STREQ(kept->getReason(), "foreign: Error reading stream.");
    EXPECT_STREQ(kept->getDetailedReason(),
                 "components/foreign/thrower(17): foreign: Error reading stream.");
}

} // namespace
