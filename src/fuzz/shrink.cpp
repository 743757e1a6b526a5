// Shrinks a failing unit in its text form: drops statements, simplifies expressions.
#include "fuzz/campaign.h"

#include <cctype>
#include <functional>
#include <string>
#include <vector>

namespace ZOA::fuzz {

namespace {

// A parsed S-expression: an atom (symbol, number or quoted text) or a list.
struct Sx {
    std::string atom;
    std::vector<Sx> kids;
    bool list = false;
};

void skipSpace(const std::string& s, std::size_t& i) {
    for (;;) {
        while (i < s.size() && std::isspace(static_cast<unsigned char>(s[i]))) ++i;
        if (i < s.size() && s[i] == ';') {
            while (i < s.size() && s[i] != '\n') ++i;
            continue;
        }
        return;
    }
}

bool parse(const std::string& s, std::size_t& i, Sx& out, unsigned depth) {
    skipSpace(s, i);
    if (i >= s.size() || depth > 2000) return false;
    if (s[i] == '(') {
        out.list = true;
        ++i;
        for (;;) {
            skipSpace(s, i);
            if (i >= s.size()) return false;
            if (s[i] == ')') {
                ++i;
                return true;
            }
            out.kids.emplace_back();
            if (!parse(s, i, out.kids.back(), depth + 1)) return false;
        }
    }
    std::size_t start = i;
    if (s[i] == '"') {
        for (++i; i < s.size() && s[i] != '"'; ++i)
            if (s[i] == '\\') ++i;
        ++i;
    } else {
        while (i < s.size() && !std::isspace(static_cast<unsigned char>(s[i])) && s[i] != '(' && s[i] != ')') ++i;
    }
    out.atom = s.substr(start, i - start);
    return true;
}

void print(const Sx& x, std::string& out, unsigned indent) {
    if (!x.list) {
        out += x.atom;
        return;
    }
    bool block = !x.kids.empty() && !x.kids[0].list &&
                 (x.kids[0].atom == "unit" || x.kids[0].atom == "subprog" || x.kids[0].atom == "block");
    out += '(';
    for (std::size_t k = 0; k < x.kids.size(); ++k) {
        if (k) {
            if (block && x.kids[k].list) out += "\n" + std::string(indent + 2, ' ');
            else out += ' ';
        }
        print(x.kids[k], out, indent + 2);
    }
    out += ')';
}

std::string print(const Sx& x) {
    std::string s;
    print(x, s, 0);
    return s + "\n";
}

bool head(const Sx& x, const char* name) { return x.list && !x.kids.empty() && !x.kids[0].list && x.kids[0].atom == name; }
bool isExprForm(const Sx& x) {
    return head(x, "BINOP") || head(x, "UNOP") || head(x, "MEM") || head(x, "CALL");
}

// Every node of the tree, in pre-order, as a path of child indices.
void paths(const Sx& x, std::vector<std::size_t>& at, std::vector<std::vector<std::size_t>>& out) {
    out.push_back(at);
    for (std::size_t k = 0; k < x.kids.size(); ++k) {
        at.push_back(k);
        paths(x.kids[k], at, out);
        at.pop_back();
    }
}
Sx* follow(Sx& root, const std::vector<std::size_t>& path) {
    Sx* x = &root;
    for (std::size_t k : path) {
        if (k >= x->kids.size()) return nullptr;
        x = &x->kids[k];
    }
    return x;
}

}  // namespace

std::string shrink(const std::string& text, const std::function<bool(const std::string&)>& stillFails,
                   unsigned budget) {
    Sx root;
    std::size_t i = 0;
    if (!parse(text, i, root, 0)) return text;
    // First only drop statements and items (big steps), then also simplify expressions.
    for (int phase = 0; phase < 2; ++phase) {
    bool progress = true;
    while (progress && budget > 0) {
        progress = false;
        std::vector<std::vector<std::size_t>> all;
        std::vector<std::size_t> at;
        paths(root, at, all);
        // Latest first, so that removing a node leaves the earlier paths valid.
        for (auto it = all.rbegin(); it != all.rend() && budget > 0; ++it) {
            if (it->empty()) continue;
            std::vector<std::size_t> parentPath(it->begin(), it->end() - 1);
            Sx* parent = follow(root, parentPath);
            if (!parent) continue;
            std::size_t idx = it->back();
            if (idx >= parent->kids.size()) continue;
            std::vector<Sx> tries;
            const Sx& node = parent->kids[idx];
            bool statementOfBlock = head(*parent, "block") && idx >= 2;
            bool subprogItem = head(*parent, "subprog") && node.list;
            bool unitItem = head(*parent, "unit") && node.list;
            if (!statementOfBlock && !subprogItem && !unitItem && !isExprForm(node)) continue;
            if (isExprForm(node) && phase == 1) {
                Sx zero;
                zero.list = true;
                zero.kids.resize(3);
                zero.kids[0].atom = "CONST";
                zero.kids[1].atom = node.kids.size() > 1 ? node.kids[1].atom : "INT_S";
                zero.kids[2].atom = zero.kids[1].atom == "FLOAT" || zero.kids[1].atom == "DOUBLE" ? "0.0" : "0";
                tries.push_back(zero);
                for (std::size_t k = 2; k < node.kids.size(); ++k)
                    if (node.kids[k].list || node.kids[k].atom[0] == 't') tries.push_back(node.kids[k]);
            }
            Sx saved = parent->kids[idx];
            if (statementOfBlock || subprogItem || unitItem) {  // try without it
                --budget;
                parent->kids.erase(parent->kids.begin() + static_cast<std::ptrdiff_t>(idx));
                if (stillFails(print(root))) {
                    progress = true;
                    continue;
                }
                parent->kids.insert(parent->kids.begin() + static_cast<std::ptrdiff_t>(idx), saved);
            }
            for (const Sx& t : tries) {
                if (budget == 0) break;
                --budget;
                parent->kids[idx] = t;
                if (stillFails(print(root))) {
                    progress = true;
                    break;
                }
                parent->kids[idx] = saved;
            }
        }
    }
    }
    return print(root);
}

}  // namespace ZOA::fuzz
