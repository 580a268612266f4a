// SPDX-License-Identifier: BSL-1.0
/// The host of the compatibility trial: uses a component in each way that depends on the binary
/// form of what both exchange.
///
///     trialHost FOLDER
///
/// Prints the name of each step that succeeds, at once, so that the last one before a crash is
/// known, and "not" before that of each other. The last line is "done".
#include "tests/abi/compatibility/trial.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/textStream.h"

#include <cstdio>
#include <sstream>
#include <stdexcept>
#include <typeinfo>
#ifdef __cpp_exceptions
#include "components/componentKit/hostKit.h"
#endif

using namespace Mz;
using namespace Mz::Test;

namespace {

const std::wstring shortText = L"short";
const std::wstring longText = L"a text that is too long for the buffer inside of a string object";

bool exchangesTexts(const Trial& trial) {
    return trial.join({shortText, longText, L""}) == shortText + L"-" + longText + L"-" &&
           trial.join({}).empty() &&
           trial.split("text") == std::vector<std::string>{"t", "e", "x", "t"};
}

bool exchangesStreams(const Trial& trial) {
    for (const std::wstring& text : {shortText, longText}) {
        std::stringstream bytes;
        QrOutBuffer out(&bytes);
        QrInBuffer in(&bytes);
        QrBinaryStream writer(&out), reader(&in);
        trial.store(writer, text);
        if (!trial.matches(reader, text))
            return false;
    }
    return trial.written(L"text") == "text 7";
}

#ifdef __cpp_exceptions
bool catches(const Trial& trial) {
    if (!trial.hasExceptions())
        return true;
    int caught = 0;
    try {
        trial.fail(0);
    } catch (const QrStreamEx::ExReadError& failure) {
        caught += std::string(failure.what()).starts_with("a long name of a stream");
    }
    try {
        trial.fail(0);
    } catch (const std::exception& failure) {
#ifdef __cpp_rtti
        caught += dynamic_cast<const QrStreamEx*>(&failure) != nullptr;
#else
        caught += std::string(failure.what()).starts_with("a long name of a stream");
#endif
    }
    try {
        trial.fail(1);
    } catch (const std::runtime_error& failure) {
        caught += std::string(failure.what()).starts_with("a long reason of the component");
    }
    try {
        trial.fail(2);
    } catch (const int value) {
        caught += value == 4711;
    }
    std::istringstream nothing;
    QrInBuffer in(&nothing);
    QrTextStream stream(&in);
    return caught == 4 && trial.failureOf(stream) == "Error reading stream.";
}
#endif

bool tell(const char* step, bool succeeded) {
    std::printf("%s%s\n", succeeded ? "" : "not ", step);
    std::fflush(stdout);
    return succeeded;
}

void runSteps(const Trial& trial) {
    tell("texts", exchangesTexts(trial));
    tell("streams", exchangesStreams(trial));
    tell("threads", trial.fromThread() == 42);
#ifdef __cpp_rtti
    const QrCastable* const root = &trial;
    tell("types", dynamic_cast<const Trial*>(root) == &trial && typeid(*root) != typeid(Trial));
#endif
#ifdef __cpp_exceptions
    tell("exceptions", catches(trial));
#endif
}

} // namespace

int main(int, char** argv) {
#ifdef __cpp_exceptions
    const std::wstring path = Kit::searchPath(argv[1]);
#else
    const std::string folder = argv[1]; // ASCII: the functions for names throw.
    const std::wstring path(folder.begin(), folder.end());
#endif
    QrGetComponentManager()->initialize(path.c_str());
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(trialBuilderUid);
    const auto trial = queryCast<Trial>(object.get());
    if (tell("loaded", static_cast<bool>(trial)))
        runSteps(*trial);
    tell("done", true);
}
