# Runs of the glimmer-render program itself, one group per CASE (its pictures
# are pinned by the picture table, tests/pictures/):
#   json     effects and options from a JSON file, with a tile named relative to
#            it: exit 0, the PNG has the size printed on stdout
#   errors   bad input of each kind the program maps to an exit status: that
#            status (2 for a malformed request, 1 for a failure), one line on
#            stderr naming the problem, and no PNG written (the messages of
#            every parser, and the help text, are checked in-process)
# Arguments: -DRENDER=<program> -DWORK=<scratch folder> -DCASE=<group>
# [-DEMULATOR=<runner>] (the cross build's qemu, or valgrind; its arguments
# may be separated by '|').

cmake_minimum_required(VERSION 3.25)
string(REPLACE "|" ";" EMULATOR "${EMULATOR}")

set(failures 0)
macro(fail message)
  message(SEND_ERROR "${message}")
  math(EXPR failures "${failures} + 1")
endmacro()

file(REMOVE_RECURSE "${WORK}")
file(MAKE_DIRECTORY "${WORK}")

# Runs the program; sets rc, out and err.
function(render)
  execute_process(COMMAND ${EMULATOR} "${RENDER}" ${ARGN}
                  WORKING_DIRECTORY "${WORK}"
                  RESULT_VARIABLE code OUTPUT_VARIABLE stdout ERROR_VARIABLE stderr)
  set(rc "${code}" PARENT_SCOPE)
  set(out "${stdout}" PARENT_SCOPE)
  set(err "${stderr}" PARENT_SCOPE)
endfunction()

# A successful render into `name`, checked against the size it printed.
function(expect_render name)
  render(${ARGN} -o "${name}")
  set(out "${out}" PARENT_SCOPE)
  if(NOT rc EQUAL 0)
    fail("${name}: exit ${rc}: ${err}")
    return()
  endif()
  if(NOT out MATCHES "bitmap ([0-9]+)x([0-9]+)\nmargins left=[0-9]+ top=[0-9]+ right=[0-9]+ bottom=[0-9]+\nkey [A-Z][0-9A-Z ]*\n")
    fail("${name}: unexpected output:\n${out}")
    return()
  endif()
  set(printed_w ${CMAKE_MATCH_1})
  set(printed_h ${CMAKE_MATCH_2})
  if(NOT EXISTS "${WORK}/${name}")
    fail("${name}: no PNG written")
    return()
  endif()
  file(READ "${WORK}/${name}" header LIMIT 24 HEX)   # the PNG's width and height at bytes 16..23
  string(SUBSTRING "${header}" 32 8 w)
  string(SUBSTRING "${header}" 40 8 h)
  math(EXPR w "0x${w}")
  math(EXPR h "0x${h}")
  if(NOT w EQUAL printed_w OR NOT h EQUAL printed_h OR w LESS 10 OR h LESS 10)
    fail("${name}: PNG is ${w}x${h}, printed ${printed_w}x${printed_h}")
  endif()
endfunction()

# A refused request: exit status, a one-line message matching `pattern`, no PNG.
function(expect_error status pattern)
  file(REMOVE "${WORK}/refused.png")
  render(${ARGN} -o refused.png)
  string(REGEX MATCHALL "\n" newlines "${err}")
  list(LENGTH newlines lines)
  if(NOT rc EQUAL status)
    fail("${ARGN}: exit ${rc}, expected ${status}: ${err}")
  elseif(NOT err MATCHES "^glimmer-render: ${pattern}")
    fail("${ARGN}: message '${err}' does not match '${pattern}'")
  elseif(NOT lines EQUAL 1)
    fail("${ARGN}: ${lines} lines on stderr: ${err}")
  endif()
  if(EXISTS "${WORK}/refused.png" OR EXISTS "${WORK}/refused.png.tmp")
    fail("${ARGN}: a PNG was written although the request was refused")
  endif()
endfunction()

if(CASE STREQUAL "json")
  expect_render(tile.png "::" -s 16)
  file(WRITE "${WORK}/style/effects.json" [=[
{ "text": "From JSON", "size": 44, "padding": [4, 4, 4, 4],
  "effects": [
    {"type": "pattern", "tile": "../tile.png", "scale": 1.5},
    {"type": "stroke", "size": 3, "color": "#2B2D42", "position": "outside"},
    {"type": "outer-glow", "size": 10, "stops": ["#FFE600@0", {"color": "#FF3C00", "position": 1, "opacity": 0.8}]}
  ] }
]=])
  expect_render(json.png --effects style/effects.json)
  if(NOT out MATCHES "\nkey [^\n]*P")
    fail("json: the pattern is missing from the key: ${out}")
  endif()
  file(WRITE "${WORK}/bad.json" [=[ {"effects": [{"type": "stroke", "sise": 3}]} ]=])
  expect_error(2 ".*stroke: unknown parameter 'sise' \\(valid: size, color, opacity, position\\)" --effects bad.json)
  file(WRITE "${WORK}/broken.json" [=[ {"effects": [ ]=])
  expect_error(2 "--effects: 'broken.json' is not valid JSON" --effects broken.json)
elseif(CASE STREQUAL "errors")
  expect_error(2 "unknown effect 'sparkle' \\(valid: outer-shadow, inner-shadow, .*\\)" -e sparkle)
  expect_error(2 "unknown option --colour" --colour red)
  expect_error(2 "nothing to draw: the image would be 0x[0-9]+ pixels" "   ")
  expect_error(2 "line 2 lies past the text's last line \\(it has 2, counted from 0\\)" "a\\nb" --first-line 2)
  expect_error(1 "--font: cannot read '/no/such/font.ttf'" --font /no/such/font.ttf)
  expect_error(1 "--font: '.*' is not a font the library can read" --font "${RENDER}")
  expect_error(1 "pattern tile: '.*' is not a PNG file" -e "pattern:tile=${RENDER}")
  expect_error(1 "the image would be [0-9]+x[0-9]+ pixels, more than can be allocated" --width 30000 --height 30000)
  expect_error(1 "--effects: cannot read 'none.json'" --effects none.json)
  # Unwritable output: a missing folder, and a folder in place of the file.
  render(-o no/such/folder/out.png)
  if(NOT rc EQUAL 1 OR NOT err MATCHES "^glimmer-render: cannot write 'no/such/folder/out.png'")
    fail("unwritable output: exit ${rc}: ${err}")
  endif()
  file(MAKE_DIRECTORY "${WORK}/taken.png")
  render(-o taken.png)
  if(NOT rc EQUAL 1 OR EXISTS "${WORK}/taken.png.tmp")
    fail("a folder as output: exit ${rc}, temporary file left: ${err}")
  endif()
else()
  message(FATAL_ERROR "unknown CASE '${CASE}'")
endif()

if(failures GREATER 0)
  message(FATAL_ERROR "${failures} check(s) failed")
endif()
