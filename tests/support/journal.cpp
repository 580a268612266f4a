// SPDX-License-Identifier: BSL-1.0
// Keeps the events in one object per process. Events may be added by several threads: components
// whose objects add them are used by several threads, too.
#include "tests/support/journal.h"

#include <mutex>
#include <string>
#include <vector>

namespace Mz::Test {

namespace {

/// Never destroyed: components may add events until the process ends.
struct Journal {
    std::mutex eventsMutex;
    std::vector<std::string> events;
    std::string text;
    void (*hook)(const char* event) = nullptr;
    QrComponentManager* manager = nullptr;
    std::wstring searchPath;
};

Journal& journal() {
    static Journal& instance = *new Journal;
    return instance;
}

} // namespace

void note(const char* event) {
    {
        const std::lock_guard lock(journal().eventsMutex);
        journal().events.emplace_back(event);
    }
    if (journal().hook)
        journal().hook(event);
}

void setHook(void (*hook)(const char* event)) {
    journal().hook = hook;
}

int noted(const char* event) {
    const std::lock_guard lock(journal().eventsMutex);
    int count = 0;
    for (const std::string& known : journal().events)
        count += known == event;
    return count;
}

const char* allNotes() {
    const std::lock_guard lock(journal().eventsMutex);
    std::string& text = journal().text;
    text.clear();
    for (const std::string& event : journal().events)
        text += event + " ";
    return text.c_str();
}

void forgetNotes() {
    const std::lock_guard lock(journal().eventsMutex);
    journal().events.clear();
}

QrComponentManager* managerUnderTest() {
    return journal().manager;
}

void setManagerUnderTest(QrComponentManager* manager) {
    journal().manager = manager;
}

const wchar_t* searchPathUnderTest() {
    return journal().searchPath.c_str();
}

void setSearchPathUnderTest(const wchar_t* path) {
    journal().searchPath = path;
}

} // namespace Mz::Test
