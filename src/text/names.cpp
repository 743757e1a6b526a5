// Enumerator and node kind lookup by printed name for the text reader.
#include "text/names.h"

#include "core/node_kinds.h"

#include <array>

namespace ZOA::text {

namespace {

// The printed names of [0, N), taken once from toString.
template <class E, int N> struct Names {
    std::array<std::string_view, N> of{};
    Names() {
        for (int i = 0; i < N; ++i) of[static_cast<std::size_t>(i)] = toString(static_cast<E>(i));
    }
    bool find(std::string_view s, E& out) const {
        for (int i = 0; i < N; ++i)
            if (of[static_cast<std::size_t>(i)] == s) {
                out = static_cast<E>(i);
                return true;
            }
        return false;
    }
};

template <class E, int N> const Names<E, N>& names() {
    static const Names<E, N> table;
    return table;
}

template <class E, int N> bool lookup(std::string_view s, E& out) { return names<E, N>().find(s, out); }

template <class E, int N> std::string_view name(E v) {
    unsigned int i = static_cast<unsigned int>(v);
    if (i >= static_cast<unsigned int>(N)) return {};
    std::string_view s = names<E, N>().of[i];
    return s.empty() || s[0] == '?' ? std::string_view() : s;
}

}  // namespace

bool lookupDataType(std::string_view s, DataType& out) { return lookup<DataType, DATA_TYPE_COUNT>(s, out); }
bool lookupBinop(std::string_view s, BinopKind& out) { return lookup<BinopKind, MAX_BINOP + 1>(s, out); }
bool lookupUnop(std::string_view s, UnopKind& out) { return lookup<UnopKind, UNOP_KIND_COUNT>(s, out); }
bool lookupNameKind(std::string_view s, NameKind& out) { return lookup<NameKind, EXTERN_DATA_REF + 1>(s, out); }
bool lookupLabelKind(std::string_view s, LabelKind& out) { return lookup<LabelKind, EPILOGUE_LABEL + 1>(s, out); }
bool lookupTempState(std::string_view s, TempState& out) { return lookup<TempState, AVAILABLE_TEMP + 1>(s, out); }

std::string_view printedName(DataType v) { return name<DataType, DATA_TYPE_COUNT>(v); }
std::string_view printedName(BinopKind v) { return name<BinopKind, MAX_BINOP + 1>(v); }
std::string_view printedName(UnopKind v) { return name<UnopKind, UNOP_KIND_COUNT>(v); }
std::string_view printedName(NameKind v) { return name<NameKind, EXTERN_DATA_REF + 1>(v); }
std::string_view printedName(LabelKind v) { return name<LabelKind, EPILOGUE_LABEL + 1>(v); }
std::string_view printedName(TempState v) { return name<TempState, AVAILABLE_TEMP + 1>(v); }

bool lookupNodeKind(std::string_view s, NodeType& out) {
    for (std::size_t i = 0; i < NODE_KIND_NAMES.size(); ++i) {
        NodeType t = static_cast<NodeType>(i);
        if (isConcreteKind(t) && NODE_KIND_NAMES[i] == s) {
            out = t;
            return true;
        }
    }
    return false;
}

}  // namespace ZOA::text
