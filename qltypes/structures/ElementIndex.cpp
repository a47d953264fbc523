#include "qltypes/structures/ElementIndex_internal.h"

#include <algorithm>
#include <atomic>
#include <cstdint>

#include <sys/mman.h>

#include "qltypes/host/Failure_internal.h"
#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/TypeMemo_internal.h"
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys::structures {

namespace {

// Process-wide, so that an element need not know its structure. A lone counter: tables of several threads only make
// each other look again.
std::atomic<unsigned long> numEdits{1};

unsigned long edits() { return numEdits.load(std::memory_order_relaxed); }

// How far in front of a walk its elements are fetched.
constexpr long stepsAhead = 6;

// Up to here the quotient of two whole doubles reaches the next whole number only where the division does.
constexpr long exactInDouble = 1L << 53;

// Reserves room, in large pages where it takes some: filling it, and questions all over it, then wait less for the
// page. Where there are none, nothing is lost.
template <class T> void reserveLarge(std::vector<T>& vector, std::size_t count) {
    constexpr std::uintptr_t pageSize = 4096;
    constexpr std::size_t fewBytes = 4 << 20;
    vector.reserve(count);
    if (count * sizeof(T) < fewBytes) return;
    const auto begin = reinterpret_cast<std::uintptr_t>(vector.data());
    const std::uintptr_t firstPage = (begin + pageSize - 1) / pageSize * pageSize;
    madvise(reinterpret_cast<void*>(firstPage), begin + count * sizeof(T) - firstPage, MADV_HUGEPAGE);
}

} // namespace

void noteEdit() { numEdits.fetch_add(1, std::memory_order_relaxed); }

void ElementIndexes::release(boost::unordered_map<long, CachedElement>& answers, bool nobodyAsks) {
    bool anyIsHeld = false;
    const auto letGo = [&](ElementIndex& index) {
        index.record_ = nullptr;
        if (nobodyAsks) {
            index.numbering_ = {};
            index.kept_.clear();
        }
        anyIsHeld = true;
    };
    if (own && own.use_count() > 1) {
        own->ownWritten_.swap(answers);
        own->written_ = &own->ownWritten_;
        letGo(*own);
    }
    for (const auto& [id, index] : underAliases)
        if (index.use_count() > 1) letGo(*index);
    if (anyIsHeld) noteEdit();
}

bool ElementIndex::Nested::operator==(const Nested& other) const {
    return index == other.index && typeId == other.typeId && size == other.size && width == other.width &&
           numDFS == other.numDFS && numRaw == other.numRaw;
}

// What an index copies of the type of an element.
struct ElementIndex::NestedType {
    StructDataType* structure; // null for a leaf
    std::shared_ptr<ElementIndex> index;
    int size = 0;
    long numDFS = 0;
    long numRaw = 0;

    NestedType(const DataTypeTable* table, int id) {
        DataType* const type = table->getDataTypeAliasedThruTo(id);
        structure =
            id != DATA_TYPE_ID_AUTO && type->getIsType(dtqStruct) ? static_cast<StructDataType*>(type) : nullptr;
        if (!structure) return;
        index = shared(table, id, *structure);
        size = table->getDataTypeAt(static_cast<unsigned long>(id + 1))->getSize();
        numDFS = structure->getNumDFSElements();
        numRaw = structure->getNumRawElements();
    }
};

// --- Reading ---------------------------------------------------------------------------------------------------------

ElementIndex::ElementIndex(const DataTypeTable* table, int id, StructDataType& record)
    : table_(table), viewId_(id), record_(&record),
      written_(id == record.getId() ? &record.cachedElements_ : &ownWritten_) {}

ElementIndex& ElementIndex::of(const DataTypeTable* table, int id) {
    return shared(table, id, *static_cast<StructDataType*>(table->getDataTypeAliasedThruTo(id)))->current();
}

const std::shared_ptr<ElementIndex>& ElementIndex::shared(const DataTypeTable* table, int id, StructDataType& record) {
    if (!record.indexes_) record.indexes_ = std::make_unique<ElementIndexes>();
    ElementIndexes& indexes = *record.indexes_;
    if (id == record.getId()) {
        if (!indexes.own) indexes.own = std::make_shared<ElementIndex>(table, id, record);
        return indexes.own;
    }
    for (const auto& [aliasId, index] : indexes.underAliases)
        if (aliasId == id) return index;
    return indexes.underAliases.emplace_back(id, std::make_shared<ElementIndex>(table, id, record)).second;
}

void ElementIndex::forget(StructDataType& record) {
    if (record.indexes_) record.indexes_->release(record.cachedElements_, true);
    record.indexes_.reset();
    record.cachedElements_.clear();
}

ElementIndex& ElementIndex::current() {
    const unsigned long now = edits();
    if (readAt_ == now || !record_) return *this;
    Numbering numbering = read();
    if (numbering != numbering_) {
        writeDown(askedElements_);
        writeDown(offset_);
        writeDown(varDimsOffset_);
        for (const Nested& nested : numbering_.nested) // written answers may point to heads that these made
            if (std::find(kept_.begin(), kept_.end(), nested.index) == kept_.end()) kept_.push_back(nested.index);
        SpanSearch nodes, raw;
        nodes.prepare(std::ssize(numbering.elements), [&](long i) { return numbering.lastNode(i); });
        raw.prepare(std::ssize(numbering.elements), [&](long i) { return numbering.rawEnd(i); });
        // Nothing from here on can fail.
        numbering_ = std::move(numbering);
        nodes_ = std::move(nodes);
        raw_ = std::move(raw);
        askedElements_.reset(numbering_.numDFS); // now that it has another number of nodes
        root_ = nullptr;
        offset_.numMoved = 0;
        varDimsOffset_.isUncopied = true; // few ask for them: no walk over all elements before the first does
    }
    readAt_ = numbering_.invalidTypeId ? 0 : now;
    return *this;
}

ElementIndex::Numbering ElementIndex::read() const {
    const std::vector<StructElement*>& elements = record_->getElements();
    Numbering made;
    made.size = table_->getDataTypeAt(static_cast<unsigned long>(viewId_ + 1))->getSize();
    made.numDFS = record_->getNumDFSElements();
    reserveLarge(made.elements, elements.size());
    reserveLarge(made.raw, elements.size());
    TypeMemo<NestedType, const DataTypeTable*> types(table_);
    long lastNode = 0;
    long raw = 0;
    for (StructElement* element : elements) {
        if (!table_->isDataTypeIdValid(element->dataTypeId)) {
            made.invalidTypeId = element->dataTypeId;
            break;
        }
        if (!element->isIndexed_) element->isIndexed_ = true; // a write costs memory the way back
        const NestedType& type = types.of(element->dataTypeId);
        const long width = element->getWidth();
        std::uint32_t position = leaf;
        if (!type.structure) {
            lastNode = wrappingAdd(lastNode, 1);
            raw = wrappingAdd(raw, element->signalType == 1 ? wrappingMultiply(width, 2) : width);
        } else {
            position = static_cast<std::uint32_t>(made.nested.size());
            made.nested.push_back({type.index, element->dataTypeId, type.size, width, type.numDFS, type.numRaw});
            lastNode =
                wrappingAdd(lastNode, width > 1 ? wrappingAdd(wrappingMultiply(width, type.numDFS), 1) : type.numDFS);
            raw = wrappingAdd(raw, wrappingMultiply(width, type.numRaw));
        }
        made.elements.push_back({element, lastNode, element->offset, position});
        made.raw.push_back(raw);
    }
    return made;
}

void ElementIndex::raiseInvalidType() const {
    failure::raise("QuillaneTypes:general", "InvalidDataTypeId", *numbering_.invalidTypeId);
}

// --- Places ----------------------------------------------------------------------------------------------------------

const ElementIndex::Nested* ElementIndex::nestedIn(long element) const {
    const std::uint32_t position = copied(element).nested;
    return position == leaf ? nullptr : &numbering_.nested[position];
}

long ElementIndex::elementAtNode(long idx) const {
    return nodes_.find(idx, [this](long i) { return lastNode(i); });
}

ElementIndex::Place ElementIndex::place(long idx) const {
    Place at;
    const long numNodes = numbering_.numDFS;
    if (idx <= 0 || numNodes <= 0) return at;
    if (idx >= numNodes || numNodes >= exactInDouble) {
        const long quotient = quotientInDouble(idx, numNodes);
        if (quotient > 0) {
            at.instance = quotient;
            at.base = wrappingMultiply(at.instance, numNodes);
            return at;
        }
    }
    const long element = elementAtNode(idx);
    if (element == numImmediate()) { // the structure says to have more nodes than its elements have
        if (numbering_.invalidTypeId) raiseInvalidType();
        return at;
    }
    if (element == lastPlaced_ + 1 && element + stepsAhead < numImmediate()) { // a walk: they lie in memory
        const auto* const next = reinterpret_cast<const char*>(&immediate(element + stepsAhead));
        __builtin_prefetch(next);
        __builtin_prefetch(next + 64);
        __builtin_prefetch(next + 128);
    }
    lastPlaced_ = element;
    const long before = lastNode(element - 1);
    at.element = element;
    at.nested = nestedIn(element);
    if (!at.nested || at.nested->width <= 1) {
        at.base = before + 1;
    } else if (idx == before + 1) {
        at.instance = -1;
    } else {
        at.instance = (idx - before - 2) / at.nested->numDFS;
        at.base = before + 2 + at.nested->numDFS * at.instance;
    }
    return at;
}

// --- Elements of nodes -----------------------------------------------------------------------------------------------

CachedElement* ElementIndex::findWritten(long idx) {
    if (written_->empty()) return nullptr;
    const auto found = written_->find(idx);
    return found == written_->end() ? nullptr : &found->second;
}

StructElement* ElementIndex::element(long idx) {
    CachedElement* answer = findWritten(idx);
    if (answer && answer->element) return answer->element;
    const Place at = place(idx);
    StructElement* found;
    if (at.isRoot())
        found = answer ? makeRoot().release() : root_ ? root_ : root_ = keep(makeRoot());
    else if (at.isPastTheEnd())
        found = element(idx - at.base);
    else if (at.isArrayNode() || at.isLeaf())
        found = copied(at.element).element;
    else if (at.isHead(idx))
        found = headOf(at, idx, answer);
    else
        found = nestedAt(at).element(idx - at.base);
    if (answer) {
        answer->element = found;
        answer->ownsElement = at.isRoot() || at.isHead(idx);
    } else {
        askedElements_.add(idx);
    }
    return found;
}

StructElement* ElementIndex::headOf(const Place& at, long idx, CachedElement*& answer) {
    const std::string& nameNow = immediate(at.element).name;
    if (!answer) {
        Nested& nested = numbering_.nested[static_cast<std::size_t>(at.nested - numbering_.nested.data())];
        if (!nested.name) nested.name = nameNow;
        if (askedElements_.contains(idx) || *nested.name == nameNow) {
            if (!nested.head) nested.head = keep(makeHead(at, *nested.name));
            return nested.head;
        }
        answer = &written(idx, false); // renamed since another instance was asked
    }
    return makeHead(at, nameNow).release();
}

StructElement* ElementIndex::keep(std::unique_ptr<StructElement> made) {
    made_.push_back(std::move(made));
    return made_.back().get();
}

std::unique_ptr<StructElement> ElementIndex::makeRoot() const {
    auto root = std::make_unique<StructElement>();
    root->dataTypeId = viewId_;
    root->setNumDimensions(1);
    root->setDimension(0, 1);
    root->unitId = 0;
    root->signalType = root->samplingMode = root->dimensionsMode = 0;
    return root;
}

std::unique_ptr<StructElement> ElementIndex::makeHead(const Place& at, const std::string& name) {
    const StructElement& root = *nestedAt(at).element(0);
    auto head = std::make_unique<StructElement>();
    head->name = name;
    head->signalType = head->samplingMode = head->dimensionsMode = 0; // kept: not those of the element
    head->dataTypeId = root.dataTypeId;
    head->setNumDimensions(static_cast<long>(root.numDims));
    for (long i = 0; i < static_cast<long>(root.numDims); ++i)
        head->setDimension(i, root.dims[i]);
    head->symbDimsId = root.symbDimsId;
    head->unitId = root.unitId;
    head->min = root.min;
    head->max = root.max;
    return head;
}

// --- Offsets of nodes ------------------------------------------------------------------------------------------------

long ElementIndex::offset(long idx) { return sum(idx, &ElementIndex::offset_); }

long ElementIndex::varDimsOffset(long idx) { return sum(idx, &ElementIndex::varDimsOffset_); }

long ElementIndex::sum(long idx, Summands ElementIndex::*which) {
    Summands& what = this->*which;
    if (what.isUncopied) renew(what);
    CachedElement* const answer = findWritten(idx);
    if (answer && answer->*what.answer != -1) return answer->*what.answer;
    const Place at = place(idx);
    long total = 0;
    bool moved = false;
    if (what.countsInstances && at.instance > 0)
        total = wrappingMultiply(at.instance, at.nested ? at.nested->size : numbering_.size);
    if (at.element >= 0) {
        long own = copyOf(at.element, what);
        if (answer || !what.wasAsked(idx)) { // elements that were asked may be gone
            const long now = immediate(at.element).*what.field;
            moved = now != own;
            own = now;
        }
        total = wrappingAdd(total, own);
    }
    if (moved && !answer && (what.wasNeverAsked() || what.numMoved > numImmediate())) {
        renew(what);
        moved = false;
    }
    long below = 0;
    if (!answer && what.askedOverUnset.contains(idx))
        below = -1;
    else if (at.isPastTheEnd())
        below = sum(idx - at.base, which);
    else if (at.nested && at.base >= 0)
        below = nestedAt(at).sum(idx - at.base, which);
    total = wrappingAdd(total, below);
    if (answer) {
        answer->*what.answer = total;
    } else if (moved) {
        written(idx, false).*what.answer = total;
        ++what.numMoved;
    } else if (total != -1) { // kept: -1 is no answer to keep
        (below == -1 ? what.askedOverUnset : what.asked).add(idx);
    }
    return total;
}

// Copies the field again, after writing down what was answered from the copy.
void ElementIndex::renew(Summands& what) {
    writeDown(what);
    varDimsOffsets_.resize(numbering_.elements.size());
    what.numMoved = 0;
    what.isUncopied = false;
    for (long i = 0; i < numImmediate(); ++i)
        copyOf(i, what) = immediate(i).*what.field;
}

long& ElementIndex::copyOf(long element, const Summands& what) {
    const auto position = static_cast<std::size_t>(element);
    return &what == &offset_ ? numbering_.elements[position].offset : varDimsOffsets_[position];
}

// --- Written answers -------------------------------------------------------------------------------------------------

CachedElement& ElementIndex::written(long idx, bool takeOwnership) {
    if (CachedElement* const found = findWritten(idx)) return *found;
    StructElement* const element = askedElements_.contains(idx) ? this->element(idx) : nullptr;
    const long offset = offset_.wasAsked(idx) ? this->offset(idx) : -1;
    const long varDimsOffset = varDimsOffset_.wasAsked(idx) ? this->varDimsOffset(idx) : -1;
    if (written_->empty()) noteEdit();
    CachedElement& made = (*written_)[idx];
    made.element = element;
    made.offset = offset;
    made.varDimsOffset = varDimsOffset;
    if (takeOwnership && element) {
        const Place at = place(idx);
        const auto keeper = std::find_if(made_.begin(), made_.end(), [&](const auto& e) { return e.get() == element; });
        if (keeper != made_.end() && (at.isRoot() || at.isHead(idx))) {
            made.ownsElement = true;
            keeper->release();
            made_.erase(keeper);
        }
    }
    return made;
}

void ElementIndex::writeDown(AskedSet& asked) {
    asked.forEach([&](long idx) { written(idx, false); });
    asked.reset(numbering_.numDFS);
}

void ElementIndex::writeDown(Summands& what) {
    writeDown(what.asked);
    writeDown(what.askedOverUnset);
}

bool ElementIndex::hasWrittenAnswersBelow() {
    const unsigned long now = edits();
    if (writtenCheckedAt_ == now) return hasWrittenBelow_;
    writtenCheckedAt_ = now; // before the nested ones are asked: a faulty structure may contain itself
    hasWrittenBelow_ = false;
    bool found = !written_->empty();
    try {
        for (const Nested& nested : numbering_.nested)
            found = found || nested.index->current().hasWrittenAnswersBelow();
    } catch (...) {
        writtenCheckedAt_ = 0;
        throw;
    }
    return hasWrittenBelow_ = found;
}

// As if element() had been called for every index below the limit.
void ElementIndex::markElementsAnswered(long limit) {
    if (numbering_.invalidTypeId) limit = std::min(limit, lastNode(numImmediate() - 1) + 1);
    const long end = std::min(limit, numbering_.numDFS);
    const long from = std::max(askedElements_.below(), 1L);
    for (long i = from < end ? elementAtNode(from) : numImmediate(); i < numImmediate(); ++i) {
        const std::uint32_t position = copied(i).nested;
        if (position == leaf) continue;
        Nested& nested = numbering_.nested[position];
        const long first = lastNode(i - 1) + (nested.width > 1 ? 2 : 1);
        if (first >= end) break;
        const std::string& nameNow = immediate(i).name;
        if (!nested.name) nested.name = nameNow;
        if (*nested.name != nameNow) // instances that were not asked have the new name
            for (long instance = 0; instance < std::max(nested.width, 1L) && first + instance * nested.numDFS < end;
                 ++instance)
                element(first + instance * nested.numDFS);
        nested.index->current().markElementsAnswered(std::min(nested.numDFS, end - first));
    }
    askedElements_.addBelow(limit);
}

// --- Raw values and leaves -------------------------------------------------------------------------------------------

long ElementIndex::elementAtRaw(long rawIdx, long from) const {
    const long element = raw_.find(
        wrappingAdd(rawIdx, 1), [this](long i) { return rawEnd(i); }, from);
    if (element == numImmediate() && numbering_.invalidTypeId) raiseInvalidType();
    return element;
}

long ElementIndex::rawSpansBefore(long element) const {
    if (element > numImmediate() && numbering_.invalidTypeId) raiseInvalidType();
    return rawEnd(std::clamp(element, 0L, numImmediate()) - 1);
}

long ElementIndex::rawBefore(long idx) {
    if (idx < 1) return 0;
    if (hasWrittenAnswersBelow()) return rawBeforeInOrder(idx);
    const long numNodes = numbering_.numDFS;
    markElementsAnswered(idx);
    if (numNodes <= 0) return 0;
    if (idx <= numNodes) return rawWithin(idx);
    return wrappingAdd(wrappingMultiply(idx / numNodes, rawWithin(numNodes)), rawWithin(idx % numNodes));
}

// Where answers are written down, each node may be another than the numbering says.
long ElementIndex::rawBeforeInOrder(long idx) {
    long raw = 0;
    for (long i = 0; i < idx; ++i) {
        const StructElement& node = *element(i);
        if (node.dataTypeId != DATA_TYPE_ID_AUTO &&
            table_->getDataTypeAliasedThruTo(node.dataTypeId)->getIsType(dtqStruct))
            continue;
        const long width = node.getWidth();
        raw = wrappingAdd(raw, node.signalType == 1 ? wrappingMultiply(width, 2) : width);
    }
    return raw;
}

// For indices up to the number of nodes.
long ElementIndex::rawWithin(long idx) {
    if (idx <= 1) return 0;
    readRaw();
    const long element = elementAtNode(idx);
    if (element == numImmediate()) {
        if (numbering_.invalidTypeId) raiseInvalidType();
        return rawBefore_.back();
    }
    const long before = rawBefore_[static_cast<std::size_t>(element)];
    const Nested* const nested = nestedIn(element);
    const long within = idx - lastNode(element - 1) - 1;
    if (!nested || within == 0) return before;
    ElementIndex& index = nested->index->current();
    if (nested->width <= 1) return wrappingAdd(before, index.rawWithin(within));
    const long instance = (within - 1) / nested->numDFS;
    return wrappingAdd(before, wrappingAdd(wrappingMultiply(instance, index.rawWithin(nested->numDFS)),
                                           index.rawWithin((within - 1) % nested->numDFS)));
}

void ElementIndex::readRaw() {
    if (rawReadAt_ == readAt_ && readAt_ == edits()) return;
    rawBefore_.reserve(numbering_.elements.size() + 1);
    rawBefore_.assign(1, 0);
    rawReadAt_ = readAt_; // before the nested ones are asked: a faulty structure may contain itself
    try {
        for (long i = 0; i < numImmediate(); ++i) {
            if (lastNode(i) >= numbering_.numDFS) break; // no index lies behind it
            const Nested* const nested = nestedIn(i);
            long raw = wrappingSubtract(rawEnd(i), rawEnd(i - 1));
            if (nested) // kept: one instance for a width of 0 or less
                raw = wrappingMultiply(std::max(nested->width, 1L), nested->index->current().rawWithin(nested->numDFS));
            rawBefore_.push_back(wrappingAdd(rawBefore_.back(), raw));
        }
    } catch (...) {
        rawReadAt_ = 0;
        throw;
    }
}

std::vector<long> ElementIndex::leaves() {
    std::vector<long> leaves;
    const long numNodes = numbering_.numDFS;
    if (!hasWrittenAnswersBelow()) {
        markElementsAnswered(numNodes);
        appendLeaves(leaves, 0, numNodes);
        return leaves;
    }
    for (long idx = 0; idx < numNodes; ++idx) {
        const int typeId = element(idx)->dataTypeId;
        if (typeId == DATA_TYPE_ID_AUTO || !table_->getDataTypeAliasedThruTo(typeId)->getIsType(dtqStruct))
            leaves.push_back(idx);
    }
    return leaves;
}

// Those below `limit` in this numbering, shifted by `base`.
void ElementIndex::appendLeaves(std::vector<long>& leaves, long base, long limit) {
    for (long i = 0; i < numImmediate(); ++i) {
        const long first = lastNode(i - 1) + 1;
        if (first >= limit) return;
        const Nested* const nested = nestedIn(i);
        if (!nested) {
            leaves.push_back(base + first);
            continue;
        }
        if (nested->numDFS <= 0) continue;
        ElementIndex& index = nested->index->current();
        if (nested->width <= 1) {
            index.appendLeaves(leaves, base + first, std::min(nested->numDFS, limit - first));
            continue;
        }
        long start = first + 1; // behind the array node
        for (long instance = 0; instance < nested->width && start < limit; ++instance, start += nested->numDFS)
            index.appendLeaves(leaves, base + start, std::min(nested->numDFS, limit - start));
    }
    if (numbering_.invalidTypeId && lastNode(numImmediate() - 1) + 1 < limit) raiseInvalidType();
}

} // namespace QLTypeSys::structures
