// DecompileASM: writes a unit as 32-bit x86 assembly for the GNU assembler, Intel syntax.
#ifndef ZOA_EMIT_X86_DECOMPILE_ASM_H
#define ZOA_EMIT_X86_DECOMPILE_ASM_H

#include "emit/decompile_base.h"

namespace ZOA {

class DecompileASM : public DecompileBase {
public:
    DecompileASM(std::ostream& os, bool isGcc);
    ~DecompileASM() override;

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
