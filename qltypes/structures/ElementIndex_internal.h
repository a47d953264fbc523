// What makes the views fast, one for each structure and id that it is viewed under: where the numbering of each
// immediate element starts, and what a depth-first view answered.
//
// A depth-first view promises that what it answered once it answers until StructDataType::clearDFSCache, also when an
// element changed in between, and that it reads everything else as it is now. Both hold without a record of each
// answer:
//   - The numbering is a copy: changed elements leave it as it was. It is read again when something that it depends on
//     changed (noteEdit tells), and then every answer given is first written down as a CachedElement.
//   - What an element may change without moving a node (offset, name) is compared with the copy when it is asked for
//   the
//     first time. Where it differs, the copy is renewed if nothing was answered from it, else the answer written down.
//   - So an index that was asked (AskedSet) and has no CachedElement is answered from the copy.
// Elements that stand for the structure itself, or for a nested one, are made once for each immediate element and
// shared by all of its instances. They live as long as this index, as the view promises.
//
// A nested structure's index is shared by all that contain it. Clearing the nested structure alone makes it a new one;
// the old one goes on answering what the containing structures asked before.
#pragma once

#include <iterator>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <boost/unordered_map.hpp>

#include "qltypes/structures/AskedSet_internal.h"
#include "qltypes/structures/SpanSearch_internal.h"
#include "qltypes/structures/StructDataType.h"

namespace QLTypeSys::structures {

/// Tells all indexes that the elements or counts of some structure, or what a type id stands for, changed.
void noteEdit();

class ElementIndex;

/// The indexes of one structure, by the id that it is viewed under.
struct ElementIndexes {
    std::shared_ptr<ElementIndex> own; // under the structure's own id
    std::vector<std::pair<int, std::shared_ptr<ElementIndex>>> underAliases;

    /// Leaves the indexes that containing structures hold to them, with what they answered in `answers` for the own id.
    /// Where nobody will ask them again they hold on to nothing: structures may have contained each other in turn.
    void release(boost::unordered_map<long, CachedElement>& answers, bool nobodyAsks);
};

class ElementIndex {
  public:
    /// A structure nested in an immediate element.
    struct Nested {
        std::shared_ptr<ElementIndex> index;
        int typeId;
        int size; // bytes of one instance
        long width;
        long numDFS;                          // of one instance
        long numRaw;                          // of one instance
        std::optional<std::string> name = {}; // of the element when an instance was first asked
        StructElement* head = nullptr;        // stands for an instance; owned by the index or a CachedElement

        bool operator==(const Nested& other) const;
    };

    /// Where a depth-first index leads.
    ///   root          no element, base below 0
    ///   past the end  no element, base at the start of an instance of the structure
    ///   array node    an element, base below 0
    ///   leaf          an element without a nested structure
    ///   head          a nested structure that starts at the index
    ///   inside        a nested structure that starts before the index
    struct Place {
        long element = -1;
        long instance = 0; // of the element or the structure; -1 for an array node
        long base = -1;
        const Nested* nested = nullptr;

        bool isRoot() const { return element < 0 && base < 0; }
        bool isPastTheEnd() const { return element < 0 && base >= 0; }
        bool isArrayNode() const { return element >= 0 && base < 0; }
        bool isLeaf() const { return element >= 0 && !nested; }
        bool isHead(long idx) const { return nested && base == idx; }
    };

    /// The index of the structure at the end of the alias chain of `id`, brought up to date. Raises
    /// `InvalidDataTypeId`.
    static ElementIndex& of(const DataTypeTable* table, int id);

    ElementIndex(const DataTypeTable* table, int id, StructDataType& record);

    /// clearDFSCache for one structure after the other, until nothing is left of what any in the table answered.
    static void forget(StructDataType& record);

    /// This index after reading what changed.
    ElementIndex& current();

    int viewId() const { return viewId_; }
    long numDFS() const { return numbering_.numDFS; }
    const StructElement& immediate(long element) const { return *copied(element).element; }
    /// Number of immediate elements, up to the first without a valid type.
    long numImmediate() const { return std::ssize(numbering_.elements); }
    /// The structure nested in an immediate element; null for a leaf.
    const Nested* nestedIn(long element) const;

    /// A structure that was not laid out has no node but its root. Raises `InvalidDataTypeId` when an element without a
    /// valid type stands in the way.
    Place place(long idx) const;

    // What a depth-first view answers, and then answers again.
    StructElement* element(long idx);
    long offset(long idx);
    long varDimsOffset(long idx);

    /// Sum of the complex widths of the leaves before a depth-first index.
    long rawBefore(long idx);
    /// Depth-first indices of all leaves.
    std::vector<long> leaves();

