// CallSignatures: the C library table and the decision from all calls of a unit.
#include "emit/call_signatures.h"

#include "core/children.h"
#include "core/type_facts.h"

#include <zoa/expr.h>
#include <zoa/zoa_file.h>

#include <algorithm>

namespace ZOA {

namespace {

const LibraryType L_VOID{"void ", VOID};
const LibraryType L_INT{"int ", INT_S};
const LibraryType L_SIZE{"unsigned int ", INT_U};
const LibraryType L_DOUBLE{"double ", DOUBLE};
const LibraryType L_PTR{"void *", POINTER};
const LibraryType L_CPTR{"const void *", POINTER};
const LibraryType L_STR{"char *", POINTER};
const LibraryType L_CSTR{"const char *", POINTER};

// Sorted by name for the binary search.
const LibraryFunction LIBRARY[] = {
    {"abort", L_VOID, {}, false},
    {"abs", L_INT, {L_INT}, false},
    {"alloca", L_PTR, {L_SIZE}, false},
    {"atoi", L_INT, {L_CSTR}, false},
    {"calloc", L_PTR, {L_SIZE, L_SIZE}, false},
    {"ceil", L_DOUBLE, {L_DOUBLE}, false},
    {"cos", L_DOUBLE, {L_DOUBLE}, false},
    {"exit", L_VOID, {L_INT}, false},
    {"exp", L_DOUBLE, {L_DOUBLE}, false},
    {"fabs", L_DOUBLE, {L_DOUBLE}, false},
    {"floor", L_DOUBLE, {L_DOUBLE}, false},
    {"fmod", L_DOUBLE, {L_DOUBLE, L_DOUBLE}, false},
    {"free", L_VOID, {L_PTR}, false},
    {"log", L_DOUBLE, {L_DOUBLE}, false},
    {"malloc", L_PTR, {L_SIZE}, false},
    {"memcmp", L_INT, {L_CPTR, L_CPTR, L_SIZE}, false},
    {"memcpy", L_PTR, {L_PTR, L_CPTR, L_SIZE}, false},
    {"memmove", L_PTR, {L_PTR, L_CPTR, L_SIZE}, false},
    {"memset", L_PTR, {L_PTR, L_INT, L_SIZE}, false},
    {"pow", L_DOUBLE, {L_DOUBLE, L_DOUBLE}, false},
    {"printf", L_INT, {L_CSTR}, true},
    {"putchar", L_INT, {L_INT}, false},
    {"puts", L_INT, {L_CSTR}, false},
    {"realloc", L_PTR, {L_PTR, L_SIZE}, false},
    {"sin", L_DOUBLE, {L_DOUBLE}, false},
    {"sprintf", L_INT, {L_STR, L_CSTR}, true},
    {"sqrt", L_DOUBLE, {L_DOUBLE}, false},
    {"strcat", L_STR, {L_STR, L_CSTR}, false},
    {"strchr", L_STR, {L_CSTR, L_INT}, false},
    {"strcmp", L_INT, {L_CSTR, L_CSTR}, false},
    {"strcpy", L_STR, {L_STR, L_CSTR}, false},
    {"strlen", L_SIZE, {L_CSTR}, false},
    {"strncmp", L_INT, {L_CSTR, L_CSTR, L_SIZE}, false},
    {"strncpy", L_STR, {L_STR, L_CSTR, L_SIZE}, false},
};

CallSignature librarySignature(const LibraryFunction* f) {
    CallSignature s;
    s.library = f;
    s.returnType = f->result.type;
    s.variadic = f->variadic;
    for (const LibraryType& p : f->params) s.params.push_back(p.type);
    return s;
}

}  // namespace

const LibraryFunction* CallSignatures::libraryFunction(std::string_view name) {
    auto it = std::lower_bound(std::begin(LIBRARY), std::end(LIBRARY), name,
                               [](const LibraryFunction& f, std::string_view n) { return f.name < n; });
    return it != std::end(LIBRARY) && it->name == name ? it : nullptr;
}

const CallSignature* CallSignatures::find(std::string_view name) const {
    auto it = signatures.find(name);
    return it == signatures.end() ? nullptr : &it->second;
}

bool CallSignatures::fits(const CallSignature& sig, CALL* c) {
    std::size_t n = c->getArgs().size();
    if (n < sig.params.size() || (!sig.variadic && n != sig.params.size())) return false;
    return sig.library || sig.defined || c->getDataType() == sig.returnType;
}

bool CallSignatures::needsResultCast(const CallSignature& sig, CALL* c) {
    if ((!sig.library && !sig.defined) || c->getDataType() == VOID || sig.returnType == VOID) return false;
    return sig.returnType != c->getDataType() || (sig.library && c->getDataType() == POINTER);
}

void CallSignatures::add(CALL* c) {
    if (c->getFunctionPointer()) return;
    const String& name = c->getFunctionName();
    std::string_view key(name.data(), name.size());
    auto it = signatures.find(key);
    if (it == signatures.end()) {
        CallSignature s;
        if (const LibraryFunction* f = libraryFunction(key)) {
            s = librarySignature(f);
        } else {
            s.returnType = c->getDataType();
            for (ExprBase* a : c->getArgs()) s.params.push_back(a ? a->getDataType() : VOID);
        }
        it = signatures.emplace(std::string(key), std::move(s)).first;
    } else if (!it->second.library && !it->second.defined) {
        // Keep the leading parameters every call agrees on.
        CallSignature& s = it->second;
        std::size_t n = 0;
        for (ExprBase* a : c->getArgs()) {
            if (n == s.params.size() || (a ? a->getDataType() : VOID) != s.params[n]) break;
            ++n;
        }
        if (n != s.params.size() || n != c->getArgs().size()) {
            s.params.resize(n);
            s.variadic = true;
        }
    }
    if (!fits(it->second, c)) misfitCalls.push_back(c);
}

// Calls are met in walk order (a node's children in forEachChild's order),
// each once however often it is shared; a shared subtree is walked again
// for each reference, as the outputs print it, and the walk stops at
// MAX_WALK_DEPTH levels, as theirs do.
void CallSignatures::walk(TreeBase* n) {
    NodeType t = n->getNodeType();
    switch (t) {
    case TEMP_NODE:
    case BUF_TEMP_NODE: return;
    case CONST_NODE: {
        CONST* c = static_cast<CONST*>(n);
        if (c->getDataType() == POINTER && c->getPValue() && met.insert(c)) textPointers.push_back(c);
        return;
    }
    default: break;
    }
    NestingLevel level(nesting);
    if (!level.entered()) return;
    if (t == CALL_NODE && met.insert(static_cast<CALL*>(n))) add(static_cast<CALL*>(n));
    forEachChild(n, t, [this](TreeBase* k) { walk(k); });
}

void CallSignatures::decide(ZOA_file& unit) {
    signatures.clear();
    misfitCalls.clear();
    textPointers.clear();
    met.clear();
    for (SUBPROG* sp : unit.getSubprogs()) {
        if (!sp) continue;
        CallSignature s;
        s.defined = true;
        s.returnType = sp->getReturnType();
        for (TEMP* t : sp->getAllArgTemps()) s.params.push_back(t ? t->getDataType() : VOID);
        signatures.emplace(std::string(sp->getName().data(), sp->getName().size()), std::move(s));
    }
    // Each statement is a walk of its own, so a cut ends only the statement
    // that holds a cycle.
    for (SUBPROG* sp : unit.getSubprogs())
        if (sp)
            for (const auto& entry : sp->getAllLabels())
                if (entry.second) forEachChild(entry.second, LABEL_NODE, [this](TreeBase* st) { walk(st); });
    for (auto& entry : unit.getCallPrototypes())
        if (entry.second && !met.contains(entry.second)) add(entry.second);
    for (auto& entry : unit.getNamePrototypes()) {
        const LibraryFunction* f = libraryFunction(entry.first);
        if (f && !find(entry.first)) signatures.emplace(entry.first, librarySignature(f));
    }
}

}  // namespace ZOA
