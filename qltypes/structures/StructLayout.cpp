#include "qltypes/structures/StructLayout.h"

#include <algorithm>
#include <cstring>
#include <limits>

#include "qltypes/host/Failure_internal.h"
#include "qltypes/structures/Arithmetic_internal.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/TypeMemo_internal.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;
using namespace QLTypeSys::structures;
namespace failure = QLTypeSys::failure;

namespace {

constexpr unsigned long largestSize = 0x7fffffff;

unsigned long roundedUp(unsigned long offset, unsigned long powerOfTwo) {
    return (offset + powerOfTwo - 1) & ~(powerOfTwo - 1);
}

// What the pass needs of an element's type.
struct ElementType {
    const StructDataType* nested; // null for a leaf
    const void* ground;           // null where there are not `size` bytes of it
    unsigned long size;
    unsigned long alignment; // 0: by DtCorrectOffsetForProperAlignment
    bool groundHasNonZero;   // as the type says; its bytes may say otherwise
    bool groundIsZero;       // all bytes

    ElementType(const DataTypeTable* table, int id) {
        const DataType* const resolved = table->getDataTypeAliasedThruTo(id); // raises for an invalid id
        const DataType* const entry = table->getDataTypeAt(static_cast<unsigned long>(id + 1));
        nested = id != DATA_TYPE_ID_AUTO && resolved->getIsType(QLTypeSys::dtqStruct)
                     ? static_cast<const StructDataType*>(resolved)
                     : nullptr;
        const int bytes = entry->getSize();
        // An alias keeps the size that its target had: of what the target is now there may be fewer bytes.
        ground = resolved->getSize() >= bytes ? entry->getGround() : nullptr;
        size = static_cast<unsigned long>(bytes);
        alignment = bytes > 7 ? 8 : bytes > 3 ? 4 : bytes > 1 ? 2 : 1;
        if (CheckForBuiltInDataType(entry->getIdAliasedThruTo()) && size != alignment) alignment = 0;
        groundHasNonZero = resolved->groundHasNonZeroStoredValue();
        const auto* const first = static_cast<const unsigned char*>(ground);
        groundIsZero =
            !first || bytes <= 0 || std::all_of(first, first + bytes, [](unsigned char b) { return b == 0; });
    }

    unsigned long aligned(unsigned long offset) const {
        if (alignment != 0) return roundedUp(offset, alignment);
        bool overflow;
        return DtCorrectOffsetForProperAlignment(offset, size, &overflow);
    }
};

long complexWidth(const StructElement& element) {
    const long width = element.getWidth();
    return element.signalType == 1 ? wrappingMultiply(width, 2) : width;
}

} // namespace

// One run over one structure.
struct StructLayoutPass {
    const DataTypeTable* table;
    int id; // as the caller named it
    StructDataType& record;
    unsigned long offset = 0; // of the next byte
    long numFlat = 0;
    long numRaw = 0;
    long numDFS = 1; // the root
    bool groundHasNonZero = false;
    bool groundIsZero = true;
    TypeMemo<ElementType, const DataTypeTable*> types{table};

    qlsvDiagnosticImpl* run();
    bool place(StructElement& element, bool isLast);
    void buildGround();

  private:
    class Former;
};

// False when the structure grew beyond the limit.
bool StructLayoutPass::place(StructElement& element, bool isLast) {
    const ElementType& type = types.of(element.dataTypeId);
    groundHasNonZero |= type.groundHasNonZero;
    groundIsZero &= type.groundIsZero;
    offset = type.aligned(offset);
    element.setOffset(static_cast<long>(offset));
    const long width = complexWidth(element);
    offset += type.size * static_cast<unsigned long>(width);
    if (type.nested) { // kept: a nested structure whose element says complex counts twice
        numRaw = wrappingAdd(numRaw, wrappingMultiply(width, type.nested->getNumRawElements()));
        numFlat = wrappingAdd(numFlat, wrappingMultiply(width, type.nested->getNumFlatElements()));
        numDFS = wrappingAdd(numDFS, wrappingMultiply(width, type.nested->getNumDFSElements()) + (width > 1 ? 1 : 0));
    } else {
        numFlat = wrappingAdd(numFlat, 1);
        numRaw = wrappingAdd(numRaw, width);
        numDFS = wrappingAdd(numDFS, 1);
    }
    if (isLast) offset = roundedUp(offset, 8);
    return offset <= largestSize;
}

