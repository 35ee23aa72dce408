// OstraCrv: two-dimensional curve geometry. This umbrella header pulls in the
// whole public interface.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/curvedata.h"
#include "ostracrv/core/mavikutils.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/io/svg_path.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/math/matrix.h"
#include "ostracrv/math/polynomial.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"
