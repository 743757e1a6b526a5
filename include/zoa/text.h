// A readable S-expression text form of a unit: reading it builds a ZOA_file through
// the public API, writing prints any unit so that reading it back rebuilds it.
#ifndef ZOA_TEXT_H
#define ZOA_TEXT_H

#include <zoa/zoa_file.h>

#include <iosfwd>
#include <list>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ZOA::text {

// One problem found in the input, at a 1-based line and column.
struct Diagnostic {
    std::string file;
    unsigned int line = 0;
    unsigned int column = 0;
    std::string message;
};

// "FILE:LINE:COL: error: message".
std::string format(const Diagnostic& d);

// Where a node was written: 1-based line and column.
struct Position {
    unsigned int line = 0;
    unsigned int column = 0;
};

// Where the reader made each node, as byte offsets, and the line starts that
// turn an offset into a line and column. A flat table in creation order; the
// first lookup sorts it (so positionOf is not to be called from two threads at
// once on the same Result).
class PositionTable {
public:
    // Node n was made by the text at byte `offset`. Records of the declaration
    // phase (unit items in order) count before those of the blocks, whatever
    // order they were made in; within a phase the first record of a node wins.
    void record(const TreeBase* n, std::size_t offset, bool inBlock) {
        Log& log = inBlock ? late_ : early_;
        if (log.empty() || log.back().size() == log.back().capacity()) grow(log);
        log.back().push_back({n, offset});
        sorted_ = false;
    }
    const Position* find(const TreeBase* n) const;
    // The line and column of a byte offset.
    Position locate(std::size_t offset) const;
    void clear();
    std::vector<std::size_t> lineStarts;  // offset of each line's first byte

private:
    struct Entry {
        const TreeBase* node;
        std::size_t offset;
    };
    struct Found {
        const TreeBase* node;
        Position position;
    };
    // Filled in chunks, so that a growing table is never copied.
    using Log = std::vector<std::vector<Entry>>;
    static void grow(Log& log);
    Log early_, late_;
    mutable std::vector<Found> index_;
    mutable bool sorted_ = true;
};

// What parse gives back: the unit it built, or the diagnostics that stopped it.
// The reader builds while it reads, so the unit was constructed (and the arena
// rewound) whenever the (unit ...) form got past its flavour, even if the text
// fails further on; on failure it is dropped again. Texts of POINTER
// constants are copied into the arena, so they live exactly as long as the nodes.
class Result {
public:
    bool ok() const { return unit_ != nullptr && diagnostics_.empty(); }
    ZOA_file* unit() const { return ok() ? unit_.get() : nullptr; }
    // Hands the unit over to the caller (null on failure).
    std::unique_ptr<ZOA_file> release() { return ok() ? std::move(unit_) : nullptr; }
    const std::vector<Diagnostic>& diagnostics() const { return diagnostics_; }
    // Where a node of the unit was written (for a temp, label or name: its
    // declaration); null for nodes the text did not make.
    const Position* positionOf(const TreeBase* node) const { return positions_.find(node); }

    // Filled by the reader.
    std::unique_ptr<ZOA_file> unit_;
    std::vector<Diagnostic> diagnostics_;
    PositionTable positions_;
};

// Overrides the flavour the text names, e.g. to write a unit written for C as
// assembly: the flags of a unit are fixed when it is constructed.
struct Flavour {
    bool isGcc = true;
    bool asmMode = false;
};

// Nesting deeper than this many parentheses is refused with a diagnostic, so
// that no input can exhaust the stack.
constexpr unsigned int MAX_NESTING = 4096;

// Ids ascend, and ids a text skips are consumed one by one (so that later
// nodes get the ids written). An id more than this many past the next free one
// is refused with a diagnostic, so that a short text cannot make the reader
// count to four billion.
constexpr unsigned int MAX_ID_SKIP = 1u << 20;

// Reads a whole text. Never throws; stops at the first error and reports it
// (one diagnostic). Constructing the unit rewinds the arena: every node of an
// earlier unit is given up, so write or output an earlier unit before parsing.
Result parse(std::string_view source, const std::string& fileName);
Result parse(std::string_view source, const std::string& fileName, const Flavour& flavour);

// Writes the unit in the text form. Shared subtrees are written once per use
// (reading them back gives separate but equal nodes); shared leaves (temps,
// names, labels) are written as references and stay shared. Writing a unit,
// reading it back and writing that gives the same bytes. A tree that contains
// itself (made through copy assignment) is written up to the repetition, then
// "(cycle)", which the reader refuses.
void write(std::ostream& os, const ZOA_file& unit);
std::string write(const ZOA_file& unit);

}  // namespace ZOA::text

#endif