    /// The first immediate element, not before `from`, at which the raw spans before it and its own pass `rawIdx`;
    /// their number if there is none.
    long elementAtRaw(long rawIdx, long from = 0) const;
    /// Sum of the raw spans of the elements in front of an immediate one.
    long rawSpansBefore(long element) const;

    /// The written answer for an index, with all that was answered before.
    CachedElement& written(long idx, bool takeOwnership);

  private:
    friend struct ElementIndexes;

    static constexpr std::uint32_t leaf = 0xffffffff;

    // What is copied of an immediate element, in half a cache line.
    struct Immediate {
        StructElement* element;
        long lastNode;        // depth-first index of its last node
        long offset;          // as it was when answers were first given
        std::uint32_t nested; // position among the nested structures, or leaf

        bool operator==(const Immediate& other) const {
            return element == other.element && lastNode == other.lastNode && nested == other.nested;
        }
    };

    // A copy of all that the places of nodes depend on.
    struct Numbering {
        std::vector<Immediate> elements; // those in front of the first without a valid type
        std::vector<long> raw; // scalar values up to the end of each element, by the counts of nested structures
        std::vector<Nested> nested;
        long numDFS = 0;
        int size = -1;                    // bytes of the structure
        std::optional<int> invalidTypeId; // of the first element without a valid type

        long lastNode(long element) const {
            return element < 0 ? 0 : elements[static_cast<std::size_t>(element)].lastNode;
        }
        long rawEnd(long element) const { return element < 0 ? 0 : raw[static_cast<std::size_t>(element)]; }

        bool operator==(const Numbering&) const = default;
    };

    struct NestedType;

    // One of the two answers that add up along the way to a node.
    struct Summands {
        long StructElement::*const field;
        long CachedElement::*const answer;
        const bool countsInstances;
        AskedSet asked = {};
        AskedSet askedOverUnset = {}; // those whose nested answer was -1, which the nested structure does not keep
        bool isUncopied = false;      // the copy is older than the numbering, and nothing was asked since
        long numMoved = 0;            // answers written down because their field differs from the copy

        bool wasAsked(long idx) const { return asked.contains(idx) || askedOverUnset.contains(idx); }
        bool wasNeverAsked() const { return asked.isEmpty() && askedOverUnset.isEmpty(); }
    };

    static const std::shared_ptr<ElementIndex>& shared(const DataTypeTable* table, int id, StructDataType& record);

    const Immediate& copied(long element) const { return numbering_.elements[static_cast<std::size_t>(element)]; }
    long lastNode(long element) const { return numbering_.lastNode(element); }
    long rawEnd(long element) const { return numbering_.rawEnd(element); }
    long elementAtNode(long idx) const;
    long& copyOf(long element, const Summands& what);
    Numbering read() const;
    CachedElement* findWritten(long idx);
    long sum(long idx, Summands ElementIndex::*which);
    void renew(Summands& what);
    void writeDown(Summands& what);
    void writeDown(AskedSet& asked);
    ElementIndex& nestedAt(const Place& at) { return at.nested->index->current(); }
    StructElement* keep(std::unique_ptr<StructElement> made);
    std::unique_ptr<StructElement> makeRoot() const;
    std::unique_ptr<StructElement> makeHead(const Place& at, const std::string& name);
    StructElement* headOf(const Place& at, long idx, CachedElement*& answer);
    void markElementsAnswered(long limit);
    bool hasWrittenAnswersBelow();
    long rawBeforeInOrder(long idx);
    long rawWithin(long idx);
    void readRaw();
    void appendLeaves(std::vector<long>& leaves, long base, long limit);
    [[noreturn]] void raiseInvalidType() const;

    const DataTypeTable* table_;
    int viewId_;
    StructDataType* record_; // null once the structure let go of this index
    Numbering numbering_;
    SpanSearch nodes_, raw_;           // in the numbering
    mutable long lastPlaced_ = -1;     // the element that place() found last
    std::vector<long> varDimsOffsets_; // copied as the offsets of the elements are
    unsigned long readAt_ = 0;

    boost::unordered_map<long, CachedElement>* written_; // the record's, or the own one
    boost::unordered_map<long, CachedElement> ownWritten_;
    AskedSet askedElements_;
    Summands offset_{&StructElement::offset, &CachedElement::offset, true};
    Summands varDimsOffset_{&StructElement::varDimsOffset, &CachedElement::varDimsOffset, false};
    std::vector<std::unique_ptr<StructElement>> made_; // roots and heads
    StructElement* root_ = nullptr;
    std::vector<std::shared_ptr<ElementIndex>> kept_; // of structures that were nested when answers were written down

    std::vector<long> rawBefore_; // sums over depth-first nodes in front of each immediate element
    unsigned long rawReadAt_ = 0;
    bool hasWrittenBelow_ = false;
    unsigned long writtenCheckedAt_ = 0;
};

} // namespace QLTypeSys::structures
