// SPDX-License-Identifier: BSL-1.0
/// What component libraries made for the tests tell about themselves while they are used.
///
/// A shared library of its own, so that a test and the components that it loads write to the same
/// journal. It stays mapped when they are not.
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

/// Adds one event.
MZ_TEST_JOURNAL_API void note(const char* event);

/// Has `hook` called after each event with its text; null ends that.
MZ_TEST_JOURNAL_API void setHook(void (*hook)(const char* event));

/// How often that event was noted.
MZ_TEST_JOURNAL_API int noted(const char* event);

/// All events in their order, each followed by a space. Valid until the next event.
MZ_TEST_JOURNAL_API const char* allNotes();

MZ_TEST_JOURNAL_API void forgetNotes();

/// The manager that a component library calls back, if the test wants it to; else null.
MZ_TEST_JOURNAL_API QrComponentManager* managerUnderTest();
MZ_TEST_JOURNAL_API void setManagerUnderTest(QrComponentManager* manager);

/// The directory that a component library gives when it calls `initialize`.
MZ_TEST_JOURNAL_API const wchar_t* searchPathUnderTest();
MZ_TEST_JOURNAL_API void setSearchPathUnderTest(const wchar_t* path);

} // namespace Mz::Test
