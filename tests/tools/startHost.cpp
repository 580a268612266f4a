// SPDX-License-Identifier: BSL-1.0
/// A host that starts its components by the tools' `start`:
///
///     startHost LIST FOLDER [mode=MODE] [own=NAME] [without=NAME] [uid] [exit] [finish]
///
/// It prints the unclean end before it, what it left out, and the number of builders; then it makes
/// an object of each builder. MODE answers the offer of the safe mode, NAME is a file's name.
/// `exit` ends the process in the middle, `finish` before that ends the work cleanly.
#include "components/componentKit/recordedList.h"
#include "components/componentManager/componentImp.h"
#include "components/componentTools/start.h"
#include "tests/components/testUids.h"

#include <algorithm>
#include <clocale>
#include <cstdio>
#include <cstdlib>

using namespace Mz;

namespace {

class Collector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override {
        items.push_back(std::move(item));
        return Continue;
    }
    std::vector<QrCPtr<QrBuilderDescription>> items;
};

std::string namesOf(const std::vector<std::filesystem::path>& files) {
    std::string names;
    for (const std::filesystem::path& file : files)
        names += " " + file.stem().string();
    return names;
}

Kit::StartMode modeNamed(const std::string& name) {
    return name == "changed"      ? Kit::StartMode::withoutChanged
           : name == "thirdParty" ? Kit::StartMode::withoutThirdParty
                                  : Kit::StartMode::asAlways;
}

} // namespace

int main(int count, char** words) {
    std::setlocale(LC_ALL, "");
    const std::vector<std::string> arguments(words + 1, words + count);
    const auto has = [&](const char* word) {
        return std::find(arguments.begin(), arguments.end(), word) != arguments.end();
    };
    const auto value = [&](const std::string& key) {
        for (const std::string& argument : arguments)
            if (argument.starts_with(key + "="))
                return argument.substr(key.size() + 1);
        return std::string();
    };
    Kit::StartOptions options;
    options.list = Kit::listFromEnvironment(arguments.at(0));
    options.searchPath = arguments.at(1);
    options.probe.timeLimit = std::chrono::seconds(60);
    options.isOwn = [&](const std::filesystem::path& file) { return file.stem() == value("own"); };
    if (const std::string name = value("without"); !name.empty())
        options.without.emplace_back(std::wstring(name.begin(), name.end()));
    if (has("uid"))
        options.without.emplace_back(Test::kitUid);
    options.afterUncleanEnd = [&](const Kit::UncleanEnd& end) {
        std::printf("unclean %s, changed%s, others'%s\n", end.whileStarting ? "start" : "work",
                    namesOf(end.changed).c_str(), namesOf(end.thirdParty).c_str());
        return modeNamed(value("mode"));
    };
    Kit::Started started = Kit::start(options);
    Collector builders;
    QrGetComponentManager()->enumerateBuilders(builders);
    std::printf("%s%d builders, left out%s\n", started ? "" : "not started, ",
                static_cast<int>(builders.items.size()), namesOf(started.leftOut()).c_str());
    std::fflush(stdout);
    if (has("finish"))
        started.finish();
    if (has("exit"))
        std::exit(0);
    for (const auto& builder : builders.items)
        QrGetComponentManager()->createObject(builder->getUid());
}
