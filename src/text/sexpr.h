// The S-expression layer of the text form: compact tokens, lists and their byte offsets.
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

// A token or a list. Atoms keep no text of their own: they are views into the
// source, so reading allocates nothing per token.
struct SNode {
    enum Kind : unsigned char { LIST, SYMBOL, STRING, INTEGER, REAL };
    Kind kind = LIST;
    bool negative = false;            // INTEGER: written with a minus sign
    bool escaped = false;             // STRING: holds escapes, so its text must be decoded
    std::size_t offset = 0;           // of the first byte ('(' or the opening quote for strings)
    std::size_t length = 0;           // bytes as written (strings: between the quotes; lists: to the ')')
    union {
        unsigned long long magnitude; // INTEGER: absolute value
        double real;                  // REAL
    };
    SItems items;                     // LIST

    SNode() : magnitude(0) {}
};

const SNode& SItems::operator[](std::size_t i) const { return first_[i]; }
const SNode& SItems::front() const { return first_[0]; }
const SNode* SItems::end() const { return first_ + n_; }

// Where the lists' items live: chunks of nodes, many lists to a chunk, so that
// reading allocates little. A mark taken before a form and released after it
// was built hands its chunks back, so memory follows the largest form, not the
// whole text.
class Forms {
public:
    struct Mark {
        std::size_t chunk = 0;
        std::size_t used = 0;
    };

    // Moves nodes [first, last) into the storage, contiguous, and views them.
    SItems keep(SNode* first, SNode* last);
    Mark mark() const { return {chunks_.size(), used_}; }
    // Gives back everything kept since m; views taken since then dangle.
    void release(const Mark& m);

    // Offsets, ascending, of the symbols that start with 's' or 'g' and a
    // digit: those that may name an item of another subprogram or a file-level name.
    std::vector<std::size_t> scopedSymbols;

private:
    struct Chunk {
        std::unique_ptr<SNode[]> nodes;
        std::size_t capacity = 0;
    };
    std::vector<Chunk> chunks_;
    std::vector<Chunk> spare_;
    std::size_t used_ = 0;
};

struct SyntaxError {
    std::size_t offset = 0;
    std::string message;
};

// Told about the first top-level form as it is read, so that it can be built
// form by form while the rest is still being read.
class FormListener {
public:
    virtual ~FormListener() = default;
    // A complete item of the first top-level form, if that form is a list.
    // Returns true when the item's nodes are no longer needed.
    virtual bool unitItem(const SNode& unitList, std::size_t index, const SNode& item) = 0;
    // A complete top-level form: the first (its items were reported already) or a later one.
    virtual void topForm(std::size_t index, const SNode& form) = 0;
};

// Reads every top-level form of source, reporting them to the listener; false
// and err set on the first syntax error. Appends the offset of every line after
// the first to lineStarts. One pass, iterative, nesting capped at MAX_NESTING.
bool readForms(std::string_view source, Forms& forms, std::vector<std::size_t>& lineStarts,
               FormListener& listener, SyntaxError& err);

// The end of the symbol that starts at offset `at`.
std::size_t symbolEnd(std::string_view source, std::size_t at);

// The text of an atom as written (strings: the decoded contents).
std::string_view atomText(std::string_view source, const SNode& n, std::string& scratch);

// A token as it can be quoted in a message: symbols and numbers as written,
// strings in quotes (shortened), lists by their head.
std::string quote(std::string_view source, const SNode& n);

}  // namespace ZOA::text

#endif
