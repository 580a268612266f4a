// SPDX-License-Identifier: BSL-1.0
/// Reports the first difference only: an inserted operation moves all that follow, and the first
/// one shows where the edit is. Components that are compiled with the headers of their host contain
/// the same bytes as it, so their tables are compared as bytes first.
#include "components/componentTools/inspecting/interfaceDifference.h"

#include "components/componentManager/interfaceTable.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/platform/system.h"
#include "components/platform/files.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <utility>

namespace Mz::Tools {

namespace {

bool isNameCharacter(char character) {
    return character == '_' || (character >= '0' && character <= '9') ||
           (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z') ||
           static_cast<unsigned char>(character) >= 0x80;
}

/// Returns the length of the scope at the begin of `text`, such as "name::"; 0 if there is none.
std::size_t scopeLength(std::string_view text) {
    std::size_t length = 0;
    while (length < text.size() && isNameCharacter(text[length]))
        ++length;
    return length > 0 && text.substr(length, 2) == "::" ? length + 2 : 0;
}

/// Returns whether two texts name the same types. GCC names inline namespaces and Clang does not,
/// so a scope may be missing in Clang's text, except for the first one of a name.
bool sameTypes(std::string_view gcc, std::string_view clang) {
    for (bool inside = false; !gcc.empty();) {
        const std::size_t scope = scopeLength(gcc);
        if (scope > 0 && clang.substr(0, scope) == gcc.substr(0, scope)) {
            clang.remove_prefix(scope);
            gcc.remove_prefix(scope);
            inside = true;
        } else if (scope > 0 && inside) {
            gcc.remove_prefix(scope);
        } else {
            std::size_t word = 0;
            while (word < gcc.size() && isNameCharacter(gcc[word]))
                ++word;
            word = std::max<std::size_t>(word, 1);
            if (clang.substr(0, word) != gcc.substr(0, word))
                return false;
            clang.remove_prefix(std::min(word, clang.size()));
            gcc.remove_prefix(word);
            inside = false;
        }
    }
    return clang.empty();
}

std::wstring number(std::int64_t value) {
    return std::to_wstring(value);
}

/// Compares two tables of one uid.
class Comparison {
  public:
    Comparison(const InterfaceTable& ofComponent, const InterfaceTable& ofHost)
        : component(ofComponent), host(ofHost), name(fromUtf8(ofHost.name)) {}

    /// Returns the first difference as the begin of a sentence; empty if there is none.
    std::wstring difference() const {
        for (const auto part : {&Comparison::operations, &Comparison::slots, &Comparison::values,
                                &Comparison::bases, &Comparison::object})
            if (std::wstring found = (this->*part)(); !found.empty())
                return found;
        return {};
    }

  private:
    bool grows() const { return component.flags & host.flags & interfaceGrows; }

    bool isSame(const std::string& here, const std::string& there) const {
        if ((component.flags & interfaceFromClang) == (host.flags & interfaceFromClang))
            return here == there;
        return component.flags & interfaceFromClang ? sameTypes(there, here)
                                                    : sameTypes(here, there);
    }

    static std::wstring quoted(const std::string& text) { return L"`" + fromUtf8(text) + L"`"; }

    /// Compares the slots that both list. Of a slot that only one lists, the other may have the
    /// same operation and not say so; if an operation was added or removed, others are in other
    /// slots.
    std::wstring operations() const {
        for (const InterfaceOperation& here : component.operations)
            for (const InterfaceOperation& there : host.operations)
                if (here.slot == there.slot && !isSame(here.text, there.text))
                    return L"slot " + number(here.slot) + L" of " + name + L" is " +
                           quoted(here.text) + L" here and " + quoted(there.text) + L" in the host";
        return {};
    }

    std::wstring slots() const {
        if (grows() || component.slotCount == host.slotCount)
            return {};
        const bool longerHere = component.slotCount > host.slotCount;
        const std::int64_t common = std::min(component.slotCount, host.slotCount);
        std::wstring added;
        for (const InterfaceOperation& operation : (longerHere ? component : host).operations)
            if (operation.slot == common)
                added = L": only " + std::wstring(longerHere ? L"here" : L"the host") +
                        (longerHere ? L" is " : L" has ") + quoted(operation.text);
        return name + L" has " + number(component.slotCount) + L" slots here and " +
               number(host.slotCount) + L" in the host" + added;
    }

    std::wstring values() const {
        for (const InterfaceValue& here : component.values)
            for (const InterfaceValue& there : host.values)
                if (isSame(here.name, there.name) && here.size && there.size)
                    if (std::wstring found = differingValue(here, there); !found.empty())
                        return found;
        return {};
    }

    std::wstring differingValue(const InterfaceValue& here, const InterfaceValue& there) const {
        const std::wstring subject =
            fromUtf8(there.name) + L", which " + name + L" passes by value, ";
        if (here.size != there.size)
            return subject + L"has " + number(here.size) + L" bytes here and " +
                   number(there.size) + L" in the host";
        if (here.alignment != there.alignment)
            return subject + L"is aligned to " + number(here.alignment) + L" bytes here and to " +
                   number(there.alignment) + L" in the host";
        if (here.flags != there.flags)
            return subject + L"is copied or destroyed in another way here than in the host";
        return {};
    }

    std::wstring bases() const {
        for (const InterfaceBase& here : component.bases)
            for (const InterfaceBase& there : host.bases)
                if (isSame(here.name, there.name))
                    if (std::wstring found = differingBase(here, there); !found.empty())
                        return found;
        return {};
    }

    std::wstring differingBase(const InterfaceBase& here, const InterfaceBase& there) const {
        const std::wstring subject = fromUtf8(there.name) + L", a base of " + name + L", ";
        if (here.virtualDestructor != there.virtualDestructor)
            return subject + L"has a virtual destructor only " +
                   (here.virtualDestructor ? L"here" : L"in the host");
        if (here.slotCount != there.slotCount)
            return subject + L"has " + number(here.slotCount) + L" slots here and " +
                   number(there.slotCount) + L" in the host";
        if (here.size != there.size)
            return subject + L"has " + number(here.size) + L" bytes here and " +
                   number(there.size) + L" in the host";
        return {};
    }

    /// Compares the object that an interface is the begin of.
    std::wstring object() const {
        if (component.objectSize != host.objectSize || component.alignment != host.alignment)
            return name + L" has " + number(component.objectSize) + L" bytes here and " +
                   number(host.objectSize) + L" in the host, by another base or member";
        return {};
    }

    const InterfaceTable& component;
    const InterfaceTable& host;
    std::wstring name;
};

} // namespace

std::optional<Finding> interfaceDifference(const std::vector<InterfaceTable>& component,
                                           const std::vector<InterfaceTable>& host) {
    for (const InterfaceTable& here : component)
        for (const InterfaceTable& there : host)
            if (here.uid == there.uid)
                if (std::wstring found = Comparison(here, there).difference(); !found.empty())
                    return Finding{Verdict::otherInterface, fromUtf8(there.name), std::move(found)};
    return std::nullopt;
}

std::optional<Finding> HostInterfaces::difference(const std::filesystem::path& component) const {
    FileBytes file(component);
    return difference(file);
}

std::optional<Finding> HostInterfaces::difference(FileBytes& component) const {
    return differenceOf(sectionsOf(component, interfaceSection));
}

std::optional<Finding> HostInterfaces::differenceOf(const std::string& content) const {
    const std::vector<std::string_view> here = splitInterfaceTables(content);
    if (here.empty())
        return std::nullopt;
    std::call_once(isRead, [this] { read(); });
    std::string unknown;
    for (const std::string_view table : here)
        if (!known.contains(table))
            unknown += table;
    const std::vector<InterfaceTable> others = parseInterfaceTables(unknown);
    for (const std::vector<InterfaceTable>& host : tables)
        if (auto finding = interfaceDifference(others, host))
            return finding;
    return std::nullopt;
}

std::vector<std::filesystem::path>
HostInterfaces::filesOf(const std::vector<std::filesystem::path>& hosts) {
    std::vector<std::filesystem::path> all{System::managerFile(), platform::programFile()};
    all.insert(all.end(), hosts.begin(), hosts.end());
    return all;
}

void HostInterfaces::read() const {
    std::vector<std::string> contents;
    for (const std::filesystem::path& host : filesOf(files))
        tables.push_back(
            parseInterfaceTables(contents.emplace_back(sectionsOf(host, interfaceSection))));
    for (const std::string& content : contents)
        for (const std::string_view table : splitInterfaceTables(content))
            if (differsFromNone(table))
                known.emplace(table);
}

bool HostInterfaces::differsFromNone(std::string_view table) const {
    const std::vector<InterfaceTable> one = parseInterfaceTables(table);
    return std::none_of(tables.begin(), tables.end(), [&](const auto& host) {
        return interfaceDifference(one, host).has_value();
    });
}

std::optional<Finding> interfaceDifference(const std::filesystem::path& component,
                                           const std::vector<std::filesystem::path>& hosts) {
    return HostInterfaces(hosts).difference(component);
}

} // namespace Mz::Tools
