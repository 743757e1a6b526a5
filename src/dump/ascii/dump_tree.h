// DumpTree: writes a node, and in a recursive dump everything it points at, as an indented text dump.
#ifndef ZOA_DUMP_ASCII_DUMP_TREE_H
#define ZOA_DUMP_ASCII_DUMP_TREE_H

#include <zoa/nesting.h>
#include <zoa/subprog.h>
#include <zoa/tree_base.h>
#include <zoa/visitor.h>

#include <initializer_list>
#include <ostream>
#include <string>
#include <typeinfo>
#include <utility>
#include <vector>

namespace ZOA {

// The constructor writes the whole dump. Each node is a block: a header (kind
// and address, data type, annotation), one line per field, an empty line; in a
// recursive dump the nodes a block points at follow four blanks deeper. Lines
// end with std::endl. Numbers use the stream's own operators and flags.
//
// Choices for trees the dump has to survive:
//  - Cycles: a DIRECT_LABEL JUMP leads to its target label, whose first
//    statement may lead back. The labels whose statements are being dumped on
//    the current path are kept on a stack; a label reached again while it is on
//    that stack gets its ordinary block (header, Id, StartStmt, Kind, empty
//    line) but nothing beneath it. Its StartStmt identity points at the block
//    already written above, so the dump terminates and stays readable.
//  - Other cycles, made with the copy assignments (a BINOP that is its own
//    operand, a SEQ that contains itself): a node met again below itself with
//    no label in between gets its ordinary block and nothing beneath it.
//  - Nesting deeper than MAX_WALK_DEPTH: where the bound is reached, a line
//    with CUT_NOTE and an empty line come in place of the block, and the rest
//    of the dump below the root's child that holds it is left out.
//  - Null children (expr, left, right, dst, src, target, list elements): the
//    identity line shows the null pointer as the stream writes it ("(0)" with
//    GCC's library) and no block is written for it.
//  - A POINTER constant holding a null pointer: "Value: (char *)0", as the C
//    output writes it; the pointer is never read through.
//  - A CALL with neither name nor function pointer: the "Function Pointer: "
//    line followed directly by the extra empty line (no pointer block), then
//    "Args: " as usual.
//  - Annotation class names come from run-time type information, demangled
//    once per annotation type per dump.
//  - A root whose kind is one of the base kinds, or unknown, writes nothing.
class DumpTree : public VisitorBase {
public:
    DumpTree(TreeBase* node, std::ostream& out, bool recursive);
    ~DumpTree() override;

#define ZOA_NODE_KIND(kind, Class) void visit(Class*) override;
#include "core/node_kinds.def"
    void reservedHook1(void*) override {}
    void reservedHook2(void*) override {}
    void reservedHook3(void*) override {}

private:
    std::ostream& writeIndent();
    static const char* dataTypeText(TreeBase* node);
    void writeNodeHeader(TreeBase* node);
    // An identity line: label (ending in "("), the address, ")".
    void writeRef(const char* label, const void* node);
    template <class List> void writeList(const char* label, const List& nodes);
    void writeTempFields(TEMP* t);
    void endBlock();
    // Dumps a child one level deeper; a null child is skipped.
    void descend(TreeBase* child);
    // When recursive: the given children's blocks, one level deeper (nulls skipped).
    void children(std::initializer_list<TreeBase*> nodes);
    const std::string& annotationClassName(const TreeAnnotation* a);

    int level;
    TreeBase* root;
    std::ostream& out;
    bool recursive;
    NestingGuard nesting;
    // The nodes on the current path, a null entry for each label.
    std::vector<TreeBase*> path;
    // Labels whose first statement is being dumped on the current path.
    std::vector<LABEL*> labelPath;
    // Demangled "class ..." names, one per annotation type met.
    std::vector<std::pair<const std::type_info*, std::string>> classNames;
};

}  // namespace ZOA

#endif
