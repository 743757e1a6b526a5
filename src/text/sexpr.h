// The S-expression layer of the text form: tokens, lists and their source positions.
#ifndef ZOA_TEXT_SEXPR_H
#define ZOA_TEXT_SEXPR_H

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ZOA::text {

struct SNode;

// The items of a list: a view into the storage of the Forms that read them.
class SItems {
public:
    SItems() = default;
    SItems(const SNode* first, std::size_t n) : first_(first), n_(n) {}
    std::size_t size() const { return n_; }
    bool empty() const { return n_ == 0; }
    inline const SNode& operator[](std::size_t i) const;
    inline const SNode& front() const;
    const SNode* begin() const { return first_; }
    inline const SNode* end() const;

private:
    const SNode* first_ = nullptr;
    std::size_t n_ = 0;
};

struct SNode {
    enum Kind { LIST, SYMBOL, STRING, INTEGER, REAL };
    Kind kind = LIST;
    unsigned int line = 0;
    unsigned int column = 0;
    std::string text;                 // symbol name, string contents, or the number as written
    unsigned long long magnitude = 0; // INTEGER: absolute value
    bool negative = false;            // INTEGER: written with a minus sign
    double real = 0;                  // REAL
    SItems items;                     // LIST
};

const SNode& SItems::operator[](std::size_t i) const { return first_[i]; }
const SNode& SItems::front() const { return first_[0]; }
const SNode* SItems::end() const { return first_ + n_; }

// What readForms read: the top-level forms, and the chunks that hold every
// list's items (many lists to a chunk, so reading allocates little). Chunks
// stay small enough for malloc to serve from memory it already has: large
// ones are fresh pages on every read.
class Forms {
public:
    SItems top;

    // Moves nodes [first, last) into the storage, contiguous, and views them.
    SItems keep(SNode* first, SNode* last);

private:
    std::vector<std::unique_ptr<SNode[]>> chunks_;
    std::size_t used_ = 0;
    std::size_t capacity_ = 0;
};

struct SyntaxError {
    unsigned int line = 0;
    unsigned int column = 0;
    std::string message;
};

// Reads every top-level form of source; false and err set on the first error.
// Iterative, and nesting is capped at MAX_NESTING.
bool readForms(std::string_view source, Forms& forms, SyntaxError& err);

// A token as it can be quoted in a message: symbols and numbers as written,
// strings in quotes (shortened), lists by their head.
std::string quote(const SNode& n);

}  // namespace ZOA::text

#endif
