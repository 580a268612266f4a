# Runs the host over the samples and compares what it writes, byte for byte, with what is written
# here for every platform.
#   cmake -DHOST=command -DSAMPLES=folder -DEXPECTED=folder -DOUTPUT=folder -P meshHostTest.cmake
file(MAKE_DIRECTORY ${OUTPUT})

function(run_host name status)
  execute_process(COMMAND ${HOST} ${ARGN} WORKING_DIRECTORY ${SAMPLES}
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
