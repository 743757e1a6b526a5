// DumpTree: the indented text dump of a node and, when recursive, of what it points at.
#include "dump/ascii/dump_tree.h"

#include <zoa/expr.h>
#include <zoa/stmt.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <cxxabi.h>

namespace ZOA {

DumpTree::DumpTree(TreeBase* node, std::ostream& out, bool recursive)
    : level(0), root(node), out(out), recursive(recursive) {
    if (!root) return;
    path.push_back(root->getNodeType() == LABEL_NODE ? nullptr : root);
    switch (root->getNodeType()) {
    case BINOP_NODE: visit(static_cast<BINOP*>(root)); break;
    case BUF_TEMP_NODE: visit(static_cast<BUF_TEMP*>(root)); break;
    case CALL_NODE: visit(static_cast<CALL*>(root)); break;
    case CONST_NODE: visit(static_cast<CONST*>(root)); break;
    case MEM_NODE: visit(static_cast<MEM*>(root)); break;
    case NAME_NODE: visit(static_cast<NAME*>(root)); break;
    case TEMP_NODE: visit(static_cast<TEMP*>(root)); break;
    case UNOP_NODE: visit(static_cast<UNOP*>(root)); break;
    case CJUMP_NODE: visit(static_cast<CJUMP*>(root)); break;
    case EXP_NODE: visit(static_cast<EXP*>(root)); break;
    case JUMP_NODE: visit(static_cast<JUMP*>(root)); break;
    case LABEL_NODE: visit(static_cast<LABEL*>(root)); break;
    case MOVE_NODE: visit(static_cast<MOVE*>(root)); break;
    case SEQ_NODE: visit(static_cast<SEQ*>(root)); break;
    case SUBPROG_NODE: visit(static_cast<SUBPROG*>(root)); break;
    case TREE_BASE_NODE:
    case EXPR_BASE_NODE:
    case STMT_BASE_NODE:
        break;  // no block for the abstract bases
    }
}

DumpTree::~DumpTree() = default;

std::ostream& DumpTree::writeIndent() {
    for (int i = 0; i < level; ++i) out.write("    ", 4);
    return out;
}

const char* DumpTree::dataTypeText(TreeBase* node) {
    switch (node->getNodeType()) {
    case BINOP_NODE:
    case BUF_TEMP_NODE:
    case CALL_NODE:
    case CONST_NODE:
    case MEM_NODE:
    case NAME_NODE:
    case TEMP_NODE:
    case UNOP_NODE:
        return toString(static_cast<ExprBase*>(node)->getDataType());
    case SUBPROG_NODE:
        return toString(static_cast<SUBPROG*>(node)->getReturnType());
    case TREE_BASE_NODE:
    case EXPR_BASE_NODE:
    case STMT_BASE_NODE:
    case CJUMP_NODE:
    case EXP_NODE:
    case JUMP_NODE:
    case LABEL_NODE:
    case MOVE_NODE:
    case SEQ_NODE:
        break;
    }
    return nullptr;
}

const std::string& DumpTree::annotationClassName(const TreeAnnotation* a) {
    const std::type_info& type = typeid(*a);
    for (const auto& entry : classNames)
        if (*entry.first == type) return entry.second;
    std::string name = "class ";
    int status = 0;
    char* demangled = abi::__cxa_demangle(type.name(), nullptr, nullptr, &status);
    if (status == 0 && demangled)
        name += demangled;
    else
        name += type.name();  // not a mangled name: show it as it is
    std::free(demangled);
    classNames.emplace_back(&type, std::move(name));
    return classNames.back().second;
}

void DumpTree::writeNodeHeader(TreeBase* node) {
    writeIndent() << toString(node->getNodeType()) << '(' << static_cast<const void*>(node) << ')' << std::endl;
    if (const char* type = dataTypeText(node)) writeIndent() << "DataType: " << type << std::endl;
    writeIndent() << "Annotation: ";
    if (const TreeAnnotation* a = node->getAnnotation()) {
        const std::string& name = annotationClassName(a);
        out.write(name.data(), static_cast<std::streamsize>(name.size()));
        out << '(' << static_cast<const void*>(a) << ')' << std::endl;
    } else {
        out << "(0)" << std::endl;
    }
}

void DumpTree::writeRef(const char* label, const void* node) {
    writeIndent() << label << node << ')' << std::endl;
}

template <class List> void DumpTree::writeList(const char* label, const List& nodes) {
    writeIndent() << label;
    const char* sep = "(";
    for (const auto* node : nodes) {
        out << sep << static_cast<const void*>(node) << ')';
        sep = ", (";
    }
    out << std::endl;
}

void DumpTree::endBlock() { out << std::endl; }

void DumpTree::children(std::initializer_list<TreeBase*> nodes) {
    if (!recursive) return;
    ++level;
    for (TreeBase* child : nodes) descend(child);
    --level;
}

void DumpTree::descend(TreeBase* child) {
    if (!child) return;
    NestingLevel nest(nesting);
    if (!nest.entered()) {
        if (nest.cutHere()) {
            writeIndent() << CUT_NOTE << std::endl;
            endBlock();
        }
        return;
    }
    bool isLabel = child->getNodeType() == LABEL_NODE;
    // Below its own copy since the last label: a cycle of the copy
    // assignments (cycles through jumps end at labels, see visit(LABEL)).
    bool again = false;
    if (!isLabel)
        for (auto it = path.rbegin(); it != path.rend() && *it; ++it)
            if (*it == child) again = true;
    path.push_back(isLabel ? nullptr : child);
    bool wasRecursive = recursive;
    if (again) recursive = false;  // its block, nothing beneath
    child->accept(this);
    recursive = wasRecursive;
    path.pop_back();
}

void DumpTree::visit(UNOP* n) {
    writeNodeHeader(n);
    writeIndent() << "Op: " << toString(n->getOp()) << std::endl;
    writeRef("Expr: (", n->getExpr());
    endBlock();
    children({n->getExpr()});
}

void DumpTree::visit(BINOP* n) {
    writeNodeHeader(n);
    writeIndent() << "Op: " << toString(n->getOp()) << std::endl;
    writeRef("Left: (", n->getLeft());
    writeRef("Right: (", n->getRight());
    endBlock();
    children({n->getLeft(), n->getRight()});
}

void DumpTree::visit(CALL* n) {
    writeNodeHeader(n);
    const String& name = n->getFunctionName();
    if (!name.empty()) {
        writeIndent() << "Name: ";
        out.write(name.data(), static_cast<std::streamsize>(name.size())) << std::endl;
    } else {
        // The pointer's block sits inside the call's block, at the same depth,
        // whether or not the dump is recursive.
        writeIndent() << "Function Pointer: " << std::endl;
        descend(n->getFunctionPointer());
        out << std::endl;
    }
    writeList("Args: ", n->getArgs());
    endBlock();
    if (!recursive) return;
    ++level;
    for (ExprBase* arg : n->getArgs()) descend(arg);
    --level;
}

void DumpTree::visit(CONST* n) {
    writeNodeHeader(n);
    writeIndent() << "Value: ";
    long long i = n->getIValue();
    switch (n->getDataType()) {
    case CHAR_U:
    case INT_U:
        out << static_cast<std::uint32_t>(i);
        break;
    case INT64_U:
        out << static_cast<unsigned long long>(i);
        break;
    case CHAR_S:
    case INT_S:
        out << static_cast<std::int32_t>(static_cast<std::uint32_t>(i));
        break;
    case INT64_S:
        out << i;
        break;
    case FLOAT:
        out << static_cast<float>(n->getFValue());
        break;
    case DOUBLE:
        out << n->getFValue();
        break;
    case POINTER:
        if (const void* p = n->getPValue())
            out << static_cast<const char*>(p);
        else
            out << "(char *)0";
        break;
    case VOID:
        break;
    }
    out << std::endl;
    endBlock();
}

void DumpTree::visit(MEM* n) {
    writeNodeHeader(n);
    writeRef("Expr: (", n->getExpr());
    endBlock();
    children({n->getExpr()});
}

void DumpTree::visit(NAME* n) {
    writeNodeHeader(n);
    writeIndent() << "Id: " << n->getId() << std::endl;
    writeRef("LabelRef: (", n->getLabelRef());
    const String& text = n->getStringValue();
    writeIndent() << "StringValue: ";
    out.write(text.data(), static_cast<std::streamsize>(text.size())) << std::endl;
    writeIndent() << "Kind: " << toString(n->getKind()) << std::endl;
    writeList("ExpList: ", n->getList());
    endBlock();
    if (!recursive) return;
    ++level;
    for (ExprBase* e : n->getList()) descend(e);
    --level;
}

void DumpTree::writeTempFields(TEMP* t) {
    writeIndent() << "Id: " << t->getId() << std::endl;
    writeIndent() << "TempKind: " << toString(t->getType()) << std::endl;
    writeIndent() << "TempState: " << toString(t->getState()) << std::endl;
}

void DumpTree::visit(TEMP* n) {
    writeNodeHeader(n);
    writeTempFields(n);
    endBlock();
}

void DumpTree::visit(BUF_TEMP* n) {
    writeNodeHeader(n);
    writeTempFields(n);
    writeIndent() << "ArraySize: " << n->getArraySize() << std::endl;
    endBlock();
}

void DumpTree::visit(CJUMP* n) {
    writeNodeHeader(n);
    writeIndent() << "Op: " << toString(n->getRelOp()) << std::endl;
    writeRef("Left: (", n->getLeft());
    writeRef("Right: (", n->getRight());
    writeRef("IfTrue: (", n->getIfTrue());
    writeRef("IfFalse: (", n->getIfFalse());
    endBlock();
    children({n->getLeft(), n->getRight()});
}

void DumpTree::visit(EXP* n) {
    writeNodeHeader(n);
    writeRef("Expr: (", n->getExpr());
    endBlock();
    children({n->getExpr()});
}

void DumpTree::visit(JUMP* n) {
    writeNodeHeader(n);
    writeRef("Expr: (", n->getExpr());
    writeRef("Target: (", n->getTarget());
    writeIndent() << "Kind: " << toString(n->getKind()) << std::endl;
    endBlock();
    if (!recursive) return;
    ++level;
    if (n->getExpr())
        descend(n->getExpr());
    else
        descend(n->getTarget());
    --level;
}

void DumpTree::visit(LABEL* n) {
    writeNodeHeader(n);
    writeIndent() << "Id: " << n->getId() << std::endl;
    const StmtList& stmts = n->getStmts();
    if (!stmts.empty())
        writeRef("StartStmt: (", stmts.front());
    else
        writeIndent() << "StartStmt: (0)" << std::endl;
    writeIndent() << "Kind: " << toString(n->getKind()) << std::endl;
    endBlock();
    if (!recursive || stmts.empty()) return;
    // A label already being dumped further up this path would loop forever.
    if (std::find(labelPath.begin(), labelPath.end(), n) != labelPath.end()) return;
    labelPath.push_back(n);
    ++level;
    descend(stmts.front());
    --level;
    labelPath.pop_back();
}

void DumpTree::visit(MOVE* n) {
    writeNodeHeader(n);
    writeRef("Dst: (", n->getDst());
    writeRef("Src: (", n->getSrc());
    endBlock();
    children({n->getDst(), n->getSrc()});
}

void DumpTree::visit(SEQ* n) {
    writeNodeHeader(n);
    writeRef("Left: (", n->getLeft());
    writeRef("Right: (", n->getRight());
    endBlock();
    children({n->getLeft(), n->getRight()});
}

void DumpTree::visit(SUBPROG* n) {
    writeNodeHeader(n);
    const String& name = n->getName();
    writeIndent() << "Name: ";
    out.write(name.data(), static_cast<std::streamsize>(name.size())) << std::endl;
    writeRef("StartLabel: (", n->getStartLabel());
    writeRef("ReturnLabel: (", n->getReturnLabel());
    writeIndent() << "ReturnType: " << toString(n->getReturnType()) << std::endl;
    writeRef("ReturnTemp: (", n->getReturnTemp());
    writeList("ArgumentTemps: ", n->getAllArgTemps());
    writeIndent() << "Labels: ";
    const char* sep = "(";
    for (const auto& entry : n->getAllLabels()) {
        out << sep << static_cast<const void*>(entry.second) << ')';
        sep = ", (";
    }
    out << std::endl;
    writeList("Names: ", n->getAllLocalNames());
    endBlock();
    if (!recursive) return;
    ++level;
    for (TEMP* t : n->getAllArgTemps()) descend(t);
    for (const auto& entry : n->getAllLabels()) descend(entry.second);
    for (NAME* name : n->getAllLocalNames()) descend(name);
    --level;
}

}  // namespace ZOA
