// SPDX-License-Identifier: BSL-1.0
/// The component of the compatibility trial. Without exceptions, it has no function that throws or
/// catches. With MZ_TRIAL_BY_HAND it does without the component kit, apart from the stamp.
#include "tests/abi/compatibility/trial.h"

#include "components/componentKit/stamp.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/textStream.h"

#include <sstream>
#include <stdexcept>
#include <thread>
#ifndef MZ_TRIAL_BY_HAND
#include "components/componentKit/componentKit.h"
#endif

using namespace Mz;
using namespace Mz::Test;

namespace {

class TrialObject final : public QrCastRef<QrCastHeap<QrCastImpl<TrialObject, Trial>>> {
  public:
    std::wstring join(const std::vector<std::wstring>& parts) const override {
        std::wstring all;
        for (const std::wstring& part : parts)
            all += (all.empty() ? L"" : L"-") + part;
        return all;
    }

    std::vector<std::string> split(const std::string& text) const override {
        std::vector<std::string> characters;
        for (const char c : text)
            characters.emplace_back(1, c);
        return characters;
    }

    void store(QrStream& stream, const std::wstring& text) const override {
        stream << text << 4711 << 0.1;
    }

    bool matches(QrStream& stream, const std::wstring& text) const override {
        std::wstring read;
        int first = 0;
        double second = 0;
        stream >> read >> first >> second;
        return read == text && first == 4711 && second == 0.1;
    }

    std::string written(const std::wstring& text) const override {
        std::ostringstream bytes;
        QrOutBuffer buffer(&bytes);
        QrTextStream(&buffer).formattedWrite(L"%ls %d", text.c_str(), 7);
        return bytes.str();
    }

    int fromThread() const override {
        int result = 0;
        const auto compute = [&] { result = 42; };
#if defined(__GLIBCXX__) && !defined(_GLIBCXX_HAS_GTHREADS)
        compute(); // This standard library has no threads.
#else
        std::thread(compute).join();
#endif
        return result;
    }

#ifdef __cpp_exceptions
    bool hasExceptions() const override {
        return true;
    }

    void fail(int kind) const override {
        if (kind == 0)
            throw QrStreamEx::ExReadError("trial", 1, "a long name of a stream, for the heap");
        if (kind == 1)
            throw std::runtime_error("a long reason of the component, for the heap");
        throw 4711;
    }

    std::string failureOf(QrStream& stream) const override {
        int value = 0;
        try {
            stream >> value;
        } catch (const QrStreamEx::ExReadError& failure) {
            return failure.what();
        }
        return "none";
    }
#else
    bool hasExceptions() const override {
        return false;
    }
    void fail(int) const override {}
    std::string failureOf(QrStream&) const override {
        return {};
    }
#endif
};

} // namespace

#ifndef MZ_TRIAL_BY_HAND
MZ_COMPONENT(L"Trial", L"For tests of compatibility",
             Kit::builderOf<TrialObject>({.uid = trialBuilderUid, .name = L"trial"}))
#else
namespace {

class TrialBuilder final
    : public QrCastMulti<TrialBuilder, QrComponentBuilder, QrBuilderDescription> {
  public:
    const QrUid& getUid() const override { return trialBuilderUid; }
    const wchar_t* getName() const override { return L"trial"; }
    const wchar_t* getLabel() const override { return L""; }
    unsigned int getNumber() const override { return 0; }
    const wchar_t* getText() const override { return L""; }
    bool getFlag() const override { return false; }
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return this; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return this; }
    QrRef<QrCastable> createObject() override { return (new TrialObject)->getCastable(); }
};

class TrialDescription final : public QrCastImpl<TrialDescription, QrComponentDescription> {
  public:
    QrRef<QrCastable> createBuilder(const QrUid&) override { return builder.getBuilder(); }
    int64 getComponentValue() override { return 0; }
    const wchar_t* getComponentLabel() override { return L"Trial"; }
    const wchar_t* getComponentText() override { return L"By hand"; }
    unsigned int getBuilderCount() override { return 1; }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        if (const QrEnum::Action action = e.process(&builder))
            return action;
        return e.finished();
    }

  private:
    TrialBuilder builder;
};

} // namespace

MZ_COMPONENT_STAMP;

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    static TrialDescription description;
    return &description;
}
#endif
