# SPDX-License-Identifier: BSL-1.0
# Runs the mesh host on the samples. Compares its output, which is the same on every platform, byte
# for byte with the expected files.
#   cmake -DHOST=command -DSAMPLES=folder -DEXPECTED=folder -DOUTPUT=folder -P meshHostTest.cmake
file(MAKE_DIRECTORY ${OUTPUT})
set(folder ${SAMPLES})

function(run_host name status)
  execute_process(COMMAND ${HOST} ${ARGN} WORKING_DIRECTORY ${folder}
    OUTPUT_FILE ${OUTPUT}/${name}.out ERROR_FILE ${OUTPUT}/${name}.err RESULT_VARIABLE result)
  if(NOT result EQUAL status)
    message(FATAL_ERROR "${name}: ended with ${result}, not ${status}")
  endif()
  foreach(stream out err)
    execute_process(RESULT_VARIABLE differs COMMAND ${CMAKE_COMMAND} -E compare_files
      ${OUTPUT}/${name}.${stream} ${EXPECTED}/${name}.${stream})
    if(differs)
      message(FATAL_ERROR "${OUTPUT}/${name}.${stream} differs from ${EXPECTED}/${name}.${stream}")
    endif()
  endforeach()
endfunction()

run_host(samples 0 icosahedron.obj icosahedronCorners.obj icosahedron.off icosahedronAscii.ply
  icosahedronLittle.ply icosahedronBig.ply icosahedronAscii.stl icosahedronBinary.stl
  icosahedronSolid.stl)
run_host(failures 1 missing.obj makeSamples.py icosahedron.off ../CMakeLists.txt
  ../../../tests/mesh/damaged.obj)
run_host(progress 0 --progress ./icosahedron.off)
run_host(nothing 0)

# Saves objects and the recorded list, and starts again with that list.
set(folder ${OUTPUT}/saved)
file(REMOVE_RECURSE ${folder})
file(MAKE_DIRECTORY ${folder})
file(COPY ${SAMPLES}/icosahedronCorners.obj ${SAMPLES}/icosahedron.off DESTINATION ${folder})
run_host(saving 0 --list "recorded list" --save meshes --draw drawn icosahedronCorners.obj
  icosahedron.off)
execute_process(RESULT_VARIABLE differs COMMAND ${CMAKE_COMMAND} -E compare_files
  ${folder}/drawn/2-icosahedron.off.svg ${EXPECTED}/2-icosahedron.off.svg)
if(differs)
  message(FATAL_ERROR "2-icosahedron.off.svg differs from ${EXPECTED}/2-icosahedron.off.svg")
endif()
run_host(loading 0 --list "recorded list" --load meshes)
foreach(name 1-icosahedronCorners.obj 2-icosahedron.off scene)
  foreach(form binary text)
    execute_process(RESULT_VARIABLE differs COMMAND ${CMAKE_COMMAND} -E compare_files
      ${folder}/meshes/${name}.${form} ${EXPECTED}/${name}.${form})
    if(differs)
      message(FATAL_ERROR "${name}.${form} differs from ${EXPECTED}/${name}.${form}")
    endif()
  endforeach()
endforeach()
file(WRITE "${folder}/damaged list" "no list")
run_host(damaged 0 --list "damaged list")
file(WRITE ${folder}/meshes/damaged.text "1 2 3")
run_host(unloadable 1 --load meshes)

# If the list cannot be written, the host does everything else. Its message names the list once.
execute_process(COMMAND ${HOST} --list "no folder/list" icosahedron.off WORKING_DIRECTORY ${folder}
  RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE error)
if(NOT result EQUAL 1 OR NOT output MATCHES "icosahedron.off: "
    OR NOT error MATCHES "^error: no folder/list: Error opening output stream\n[^/]*$")
  message(FATAL_ERROR "a list that cannot be written ended with ${result}: ${output}${error}")
endif()

# If nothing can be saved, the message continues with the system's text, which differs.
execute_process(COMMAND ${HOST} --save icosahedron.off icosahedron.off WORKING_DIRECTORY ${folder}
  RESULT_VARIABLE result OUTPUT_QUIET ERROR_VARIABLE error)
if(NOT result EQUAL 1 OR NOT error MATCHES "^error: icosahedron.off: ")
  message(FATAL_ERROR "saving to a file as a folder ended with ${result}: ${error}")
endif()
