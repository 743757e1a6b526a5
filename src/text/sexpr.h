// The S-expression layer of the text form: tokens, lists and their source positions.
#ifndef ZOA_TEXT_SEXPR_H
#define ZOA_TEXT_SEXPR_H

#include <string>
#include <string_view>
#include <vector>

namespace ZOA::text {

struct SNode {
    enum Kind { LIST, SYMBOL, STRING, INTEGER, REAL };
    Kind kind = LIST;
    unsigned int line = 0;
    unsigned int column = 0;
    std::string text;                 // symbol name, string contents, or the number as written
    unsigned long long magnitude = 0; // INTEGER: absolute value
    bool negative = false;            // INTEGER: written with a minus sign
    double real = 0;                  // REAL
    std::vector<SNode> items;         // LIST
};

struct SyntaxError {
    unsigned int line = 0;
    unsigned int column = 0;
    std::string message;
};

// Reads every top-level form of source; false and err set on the first error.
// Iterative, and nesting is capped at MAX_NESTING.
bool readForms(std::string_view source, std::vector<SNode>& forms, SyntaxError& err);

// A token as it can be quoted in a message: symbols and numbers as written,
// strings in quotes (shortened), lists by their head.
std::string quote(const SNode& n);

}  // namespace ZOA::text

#endif
