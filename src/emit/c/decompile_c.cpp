// DecompileC (placeholder: writes nothing yet).
#include "emit/c/decompile_c.h"

namespace ZOA {

DecompileC::DecompileC(std::ostream& os, bool isGcc) : DecompileBase(os, isGcc) {}
DecompileC::~DecompileC() {}

void DecompileC::visit(UNOP*) {}
void DecompileC::visit(TEMP*) {}
void DecompileC::visit(SUBPROG*) {}
void DecompileC::visit(SEQ*) {}
void DecompileC::visit(NAME*) {}
void DecompileC::visit(MOVE*) {}
void DecompileC::visit(MEM*) {}
void DecompileC::visit(LABEL*) {}
void DecompileC::visit(JUMP*) {}
void DecompileC::visit(EXP*) {}
void DecompileC::visit(CONST*) {}
void DecompileC::visit(CJUMP*) {}
void DecompileC::visit(CALL*) {}
void DecompileC::visit(BUF_TEMP*) {}
void DecompileC::visit(BINOP*) {}

void DecompileC::defineName(NAME*) {}
void DecompileC::declareNamePrototype(NAME*) {}
void DecompileC::declareSubprogPrototype(SUBPROG*) {}
void DecompileC::declareCallPrototype(CALL*) {}

}  // namespace ZOA
