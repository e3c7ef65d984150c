// Doubly linked lists with a remembered position, as Columns, rows and cells are kept.
#pragma once

#include <cstdint>

namespace ingester {

/// Walks to node `index` (from 0) of `count`, from the nearest of head, tail and the remembered
/// position, and remembers it. Null for an index out of range.
template <class Node> Node* Walk_To(Node* first, Node* last, Node*& cursor, std::int32_t& cursor_index,
                                    std::int32_t count, std::int32_t index)
{
    if (index < 0 || index >= count)
        return nullptr;
    const std::int32_t from_end = count - 1 - index;
    Node* node = first;
    std::int32_t steps = index;  // forwards when positive
    if (from_end < index) {
        node = last;
        steps = -from_end;
    }
    if (cursor_index >= 0 && cursor != nullptr) {
        const std::int32_t from_cursor = index - cursor_index;
        const std::int32_t cursor_way = from_cursor < 0 ? -from_cursor : from_cursor;
        if (cursor_way < (steps < 0 ? -steps : steps)) {
            node = cursor;
            steps = from_cursor;
        }
    }
    for (; steps > 0 && node != nullptr; --steps)
        node = node->next;
    for (; steps < 0 && node != nullptr; ++steps)
        node = node->prev;
    cursor = node;
    cursor_index = node == nullptr ? -1 : index;
    return node;
}

/// Takes `node` out of its list.
template <class Node> void Unlink(Node*& first, Node*& last, Node* node)
{
    (node->prev != nullptr ? node->prev->next : first) = node->next;
    (node->next != nullptr ? node->next->prev : last) = node->prev;
    node->next = node->prev = nullptr;
}

/// Puts the chain `head`..`tail` in front of `before`; at the end when that is null.
template <class Node> void Link_Before(Node*& first, Node*& last, Node* before, Node* head, Node* tail)
{
    Node* const behind = before != nullptr ? before->prev : last;
    head->prev = behind;
    tail->next = before;
    (behind != nullptr ? behind->next : first) = head;
    (before != nullptr ? before->prev : last) = tail;
}

}  // namespace ingester
