// The visitor interface that every consumer of the tree implements.
#ifndef ZOA_VISITOR_H
#define ZOA_VISITOR_H

#include <zoa/export.h>

namespace ZOA {

class UNOP;
class TEMP;
class SUBPROG;
class SEQ;
class NAME;
class MOVE;
class MEM;
class LABEL;
class JUMP;
class EXP;
class CONST;
class CJUMP;
class CALL;
class BUF_TEMP;
class BINOP;

// One visit operation per concrete node class; a node's accept() calls the one
// for its own class (a BUF_TEMP reaches visit(BUF_TEMP*), never visit(TEMP*)).
// The slot order below is part of the interface. The three hooks are reserved:
// nothing calls them. Visitors are ordinary objects, not arena memory.
class ZOA_API VisitorBase {
protected:
    VisitorBase() = default;
    VisitorBase(const VisitorBase&) = default;
    VisitorBase& operator=(const VisitorBase&) = default;
    virtual ~VisitorBase();

public:
    virtual void visit(UNOP*) = 0;
    virtual void visit(TEMP*) = 0;
    virtual void visit(SUBPROG*) = 0;
    virtual void visit(SEQ*) = 0;
    virtual void visit(NAME*) = 0;
    virtual void visit(MOVE*) = 0;
    virtual void visit(MEM*) = 0;
    virtual void visit(LABEL*) = 0;
    virtual void visit(JUMP*) = 0;
    virtual void visit(EXP*) = 0;
    virtual void visit(CONST*) = 0;
    virtual void visit(CJUMP*) = 0;
    virtual void visit(CALL*) = 0;
    virtual void visit(BUF_TEMP*) = 0;
    virtual void visit(BINOP*) = 0;
    virtual void reservedHook1(void*) = 0;
    virtual void reservedHook2(void*) = 0;
    virtual void reservedHook3(void*) = 0;
};

}  // namespace ZOA

#endif
