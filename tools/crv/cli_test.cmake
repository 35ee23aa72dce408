# Runs the crv tool the way a user does and checks its exit statuses and
# messages: 0 on success, 2 on a bad command line, 1 on unreadable input.
# Invoked by CTest as: cmake -DCRV=... -DSAMPLES=... -DWORK=... -P cli_test.cmake
file(REMOVE_RECURSE ${WORK})
file(MAKE_DIRECTORY ${WORK})
set(failures 0)

# expect(STATUS PATTERN ARGS...): runs crv ARGS, checks the exit status and
# that standard output or error matches PATTERN ("" for any).
function(expect status pattern)
  execute_process(COMMAND ${CRV} ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc STREQUAL "${status}")
    message(SEND_ERROR "crv ${ARGN}: exit status ${rc}, expected ${status}\n${out}${err}")
  elseif(NOT pattern STREQUAL "" AND NOT "${out}${err}" MATCHES "${pattern}")
    message(SEND_ERROR "crv ${ARGN}: output does not match '${pattern}':\n${out}${err}")
  endif()
endfunction()

file(WRITE ${WORK}/broken.svg "<svg><path d='M0 0'></svg>")
file(WRITE ${WORK}/notsvg.svg "<html/>")
file(WRITE ${WORK}/baddata.svg "<svg viewBox='0 0 10 10'><path d='M1 1 L5 5 L'/></svg>")

# Success.
expect(0 "usage: crv" help)
expect(0 "usage: crv info" help info)
expect(0 "usage: crv render" help render)
expect(0 "usage: crv info" info --help)
expect(0 "usage: crv render" render -h)
expect(0 "shape 1: <path id=\"ring\">.*subpath 2: closed" info ${SAMPLES}/ring.svg)
expect(0 "fill-rule evenodd" info ${SAMPLES}/groups.svg)
# Areas with y up: the outline drawn clockwise on screen counts positive, the
# hole drawn the other way negative (a circle of radius 50 and one of 25).
expect(0 "subpath 1: closed, 4 nodes, 13 points, 4 segments, valid, area 785[0-9.]*, length 314.1" info ${SAMPLES}/ring.svg)
expect(0 "subpath 2: closed, [^\n]*area -196[0-9.]*, length 157.0[^\n]*bounds x 35 .. 85, y 35 .. 85" info ${SAMPLES}/ring.svg)
expect(0 "" info --precision 4 ${SAMPLES}/letter.svg)
expect(0 "" render ${SAMPLES}/overlap.svg -o ${WORK}/overlap.svg)
expect(0 "" render ${SAMPLES}/letter.svg --output=${WORK}/letter.svg)
expect(0 "subpath 2: closed[^\n]*depth 2 \\(hole\\)" info ${SAMPLES}/ring.svg)
expect(0 "subpath 3: closed[^\n]*depth 3 \\(island\\)\n  subpath 4: closed[^\n]*depth 4 \\(hole\\)" info ${SAMPLES}/nested.svg)
expect(0 "usage: crv inside" help inside)
expect(0 "\"ring\"> fill-rule nonzero: nonzero inside, evenodd inside" inside ${SAMPLES}/ring.svg 20 60)
expect(0 "\"frame\"> fill-rule evenodd: nonzero inside, evenodd outside; filled: outside" inside ${SAMPLES}/ring.svg 175 60)
expect(0 "\"ring\"> fill-rule nonzero: on the outline" inside ${SAMPLES}/ring.svg 60 10)
expect(0 "point -5 -7.5 \\(library -5 127.5\\)" inside ${SAMPLES}/ring.svg -5 -7.5)
# Geometry read up to a path data error still counts as read.
expect(0 "baddata.svg: line 1: <path> d: expected a number at offset 11" info ${WORK}/baddata.svg)

# Meetings: the star crosses the disc twice; two files together.
expect(0 "usage: crv intersect-points" help intersect-points)
expect(0 "^2 meetings among 2 subpaths.*meeting 1: [^\n]*crossing.*meeting 2: [^\n]*crossing" intersect-points ${SAMPLES}/overlap.svg)
expect(0 "meetings among 6 subpaths" intersect-points ${SAMPLES}/ring.svg ${SAMPLES}/overlap.svg)
file(WRITE ${WORK}/share.svg "<svg viewBox='0 0 120 80'><rect x='10' y='10' width='40' height='40'/><rect x='50' y='20' width='40' height='40'/><path d='M30 50 L30 70'/></svg>")
expect(0 "overlap start.*overlap end.*touch" intersect-points ${WORK}/share.svg -o ${WORK}/share_out.svg)
file(READ ${WORK}/share_out.svg drawn)
foreach(part "id=\"meetings\"" "id=\"overlaps\"" "overlap end</text>")
  string(FIND "${drawn}" "${part}" at)
  if(at EQUAL -1)
    message(SEND_ERROR "intersect-points drawing lacks ${part}")
  endif()
