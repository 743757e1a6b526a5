// ZOA_file: one translation unit, its subprograms, file-level names and prototypes.
#ifndef ZOA_ZOA_FILE_H
#define ZOA_ZOA_FILE_H

#include <zoa/enums.h>
#include <zoa/export.h>
#include <zoa/expr.h>
#include <zoa/subprog.h>

#include <iosfwd>
#include <list>
#include <map>
#include <string>

namespace ZOA {

// Constructing a ZOA_file rewinds the arena: every node of an earlier unit is
// given up. Build, output and abandon one unit at a time, on one thread.
//
// Output operations write onto the caller's stream and always return true:
//  - decompile: C source (GCC flavour when isGcc, MSVC otherwise) or, in
//    assembly mode, 32-bit x86 assembly for the GNU assembler (Intel syntax).
//    Afterwards the unit forgets its subprograms, file-level names and call
//    prototypes; a second decompile writes only the remaining prototypes.
//    In assembly a NAME is .La<id>, its text or ng<id>/nl<id>: an address, but static/extern data a dword value.
//  - dumpDot: one Graphviz digraph per subprogram; node statistics go to the
//    process's standard output.
//  - dumpAscii: an indented text dump of every subprogram.
class ZOA_API ZOA_file {
public:
    ZOA_file(bool isGcc, bool asmMode);
    ~ZOA_file();
    ZOA_file(const ZOA_file&) = delete;
    ZOA_file& operator=(const ZOA_file&) = delete;

    bool IsGcc() const { return isGcc; }
    bool IsAsmMode() const { return asmMode; }
    unsigned int getMemoryUsage();

    // A new subprogram, appended to the unit; with addPrototype it is also
    // entered in the subprogram prototypes under its name.
    SUBPROG* createSubprog(DataType returnType, const char* name, bool addPrototype);

    // Deduplicated file-level names, numbered from 0 in creation order. A new
    // SUBPROG_REF name whose function has no subprogram here gets a prototype.
    NAME* getName(NameKind k, const char* text);
    NAME* getName(CONST* c);
    NAME* getName(const std::list<ExprBase*>& values);
    NAME* getName(LABEL* l);  // a new LABEL_REF name on every call, not recorded

    // Records a prototype for the called function when no subprogram of the
    // unit has its name (decided now); a later call of the same name replaces it.
    void addFunctionPrototype(CALL* call);

    bool decompile(std::ostream& os);
    bool dumpDot(std::ostream& os);
    bool dumpAscii(std::ostream& os);

    const std::list<SUBPROG*>& getSubprogs() const { return subprogs; }
    const std::list<NAME*>& getNames() const { return names; }
    const std::map<std::string, CALL*>& getCallPrototypes() const { return callPrototypes; }
    const std::map<std::string, SUBPROG*>& getSubprogPrototypes() const { return subprogPrototypes; }
    const std::map<std::string, NAME*>& getNamePrototypes() const { return namePrototypes; }

private:
    bool needsPrototype(const std::string& name) const;
    void addFunctionPrototype(SUBPROG* sp);
    void addFunctionPrototype(NAME* n);

    bool isGcc;
    bool asmMode;
    std::list<SUBPROG*> subprogs;
    std::list<NAME*> names;
    std::map<std::string, CALL*> callPrototypes;
    std::map<std::string, SUBPROG*> subprogPrototypes;
    std::map<std::string, NAME*> namePrototypes;
};

}  // namespace ZOA

#endif
