#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "schedule/ShowEvent.h"

namespace vtr {

class LinkedList;
class Schedule;

// One node of a schedule's event list. Nodes are owned by their list; a node pointer stays
// valid until the node is deleted.
class Node {
  public:
    Node* NextNode() const noexcept { return next_; }
    Node* PreviousNode() const noexcept { return previous_; }
    const ShowEventPtr& Obj() const noexcept { return obj_; }

  private:
    friend class LinkedList;
    friend class Schedule;

    explicit Node(ShowEventPtr obj) : obj_(std::move(obj)) {}

    Node* next_ = nullptr;
    Node* previous_ = nullptr;
    ShowEventPtr obj_;
    std::size_t slot_ = 0;  // place in the list's node collection

    // The schedule's lookup bookkeeping for this node (see Schedule).
    bool indexed_ = false;
    bool degenerate_ = false;
    bool broken_ = false;
    int64_t length_ = 0;
    std::multimap<int32_t, Node*>::iterator position_;
};

// A doubly linked list of events from FirstNode to LastNode (no wrap-around links).
class LinkedList {
  public:
    // A list of one node carrying the object.
    explicit LinkedList(ShowEventPtr obj);
    LinkedList(const LinkedList&) = delete;
    LinkedList& operator=(const LinkedList&) = delete;

    Node* FirstNode() const noexcept { return first_; }
    Node* LastNode() const noexcept { return last_; }
    int32_t Count() const noexcept { return static_cast<int32_t>(nodes_.size()); }

    Node* InsertAfter(Node* node, ShowEventPtr obj);
    Node* InsertBefore(Node* node, ShowEventPtr obj);
    // Unlinks and frees the node. Deleting the only node raises "Can't delete only node"
    // (source "LinkedList.DeleteNode").
    void DeleteNode(Node* node);

  private:
    Node* Make(ShowEventPtr obj);

    std::vector<std::unique_ptr<Node>> nodes_;
    Node* first_ = nullptr;
    Node* last_ = nullptr;
};

namespace LinkedListFunctions {
std::unique_ptr<LinkedList> NewLinkedList(ShowEventPtr obj);
}  // namespace LinkedListFunctions

}  // namespace vtr
