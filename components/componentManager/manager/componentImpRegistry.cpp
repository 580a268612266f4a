// SPDX-License-Identifier: BSL-1.0
/// Builder records, and their index.
///
/// A record holds copies of the texts of its builder, so that clients read them without loading the
/// library. The texts of the component are in the library record, which all its builders share. The
/// index is keyed by uid alone: the last registered builder wins, and dropping a library removes
/// its uids, even if a builder of another library has replaced the entry.
#include "components/componentManager/manager/componentImpPrivate.h"

#include <cstddef>
#include <list>
#include <memory>
#include <string>

namespace Mz {

using Builder = ComponentManager::Builder;

Builder::Builder() = default;
Builder::Builder(const Builder& other) = default;
Builder& Builder::operator=(const Builder& other) = default;
Builder::~Builder() = default;

const QrUid& Builder::getUid() const {
    return uid;
}

const wchar_t* Builder::getName() const {
    return name.c_str();
}

const wchar_t* Builder::getLabel() const {
    return label.c_str();
}

unsigned int Builder::getNumber() const {
    return number;
}

const wchar_t* Builder::getText() const {
    return text.c_str();
}

const wchar_t* Builder::getComponentLabel() const {
    return library->componentText1.c_str();
}

const wchar_t* Builder::getComponentText() const {
    return library->componentText2.c_str();
}

bool Builder::getFlag() const {
    return flag;
}

QrRefPtr<QrComponentBuilder> Builder::getBuilder() {
    return library->manager->getComponentBuilder(*library, uid);
}

QrCRefPtr<QrComponentBuilder> Builder::getBuilder() const {
    return library->manager->getComponentBuilder(*library, uid);
}

void ComponentManager::reindexBuilders(ComponentLibrary& library) {
    // Last to first, so that the first of several builders with the same uid wins.
    for (std::size_t index = library.builders.size(); index-- > 0;)
        builderIndex[library.builders[index].uid] = &library.builders[index];
}

void ComponentManager::dropBuilders(ComponentLibrary& library) {
    if (library.builders.empty())
        return;
    std::list<BuilderList> place;
    place.emplace_back(builderPool);
    dropBuilders(library, place);
}

void ComponentManager::dropBuilders(ComponentLibrary& library, std::list<BuilderList>& place) {
    if (library.builders.empty())
        return;
    for (std::size_t index = library.builders.size(); index-- > 0;)
        builderIndex.erase(library.builders[index].uid);
    place.front().swap(library.builders);
    droppedBuilders.splice(droppedBuilders.end(), place);
}

} // namespace Mz
