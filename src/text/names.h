// Spellings shared by the reader and the writer of the text form: enumerators by printed name.
#ifndef ZOA_TEXT_NAMES_H
#define ZOA_TEXT_NAMES_H

#include <zoa/enums.h>

#include <string>
#include <string_view>

namespace ZOA::text {

// Looks an enumerator up by its printed name ("INT_S", "PLUS", ...); false if
// there is none. Numbers for values outside an enumeration are the reader's
// business, not these lookups'.
bool lookupDataType(std::string_view s, DataType& out);
bool lookupBinop(std::string_view s, BinopKind& out);
bool lookupUnop(std::string_view s, UnopKind& out);
bool lookupNameKind(std::string_view s, NameKind& out);
bool lookupLabelKind(std::string_view s, LabelKind& out);
bool lookupTempState(std::string_view s, TempState& out);
// A node kind by the head the text form writes for it ("MOVE", "BINOP", ...).
bool lookupNodeKind(std::string_view s, NodeType& out);

// The printed name of an enumerator; empty when it has none.
std::string_view printedName(DataType v);
std::string_view printedName(BinopKind v);
std::string_view printedName(UnopKind v);
std::string_view printedName(NameKind v);
std::string_view printedName(LabelKind v);
std::string_view printedName(TempState v);

// How the writer spells an enumerator: its printed name, or its number when it has none.
struct Spelling {
    std::string_view name;
    int number;
};
template <class E> Spelling spell(E v) { return {printedName(v), static_cast<int>(v)}; }

}  // namespace ZOA::text

#endif
