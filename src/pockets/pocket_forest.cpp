// Lifetime and counting of the pocket forest.
#include "pockets/pocket_model.h"
#include "pockets/pocket_walk.h"

namespace pc {

namespace {

// Deletes a chain of pockets with everything under them, without a stack: a
// pocket's first child is moved in front of it until it has none left. The
// nodes are told only while they are known to live: at the end of the run
// the levels go before the forest.
void deletePocketChain(Pocket* pocket, bool forgetInNodes) {
  while (pocket != nullptr) {
    if (Pocket* child = pocket->firstChild) {
      pocket->firstChild = child->nextSibling;
      child->nextSibling = pocket;
      pocket = child;
    } else {
      Pocket* next = pocket->nextSibling;
      // The node stays taken; it just has no pocket any more.
      if (forgetInNodes && pocket->node != nullptr && pocket->node->pocket == pocket) pocket->node->pocket = nullptr;
      delete pocket;
      pocket = next;
    }
  }
}

}  // namespace

void deletePocketTree(Pocket* pocket) {
  if (pocket == nullptr) return;
  pocket->nextSibling = nullptr;
  deletePocketChain(pocket, true);
}

PocketForest::~PocketForest() { deletePocketChain(firstRoot, false); }

std::int32_t pocketCount(const PocketForest& forest) {
  std::int32_t count = 0;
  for (const Pocket* p = forest.firstRoot; p != nullptr; p = nextPocketInPreOrder(p)) ++count;
  return count;
}

}  // namespace pc
