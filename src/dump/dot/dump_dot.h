// DumpDot: writes one subprogram as a Graphviz digraph, with node statistics on the diagnostic stream.
#ifndef ZOA_DUMP_DOT_DUMP_DOT_H
#define ZOA_DUMP_DOT_DUMP_DOT_H

#include "support/pointer_table.h"
#include "support/text_sink.h"

#include <zoa/enums.h>
#include <zoa/memmgr.h>
#include <zoa/nesting.h>
#include <zoa/tree_base.h>

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

namespace ZOA {

class CONST;
class SUBPROG;

// All the work happens in the constructor: the subprogram is walked once,
// collecting its nodes by kind in post-order (CONST, NAME, TEMP, BUF_TEMP and
// LABEL once each, every other kind once per visit); the statistics are
// written to std::cout and flushed; then the digraph goes to `out`: header,
// one subgraph per node kind with record labels, one subgraph of edges.
// Node identities are addresses written as unsigned decimal numbers.
//
// The collection walk follows at most MAX_WALK_DEPTH levels of children: a
// subprogram whose nodes form a cycle (possible with the copy assignments)
// gets the nodes collected down to that depth, and the rest of the label
// that holds the cycle is left out; its edges may then point at
// identities that have no declaration, which Graphviz draws as plain nodes.
//
// Choices where the output is otherwise open:
//  - Operator texts are the enumerator names of ZOA::toString(BinopKind) and
//    toString(UnopKind) ("PLUS" ... "RSHIFT", "BITWISE_AND", "MAX_BINOP",
//    "CONV4" ...), as in the ASCII dump; values outside the enumerations "?".
//  - A POINTER constant holding a null pointer is labelled "(char *)0"; the
//    pointer is never read through.
//  - A null child (a BINOP operand, a CALL argument, a label's first statement,
//    a CJUMP label and so on) gets no edge; nothing is dereferenced.
//  - Numbers follow `out`'s formatting flags and locale (std::hex gives hex
//    identities); with the default decimal formatting they are written
//    directly, without a formatted stream operation per number.
class DumpDot {
public:
    // Storage that ZOA_file::dumpDot reuses from one subprogram to the next,
    // so that dumping allocates only when a subprogram outgrows the others.
    // Its text sink writes to the stream the dumps write to.
    struct Workspace {
        explicit Workspace(std::ostream& out) : text(out) {}
        std::vector<TreeBase*> nodesByKind[NODE_TYPE_COUNT];
        PointerSet<const TreeBase*> declaredOnce;
        TextSink text;  // DOT text on its way to the stream
    };

    // The node statistics go to `stats`, std::cout when it is null. A given
    // workspace must have been made for `out`.
    DumpDot(SUBPROG* subprog, std::ostream& out, Workspace* workspace = nullptr, std::ostream* stats = nullptr);
    ~DumpDot();
    DumpDot(const DumpDot&) = delete;
    DumpDot& operator=(const DumpDot&) = delete;

private:
    enum EdgeEnding { PLAIN, BLUE, RED, BOLD_BLUE, BOLD_RED, OPEN };

    // Children first, then n.
    void collect(TreeBase* n);
    // Leaves and labels once, other kinds per visit.
    void record(TreeBase* n, NodeType k);

    void writeStatistics(std::ostream& os);
    void writeGraphHeader();
    void writeKindBlocks();
    void writeConnections();
    void declareNode(TreeBase* n, int depth);
    void writeFields(TreeBase* n);
    void writeConstValue(CONST* c);
    void declareTemps(SUBPROG* sp, int depth);
    void writeEdges(TreeBase* n, int depth);
    void edge(const TreeBase* from, const TreeBase* to, EdgeEnding ending, int depth);

    // Text goes through workspace.text and reaches `out` in large pieces.
    template <std::size_t N> void lit(const char (&s)[N]) { text.write(s, N - 1); }
    void indent(int depth) { text.indent(static_cast<unsigned int>(depth)); }
    void putUnsigned(unsigned long long v);
    void putSigned(long long v);
    void putIdentity(const TreeBase* n);
    template <class F> void putFloating(F v);

    std::unique_ptr<Workspace> ownWorkspace;
    Workspace& workspace;
    std::vector<TreeBase*>* nodesByKind;  // workspace.nodesByKind
    TextSink& text;
    NestingGuard nesting;
    SUBPROG* subprog;
    std::ostream& out;
    bool plainNumbers;  // out formats integers as bare decimal digits
};

}  // namespace ZOA

#endif
