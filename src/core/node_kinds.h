// The list of node kinds as data: printed names and the visit overrides a visitor declares.
#ifndef ZOA_CORE_NODE_KINDS_H
#define ZOA_CORE_NODE_KINDS_H

#include <zoa/enums.h>

#include <array>
#include <string_view>

namespace ZOA {

namespace detail {
constexpr std::array<std::string_view, NODE_TYPE_COUNT> makeNodeKindNames() {
    std::array<std::string_view, NODE_TYPE_COUNT> names{};
    names[TREE_BASE_NODE] = "TreeBase";
    names[EXPR_BASE_NODE] = "ExprBase";
    names[STMT_BASE_NODE] = "StmtBase";
#define ZOA_NODE_KIND(kind, Class) names[kind] = #Class;
#include "core/node_kinds.def"
    return names;
}
}  // namespace detail

// Indexed by NodeType.
inline constexpr std::array<std::string_view, NODE_TYPE_COUNT> NODE_KIND_NAMES = detail::makeNodeKindNames();

// The printed name of a node kind ("BINOP", "BUF_TEMP", ...); the base kinds
// answer their class names ("TreeBase", "ExprBase", "StmtBase"), anything
// outside the enumeration "".
constexpr std::string_view nodeKindName(NodeType t) {
    unsigned int i = static_cast<unsigned int>(t);
    return i < NODE_KIND_NAMES.size() ? NODE_KIND_NAMES[i] : std::string_view();
}

// True for the fifteen kinds a node object can have.
constexpr bool isConcreteKind(NodeType t) {
    return t != TREE_BASE_NODE && t != EXPR_BASE_NODE && t != STMT_BASE_NODE &&
           static_cast<unsigned int>(t) < static_cast<unsigned int>(NODE_TYPE_COUNT);
}

}  // namespace ZOA

// A visitor declares its fifteen visit overrides from the list:
//   #define ZOA_NODE_KIND(kind, Class) void visit(Class*) override;
//   #include "core/node_kinds.def"

#endif
