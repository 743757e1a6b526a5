// Enumerator lookup by printed name for the text reader.
#include "text/names.h"

namespace ZOA::text {

namespace {

// Tries every value in [0, count) against toString, then a plain number.
template <class E> bool lookup(const std::string& s, int count, E& out) {
    for (int i = 0; i < count; ++i)
        if (s == toString(static_cast<E>(i))) {
            out = static_cast<E>(i);
            return true;
        }
    return false;
}

}  // namespace

bool lookupDataType(const std::string& s, DataType& out) { return lookup(s, DATA_TYPE_COUNT, out); }
bool lookupBinop(const std::string& s, BinopKind& out) { return lookup(s, MAX_BINOP + 1, out); }
bool lookupUnop(const std::string& s, UnopKind& out) { return lookup(s, UNOP_KIND_COUNT, out); }
bool lookupNameKind(const std::string& s, NameKind& out) { return lookup(s, EXTERN_DATA_REF + 1, out); }
bool lookupLabelKind(const std::string& s, LabelKind& out) { return lookup(s, EPILOGUE_LABEL + 1, out); }
bool lookupTempState(const std::string& s, TempState& out) { return lookup(s, AVAILABLE_TEMP + 1, out); }

}  // namespace ZOA::text
