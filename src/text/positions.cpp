// The reader's position table: node to byte offset, turned into lines and columns on first use.
#include <zoa/text.h>

#include <algorithm>

namespace ZOA::text {

void PositionTable::grow(Log& log) {
    // Chunks double from 1,024 entries to 65,536.
    std::size_t last = log.empty() ? 512 : log.back().capacity();
    log.emplace_back();
    log.back().reserve(std::min<std::size_t>(last * 2, std::size_t(1) << 16));
}

const Position* PositionTable::find(const TreeBase* n) const {
    if (!sorted_) {
        auto byNode = [](const Entry& a, const Entry& b) { return std::less<const TreeBase*>()(a.node, b.node); };
        auto flat = [&](const Log& log) {
            std::vector<Entry> all;
            for (const auto& chunk : log) all.insert(all.end(), chunk.begin(), chunk.end());
            std::stable_sort(all.begin(), all.end(), byNode);
            return all;
        };
        std::vector<Entry> early = flat(early_), late = flat(late_);
        // Merge, keeping for each node its first early record, else its first late one.
        index_.clear();
        index_.reserve(early.size() + late.size());
        auto a = early.begin(), b = late.begin();
        while (a != early.end() || b != late.end()) {
            const Entry* next;
            if (b == late.end() || (a != early.end() && !std::less<const TreeBase*>()(b->node, a->node)))
                next = &*a;
            else
                next = &*b;
            const TreeBase* node = next->node;
            if (index_.empty() || index_.back().node != node) index_.push_back({node, locate(next->offset)});
            while (a != early.end() && a->node == node) ++a;
            while (b != late.end() && b->node == node) ++b;
        }
        sorted_ = true;
    }
    auto it = std::lower_bound(index_.begin(), index_.end(), n, [](const Found& f, const TreeBase* x) {
        return std::less<const TreeBase*>()(f.node, x);
    });
    return it != index_.end() && it->node == n ? &it->position : nullptr;
}

Position PositionTable::locate(std::size_t offset) const {
    auto it = std::upper_bound(lineStarts.begin(), lineStarts.end(), offset);
    std::size_t line = static_cast<std::size_t>(it - lineStarts.begin());
    std::size_t start = line ? lineStarts[line - 1] : 0;
    return {static_cast<unsigned int>(line ? line : 1), static_cast<unsigned int>(offset - start + 1)};
}

void PositionTable::clear() {
    early_.clear();
    late_.clear();
    index_.clear();
    lineStarts.clear();
    sorted_ = true;
}

}  // namespace ZOA::text
