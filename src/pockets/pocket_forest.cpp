// Lifetime and counting of the pocket forest.
#include "pockets/pocket_model.h"
#include "pockets/pocket_walk.h"

namespace pc {

void deletePocketTree(Pocket* pocket) {
  if (pocket == nullptr) return;
  pocket->nextSibling = nullptr;
  // The node stays taken; it just has no pocket any more.
  deleteChain(pocket, [](Pocket& p) {
    if (p.node != nullptr && p.node->pocket == &p) p.node->pocket = nullptr;
  });
}

// The nodes are not touched here: at the end of the run the levels go
// before the forest.
PocketForest::~PocketForest() { deleteChain(firstRoot, [](Pocket&) {}); }

std::int32_t pocketCount(const PocketForest& forest) {
  std::int32_t count = 0;
  for (const Pocket* p = forest.firstRoot; p != nullptr; p = nextPocketInPreOrder(p)) ++count;
  return count;
}

}  // namespace pc
