// The tool view of the current toolpath: its frame, scaled to the run's units.
#include "tool/tool_view.h"

#include "tool/frame_table.h"

namespace pc {

int loadView(int kind, double scale, const char* name) {
  if (kind < 1 || kind > kFrameCount) return -1;
  const int index = kind - 1;
  if (defineView(index, name) != 0) return -1;
  scaleView(index, scale);
  return 0;
}

}  // namespace pc
