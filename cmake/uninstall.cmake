# cmake -DMANIFESTS=folder -P uninstall.cmake
# Removes the files that the lists in `folder` name, those of whole installs and those of components, the folders of
# ours that are empty then, and the lists. A list holds the latest install alone.
file(GLOB manifests ${MANIFESTS}/install_manifest*.txt)
if(NOT manifests)
  message(FATAL_ERROR "Nothing is installed from ${MANIFESTS}")
endif()

foreach(manifest IN LISTS manifests)
  file(STRINGS ${manifest} files)
  foreach(file IN LISTS files)
    set(file $ENV{DESTDIR}${file})
    message(STATUS "Removing ${file}")
    file(REMOVE ${file})
    cmake_path(GET file PARENT_PATH folder)
    while(folder MATCHES "/ktorba(/simulator)?$")
      list(APPEND folders ${folder})
      cmake_path(GET folder PARENT_PATH folder)
    endwhile()
  endforeach()
  file(REMOVE ${manifest})
endforeach()

list(REMOVE_DUPLICATES folders)
list(SORT folders ORDER DESCENDING)  # what is inside a folder before the folder
foreach(folder IN LISTS folders)
  file(GLOB left ${folder}/* ${folder}/.*)
  if(IS_DIRECTORY ${folder} AND NOT left)
    file(REMOVE_RECURSE ${folder})
  endif()
endforeach()
