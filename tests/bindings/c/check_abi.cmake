# Whether the interface, types included, is the one on record:
#   cmake -DLIBRARY=<with debug information> -DRECORD=<file> -DABIDIFF=... -DABIDW=... [-DWRITE=ON]
#         -P check_abi.cmake
# -DWRITE=ON writes the record, after something was added (cmake --build ... --target record_c_abi). What
# goes or changes needs a new QUENBY_ABI as well.
cmake_minimum_required(VERSION 3.25)
if(WRITE)
  execute_process(COMMAND ${ABIDW} --no-corpus-path --no-comp-dir-path --no-show-locs --no-elf-needed
                          --out-file ${RECORD} ${LIBRARY} COMMAND_ERROR_IS_FATAL ANY)
  return()
endif()
execute_process(COMMAND ${ABIDIFF} ${RECORD} ${LIBRARY}
                RESULT_VARIABLE changed OUTPUT_VARIABLE report ERROR_VARIABLE report)
if(changed)
  message(FATAL_ERROR "The interface is not the one on record (${RECORD}):\n${report}")
endif()
