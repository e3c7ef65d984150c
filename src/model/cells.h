// Cells: nodes of doubly linked lists, carved from large blocks.
#pragma once

#include "support/arena.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string_view>
#include <vector>

namespace ingester {

/// What a node holds: a number, or a text kept in an arena (or null, for kinds 33 and 34).
union Cell_Value {
    double number;
    const char* text;
};

/// One cell of a Column: 24 bytes. All text in the model is in the code that the request's text has, see
/// support/letters.h.
struct Cell_Node {
    Cell_Node* next;
    Cell_Node* prev;
    Cell_Value value;

    [[nodiscard]] std::string_view Text() const
    {
        return value.text == nullptr ? std::string_view{} : Text_Arena::View(value.text);
    }
};

/// Has the nodes that a sweep comes to next brought near. They mostly lie behind each other, but processors
/// don't look beyond the page that they are on.
inline void Bring_Nodes_Near(const Cell_Node* node)
{
    constexpr std::size_t nodes_ahead = 300;
    __builtin_prefetch(node + nodes_ahead);
}

/// A level value or a label of a Factor: the same shape as a cell.
using Level_Node = Cell_Node;

/// One row of a Sheet.
struct Row_Node {
    Row_Node* next;
    Row_Node* prev;
    std::int32_t restricted;  ///< 1: excluded by a restriction
    std::int16_t empty;       ///< set by `Find_Empty_Rows`
};

struct Free_Deleter {
    void operator()(void* pointer) const { std::free(pointer); }
};

/// The blocks of one list; they go when the list goes. Nodes that are unlinked stay in their block.
using Block_Table = std::vector<std::unique_ptr<void, Free_Deleter>>;

/// The most nodes in one block of each kind.
constexpr std::size_t Cell_Nodes_Per_Block = 6666664;
constexpr std::size_t Row_Nodes_Per_Block = 3999998;

/// What `Alloc_Cell_Nodes` makes beside the column types: lists of a Factor, and rows.
enum Node_Kind : std::int32_t {
    level_value_nodes = 90,
    label_nodes = 91,
    row_nodes = 92,
};

/// Zeroed memory, or null after "Error: Not enough memory to read data.\n".
/// For large tables that may fail; freed with std::free.
[[nodiscard]] void* Alloc_Zeroed(std::size_t bytes);

/// As realloc; on failure the old memory stays, and null comes back after the same message.
[[nodiscard]] void* Realloc_Checked(void* pointer, std::size_t bytes);

/// Makes `count` linked nodes for a list of `kind` (a column type, 33, 34, 90 or 91): numbers are
/// `Missing_Value`, texts empty, or null for 33 and 34. The blocks go behind those of `blocks`.
/// Returns how many blocks there are then; 0 and no nodes for a `count` below 1, or
/// after "Ingester out of memory.\n".
std::size_t Alloc_Cell_Nodes(std::int32_t kind, std::int64_t count, Cell_Node*& first, Cell_Node*& last,
                             Block_Table& blocks);

/// The same for rows (kind 92).
std::size_t Alloc_Row_Nodes(std::int64_t count, Row_Node*& first, Row_Node*& last, Block_Table& blocks);

}  // namespace ingester
