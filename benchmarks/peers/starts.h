// SPDX-License-Identifier: BSL-1.0
/// Starts of a peer with many plug-in libraries.
#pragma once

#include "freshStart.h"

#include <memory>
#include <string>

namespace Mz::Benchmarks {

/// Adds the first starts of a peer.
///
/// \param plugin  a plug-in library of the peer, of which copies are made
/// \param program  mzPeerStart of the peer
/// \param work  what the program does on a folder of plug-ins for a first start
inline void addFirstStarts(RatioTable& table, const std::string& peer, const std::string& plugin,
                           const std::string& program, const std::string& work) {
    for (const unsigned int count : {100U, 1000U}) {
        const auto folder = std::make_shared<LazyFolder>(plugin, count, work, program);
        table.addPeer("start/first" + std::to_string(count), peer,
                      freshly(work, folder, count, program));
    }
}

/// Adds the starts of a peer that loads no library, after `preparation` has run once.
inline void addRecordedStarts(RatioTable& table, const std::string& peer, const std::string& plugin,
                              const std::string& program, const std::string& work,
                              const std::string& preparation) {
    for (const unsigned int count : {100U, 1000U, 4000U}) {
        const auto folder = std::make_shared<LazyFolder>(plugin, count, preparation, program);
        table.addPeer("start/recorded" + std::to_string(count), peer,
                      freshly(work, folder, count, program));
    }
}

} // namespace Mz::Benchmarks
