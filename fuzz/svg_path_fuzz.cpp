// libFuzzer target for the path data reader and writer.
//
// Any byte string goes through ParseSvgPathData. Whatever the outcome, the
// curve handed back must be valid and finite, the error position must lie in
// the text, and the curve must survive a write and a second read unchanged.
// A broken property aborts, which the fuzzer reports as a crash.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "polycurve.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string_view d(reinterpret_cast<const char*>(data), size);
  OstraCrv::PolycurveD c;
  OstraCrv::SvgPathError e;
  const bool ok = OstraCrv::ParseSvgPathData(d, c, &e);
  if (!ok && (e.reason == nullptr || e.offset > size)) std::abort();
  if (!OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount())) std::abort();
  for (const auto& p : c.Points())
    if (!p.IsFinite()) std::abort();
  std::string w;
  if (!OstraCrv::WriteSvgPathData(c, w)) std::abort();
  OstraCrv::PolycurveD back;
  if (!OstraCrv::ParseSvgPathData(w, back) || back.Compare(c) != 0) std::abort();
  return 0;
}
