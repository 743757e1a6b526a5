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

template <class E, int N> bool lookup(std::string_view s, E& out) {
    static const Names<E, N> names;
    return names.find(s, out);
}

}  // namespace

bool lookupDataType(std::string_view s, DataType& out) { return lookup<DataType, DATA_TYPE_COUNT>(s, out); }
bool lookupBinop(std::string_view s, BinopKind& out) { return lookup<BinopKind, MAX_BINOP + 1>(s, out); }
bool lookupUnop(std::string_view s, UnopKind& out) { return lookup<UnopKind, UNOP_KIND_COUNT>(s, out); }
bool lookupNameKind(std::string_view s, NameKind& out) { return lookup<NameKind, EXTERN_DATA_REF + 1>(s, out); }
bool lookupLabelKind(std::string_view s, LabelKind& out) { return lookup<LabelKind, EPILOGUE_LABEL + 1>(s, out); }
bool lookupTempState(std::string_view s, TempState& out) { return lookup<TempState, AVAILABLE_TEMP + 1>(s, out); }

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