// Writes each element's ground, side by side as often as it is wide. Padding stays as it is.
void StructLayoutPass::buildGround() {
    for (const StructElement* element : record.elements_) {
        const ElementType& type = types.of(element->dataTypeId);
        const auto size = static_cast<long>(type.size);
        const long room = record.size_ - element->offset; // widths below 0 let elements lie past the end
        const long bytes = std::min(wrappingMultiply(size, complexWidth(*element)), room);
        if (!type.ground || bytes < size || size <= 0) continue;
        unsigned char* const first = record.ground_ + element->offset;
        std::memcpy(first, type.ground, type.size);
        for (long done = size; done < bytes;) { // what is written doubles with each step
            const long step = std::min(done, bytes - done);
            std::memcpy(first + done, first, static_cast<std::size_t>(step));
            done += step;
        }
    }
}

// Puts back what a layout stores before it needs memory for the ground.
class StructLayoutPass::Former {
  public:
    explicit Former(StructDataType& record)
        : record_(record), counts_{record.numFlatElements_, record.numRawElements_, record.numDFSElements_},
          plainFlags_{record.plainCopy_, record.plainConstruct_, record.plainDestroy_},
          propertiesCached_(record.propertiesCached_), derived_(record.derived_) {}

    void putBack() const {
        for (StructElement* element : record_.elements_)
            element->setOffset(-1);
        record_.setNumFlatElements(counts_[0]);
        record_.setNumRawElements(counts_[1]);
        record_.setNumDFSElements(counts_[2]);
        record_.plainCopy_ = plainFlags_[0];
        record_.plainConstruct_ = plainFlags_[1];
        record_.plainDestroy_ = plainFlags_[2];
        record_.propertiesCached_ = propertiesCached_;
        record_.derived_ = derived_;
    }

  private:
    StructDataType& record_;
    const long counts_[3];
    const bool plainFlags_[3];
    const bool propertiesCached_;
    const FrequentlyAccessedProperties derived_;
};

qlsvDiagnosticImpl* StructLayoutPass::run() {
    const Former former(record);
    record.createCacheForFrequentlyAccessedProperties(table);
    const std::vector<StructElement*>& elements = record.getElements();
    if (elements.empty()) return nullptr;
    for (StructElement* element : elements) {
        if (!place(*element, element == elements.back()))
            return failure::diagnosticOf(failure::message("Quillane:General", "InvalidDataTypeSizeInDataTypeTable",
                                                          largestSize, DtGetDataTypeName(table, id)));
    }
    const bool isFirstLayout = record.getSize() == -1; // then the ground starts zero-filled
    record.setNumFlatElements(numFlat);
    record.setNumRawElements(numRaw);
    record.setNumDFSElements(numDFS);
    try {
        record.setSize(static_cast<int>(offset));
    } catch (const foundation::core::except::IException& e) {
        if (e.diagnostic() && e.diagnostic()->isOutOfMemory()) former.putBack(); // then it never had a size
        throw;
    }
    record.setGroundHasNonZeroStoredValue(groundHasNonZero);
    if (!groundIsZero || !isFirstLayout) buildGround();
    return nullptr;
}

qlsvDiagnosticImpl* DtComputeDerivedStructAttributes(DataTypeTable* table, int id) {
    qlsvDiagnosticImpl* tooLarge = nullptr;
    qlsvDiagnosticImpl* raised = failure::diagnosticFrom([&] {
        tooLarge = StructLayoutPass{table, id, *DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)}.run();
    });
    return raised ? raised : tooLarge;
}

unsigned long DtCorrectOffsetForProperAlignment(unsigned long offset, unsigned long size, bool* overflow) {
    if (size != 0 && size % 2 == 0) {
        const unsigned long toEight = -offset % 8;
        const unsigned long toSize = (size - offset % size) % size;
        offset += std::min(toEight, toSize);
    }
    if (overflow) *overflow = offset > largestSize;
    return offset;
}
