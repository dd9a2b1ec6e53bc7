# Locates the headers and interpreter of CPython 2.7: first through pyenv,
# then through python2.7-config on the PATH.
set(PYTHON27_PREFIX "" CACHE PATH "Installation prefix of CPython 2.7")
if(NOT PYTHON27_PREFIX)
  execute_process(COMMAND pyenv prefix 2.7.18 OUTPUT_VARIABLE _py_prefix
                  OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET RESULT_VARIABLE _py_rc)
  if(NOT _py_rc EQUAL 0 OR NOT EXISTS "${_py_prefix}/include/python2.7/Python.h")
    find_program(_py_config python2.7-config)
    if(_py_config)
      execute_process(COMMAND ${_py_config} --prefix OUTPUT_VARIABLE _py_prefix
                      OUTPUT_STRIP_TRAILING_WHITESPACE)
    endif()
  endif()
  set(PYTHON27_PREFIX "${_py_prefix}" CACHE PATH "" FORCE)
endif()
find_path(PYTHON27_INCLUDE_DIR Python.h
          HINTS ${PYTHON27_PREFIX}/include/python2.7 NO_DEFAULT_PATH)
find_program(PYTHON27_EXECUTABLE python2.7 HINTS ${PYTHON27_PREFIX}/bin NO_DEFAULT_PATH)
if(NOT PYTHON27_INCLUDE_DIR OR NOT PYTHON27_EXECUTABLE)
  message(FATAL_ERROR "CPython 2.7 not found (tried pyenv 2.7.18 and python2.7-config)")
endif()
message(STATUS "CPython 2.7: ${PYTHON27_EXECUTABLE}")
