# The parts of the tool that stand on libraries which not every system has. Each is on where its libraries are found;
# where they are not it is off, with a message, and the tool refuses what it would take with a word on why.

find_package(PkgConfig)

# ktorba_part(option what library...): what is left out without the libraries, and their names for pkg-config.
function(ktorba_part option what)
  if(NOT ${option})
    return()
  endif()
  foreach(library IN LISTS ARGN)
    if(PKG_CONFIG_FOUND)
      pkg_check_modules(${library} QUIET IMPORTED_TARGET GLOBAL ${library})
    endif()
    if(NOT ${library}_FOUND)
      message(NOTICE "${option} is off: ${library} is not there. The tool will do without ${what}.")
      set(${option} OFF PARENT_SCOPE)
    endif()
  endforeach()
endfunction()

ktorba_part(KTORBA_WITH_SOUND "sound files, but for plain WAV as an output, and resampling" sndfile samplerate)
ktorba_part(KTORBA_WITH_PICTURES "pictures" cairo)
ktorba_part(KTORBA_WITH_ARCHIVES ".npz archives" libzip)
