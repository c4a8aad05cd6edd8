// RecyclingQueue: the first-in-first-out work list of the breadth-first walk.
// Cells are recycled through a free stack instead of going back to the heap,
// so a queue that is emptied and refilled allocates nothing new.
#pragma once

#include <cstdint>
#include <optional>

namespace pc {

template <typename T>
class RecyclingQueue {
 public:
  RecyclingQueue() = default;
  RecyclingQueue(const RecyclingQueue&) = delete;
  RecyclingQueue& operator=(const RecyclingQueue&) = delete;
  ~RecyclingQueue() {
    freeChain(head_);
    freeChain(freeNodes_);
  }

  std::int32_t count() const { return count_; }
  bool empty() const { return count_ == 0; }

  // Returns false when no cell could be obtained.
  bool push(const T& value) {
    Cell* cell = freeNodes_;
    if (cell != nullptr) {
      freeNodes_ = cell->next;
    } else {
      cell = new (std::nothrow) Cell;
      if (cell == nullptr) return false;
      ++allocatedCells_;
    }
    cell->value = value;
    cell->next = nullptr;
    if (tail_ != nullptr) {
      tail_->next = cell;
    } else {
      head_ = cell;
    }
    tail_ = cell;
    ++count_;
    return true;
  }

  std::optional<T> pop() {
    if (head_ == nullptr) return std::nullopt;
    Cell* cell = head_;
    head_ = cell->next;
    if (head_ == nullptr) tail_ = nullptr;
    cell->next = freeNodes_;
    freeNodes_ = cell;
    --count_;
    return cell->value;
  }

  // Moves every cell in use onto the free stack at once.
  void clearAll() {
    if (head_ != nullptr) {
      tail_->next = freeNodes_;
      freeNodes_ = head_;
      head_ = tail_ = nullptr;
    }
    count_ = 0;
  }

  // Number of cells ever obtained from the heap (for tests of the recycling).
  std::int32_t allocatedCells() const { return allocatedCells_; }

 private:
  struct Cell {
    T value{};
    Cell* next = nullptr;
  };
  static void freeChain(Cell* cell) {
    while (cell != nullptr) {
      Cell* next = cell->next;
      delete cell;
      cell = next;
    }
  }
  Cell* head_ = nullptr;
  Cell* tail_ = nullptr;
  Cell* freeNodes_ = nullptr;
  std::int32_t count_ = 0;
  std::int32_t allocatedCells_ = 0;
};

}  // namespace pc
