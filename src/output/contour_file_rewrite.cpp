#include "output/contour_file_rewrite.h"

#include <cstring>

#include "env/path_expander.h"
#include "output/outline_check.h"
#include "output/outline_list.h"

namespace pc {

int rewriteContourFile(const CheckedArray<Pocket*>& pockets) {
  if (pockets.count < 1) return 0;  // an existing file stays as it is
  CheckedArray<Point> outline = makeOutlineList(pockets);

  char name[512];
  std::strcpy(name, kContourFileName);
  if (expandNameInPlace(name, sizeof name) != EXPAND_OK) return -1;
  TaggedFile file = openTaggedFile(name, kTaggedCreateMode);

  const bool checked = writeCheckedOutlines(pockets, outline, [&](float z) {
    writeTaggedRecord(file, 'n', z, z);
    writeContours(file, outline.data, outline.count);
    writeTaggedRecord(file, 'e', 0.0f, 0.0f);
  });
  closeTaggedFile(file);
  return checked ? 0 : -1;
}

}  // namespace pc
