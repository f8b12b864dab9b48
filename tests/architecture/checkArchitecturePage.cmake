file(STRINGS ${LINES} lines)
file(READ ${PAGE} page)
string(REGEX REPLACE "[ \n]+" " " page "${page}")  # the page wraps its lines
foreach(line IN LISTS lines)
  string(FIND "${page}" "${line}" position)
  if(position EQUAL -1)
    message(SEND_ERROR "${PAGE} does not say: ${line}")
  endif()
endforeach()
