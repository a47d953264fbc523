#include "description/Resolver.h"

#include <string_view>
#include <unordered_map>

#include <fmt/format.h>
#include <fmt/ranges.h>

namespace inspector {
namespace {

using Indices = std::unordered_map<std::string_view, std::size_t>;

std::vector<const TypeReference*> referencesOf(const TypeDescription& type) {
    std::vector<const TypeReference*> references;
    if (const auto* alias = std::get_if<AliasDescription>(&type.kind)) references.push_back(&alias->target);
    if (const auto* matrix = std::get_if<MatrixDescription>(&type.kind)) references.push_back(&matrix->element);
    if (const auto* structure = std::get_if<StructureDescription>(&type.kind)) {
        for (const ElementDescription& element : structure->elements)
            references.push_back(&element.type);
    }
    return references;
}

Indices indicesByName(const Description& description, const std::function<bool(const std::string&)>& isKnown) {
    Indices indices;
    for (std::size_t i = 0; i < description.types.size(); ++i) {
        const TypeDescription& type = description.types[i];
        if (isKnown(type.name))
            throw InputError(type.place, fmt::format("'{}' is the name of a number type", type.name));
        const auto [earlier, isNew] = indices.emplace(type.name, i);
        if (!isNew) {
            throw InputError(type.place, fmt::format("'{}' is described already at {}", type.name,
                                                     toText(description.types[earlier->second].place)));
        }
    }
    return indices;
}

// A walk in depth, with its own stack: descriptions may be nested deeper than the stack of the process allows.
class Walk {
  public:
    Walk(const Description& description, const std::function<bool(const std::string&)>& isKnown)
        : types_(description.types), isKnown_(isKnown), indices_(indicesByName(description, isKnown)),
          states_(types_.size(), State::New) {}

    std::vector<std::size_t> order() {
        for (std::size_t i = 0; i < types_.size(); ++i) {
            if (states_[i] != State::New) continue;
            open(i);
            while (!stack_.empty())
                step();
        }
        return std::move(order_);
    }

  private:
    enum class State { New, Open, Done };
    struct Level {
        std::size_t type;
        std::vector<const TypeReference*> references;
        std::size_t next = 0; // of references
    };

    void open(std::size_t type) {
        states_[type] = State::Open;
        stack_.push_back({type, referencesOf(types_[type])});
    }

    void step() {
        Level& level = stack_.back();
        if (level.next == level.references.size()) {
            states_[level.type] = State::Done;
            order_.push_back(level.type);
            stack_.pop_back();
            return;
        }
        const TypeReference& reference = *level.references[level.next++];
        const auto found = indices_.find(reference.name);
        if (found == indices_.end()) {
            if (!isKnown_(reference.name))
                throw InputError(reference.place, fmt::format("unknown type '{}'", reference.name));
            return;
        }
        if (states_[found->second] == State::Open) complainOfCycle(reference, found->second);
        if (states_[found->second] == State::New) open(found->second);
    }

    [[noreturn]] void complainOfCycle(const TypeReference& reference, std::size_t first) const {
        std::vector<std::string_view> labels;
        for (const Level& level : stack_) {
            if (level.type == first || !labels.empty()) labels.push_back(types_[level.type].label);
        }
        constexpr std::size_t mostShown = 8;
        const std::size_t numOmitted = labels.size() > mostShown ? labels.size() - mostShown : 0;
        labels.resize(labels.size() - numOmitted);
        throw InputError(reference.place,
                         fmt::format("cycle: {}{} -> {}", fmt::join(labels, " -> "),
                                     numOmitted ? fmt::format(" -> ({} more)", numOmitted) : "", types_[first].label));
    }

    const std::vector<TypeDescription>& types_;
    const std::function<bool(const std::string&)>& isKnown_;
    const Indices indices_;
    std::vector<State> states_;
    std::vector<Level> stack_;
    std::vector<std::size_t> order_;
};

} // namespace

std::vector<std::size_t> registrationOrder(const Description& description,
                                           const std::function<bool(const std::string&)>& isKnown) {
    return Walk(description, isKnown).order();
}

} // namespace inspector
