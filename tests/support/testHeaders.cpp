// SPDX-License-Identifier: BSL-1.0
/// Nothing but the headers that `mzTestHeaders` precompiles: CMake precompiles for a target with a
/// source.
