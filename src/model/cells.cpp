#include "model/cells.h"

#include "model/sheet.h"
#include "platform/refusals.h"
#include "request/messages.h"
#include "request/request.h"

#include <algorithm>

namespace ingester {

void* Alloc_Zeroed(std::size_t bytes)
{
    void* const memory = std::calloc(std::max<std::size_t>(bytes, 1), 1);
    if (memory == nullptr)
        Report_Message("Error: Not enough memory to read data.\n");
    return memory;
}

void* Realloc_Checked(void* pointer, std::size_t bytes)
{
    void* const memory = Take_Memory(pointer, std::max<std::size_t>(bytes, 1));
    if (memory == nullptr)
        Report_Message("Error: Not enough memory to read data.\n");
    return memory;
}

namespace {

/// Links the nodes of one block, behind `last` if there is one; `set` fills a node's payload.
template <class Node, class Set>
void Link_Block(Node* nodes, std::size_t count, Node*& first, Node*& last, Set set)
{
    Node* previous = last;
    if (previous != nullptr)
        previous->next = nodes;
    else
        first = nodes;
    for (std::size_t i = 0; i < count; ++i) {
        nodes[i].prev = previous;
        nodes[i].next = &nodes[i + 1];
        set(nodes[i]);
        previous = &nodes[i];
    }
    previous->next = nullptr;
    last = previous;
}

/// Makes `count` linked nodes in blocks of at most `per_block`.
template <class Node, class Set> std::size_t Alloc_Nodes(std::int64_t count, std::size_t per_block,
                                                         Node*& first, Node*& last, Block_Table& blocks,
                                                         Set set)
{
    first = nullptr;
    last = nullptr;
    if (count < 1)
        return 0;
    const std::size_t blocks_before = blocks.size();
    for (auto left = static_cast<std::size_t>(count); left > 0;) {
        const std::size_t size = std::min(left, per_block);
        blocks.emplace_back();  // room for the owner comes first
        blocks.back().reset(Take_Memory(nullptr, size * sizeof(Node)));
        void* const block = blocks.back().get();
        if (block == nullptr) {
            blocks.resize(blocks_before);
            first = nullptr;
            last = nullptr;
            Report_Message("Ingester out of memory.\n");
            request.Out_Of_Memory = true;
            return 0;
        }
        Link_Block(static_cast<Node*>(block), size, first, last, set);
        left -= size;
    }
    return blocks.size();
}

/// What a fresh cell of `kind` holds.
Cell_Value Blank_Value(std::int32_t kind)
{
    Cell_Value value;
    if (kind == long_text_column || kind == unbuffered_text_column)
        value.text = nullptr;
    else if (Is_Text_Like(kind) || kind == label_nodes)
        value.text = Text_Arena::Empty();
    else
        value.number = Missing_Value;
    return value;
}

}  // namespace

std::size_t Alloc_Cell_Nodes(std::int32_t kind, std::int64_t count, Cell_Node*& first, Cell_Node*& last,
                             Block_Table& blocks)
{
    const Cell_Value blank = Blank_Value(kind);
    return Alloc_Nodes(count, Cell_Nodes_Per_Block, first, last, blocks,
                       [blank](Cell_Node& node) { node.value = blank; });
}

std::size_t Alloc_Row_Nodes(std::int64_t count, Row_Node*& first, Row_Node*& last, Block_Table& blocks)
{
    return Alloc_Nodes(count, Row_Nodes_Per_Block, first, last, blocks, [](Row_Node& node) {
        node.restricted = 0;
        node.empty = 0;
    });
}

}  // namespace ingester
