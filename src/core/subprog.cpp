// SUBPROG: numbering, the temp pool, labels and deduplicated local names.
#include <zoa/subprog.h>
#include <zoa/visitor.h>

#include "core/type_facts.h"

#include <cstring>

namespace ZOA {

SUBPROG::SUBPROG(DataType returnType, const char* name) : name(name ? name : ""), returnType(returnType) {
    startLabel = createNewLabel(PROLOGUE_LABEL);
    startLabel->setComment("prologue");
    returnLabel = createNewLabel(EPILOGUE_LABEL);
    returnLabel->setComment("epilogue");
    if (returnType != VOID) {
        returnTemp = new TEMP(createTempId(), returnType, RETURN_TEMP);
        returnTemp->setComment("return temp");
        allTemps.push_back(returnTemp);
    }
}

SUBPROG::~SUBPROG() {}

void SUBPROG::accept(VisitorBase* v) { v->visit(this); }

TEMP* SUBPROG::getTemp(DataType t, unsigned int size, TempState state) {
    for (TEMP* tmp : allTemps) {
        if (tmp->getState() != AVAILABLE_TEMP || tmp->getDataType() != t) continue;
        bool isBuf = tmp->getNodeType() == BUF_TEMP_NODE;
        if (size != 0 ? (isBuf && static_cast<BUF_TEMP*>(tmp)->getArraySize() == size) : !isBuf) {
            tmp->setState(IN_USE_TEMP);
            return tmp;
        }
    }
    TEMP* tmp = size != 0 ? static_cast<TEMP*>(new BUF_TEMP(createTempId(), size))
                          : new TEMP(createTempId(), t);
    tmp->setState(state);
    allTemps.push_back(tmp);
    return tmp;
}

TEMP* SUBPROG::getArgTemp(DataType t) {
    TEMP* tmp = new TEMP(createTempId(), t, ARGUMENT_TEMP);
    allTemps.push_back(tmp);
    argTemps.push_back(tmp);
    return tmp;
}

void SUBPROG::freeTemp(TEMP* t) {
    if (t && t->getState() == IN_USE_TEMP) t->setState(AVAILABLE_TEMP);
}

void SUBPROG::freeAllTemps() {
    for (TEMP* t : allTemps) freeTemp(t);
}

LABEL* SUBPROG::createNewLabel(LabelKind k) {
    LABEL* l = new LABEL(createLabelId(), k);
    labels[l->getId()] = l;
    return l;
}

void SUBPROG::addLabel(LABEL* l) {
    if (l) labels[l->getId()] = l;
}

void SUBPROG::freeDeadLabel(LABEL* l) {
    if (!l) return;
    auto it = labels.find(l->getId());
    if (it == labels.end()) return;
    labels.erase(it);
    if (l == returnLabel) returnLabel = nullptr;
    l->freeNode();
}

void SUBPROG::replaceReturnLabel(LABEL* l) {
    if (returnLabel) returnLabel->freeNode();
    returnLabel = l;
}

NAME* SUBPROG::getName(NameKind k, const char* text) {
    if (NAME* n = getMatchingName(k, text, localNames)) return n;
    NAME* n = new NAME(createNameId(), k, text);
    n->setDeclaredLocal();
    localNames.push_back(n);
    return n;
}

NAME* SUBPROG::getName(CONST* c) {
    if (NAME* n = getMatchingName(c, localNames)) return n;
    NAME* n = new NAME(createNameId(), c);
    n->setDeclaredLocal();
    localNames.push_back(n);
    return n;
}

NAME* SUBPROG::getName(const std::list<ExprBase*>& values) {
    if (NAME* n = getMatchingName(values, localNames)) return n;
    NAME* n = new NAME(createNameId(), values);
    n->setDeclaredLocal();
    localNames.push_back(n);
    return n;
}

NAME* SUBPROG::getName(LABEL* l) { return new NAME(l); }

// Matching, shared by the local (arena) and file-level (standard) name lists.
namespace {

bool sameText(const NAME* n, const char* text) {
    const char* t = text ? text : "";
    const String& s = n->getStringValue();
    return s.size() == std::strlen(t) && std::memcmp(s.data(), t, s.size()) == 0;
}

const CONST* asConst(const ExprBase* e) {
    return e && const_cast<ExprBase*>(e)->getNodeType() == CONST_NODE ? static_cast<const CONST*>(e) : nullptr;
}

// Equal type and value: integers on all 64 bits, floats by ==, pointers by identity.
bool sameValue(const ExprBase* a, const ExprBase* b) {
    if (!a || !b || a->getDataType() != b->getDataType()) return false;
    DataType t = a->getDataType();
    if (t == POINTER) return a == b;
    const CONST* ca = asConst(a);
    const CONST* cb = asConst(b);
    if (!ca || !cb) return false;
    if (isIntegerType(t)) return ca->getIValue() == cb->getIValue();
    if (isFloatingType(t)) return ca->getFValue() == cb->getFValue();
    return false;
}

template <class List> NAME* matchText(const char* text, const List& names) {
    for (NAME* n : names) {
        NameKind k = n->getKind();
        if ((k == STRINGLIT_REF || k == SUBPROG_REF || k == STATIC_DATA_REF || k == EXTERN_DATA_REF) &&
            sameText(n, text))
            return n;
    }
    return nullptr;
}

template <class List> NAME* matchKindText(NameKind k, const char* text, const List& names) {
    for (NAME* n : names)
        if (n->getKind() == k && sameText(n, text)) return n;
    return nullptr;
}

template <class List> NAME* matchConst(CONST* c, const List& names) {
    if (!c) return nullptr;
    DataType t = c->getDataType();
    if (!isIntegerType(t) && !isFloatingType(t)) return nullptr;
    for (NAME* n : names) {
        const ExprList& l = n->getList();
        if (l.size() == 1 && asConst(l.front()) && n->getDataType() == t && sameValue(l.front(), c)) return n;
    }
    return nullptr;
}

template <class List> NAME* matchValues(const std::list<ExprBase*>& values, const List& names) {
    for (NAME* n : names) {
        const ExprList& l = n->getList();
        if (l.size() != values.size()) continue;
        bool same = true;
        auto v = values.begin();
        for (auto e = l.begin(); same && e != l.end(); ++e, ++v) same = sameValue(*e, *v);
        if (same) return n;
    }
    return nullptr;
}

}  // namespace

NAME* SUBPROG::getMatchingName(const char* text, const NameList& names) { return matchText(text, names); }
NAME* SUBPROG::getMatchingName(NameKind k, const char* text, const NameList& names) {
    return matchKindText(k, text, names);
}
NAME* SUBPROG::getMatchingName(CONST* c, const NameList& names) { return matchConst(c, names); }
NAME* SUBPROG::getMatchingName(const std::list<ExprBase*>& values, const NameList& names) {
    return matchValues(values, names);
}
NAME* SUBPROG::getMatchingName(const char* text, const std::list<NAME*>& names) { return matchText(text, names); }
NAME* SUBPROG::getMatchingName(NameKind k, const char* text, const std::list<NAME*>& names) {
    return matchKindText(k, text, names);
}
NAME* SUBPROG::getMatchingName(CONST* c, const std::list<NAME*>& names) { return matchConst(c, names); }
NAME* SUBPROG::getMatchingName(const std::list<ExprBase*>& values, const std::list<NAME*>& names) {
    return matchValues(values, names);
}

}  // namespace ZOA
