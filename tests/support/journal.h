// SPDX-License-Identifier: BSL-1.0
/// The events that test components report while they are used.
///
/// It is a shared library, so that a test and the components that it loads use the same journal. It
/// stays mapped when they are unloaded.
#pragma once

#include "components/base/export.h"

#ifdef MZ_BUILDING_TEST_JOURNAL
#define MZ_TEST_JOURNAL_API MZ_EXPORT
#else
#define MZ_TEST_JOURNAL_API MZ_IMPORT
#endif

namespace Mz {
class QrComponentManager;
}

namespace Mz::Test {

/// Adds an event.
MZ_TEST_JOURNAL_API void note(const char* event);

/// Sets a function that is called with each event, or none if `hook` is null.
MZ_TEST_JOURNAL_API void setHook(void (*hook)(const char* event));

/// Returns how often that event was reported.
MZ_TEST_JOURNAL_API int noted(const char* event);

/// Returns all events in their order, each followed by a space. Valid until the next event.
MZ_TEST_JOURNAL_API const char* allNotes();

MZ_TEST_JOURNAL_API void forgetNotes();

/// The manager that components call back, or null.
MZ_TEST_JOURNAL_API QrComponentManager* managerUnderTest();
MZ_TEST_JOURNAL_API void setManagerUnderTest(QrComponentManager* manager);

/// The search path that components pass to `initialize`.
MZ_TEST_JOURNAL_API const wchar_t* searchPathUnderTest();
MZ_TEST_JOURNAL_API void setSearchPathUnderTest(const wchar_t* path);

} // namespace Mz::Test