endforeach()
# The set operations: two shapes of one sample against a shifted copy.
file(WRITE ${WORK}/disc.svg "<svg xmlns='http://www.w3.org/2000/svg' viewBox='0 0 200 160'><circle cx='75' cy='80' r='55'/></svg>")
file(WRITE ${WORK}/box.svg "<svg xmlns='http://www.w3.org/2000/svg' viewBox='0 0 200 160'><rect x='60' y='20' width='100' height='80'/></svg>")
expect(0 "union: 1 loop" union ${WORK}/disc.svg ${WORK}/box.svg -o ${WORK}/union.svg)
expect(0 "intersect: 1 loop" intersect ${WORK}/disc.svg ${WORK}/box.svg -o ${WORK}/intersect.svg --precise)
expect(0 "subtract: 1 loop" subtract ${WORK}/disc.svg ${WORK}/box.svg --output=${WORK}/subtract.svg)
expect(0 "xor: 2 loops" xor ${WORK}/disc.svg ${WORK}/box.svg -o ${WORK}/xor.svg --evenodd)
expect(0 "union: " union ${SAMPLES}/overlap.svg ${SAMPLES}/ring.svg -o ${WORK}/mixed.svg)
expect(0 "<path id=\"union\"" info ${WORK}/union.svg)
expect(0 "usage: crv union" help xor)
expect(2 "expects two files" union ${WORK}/disc.svg -o ${WORK}/x.svg)
expect(2 "exclude each other" xor ${WORK}/disc.svg ${WORK}/box.svg -o ${WORK}/x.svg --nonzero --evenodd)
expect(2 "needs an output file" intersect ${WORK}/disc.svg ${WORK}/box.svg)
expect(1 "cannot open file" subtract ${WORK}/disc.svg ${WORK}/missing.svg -o ${WORK}/x.svg)

# Bad usage.
expect(2 "usage: crv")
expect(2 "unknown command 'frobnicate'" frobnicate)
expect(2 "unknown command" help frobnicate)
expect(2 "expects exactly one FILE" info)
expect(2 "expects exactly one FILE" info a.svg b.svg)
expect(2 "unknown option --bogus" info --bogus ${SAMPLES}/ring.svg)
expect(2 "--precision" info --precision x ${SAMPLES}/ring.svg)
expect(2 "needs an output file" render ${SAMPLES}/ring.svg)
expect(2 "expects FILE.svg and the two coordinates" inside ${SAMPLES}/ring.svg 1)
expect(2 "unknown option --bogus" inside ${SAMPLES}/ring.svg 1 2 --bogus)
expect(2 "option --output needs a value" render ${SAMPLES}/ring.svg -o)
expect(2 "expects one or two SVG files" intersect-points)
expect(2 "expects one or two SVG files" intersect-points a.svg b.svg c.svg)
expect(2 "--tolerance takes a positive number" intersect-points ${SAMPLES}/ring.svg --tolerance -1)
expect(1 "crv: ${WORK}/missing.svg: cannot open file" intersect-points ${SAMPLES}/ring.svg ${WORK}/missing.svg)

# Unreadable input: one line naming the file and the problem.
expect(1 "crv: ${WORK}/missing.svg: cannot open file" info ${WORK}/missing.svg)
expect(1 "crv: ${WORK}/broken.svg: not well-formed XML" info ${WORK}/broken.svg)
expect(1 "crv: ${WORK}/notsvg.svg: root element is <html>" render ${WORK}/notsvg.svg -o ${WORK}/x.svg)
expect(1 "crv: ${WORK}/missing.svg: cannot open file" inside ${WORK}/missing.svg 1 2)
expect(1 "cannot write file" render ${SAMPLES}/ring.svg -o ${WORK}/no/such/dir/out.svg)

# The rendered file is an SVG document that crv itself reads back: the
# drawing's shapes, the legend and the markers.
expect(0 "shapes" info ${WORK}/overlap.svg)
file(READ ${WORK}/overlap.svg rendered)
foreach(part "<path id=\"disc\"" "<path id=\"star\"" "id=\"handles\"" "id=\"nodes\"" "closed start")
  string(FIND "${rendered}" "${part}" at)
  if(at EQUAL -1)
    message(SEND_ERROR "rendered file lacks ${part}")
  endif()
endforeach()
