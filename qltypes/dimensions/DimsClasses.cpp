#include "qltypes/dimensions/DimsClasses_internal.h"

namespace QLTypeSys {

int DimsClasses::nextOf(int size) const {
    const auto shortcut = shortcuts_.find(size);
    if (shortcut != shortcuts_.end() && shortcut->second.generation == generation_) return shortcut->second.to;
    const auto parent = parents_.find(size);
    return parent == parents_.end() ? size : parent->second;
}

int DimsClasses::rootOf(int size) const {
    int root = size;
    int numSteps = 0;
    for (int next = nextOf(root); next < root; next = nextOf(root)) {
        root = next;
        ++numSteps;
    }
    if (numSteps < 2) return root;
    for (int at = size; at != root;) {
        const int next = nextOf(at);
        shortcuts_.insert_or_assign(at, Shortcut{root, generation_});
        at = next;
    }
    return root;
}

} // namespace QLTypeSys
