// DumpDot: writes one subprogram as a Graphviz digraph, with node statistics on std::cout.
#ifndef ZOA_DUMP_DOT_DUMP_DOT_H
#define ZOA_DUMP_DOT_DUMP_DOT_H

#include "dump/dot/node_set.h"
#include "dump/stable_ids.h"
#include "dump/text_buffer.h"

#include <zoa/all_visitor.h>
#include <zoa/enums.h>
#include <zoa/memmgr.h>

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

namespace ZOA {

// All the work happens in the constructor: the subprogram is walked once,
// collecting its nodes by kind in post-order (CONST, NAME, TEMP, BUF_TEMP and
// LABEL once each, every other kind once per visit); the statistics are
// written to std::cout and flushed; then the digraph goes to `out`: header,
// one subgraph per node kind with record labels, one subgraph of edges.
// Node identities are addresses written as unsigned decimal numbers.
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
class DumpDot : public AllVisitor {
public:
    // Storage that ZOA_file::dumpDot reuses from one subprogram to the next,
    // so that dumping allocates only when a subprogram outgrows the others.
    struct Workspace {
        std::vector<TreeBase*> nodesByKind[NODE_TYPE_COUNT];
        NodeSet declaredOnce;
        TextBuffer text;  // DOT text not yet handed to the stream
        StableIds ids;    // sound profile identities
    };

    // The node statistics go to `stats`, std::cout when it is null. With
    // sound (the sound profile) node identities are numbers in order of first
    // appearance in the digraph, not addresses; names, call names and string
    // constants are escaped (dot_escape.h) and a CHAR_U constant shows its
    // value in decimal, so that Graphviz renders every digraph.
    DumpDot(SUBPROG* subprog, std::ostream& out, Workspace* workspace = nullptr, std::ostream* stats = nullptr,
            bool sound = false);
    ~DumpDot() override;

    void visit(UNOP* n) override;
    void visit(TEMP* n) override;
    void visit(SUBPROG* n) override;
    void visit(SEQ* n) override;
    void visit(NAME* n) override;
    void visit(MOVE* n) override;
    void visit(MEM* n) override;
    void visit(LABEL* n) override;
    void visit(JUMP* n) override;
    void visit(EXP* n) override;
    void visit(CONST* n) override;
    void visit(CJUMP* n) override;
    void visit(CALL* n) override;
    void visit(BUF_TEMP* n) override;
    void visit(BINOP* n) override;
    void reservedHook1(void*) override {}
    void reservedHook2(void*) override {}
    void reservedHook3(void*) override {}

private:
    enum EdgeEnding { PLAIN, BLUE, RED, BOLD_BLUE, BOLD_RED, OPEN };

    void collect(TreeBase* n);      // every visit
    void collectOnce(TreeBase* n);  // first visit only

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
    void put(const char* s, std::size_t n) { text.append(s, n); }
    template <std::size_t N> void lit(const char (&s)[N]) { text.append(s, N - 1); }
    void put(const String& s) { text.append(s.data(), s.size()); }
    // A user text inside a label: escaped in the sound profile.
    void putText(const char* s, std::size_t n, bool record = true);
    void putText(const String& s, bool record = true) { putText(s.data(), s.size(), record); }
    void putCString(const char* s);
    void indent(int depth);
    void putUnsigned(unsigned long long v);
    void putSigned(long long v);
    void putIdentity(const TreeBase* n);
    template <class F> void putFloating(F v);
    void flushText();

    std::unique_ptr<Workspace> ownWorkspace;
    Workspace& workspace;
    std::vector<TreeBase*>* nodesByKind;  // workspace.nodesByKind
    TextBuffer& text;
    SUBPROG* subprog;
    std::ostream& out;
    bool plainNumbers;  // out formats integers as bare decimal digits
    bool sound;
};

}  // namespace ZOA

#endif
