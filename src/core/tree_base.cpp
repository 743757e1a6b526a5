// Node and annotation bases: arena allocation, annotations, type sizes.
#include <zoa/tree_base.h>
#include <zoa/visitor.h>

#include "core/type_facts.h"

namespace ZOA {

TreeAnnotation::~TreeAnnotation() {}

// Annotations are client classes: give them what global operator new promises.
void* TreeAnnotation::operator new(std::size_t size) { return MemMgr::allocateAligned(size, alignof(std::max_align_t)); }

void* TreeAnnotation::operator new(std::size_t size, std::align_val_t align) {
    std::size_t a = static_cast<std::size_t>(align);
    return MemMgr::allocateAligned(size, a > alignof(std::max_align_t) ? a : alignof(std::max_align_t));
}

void TreeBase::setAnnotation(TreeAnnotation* a, bool deleteOld) {
    if (deleteOld && annotation) delete annotation;
    annotation = a;
}

unsigned int ExprBase::sizeOfDataType(DataType t) { return sizeOfType(t); }

VisitorBase::~VisitorBase() {}

}  // namespace ZOA
