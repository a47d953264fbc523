// Symbolic dimensions: expressions over symbols, simplified, the same when their ids are equal.
#include <iostream>

#include "qltypes/dimensions/SymbolicDims.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

int main() {
    QLTypeSys::SymbolicDimsTable table;
    QLTypeSys::SymbolicDimsString k(table, "K"), l(table, "L"), m(table, "M");
    QLTypeSys::SymbolicDimsQLSizeValue two(table, 2);
    std::cout << ((k * l + two * k) / two % m).toString(); // (K*L + 2*K)/2 % M
    std::cout << '\n';

    const QLTypeSys::SymbolicDims one = (k + l) * (k + l);
    const QLTypeSys::SymbolicDims other = k * k + two * k * l + l * l;
    std::cout << one.toString() << (one.getId() == other.getId() ? " is" : " is not") << " the same as its expansion\n";

    const QLTypeSys::SymbolicDimsND shape(table, {k.getId(), l.getId(), two.getId()});
    std::cout << shape.toString() << " holds " << shape.getSize().toString() << " elements, in the host language "
              << table.getTorvexExpr(shape.getSize().getId()) << '\n';

    table.registerValue("K", 3);
    table.registerValue("L", 5);
    std::cout << "for K = 3, L = 5:";
    for (const unsigned long dimension : table.getNumericDims(shape.getId()))
        std::cout << ' ' << dimension;
    std::cout << '\n';
}
