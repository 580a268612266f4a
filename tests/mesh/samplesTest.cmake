# SPDX-License-Identifier: BSL-1.0
# Runs the script that makes the samples and compares its files with those of the repository.
#   cmake -DPYTHON=program -DSAMPLES=folder -DOUTPUT=folder -P samplesTest.cmake
file(REMOVE_RECURSE ${OUTPUT})
file(MAKE_DIRECTORY ${OUTPUT})
execute_process(COMMAND ${PYTHON} ${SAMPLES}/makeSamples.py ${OUTPUT} COMMAND_ERROR_IS_FATAL ANY)
file(GLOB made RELATIVE ${OUTPUT} ${OUTPUT}/*)
list(LENGTH made count)
if(NOT count EQUAL 9)
  message(FATAL_ERROR "the script made ${count} samples")
endif()
foreach(name ${made})
  execute_process(COMMAND ${CMAKE_COMMAND} -E compare_files ${OUTPUT}/${name} ${SAMPLES}/${name}
    COMMAND_ERROR_IS_FATAL ANY)
endforeach()
