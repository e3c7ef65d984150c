// What a book must look like, told by a program that shares nothing with the library's own: every record in
// its place and of its length, every offset where it points.
#pragma once

#include <string>

namespace ingester {

struct Walked_Book {
    std::string faults;  ///< empty for a sound book
    std::string types;   ///< of all records, with blanks between: a short picture of the book
};

[[nodiscard]] Walked_Book Walk_Book(const std::string& bytes);

}  // namespace ingester
