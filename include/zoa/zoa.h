// libZOA: a tree IR for code generators, and its C, x86 assembly, DOT and ASCII outputs.
#ifndef ZOA_ZOA_H
#define ZOA_ZOA_H

#include <zoa/all_visitor.h>
#include <zoa/enums.h>
#include <zoa/expr.h>
#include <zoa/memmgr.h>
#include <zoa/nesting.h>
#include <zoa/stmt.h>
#include <zoa/subprog.h>
#include <zoa/tree_base.h>
#include <zoa/visitor.h>
#include <zoa/zoa_file.h>

#endif
