// DecompileASM (placeholder: writes nothing yet).
#include "emit/x86/decompile_asm.h"

namespace ZOA {

DecompileASM::DecompileASM(std::ostream& os, bool isGcc) : DecompileBase(os, isGcc) {}
DecompileASM::~DecompileASM() {}

void DecompileASM::visit(UNOP*) {}
void DecompileASM::visit(TEMP*) {}
void DecompileASM::visit(SUBPROG*) {}
void DecompileASM::visit(SEQ*) {}
void DecompileASM::visit(NAME*) {}
void DecompileASM::visit(MOVE*) {}
void DecompileASM::visit(MEM*) {}
void DecompileASM::visit(LABEL*) {}
void DecompileASM::visit(JUMP*) {}
void DecompileASM::visit(EXP*) {}
void DecompileASM::visit(CONST*) {}
void DecompileASM::visit(CJUMP*) {}
void DecompileASM::visit(CALL*) {}
void DecompileASM::visit(BUF_TEMP*) {}
void DecompileASM::visit(BINOP*) {}

void DecompileASM::defineName(NAME*) {}
void DecompileASM::declareNamePrototype(NAME*) {}
void DecompileASM::declareSubprogPrototype(SUBPROG*) {}
void DecompileASM::declareCallPrototype(CALL*) {}

}  // namespace ZOA
