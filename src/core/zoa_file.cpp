// ZOA_file: construction, subprograms, file-level names and prototypes.
#include <zoa/zoa_file.h>

#include <iostream>

namespace ZOA {

ZOA_file::ZOA_file(bool isGcc, bool asmMode) : ZOA_file(isGcc, asmMode, Profile::EXACT) {}

ZOA_file::ZOA_file(bool isGcc, bool asmMode, Profile profile) : isGcc(isGcc), asmMode(asmMode), profile(profile) {
    MemMgr::rewind();
    arenaGeneration = MemMgr::getGeneration();
}

bool ZOA_file::checkCurrent() const {
    if (isCurrent()) return true;
    getDiagnosticStream() << "ZOA_file: a later ZOA_file rewound the arena under this unit; its nodes are gone, "
                             "nothing written\n";
    return false;
}

std::ostream& ZOA_file::getDiagnosticStream() const {
    if (diagnostics) return *diagnostics;
    return profile == Profile::EXACT ? std::cout : std::cerr;
}

ZOA_file::~ZOA_file() {}

unsigned int ZOA_file::getMemoryUsage() { return MemMgr::getMemoryUsage(); }

SUBPROG* ZOA_file::createSubprog(DataType returnType, const char* name, bool addPrototype) {
    SUBPROG* sp = new SUBPROG(returnType, name);
    subprogs.push_back(sp);
    if (addPrototype) addFunctionPrototype(sp);
    return sp;
}

bool ZOA_file::needsPrototype(const std::string& name) const {
    for (SUBPROG* sp : subprogs) {
        const String& n = sp->getName();
        if (n.size() == name.size() && n.compare(0, n.size(), name.data(), name.size()) == 0) return false;
    }
    return true;
}

void ZOA_file::addFunctionPrototype(CALL* call) {
    if (!call) return;
    std::string name(call->getFunctionName().data(), call->getFunctionName().size());
    if (needsPrototype(name)) callPrototypes[name] = call;
}

void ZOA_file::addFunctionPrototype(SUBPROG* sp) {
    subprogPrototypes[std::string(sp->getName().data(), sp->getName().size())] = sp;
}

void ZOA_file::addFunctionPrototype(NAME* n) {
    std::string text(n->getStringValue().data(), n->getStringValue().size());
    if (needsPrototype(text)) namePrototypes[text] = n;
}

NAME* ZOA_file::getName(NameKind k, const char* text) {
    if (NAME* n = SUBPROG::getMatchingName(k, text, names)) return n;
    NAME* n = new NAME(static_cast<unsigned int>(names.size()), k, text);
    names.push_back(n);
    if (k == SUBPROG_REF) addFunctionPrototype(n);
    return n;
}

NAME* ZOA_file::getName(CONST* c) {
    if (NAME* n = SUBPROG::getMatchingName(c, names)) return n;
    NAME* n = new NAME(static_cast<unsigned int>(names.size()), c);
    names.push_back(n);
    return n;
}

NAME* ZOA_file::getName(const std::list<ExprBase*>& values) {
    if (NAME* n = SUBPROG::getMatchingName(values, names)) return n;
    NAME* n = new NAME(static_cast<unsigned int>(names.size()), values);
    names.push_back(n);
    return n;
}

NAME* ZOA_file::getName(LABEL* l) { return new NAME(l); }

NAME* ZOA_file::createData(const std::list<ExprBase*>& values) {
    NAME* n = new NAME(static_cast<unsigned int>(names.size()), values);
    n->kind = DATA_ARRAY_REF;
    n->privateData = true;
    names.push_back(n);
    return n;
}

NAME* ZOA_file::createData(CONST* c) {
    NAME* n = new NAME(static_cast<unsigned int>(names.size()), c ? c : new CONST(0));
    n->privateData = true;
    names.push_back(n);
    return n;
}

NAME* ZOA_file::createZeroData(unsigned int bytes) {
    NAME* n = createData(std::list<ExprBase*>{});
    n->zeroBytes = bytes;
    return n;
}

}  // namespace ZOA
