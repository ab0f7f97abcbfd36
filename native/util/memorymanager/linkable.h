// Intrusive doubly linked list node. A list is circular through a head node of
// the same type; an empty head points to itself.
#pragma once

struct linkable {
    linkable* next = nullptr;
    linkable* prev = nullptr;

    void init_head() { next = prev = this; }
    bool islinked() const { return next != nullptr; }
    void unlink() {
        if (!next) return;
        next->prev = prev;
        prev->next = next;
        next = prev = nullptr;
    }
    // Insert `node` directly after this head (newest first when walking next).
    void insert_after(linkable& node) {
        node.next = next;
        node.prev = this;
        next->prev = &node;
        next = &node;
    }
    bool empty_head() const { return next == this; }
};
