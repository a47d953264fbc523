// The parser of the expression engine's own syntax, under each of its options: never crashes, gives an expression or
// one message with a position in the text; a refused text leaves the table as it was; what is printed reads back as the
// same expression.
#include <string>

#include "fuzz/Fuzz.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/symbolic/SymbolicExprParser.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"

namespace {

void checkRefusal(const qlsvDiagnosticImpl& refusal, std::size_t size) {
    fuzz::claim(refusal.numItems() == 1, "one message says why a text is refused");
    const long* position = boost::get<long>(&refusal.item(0).arguments.front());
    fuzz::claim(position && *position >= 0 && static_cast<std::size_t>(*position) <= size, "it says where");
    fuzz::claim(refusal.text().find("at byte ") == 0, "it has a text");
}

void checkReadsBack(QL::SymbolicExprTable& table, const QL::SymbolicExprParser& parse, unsigned long id, bool host) {
    QL::SymbolicExprPrinter print(table, QL::SymbolicExprPrinter::Predicate::instance(), host, host, host, {});
    const std::string printed = print(table.get(id));
    auto [again, refusal] = parse(printed.c_str());
    fuzz::claim(refusal == nullptr, "what is printed can be read");
    // The host language does not tell 1.0 from 1: there, reading and printing once more changes nothing.
    fuzz::claim(host ? print(table.get(again)) == printed : again == id, "what is printed is what is read");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string input(reinterpret_cast<const char*>(data), size);
    const std::string text = input.c_str(); // up to the first NUL
    for (const bool host : {false, true}) {
        for (const bool lists : {false, true}) {
            QL::SymbolicExprTable table;
            const QL::SymbolicExprParser parse(table, host, lists);
            auto [id, refusal] = parse(text.c_str());
            fuzz::claim((refusal != nullptr) == (id == QL::SymbolicExprTable::noExpr), "read or refused");
            if (refusal) {
                checkRefusal(*refusal, text.size());
                fuzz::claim(table.getNumExprs() == 0, "a refused text leaves nothing");
            } else {
                checkReadsBack(table, parse, id, host);
            }
            qlsvDiscardDiagnostic(refusal);
        }
    }
    return 0;
}
