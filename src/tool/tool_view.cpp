// Interim tool view: no frame is loaded yet.
#include "tool/tool_view.h"

namespace pc {

int loadView(int /*kind*/, double /*scale*/, const char* /*name*/) { return -1; }

}  // namespace pc
