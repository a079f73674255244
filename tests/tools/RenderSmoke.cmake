# Smoke runs of the glimmer-render program, one group per CASE:
#   effects  every effect kind from the command line: exit 0, the PNG exists and
#            has the size printed on stdout
#   json     effects and options from a JSON file, with a tile named relative to it
#   errors   bad input: the expected exit status, one line on stderr naming the
#            problem, and no PNG written
#   gallery  the contact sheet renders
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

# Width and height from a PNG's header.
function(png_size path width_var height_var)
  file(READ "${path}" header LIMIT 24 HEX)
  string(SUBSTRING "${header}" 32 8 w)
  string(SUBSTRING "${header}" 40 8 h)
  math(EXPR w "0x${w}")
  math(EXPR h "0x${h}")
  set(${width_var} ${w} PARENT_SCOPE)
  set(${height_var} ${h} PARENT_SCOPE)
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
  png_size("${WORK}/${name}" w h)
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

if(CASE STREQUAL "effects")
  expect_render(plain.png)   # no argument at all: the bundled font and default text
  expect_render(tile.png "::" -s 16 -e "text:color=#E4572E")
  foreach(effect
      outer-shadow inner-shadow outer-glow "outer-glow:stops=#FFE600/#8000FF" inner-glow
      "stroke:position=outside" "stroke:position=center" "stroke:position=inside"
      linear-gradient radial-gradient "pattern:tile=tile.png,scale=2" bevel "bevel:style=outer,technique=hard"
      emboss "emboss:style=two-sided" "text:color=#80FF0000,opacity=0.5")
    string(REGEX REPLACE "[^a-z0-9]+" "-" name "${effect}")
    expect_render("${name}.png" "Glimmer" -s 48 -e "${effect}")
  endforeach()
  expect_render(combined.png "Two\\nlines" -s 40 --align center --padding 8 -e stroke -e outer-shadow
                -e "linear-gradient:stops=#FFD200/#F7971E" --background "#FFF0C0")
  expect_render(wrapped.png "a longer text that wraps" --width 200 --gravity bottom --height 300 --first-line 1
                --max-lines 2)
  expect_render(exact.png "Glimmer" -s 48 -e "stroke:position=inside" -e outer-shadow --exact)
elseif(CASE STREQUAL "json")
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
  file(WRITE "${WORK}/array.json" [=[ [ {"type": "emboss", "size": 4}, {"type": "text", "color": "gold"} ] ]=])
  expect_render(array.png "Array" --effects array.json)
  file(WRITE "${WORK}/bad.json" [=[ {"effects": [{"type": "stroke", "sise": 3}]} ]=])
  expect_error(2 ".*stroke: unknown parameter 'sise' \\(valid: size, color, opacity, position\\)" --effects bad.json)
  file(WRITE "${WORK}/broken.json" [=[ {"effects": [ ]=])
  expect_error(2 "--effects: 'broken.json' is not valid JSON" --effects broken.json)
elseif(CASE STREQUAL "errors")
  expect_error(2 "unknown effect 'sparkle' \\(valid: outer-shadow, inner-shadow, .*\\)" -e sparkle)
  expect_error(2 "stroke: unknown parameter 'width' \\(valid: size, color, opacity, position\\)" -e stroke:width=3)
  expect_error(2 "stroke color: '#12345' is not a colour" -e "stroke:color=#12345")
  expect_error(2 "bevel style: 'sideways' is not one of inner, outer" -e bevel:style=sideways)
  expect_error(2 "outer-shadow angle: 'left' is not a number" -e outer-shadow:angle=left)
  expect_error(2 "unknown option --colour" --colour red)
  expect_error(2 "--size must lie in 1..2048 pixels" --size 0)
  expect_error(2 "pattern needs tile=FILE" -e pattern)
  expect_error(2 "line 2 lies past the text's last line \\(it has 2, counted from 0\\)" "a\\nb" --first-line 2)
  expect_error(1 "--font: cannot read '/no/such/font.ttf'" --font /no/such/font.ttf)
  expect_error(1 "--font: '.*' is not a font the library can read" --font "${RENDER}")
  expect_error(1 "pattern tile: cannot read 'missing.png'" -e pattern:tile=missing.png)
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
  render(--help)
  if(NOT rc EQUAL 0 OR NOT out MATCHES "outer-shadow" OR NOT out MATCHES "highlight-opacity=0.75")
    fail("--help: exit ${rc}")
  endif()
elseif(CASE STREQUAL "gallery")
  render(--gallery -o gallery.png)
  if(NOT rc EQUAL 0 OR NOT out MATCHES "gallery [0-9]+x[0-9]+, 20 cells")
    fail("gallery: exit ${rc}: ${out}${err}")
  elseif(NOT EXISTS "${WORK}/gallery.png")
    fail("gallery: no PNG written")
  else()
    png_size("${WORK}/gallery.png" w h)
    if(w LESS 800 OR h LESS 600)
      fail("gallery: only ${w}x${h}")
    endif()
  endif()
else()
  message(FATAL_ERROR "unknown CASE '${CASE}'")
endif()

if(failures GREATER 0)
  message(FATAL_ERROR "${failures} check(s) failed")
endif()
