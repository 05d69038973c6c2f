# Fails unless the library exports exactly the routines of its header.
execute_process(COMMAND ${NM} -D --defined-only ${LIBRARY}
                OUTPUT_VARIABLE listing COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL " [TBDRVW] [^ @\n]+" lines "${listing}")
string(REGEX REPLACE " [TBDRVW] " "" exported "${lines}")
set(expected
  _slapd_utils_decode_buffer_free
  aes_key_data_free
  aes_key_data_from_bytes
  aes_key_data_from_file
  check_format
  copyFile
  format_password
  getNUVInstallPath
  initLocaleMutex
  nuv_snprintf
  set_locale_mutex
  unformat_password)
list(SORT exported)
list(SORT expected)
if(NOT exported STREQUAL expected)
  message(FATAL_ERROR "exported: ${exported}\nexpected: ${expected}")
endif()
