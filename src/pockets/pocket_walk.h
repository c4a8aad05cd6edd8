// Iterative walks over the pocket forest. They climb back up through
// `parent`, so they need no stack however deep the forest is.
#pragma once

#include "pockets/pocket_model.h"

namespace pc {

// The pocket after `pocket` in depth-first pre-order (children in chain
// order), or nullptr after the last pocket of the last root's zone.
template <typename P>
P* nextPocketInPreOrder(P* pocket) {
  if (pocket->firstChild != nullptr) return pocket->firstChild;
  while (pocket != nullptr && pocket->nextSibling == nullptr) pocket = pocket->parent;
  return pocket != nullptr ? pocket->nextSibling : nullptr;
}

}  // namespace pc
