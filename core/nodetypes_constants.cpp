// The published node bytes and the reporting hook.
#include "ostracrv/core/nodetype.h"

namespace NodeTypes {
constinit const NODETYPE arc = 0xC0;
namespace Open {
constinit const NODETYPE move = 0x04;
constinit const NODETYPE line = 0x44;
constinit const NODETYPE curve = 0x84;
constinit const NODETYPE smoothLine = 0x54;
constinit const NODETYPE smoothCurve = 0x94;
constinit const NODETYPE symmCurve = 0xA4;
}  // namespace Open
namespace Closed {
constinit const NODETYPE move = 0x0C;
constinit const NODETYPE line = 0x48;
constinit const NODETYPE curve = 0x88;
constinit const NODETYPE smoothLine = 0x58;
constinit const NODETYPE smoothCurve = 0x98;
constinit const NODETYPE symmCurve = 0xA8;
}  // namespace Closed
}  // namespace NodeTypes

// A single place to hang a diagnostic on; it deliberately does nothing.
int crvProblem() { return 0; }
