// SPDX-License-Identifier: BSL-1.0
/// Nothing but precompiled headers, which CMake makes for a target with a source.
