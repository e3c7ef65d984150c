// What holds a book together, told by a program that shares nothing with the library's own: every record ends
// where the next begins, and every offset points at what it is for.
#pragma once

#include <string>

namespace ingester {

/// What is wrong with a book; empty for a sound one.
[[nodiscard]] std::string Faults_Of_Book(const std::string& bytes);

}  // namespace ingester
