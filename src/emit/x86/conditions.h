// The condition codes of the six relations: the one table behind set<cc> and j<cc>.
#ifndef ZOA_EMIT_X86_CONDITIONS_H
#define ZOA_EMIT_X86_CONDITIONS_H

#include "core/op_facts.h"

#include <string_view>

namespace ZOA {

// Indexed by relation - EQ, in the order of RELATIONS. The signed codes, as
// the fixed texts have them whatever the operands' types.
inline constexpr std::string_view CONDITION_CODES[] = {"e", "ne", "l", "le", "g", "ge"};
static_assert(sizeof(CONDITION_CODES) / sizeof(*CONDITION_CODES) == sizeof(RELATIONS) / sizeof(*RELATIONS),
              "one condition code per relation");

// The codes of the relations on unsigned operands and addresses.
inline constexpr std::string_view UNSIGNED_CONDITION_CODES[] = {"e", "ne", "b", "be", "a", "ae"};
static_assert(sizeof(UNSIGNED_CONDITION_CODES) == sizeof(CONDITION_CODES), "one unsigned code per relation");

// The condition code of a relation; "" for any other operator.
constexpr std::string_view conditionCode(BinopKind op) {
    return isRelation(op) ? CONDITION_CODES[op - EQ] : std::string_view();
}

}  // namespace ZOA

#endif
