#include "dims/KnownFacts.h"

#include <fmt/format.h>

#include "dims/Script.h"
#include "dims/Session.h"

namespace inspector {

KnownFacts readKnownFacts(const std::string& file, const std::string& text) {
    Session session(file);
    for (const Statement& statement : readScript(file, text)) {
        if (statement.verb == Verb::Quit) break;
        const Answer answer = session.run(statement);
        if (answer.contradiction)
            throw InputError(placeOf(file, statement.whole), fmt::format("refused: {}", answer.contradiction->message));
    }
    KnownFacts known;
    known.source = file;
    const Answer listed = session.run(readStatement(file, "list", 0).value());
    for (const auto& fact : listed.values["facts"])
        known.facts.push_back({fact["expression"], fact["blocks"]});
    known.graph = factGraph(session);
    return known;
}

} // namespace inspector
