// The man page and the completions of shells, made from the options themselves.
#pragma once

#include <string_view>

namespace ingester {

/// Prints the document that a hidden option asks for: --make-man, --make-bash or --make-zsh. False for any
/// other word.
bool Print_Option_Document(std::string_view word);

}  // namespace ingester
