// The containment tree of one level: insertion of contours, the search for
// the deepest node holding a point, the outer-node list and the level's
// lifetime. Every walk is iterative (first child, then next sibling, then
// back up through `parent`), so deeply nested contours cannot exhaust the
// stack. Each long sibling chain has a compact copy (ChainIndex) that the
// scans run over; the links stay the model's structure and the copies are
// kept in step with them.
#include <new>
#include <utility>

#include "pockets/chain_index.h"
#include "pockets/node_geometry.h"
#include "pockets/pocket_model.h"
#include "pockets/pocket_walk.h"

namespace pc {

namespace {

void releaseTree(ZLevel& level) {
  deleteChain(level.root, [](ContourNode& node) { releaseSearchAids(node); });
  level.root = nullptr;
  delete level.rootChain;
  level.rootChain = nullptr;
}

// The node after `node` in pre-order, with the change of depth.
template <typename Node>
Node* nextInPreOrder(Node* node, int& depth) {
  if (node->firstChild != nullptr) {
    ++depth;
    return node->firstChild;
  }
  while (node != nullptr && node->nextSibling == nullptr) {
    node = node->parent;
    --depth;
  }
  return node != nullptr ? node->nextSibling : nullptr;
}

// Chains shorter than this are scanned through their links.
constexpr std::int32_t kIndexedChainLength = 16;

// The link holding the first node of the chain under `parent` (the level's
// top-level chain when parent is null), and the slot of its compact copy.
ContourNode*& headLink(ZLevel& level, ContourNode* parent) {
  return parent != nullptr ? parent->firstChild : level.root;
}

ChainIndex*& chainSlot(ZLevel& level, ContourNode* parent) {
  return parent != nullptr ? parent->childChain : level.rootChain;
}

// The chain's compact copy, made from its links once the chain is long
// enough to pay for it; nullptr for a chain to scan through its links.
ChainIndex* chainOf(ZLevel& level, ContourNode* parent) {
  ChainIndex*& slot = chainSlot(level, parent);
  if (slot != nullptr) return slot;
  ContourNode* head = headLink(level, parent);
  std::int32_t length = 0;
  for (ContourNode* n = head; n != nullptr && length < kIndexedChainLength; n = n->nextSibling) ++length;
  if (length >= kIndexedChainLength) slot = ChainIndex::fromLinks(head);
  return slot;
}

// Where the walk down the tree stopped in one chain: the first sibling
// related to the new node, or the chain's end.
struct ChainStop {
  int relation = 0;
  ContourNode* sibling = nullptr;   // the related sibling
  std::int32_t index = -1;          // its index in the chain's copy, if any
  ContourNode** end = nullptr;      // the chain's last link when none is related
};

ChainStop firstRelated(ZLevel& level, ContourNode* parent, ContourNode& node) {
  ChainStop stop;
  if (ChainIndex* chain = chainOf(level, parent)) {
    const std::int32_t i = chain->firstNotApart(*node.contour, 0, [&](std::int32_t k) {
      stop.relation = nodeRelation(node, *(*chain)[k].node);
      return stop.relation != 0;
    });
    if (i < chain->size()) {
      stop.sibling = (*chain)[i].node;
      stop.index = i;
    } else {
      stop.end = &(*chain)[chain->size() - 1].node->nextSibling;
    }
    return stop;
  }
  ContourNode** link = &headLink(level, parent);
  for (; *link != nullptr; link = &(*link)->nextSibling) {
    stop.relation = nodeRelation(node, **link);
    if (stop.relation != 0) {
      stop.sibling = *link;
      return stop;
    }
  }
  stop.end = link;
  return stop;
}

// `node` encloses `x`, a node of the chain under `parent`: it takes x's
// place with x as its first child. Of x's following siblings those related
// to it join its child chain, the others stay behind it in their previous
// order (keeping their parent). Siblings before x are untouched.
void insertAbove(ZLevel& level, ContourNode* parent, ContourNode* x, ContourNode* node) {
  ContourNode** link = &headLink(level, parent);
  while (*link != x) link = &(*link)->nextSibling;
  *link = node;
  node->parent = parent;
  node->firstChild = x;
  ContourNode* following = x->nextSibling;
  x->parent = node;
  ContourNode** keptTail = &x->nextSibling;
  ContourNode** movedTail = &node->nextSibling;
  while (following != nullptr) {
    ContourNode* next = following->nextSibling;
    if (nodeRelation(*node, *following) != 0) {
      following->parent = node;
      *keptTail = following;
      keptTail = &following->nextSibling;
    } else {
      *movedTail = following;
      movedTail = &following->nextSibling;
    }
    following = next;
  }
  *keptTail = nullptr;
  *movedTail = nullptr;
}

// The same on a chain with a compact copy: only the followers whose box is
// not apart from the new one can be related, so only they are visited, and
// the copy is updated in place.
void insertAboveIndexed(ZLevel& level, ContourNode* parent, ChainIndex& chain, std::int32_t at,
                        ContourNode* node) {
  ContourNode* x = chain[at].node;
  (at > 0 ? chain[at - 1].node->nextSibling : headLink(level, parent)) = node;
  node->parent = parent;
  node->firstChild = x;
  node->nextSibling = x->nextSibling;
  x->parent = node;
  x->nextSibling = nullptr;

  CheckedArray<std::int32_t> kept(0, 64);
  chain.firstNotApart(*node->contour, at + 1, [&](std::int32_t k) {
    if (nodeRelation(*node, *chain[k].node) != 0) kept.append(k);
    return false;
  });
  // Unlink the related followers from the chain, in order, and hang them
  // after x. A follower's predecessor is the entry before it, or, when that
  // one left too, the predecessor it had.
  ContourNode* childTail = x;
  ContourNode* predecessorOfLast = nullptr;
  for (std::int32_t i = 0; i < kept.count; ++i) {
    const std::int32_t k = kept.data[i];
    ContourNode* y = chain[k].node;
    ContourNode* predecessor = (i > 0 && kept.data[i - 1] == k - 1) ? predecessorOfLast
                               : (k - 1 == at ? node : chain[k - 1].node);
    predecessor->nextSibling = y->nextSibling;
    predecessorOfLast = predecessor;
    y->parent = node;
    y->nextSibling = nullptr;
    childTail->nextSibling = y;
    childTail = y;
  }
  chain.replace(at, node);
  chain.remove(kept.data, kept.count);
}

}  // namespace

ZLevel::ZLevel(ZLevel&& other) noexcept
    : root(std::exchange(other.root, nullptr)),
      outerCache(std::move(other.outerCache)),
      rootChain(std::exchange(other.rootChain, nullptr)) {}

ZLevel& ZLevel::operator=(ZLevel&& other) noexcept {
  if (this != &other) {
    releaseTree(*this);
    root = std::exchange(other.root, nullptr);
    outerCache = std::move(other.outerCache);
    rootChain = std::exchange(other.rootChain, nullptr);
  }
  return *this;
}

ZLevel::~ZLevel() { releaseTree(*this); }

std::int32_t nodeCount(const ZLevel& level) {
  std::int32_t count = 0;
  int depth = 0;
  for (const ContourNode* node = level.root; node != nullptr; node = nextInPreOrder(node, depth)) ++count;
  return count;
}

void addContourToLevel(ZLevel& level, ZContour* contour) {
  if (contour == nullptr) return;
  // The node exists from the start so that its contour can carry an edge
  // index while it is tested as the container of others.
  ContourNode* node = new (std::nothrow) ContourNode;
  if (node == nullptr) modelAllocationFailure();
  node->contour = contour;

  // Walk down from the top-level chain: the first sibling related to the new
  // contour decides; apart siblings are passed.
  ContourNode* parent = nullptr;
  for (;;) {
    const ChainStop stop = firstRelated(level, parent, *node);
    if (stop.relation == 1) {
      parent = stop.sibling;
    } else if (stop.relation == 2) {
      if (stop.index >= 0) {
        insertAboveIndexed(level, parent, *chainSlot(level, parent), stop.index, node);
      } else {
        insertAbove(level, parent, stop.sibling, node);
      }
      return;
    } else {
      node->parent = parent;
      *stop.end = node;
      if (ChainIndex* chain = chainSlot(level, parent)) chain->append(node);
      return;
    }
  }
}

ContourNode* deepestNodeHolding(ZLevel& level, Point p) {
  ContourNode* found = nullptr;
  for (;;) {
    ContourNode* holder = nullptr;
    if (ChainIndex* chain = chainOf(level, found)) {
      const std::int32_t i = chain->firstHolding(p, [&](std::int32_t k) {
        return pointInNode(p, *(*chain)[k].node);
      });
      if (i < chain->size()) holder = (*chain)[i].node;
    } else {
      for (ContourNode* n = headLink(level, found); n != nullptr; n = n->nextSibling) {
        if (pointInNode(p, *n)) {
          holder = n;
          break;
        }
      }
    }
    if (holder == nullptr) return found;
    found = holder;
  }
}

CheckedArray<ContourNode*>& outerNodes(ZLevel& level) {
  if (!level.outerCache) {
    level.outerCache.reset(new (std::nothrow) CheckedArray<ContourNode*>(nodeCount(level), 100));
    if (!level.outerCache) modelAllocationFailure();
  } else {
    level.outerCache->reset();
  }
  // Pre-order keeping the nodes of even depth: each outer node comes before
  // the outer nodes inside its islands, and those before its next sibling.
  CheckedArray<ContourNode*>& outer = *level.outerCache;
  int depth = 0;
  for (ContourNode* node = level.root; node != nullptr; node = nextInPreOrder(node, depth)) {
    if (depth % 2 == 0) outer.append(node);
  }
  return outer;
}

}  // namespace pc
