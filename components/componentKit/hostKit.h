// SPDX-License-Identifier: BSL-1.0
/// Functions and classes that keep the source of a host short. Header-only.
///
///     int main() {
///         Mz::Kit::initialize(Mz::Kit::programFolder() / "components");
///         if (const auto greeter = Mz::Kit::create<Greeter>(worldGreeterUid))
///             std::cout << greeter->greeting() << '\n';
///     }
///
/// This header includes the whole kit for hosts, one header for each thought:
///
/// - `names.h`: names and search paths in the form that the library takes
/// - `manager.h`: the component manager: start, objects, list of builders
/// - `recordedList.h`: starts that load no library
/// - `controller.h`: messages, progress, abort, file lookup
/// - `importer.h`: imports of foreign files
/// - `importFile.h`: imports under a policy, of files and of bytes, with a report
/// - `translation.h`: interfaces that one object supplies for another
/// - `uidLiteral.h`: uids as text
#pragma once

#include "components/componentKit/controller.h"
#include "components/componentKit/importFile.h"
#include "components/componentKit/importer.h"
#include "components/componentKit/manager.h"
#include "components/componentKit/names.h"
#include "components/componentKit/recordedList.h"
#include "components/componentKit/translation.h"
#include "components/componentKit/uidLiteral.h"
