#include "schedule/LinkedList.h"

#include "engine/VtrError.h"
#include "show/ModelErrors.h"

namespace vtr {

LinkedList::LinkedList(ShowEventPtr obj) {
    Node* node = Make(std::move(obj));
    first_ = last_ = node;
}

Node* LinkedList::Make(ShowEventPtr obj) {
    auto node = std::unique_ptr<Node>(new Node(std::move(obj)));
    node->slot_ = nodes_.size();
    nodes_.push_back(std::move(node));
    return nodes_.back().get();
}

Node* LinkedList::InsertAfter(Node* node, ShowEventPtr obj) {
    if (node == nullptr) {
        ModelErrors::ObjectNotSet("LinkedList.InsertAfter");
    }
    Node* added = Make(std::move(obj));
    added->previous_ = node;
    added->next_ = node->next_;
    if (node->next_ != nullptr) {
        node->next_->previous_ = added;
    } else {
        last_ = added;
    }
    node->next_ = added;
    return added;
}

Node* LinkedList::InsertBefore(Node* node, ShowEventPtr obj) {
    if (node == nullptr) {
        ModelErrors::ObjectNotSet("LinkedList.InsertBefore");
    }
    Node* added = Make(std::move(obj));
    added->next_ = node;
    added->previous_ = node->previous_;
    if (node->previous_ != nullptr) {
        node->previous_->next_ = added;
    } else {
        first_ = added;
    }
    node->previous_ = added;
    return added;
}

void LinkedList::DeleteNode(Node* node) {
    if (node == nullptr) {
        ModelErrors::ObjectNotSet("LinkedList.DeleteNode");
    }
    if (nodes_.size() == 1) {
        Raise(1, "LinkedList.DeleteNode", "Can't delete only node");
    }
    if (node->previous_ != nullptr) {
        node->previous_->next_ = node->next_;
    } else {
        first_ = node->next_;
    }
    if (node->next_ != nullptr) {
        node->next_->previous_ = node->previous_;
    } else {
        last_ = node->previous_;
    }
    const std::size_t slot = node->slot_;
    if (slot + 1 != nodes_.size()) {
        nodes_[slot] = std::move(nodes_.back());
        nodes_[slot]->slot_ = slot;
    }
    nodes_.pop_back();
}

namespace LinkedListFunctions {

std::unique_ptr<LinkedList> NewLinkedList(ShowEventPtr obj) {
    return std::make_unique<LinkedList>(std::move(obj));
}

}  // namespace LinkedListFunctions

}  // namespace vtr
