# Locates CPython 3 interpreters under pyenv, and the headers that build the
# stable-ABI module (Py_LIMITED_API 3.8: one file serves 3.8 and every later
# 3.x). The headers come from PYTHON3_EXECUTABLE when it is given (the wheel
# build passes the interpreter it builds for), else from the oldest pyenv
# CPython 3.8 or later, else from python3-config on the PATH.

# The folder of pyenv's versions: `pyenv root`, else $PYENV_ROOT, else ~/.pyenv.
execute_process(COMMAND pyenv root OUTPUT_VARIABLE _pyenv_root
                OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET RESULT_VARIABLE _pyenv_rc)
if(NOT _pyenv_rc EQUAL 0 OR NOT _pyenv_root)
  if(DEFINED ENV{PYENV_ROOT})
    set(_pyenv_root "$ENV{PYENV_ROOT}")
  else()
    set(_pyenv_root "$ENV{HOME}/.pyenv")
  endif()
endif()

# orvxml_pyenv_python(<var> <version prefix>): the interpreter of the newest
# pyenv version that starts with the prefix ("3.8" finds 3.8.18), or
# <var>-NOTFOUND.
function(orvxml_pyenv_python var prefix)
  file(GLOB _dirs LIST_DIRECTORIES true "${_pyenv_root}/versions/${prefix}.*")
  set(_best "")
  foreach(_dir ${_dirs})
    get_filename_component(_v "${_dir}" NAME)
    if(_v MATCHES "^[0-9.]+$" AND EXISTS "${_dir}/bin/python"
       AND (NOT _best OR _v VERSION_GREATER _best))
      set(_best "${_v}")
    endif()
  endforeach()
  if(_best)
    set(${var} "${_pyenv_root}/versions/${_best}/bin/python" PARENT_SCOPE)
  else()
    set(${var} "${var}-NOTFOUND" PARENT_SCOPE)
  endif()
endfunction()

set(PYTHON3_EXECUTABLE "" CACHE FILEPATH "CPython 3.8+ whose headers build the stable-ABI module")
if(NOT PYTHON3_EXECUTABLE)
  file(GLOB _dirs LIST_DIRECTORIES true "${_pyenv_root}/versions/3.*")
  set(_oldest "")
  foreach(_dir ${_dirs})
    get_filename_component(_v "${_dir}" NAME)
    if(_v MATCHES "^[0-9.]+$" AND _v VERSION_GREATER_EQUAL 3.8 AND EXISTS "${_dir}/bin/python"
       AND (NOT _oldest OR _v VERSION_LESS _oldest))
      set(_oldest "${_v}")
    endif()
  endforeach()
  if(_oldest)
    set(PYTHON3_EXECUTABLE "${_pyenv_root}/versions/${_oldest}/bin/python" CACHE FILEPATH "" FORCE)
  endif()
endif()

set(_py3_include "")
if(PYTHON3_EXECUTABLE)
  execute_process(COMMAND "${PYTHON3_EXECUTABLE}" -c
      "import sys, sysconfig; print('%d.%d' % sys.version_info[:2]); print(sysconfig.get_paths()['include'])"
      OUTPUT_VARIABLE _py3_out OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE _py3_rc)
  if(_py3_rc EQUAL 0)
    string(REPLACE "\n" ";" _py3_out "${_py3_out}")
    list(GET _py3_out 0 _py3_version)
    list(GET _py3_out 1 _py3_include)
    if(_py3_version VERSION_LESS 3.8)
      message(FATAL_ERROR "${PYTHON3_EXECUTABLE} is CPython ${_py3_version}; the module needs 3.8 or later")
    endif()
  endif()
else()
  find_program(_py3_config python3-config)
  if(_py3_config)
    execute_process(COMMAND ${_py3_config} --includes OUTPUT_VARIABLE _py3_flags
                    OUTPUT_STRIP_TRAILING_WHITESPACE)
    string(REGEX MATCH "-I([^ ]+)" _m "${_py3_flags}")
    set(_py3_include "${CMAKE_MATCH_1}")
  endif()
endif()

find_path(PYTHON3_INCLUDE_DIR Python.h HINTS ${_py3_include} NO_DEFAULT_PATH)
if(NOT PYTHON3_INCLUDE_DIR)
  message(FATAL_ERROR "CPython 3.8 or later with headers not found (tried PYTHON3_EXECUTABLE, "
          "pyenv under ${_pyenv_root} and python3-config); install one with pyenv, or "
          "configure with -DORVXML_BUILD_MODULE3=OFF")
endif()
message(STATUS "CPython 3 headers (stable ABI): ${PYTHON3_INCLUDE_DIR}")
