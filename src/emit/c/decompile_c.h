// DecompileC: writes a unit as C source, GCC and MSVC flavours.
#ifndef ZOA_EMIT_C_DECOMPILE_C_H
#define ZOA_EMIT_C_DECOMPILE_C_H

#include "emit/decompile_base.h"

namespace ZOA {

class DecompileC : public DecompileBase {
public:
    DecompileC(std::ostream& os, bool isGcc);
    ~DecompileC() override;

    void visit(UNOP*) override;
    void visit(TEMP*) override;
    void visit(SUBPROG*) override;
    void visit(SEQ*) override;
    void visit(NAME*) override;
    void visit(MOVE*) override;
    void visit(MEM*) override;
    void visit(LABEL*) override;
    void visit(JUMP*) override;
    void visit(EXP*) override;
    void visit(CONST*) override;
    void visit(CJUMP*) override;
    void visit(CALL*) override;
    void visit(BUF_TEMP*) override;
    void visit(BINOP*) override;

    void defineName(NAME* n) override;
    void declareNamePrototype(NAME* n) override;
    void declareSubprogPrototype(SUBPROG* sp) override;
    void declareCallPrototype(CALL* c) override;
};

}  // namespace ZOA

#endif
