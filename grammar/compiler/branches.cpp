#include <algorithm>

#include "grammar/compiler/passes.h"

/// Choices that stand right behind each other become one to a search: of ten optional clauses it then asks
/// once which of them comes next, and not of each whether it does.
namespace zr::gc {
namespace {

using Branches = std::vector<Branch>;

/// Adds a branch unless an earlier one goes on at the same node: that reads the same, and is preferred.
void add(Branches& branches, Branch branch) {
    const auto known = std::find_if(branches.begin(), branches.end(),
                                    [&](const Branch& each) { return each.stop == branch.stop; });
    if (known == branches.end()) branches.push_back(std::move(branch));
}

/// The branches with those of a choice in place of the one that leads to it.
Branches opened(const Program& p, const Branches& branches, std::size_t place) {
    Branches made;
    for (std::size_t i = 0; i < branches.size(); ++i) {
        if (i != place) {
            add(made, branches[i]);
            continue;
        }
        for (int target : p.nodes[index(branches[i].stop)].targets) {
            Branch branch{p.skip(target), branches[i].path};
            branch.path.push_back(target);
            add(made, std::move(branch));
        }
    }
    return made;
}

}  // namespace

void findBranches(Program& p) {
    for (Node& n : p.nodes) {
        if (n.op != Op::Choice) continue;
        Branches branches;
        for (int target : n.targets) add(branches, {p.skip(target), {target}});
        for (std::size_t i = 0; i < branches.size();) {
            if (p.nodes[index(branches[i].stop)].op == Op::Choice) {
                Branches more = opened(p, branches, i);
                if (more.size() <= Program::kTargets) {
                    branches = std::move(more);
                    continue;
                }
            }
            ++i;
        }
        n.branches = std::move(branches);
    }
}

}  // namespace zr::gc
