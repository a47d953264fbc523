// Reads polynomials straight from the nodes of expressions: of simplified ones, which ExprWriter wrote, and of plain
// sums of products.
#pragma once

#include <optional>
#include <span>
#include <utility>
#include <vector>

#include <boost/container/small_vector.hpp>

#include "qlplatform/symbolic/NodeStore_internal.h"
#include "qlplatform/symbolic/Polynomial_internal.h"

namespace QL {

inline bool isSum(SymbolicOp op) { return op == SymbolicOp::Plus || op == SymbolicOp::Minus; }

inline bool isArithmetic(SymbolicOp op) {
    return isSum(op) || op == SymbolicOp::UnaryMinus || op == SymbolicOp::Multiply || op == SymbolicOp::Divide ||
           op == SymbolicOp::Power;
}

class ExprReader {
  public:
    explicit ExprReader(const NodeStore& store) : store_(store) {}

    /// A product of numbers and atoms.
    struct Product {
        Integer coefficient{1};
        boost::container::small_vector<Factor, 8> factors; // atoms ascend
        bool hasDoubles = false;                           // an atom is a double value
        bool hasQuotients = false;                         // an atom is a quotient by something else than 0

        std::span<const Factor> atoms() const { return {factors.data(), factors.size()}; }
    };
    /// A sum of such products, in order.
    struct Sum {
        Polynomial polynomial;
        bool hasDoubles = false;
        bool hasQuotients = false;
    };

    /// A term of a simplified sum, or a simplified product. A sum in it that was not multiplied out is an atom.
    Product simplifiedTerm(NodeId term) const;
    /// A simplified expression that is no quotient.
    Sum simplifiedSum(NodeId sum) const;

    /// A sum of products of integer values, symbols and other atoms that are simplified, with nothing else in it but
    /// what it says; nothing for any other expression, and for one beyond the limits.
    std::optional<Polynomial> plainSum(NodeId sum) const;

    /// Whether it is the number 0.
    bool isZero(NodeId id) const;

  private:
    enum class Form { Simplified, Plain };

    bool readTerm(NodeId term, Form form, Product& product) const;
    bool readFactor(NodeId factor, Form form, Product& product) const;
    bool readPower(NodeId power, Form form, Product& product) const;
    bool addFactor(NodeId atom, std::uint64_t exponent, Form form, Product& product) const;
    std::optional<std::uint64_t> wholeExponent(NodeId exponent, Form form) const;
    std::optional<Integer> numberIn(NodeId id) const;
    std::optional<Integer> wholeNumber(NodeId leaf) const;
    void listTerms(NodeId sum) const;

    const NodeStore& store_;
    mutable std::vector<std::pair<NodeId, bool>>
        terms_; // of the sum that is read, and whether each is subtracted; last first
};

} // namespace QL
