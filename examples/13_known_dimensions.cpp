// A filter bank with symbolic sizes: facts are stated, asked for, contradicted and listed.
#include <cstdio>

#include "qlplatform/services/IException.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

class QLBlock {}; // whoever states facts: here two blocks

namespace {

using namespace QLTypeSys;

void print(SymbolicDimsTable& table, const char* relation, const std::vector<SymbolicDimsCGConstraint>& pairs) {
    for (const SymbolicDimsCGConstraint& pair : pairs)
        std::printf("  %s %s %s\n", table.getSymbolicDims(pair.first).toString().c_str(), relation,
                    table.getSymbolicDims(pair.second).toString().c_str());
}

const char* answer(bool isKnown) { return isKnown ? "yes" : "not known"; }

} // namespace

int main() {
    SymbolicDimsTable table;
    const SymbolicDimsString frame(table, "Frame"), hop(table, "Hop"), taps(table, "Taps"), bands(table, "Bands");
    const SymbolicDimsQLSizeValue two(table, 2);
    const QLBlock buffer, filter;

    table.addGreaterThanRelation(frame.getId(), hop.getId(), &buffer);
    table.addGreaterThanRelation(hop.getId(), taps.getId(), &buffer);
    table.addRange(taps.getId(), 8, 64, &filter, generateBothBounds);
    table.addEqualRelation(bands.getId(), (frame / two).getId(), &filter);

    const SymbDimsRange range = table.getRange(frame.getId());
    std::printf("Frame > Taps: %s\n", answer(table.hasGreaterThanRelation(frame.getId(), taps.getId())));
    std::printf("Frame is at least %d\n", range.min);
    std::printf("Bands == Frame/2: %s\n", answer(table.hasEqualRelation((frame / two).getId(), bands.getId())));
    std::printf("Frame > Bands: %s\n", answer(table.hasGreaterThanRelation(frame.getId(), bands.getId())));

    try {
        table.addGreaterThanRelation(taps.getId(), frame.getId(), &filter);
    } catch (const foundation::core::except::IException& e) {
        std::printf("refused: %s\n", e.what());
    }

    std::vector<int> facts;
    table.getSymbolicDimsConstraints(&filter, facts);
    std::printf("the filter stated\n");
    for (const int fact : facts)
        std::printf("  %s\n", table.getDisplayString(fact));
    std::printf("for the code generator\n");
    std::vector<SymbolicDimsCGConstraint> pairs;
    table.getEquivalentSymbolicDims(pairs);
    print(table, "==", pairs);
    table.getGreaterThanSymbolicDims(pairs);
    print(table, ">", pairs);
    table.getLessThanSymbolicDims(pairs);
    print(table, "<", pairs);
}
