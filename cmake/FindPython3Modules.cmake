# Locates the CPython 3 interpreters to build the module for: the one
# PYTHON3_EXECUTABLE names when it is given (the wheel build passes the
# interpreter it builds for), else every pyenv CPython from 3.8 on (the newest
# patch release of each), else python3 on the PATH. For each it gives, in
# ORVXML_PYTHON3_BUILDS, three entries: the version tag ("313"), the folder of
# its headers and the file-name suffix of its extension modules. A module is
# built for each interpreter against its own headers: the result string is
# written straight into the str's buffer, which the stable ABI doesn't allow.

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

set(PYTHON3_EXECUTABLE "" CACHE FILEPATH "The one CPython 3.8+ to build the module for (default: every one pyenv has)")
set(_py3_exes)
if(PYTHON3_EXECUTABLE)
  list(APPEND _py3_exes "${PYTHON3_EXECUTABLE}")
else()
  file(GLOB _dirs LIST_DIRECTORIES true "${_pyenv_root}/versions/3.*")
  set(_minors)
  foreach(_dir ${_dirs})
    get_filename_component(_v "${_dir}" NAME)
    if(_v MATCHES "^(3\\.[0-9]+)\\.[0-9]+$" AND _v VERSION_GREATER_EQUAL 3.8)
      list(APPEND _minors ${CMAKE_MATCH_1})
    endif()
  endforeach()
  list(REMOVE_DUPLICATES _minors)
  foreach(_minor ${_minors})
    orvxml_pyenv_python(_exe ${_minor})
    if(_exe)
      list(APPEND _py3_exes "${_exe}")
    endif()
  endforeach()
  if(NOT _py3_exes)
    find_program(_py3_path python3)
    if(_py3_path)
      list(APPEND _py3_exes "${_py3_path}")
    endif()
  endif()
endif()

set(ORVXML_PYTHON3_BUILDS)
foreach(_exe ${_py3_exes})
  execute_process(COMMAND "${_exe}" -c
      "import sys, sysconfig; print('%d%d' % sys.version_info[:2]); print(sysconfig.get_paths()['include']); print(sysconfig.get_config_var('EXT_SUFFIX'))"
      OUTPUT_VARIABLE _py3_out OUTPUT_STRIP_TRAILING_WHITESPACE RESULT_VARIABLE _py3_rc)
  if(NOT _py3_rc EQUAL 0)
    message(FATAL_ERROR "${_exe} does not run")
  endif()
  string(REPLACE "\n" ";" _py3_out "${_py3_out}")
  list(GET _py3_out 0 _py3_tag)
  list(GET _py3_out 1 _py3_include)
  list(GET _py3_out 2 _py3_suffix)
  if(_py3_tag LESS 38)
    message(FATAL_ERROR "${_exe} is CPython ${_py3_tag}; the module needs 3.8 or later")
  endif()
  if(NOT EXISTS "${_py3_include}/Python.h")
    message(FATAL_ERROR "${_exe} has no headers (${_py3_include}/Python.h)")
  endif()
  list(APPEND ORVXML_PYTHON3_BUILDS ${_py3_tag} ${_py3_include} ${_py3_suffix})
  message(STATUS "CPython 3 module for ${_exe}: PyOrvXml${_py3_suffix}")
endforeach()
if(NOT ORVXML_PYTHON3_BUILDS)
  message(FATAL_ERROR "No CPython 3.8 or later with headers found (tried PYTHON3_EXECUTABLE, "
          "pyenv under ${_pyenv_root} and python3 on the PATH); install one with pyenv, or "
          "configure with -DORVXML_BUILD_MODULE3=OFF")
endif()
