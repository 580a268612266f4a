# SPDX-License-Identifier: BSL-1.0
# Installs `build` below `work`, builds copies of the examples `names` against that, and compares
# what they print with their READMEs. One configuration serves all of them.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
separate_arguments(list UNIX_COMMAND "${names}")
foreach(name IN LISTS list)
  file(COPY ${source}/${name} DESTINATION ${work}/copies)
endforeach()
run(${CMAKE_COMMAND} -S ${CMAKE_CURRENT_LIST_DIR}/examples -B ${work}/build -G ${generator}
  -D CMAKE_PREFIX_PATH=${work}/prefix -D FOLDER=${work}/copies "-DNAMES=${names}"
  ${toolchainOptions})
run(${CMAKE_COMMAND} --build ${work}/build)

foreach(name IN LISTS list)
  if(NOT EXISTS ${work}/build/${name}/${name}Host${suffix})
    if(NOT name MATCHES "^(archive|images)$") # They need libraries that may be missing.
      message(FATAL_ERROR "the example ${name} has not been built")
    endif()
    continue()
  endif()
  run(${CMAKE_COMMAND} -D source=${work}/copies/${name} -D programs=${work}/build/${name}
    -D work=${work}/run/${name} -D emulator=${emulator} -D suffix=${suffix}
    -D librarySuffix=${librarySuffix}
    -P ${CMAKE_CURRENT_LIST_DIR}/../examples/readmeOutput.cmake)
endforeach()
