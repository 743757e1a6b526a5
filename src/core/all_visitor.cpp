// AllVisitor: the fixed whole-tree walk that collecting visitors build on.
#include <zoa/all_visitor.h>

#include "core/children.h"

#include <vector>

namespace ZOA {

AllVisitor::AllVisitor(TreeBase* root) {
    if (root) root->accept(this);
}

AllVisitor::~AllVisitor() {}

void AllVisitor::walk(TreeBase* child) {
    NestingLevel level(nesting);
    if (level.entered()) child->accept(this);
}

void AllVisitor::walkChildren(TreeBase* n) {
    forEachChild(n, [this](TreeBase* child) { walk(child); });
}

void AllVisitor::visit(SUBPROG* sp) {
    // A copy, so that labels added or removed during the walk do not disturb it.
    std::vector<LABEL*> labels;
    labels.reserve(sp->getAllLabels().size());
    for (const auto& entry : sp->getAllLabels()) labels.push_back(entry.second);
    for (LABEL* l : labels)
        if (l) walk(l);
    if (TEMP* t = sp->getReturnTemp()) walk(t);
}

void AllVisitor::visit(LABEL* n) { walkChildren(n); }
void AllVisitor::visit(SEQ* n) { walkChildren(n); }
void AllVisitor::visit(MOVE* n) { walkChildren(n); }
void AllVisitor::visit(EXP* n) { walkChildren(n); }
void AllVisitor::visit(JUMP* n) { walkChildren(n); }
void AllVisitor::visit(CJUMP* n) { walkChildren(n); }
void AllVisitor::visit(BINOP* n) { walkChildren(n); }
void AllVisitor::visit(UNOP* n) { walkChildren(n); }
void AllVisitor::visit(MEM* n) { walkChildren(n); }
void AllVisitor::visit(CALL* n) { walkChildren(n); }
void AllVisitor::visit(NAME* n) { walkChildren(n); }
void AllVisitor::visit(TEMP*) {}
void AllVisitor::visit(BUF_TEMP*) {}
void AllVisitor::visit(CONST*) {}

}  // namespace ZOA
