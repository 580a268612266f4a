# SPDX-License-Identifier: BSL-1.0
# What is measured on Linux alone, and the programs, which use Google Benchmark.

# What the start of a process costs by itself.
add_executable(mzBenchmarkEmpty empty.cpp)
target_link_libraries(mzBenchmarkEmpty PRIVATE Mz::MZcomponentManager mzCompile)

target_sources(mzBenchmarkWorks PRIVATE
  main.cpp
  memory.cpp
  ratioJson.cpp
  ratioReporter.cpp
  scanBenchmarks.cpp
  toolsBenchmarks.cpp)
target_link_libraries(mzBenchmarkWorks PUBLIC mzJson benchmark::benchmark)
target_compile_definitions(mzBenchmarkWorks
  PRIVATE MZ_BENCHMARK_EMPTY="$<TARGET_FILE:mzBenchmarkEmpty>")
mz_use_locales(mzBenchmarkWorks)
list(APPEND usedByBenchmarks mzBenchmarkEmpty)

add_executable(mzBenchmarks)
target_link_libraries(mzBenchmarks PRIVATE mzBenchmarkWorks mzCompile)
add_dependencies(mzBenchmarks ${usedByBenchmarks})

# What a guarded import costs. It imports through the mesh components.
add_executable(mzGuardedImport guardedImport.cpp sphere.cpp)
add_dependencies(mzGuardedImport meshObj)
target_link_libraries(mzGuardedImport PRIVATE Mz::MZcomponentTools mzCompile)
