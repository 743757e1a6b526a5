// Checks a unit or a subprogram for trees the outputs cannot make sense of.
#ifndef ZOA_VERIFY_H
#define ZOA_VERIFY_H

#include <zoa/zoa_file.h>

#include <string>
#include <vector>

namespace ZOA::verify {

enum class Severity { ERROR, WARNING };

// One finding. `node` is the node at fault (a statement, expression, label or
// name); `subprog` the subprogram it was found in (null for file-level names).
struct Diagnostic {
    Severity severity = Severity::ERROR;
    TreeBase* node = nullptr;
    SUBPROG* subprog = nullptr;
    std::string message;
};

// Errors: jump targets that are no live label of the same subprogram, a CJUMP
// relation outside EQ..GE, a MOVE into something that is neither a TEMP nor a
// MEM, a null child (SEQ sides may be null), a temporary of another subprogram,
// a JUMP whose kind contradicts its fields, a CALL with neither name nor
// pointer, data names lacking the text or values their kind needs.
// Warnings: a temporary no subprogram handed out (a free-standing BUF_TEMP);
// in assembly mode, what the assembly output cannot translate: BINOP operators
// other than PLUS, MINUS, MUL and the six relations, UNOP operators other than
// CONV4, and FLOAT or DOUBLE values; a subprogram, called function or
// function/data name text that is not a C identifier or is a C keyword (the
// sound C output refuses it).
// A node shared by several parents is checked and reported once, so a tree
// that contains itself (made through copy assignment) is walked once too. The walk
// keeps its own stack, so any depth of tree is fine.
std::vector<Diagnostic> verify(ZOA_file& unit);
// One subprogram; `unit` (may be null) tells whose temporary a foreign one is.
std::vector<Diagnostic> verify(SUBPROG& subprog, bool asmMode, ZOA_file* unit = nullptr);

// "error: message" or "warning: message".
std::string format(const Diagnostic& d);

}  // namespace ZOA::verify

#endif
