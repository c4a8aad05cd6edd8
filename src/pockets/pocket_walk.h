// Iterative walks over the pocket forest and the level trees. They climb
// back up through `parent`, or reshape the chain they walk, so they need no
// stack however deep the tree is.
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

// Deletes a chain of items (nodes or pockets) with everything under them, in
// time linear in their number and without a stack: an item's first child is
// moved in front of it, so the chain being walked always holds what is left.
// `release` sees each item just before it is deleted.
template <typename T, typename Release>
void deleteChain(T* item, Release release) {
  while (item != nullptr) {
    if (T* child = item->firstChild) {
      item->firstChild = child->nextSibling;
      child->nextSibling = item;
      item = child;
    } else {
      T* next = item->nextSibling;
      release(*item);
      delete item;
      item = next;
    }
  }
}

}  // namespace pc
