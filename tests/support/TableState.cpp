#include "tests/support/TableState.h"

#include <algorithm>
#include <sstream>

#include "qlplatform/strings/Strings.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataType;
using QLTypeSys::DataTypeTable;

namespace {

std::string bytes(const void* from, int count) {
    std::string text;
    for (int i = 0; from && i < count; ++i)
        text += std::to_string(static_cast<const unsigned char*>(from)[i]) + '.';
    return text;
}

// A function says that it is there and which it is, by its address.
template <class F> const void* address(F f) { return reinterpret_cast<const void*>(f); }

void put(std::ostream& out, const StructElement& e) {
    out << "\n  " << e.name << ' ' << e.dataTypeId << ' ' << e.unitId << ' ' << e.symbDimsId << " [";
    for (unsigned long i = 0; i < e.numDims; ++i)
        out << e.dims[i] << ' ';
    out << "] " << e.offset << ' ' << e.varDimsOffset << ' ' << e.signalType << e.samplingMode << e.dimensionsMode
        << ' ' << e.min << ' ' << e.max;
}

void put(std::ostream& out, const StructDataType& s) {
    out << "\n counts " << s.getNumElements() << ' ' << s.getNumFlatElements() << ' ' << s.getNumRawElements() << ' '
        << s.getNumDFSElements() << " flags " << s.hasFrameBasedElements() << s.hasVarDims() << s.hasAOB()
        << s.hasComplexData() << s.hasStringData() << s.hasHalfPrecisionData() << s.emitPaddingInCode() << s.isBusType()
        << " checksum " << bytes(s.getDtChecksumValue().words.data(), 16);
    for (const StructElement* e : s.getElements())
        put(out, *e);
}

void put(std::ostream& out, const DataType& r) {
    out << r.getId() << ' ' << r.getName() << ' ' << r.getShortName() << " source " << r.getDataTypeSource() << " kind "
        << r.getType() << " size " << r.getSize() << " storage " << r.getStorageId() << " to " << r.getIdAliasedTo()
        << " thru " << r.getIdAliasedThruTo() << " test " << r.getIdAliasedToForTesting() << " flags "
        << r.getAliasedToLocked() << r.getIsAliasToLocked() << r.isAtomic() << r.groundHasNonZeroStoredValue()
        << r.getNeedRegisterIdentifier() << r.getIsValidFixptType() << r.canContainNegativeNumbers() << r.getPlainCopy()
        << r.getPlainConstruct() << r.getPlainDestroy() << r.getIsPointerType() << r.getVisitFlag() << r.isImage()
        << r.isDynamicMatrix() << " ground " << r.getDefaultGround() << r.getConstructedGround();
    if (r.getSize() > 0 && r.getSize() < 4096) out << bytes(r.getGround(), r.getSize());
    out << " properties " << r.getPropertiesSize() << ' ' << bytes(r.getProperties(), r.getPropertiesSize())
        << " checksum " << bytes(r.getChecksumElements(), 16) << " contained " << r.getContainedDataType() << ' '
        << r.getContainedDataNumDims() << ' ' << r.containedDataType() << " target " << r.getTargetSize() << ' '
        << address(r.getHostToTargetFcn()) << ' ' << address(r.getTargetToHostFcn()) << ' ' << r.getInterface() << ' '
        << r.getCGType() << " depends";
    for (const int id : r.dependsOn())
        out << ' ' << id;
    out << "\n functions";
#define STEM(Stem, literal) out << ' ' << address(r.get##Stem##Fcn());
#define NAMED_STEM(Stem, literal, nameLiteral, isForwarded)                                                            \
    out << ' ' << address(r.get##Stem##Fcn()) << ' ' << r.get##Stem##FcnName();
#include "tests/types/PropertyStems.def"
}

} // namespace

std::vector<std::string> testsupport::stateOf(const DataTypeTable& table, const std::vector<std::string>& names) {
    std::vector<std::string> lines;
    for (unsigned long at = 0; at < static_cast<unsigned long>(table.getNumDataTypes()); ++at) {
        const DataType& record = *table.getDataTypeAt(at);
        std::ostringstream out;
        put(out, record);
        if (record.getIsType(QLTypeSys::dtqStruct)) put(out, static_cast<const StructDataType&>(record));
        lines.push_back(out.str());
        lines.push_back(std::string(record.getName()) + " is " + std::to_string(table.getDataTypeId(record.getName())) +
                        ", " + table.getDTACompliantString(record.getId()));
    }
    for (const std::string& name : names)
        lines.push_back(name + " is " + std::to_string(table.getDataTypeId(name.c_str())) + " custom " +
                        std::to_string(table.hasCustomDataTypeCallback(name.c_str())) + ' ' +
                        table.getHeaderFileForCustomType(name));
    std::vector<std::string> custom = table.getAllCustomDataTypeName();
    std::sort(custom.begin(), custom.end());
    lines.insert(lines.end(), custom.begin(), custom.end());
    return lines;
}

std::vector<std::string> testsupport::answersOf(const DataTypeTable& table, int id) {
    const QLTypeSys::ImmediateElementAccess immediate(&table, id);
    const QLTypeSys::DFSElementAccess dfs(&table, id);
    const QLTypeSys::FlatElementAccess flat(&table, id);
    const QLTypeSys::RawElementAccess raw(&table, id);
    std::vector<std::string> lines;
    const auto line = [&](const char* view, long idx, const auto&... parts) {
        std::ostringstream out;
        out << view << ' ' << idx;
        ((out << ' ' << parts), ...);
        lines.push_back(out.str());
    };
    for (long i = 0; i < immediate.getNumElements(); ++i)
        line("immediate", i, immediate.getName(i), immediate.getOffset(i), immediate.getPadding(i),
             immediate.getRawElementIdx(i));
    const long numNodes = dfs.getNumElements();
    for (long i = 0; i < numNodes + 3; ++i) {
        long element, instance, base, parentElement;
        int typeId, parent;
        dfs.computeDataTypeIdAndIndex(i, &element, &instance, &typeId, &base);
        dfs.getImmediateParentDTypeIdAndOffset(i, parent, parentElement);
        line("node", i, dfs.getName(i), dfs.getDataTypeId(i), dfs.getWidth(i), dfs.getOffset(i),
             dfs.getVarDimsOffset(i), dfs.getSignalType(i), element, instance, typeId, base, parent, parentElement,
             dfs.getRawElementIdx(i), dfs.getFlatElementIdx(i), qlsvUtf8FromUtf16(dfs.getFullPathAsString(i, true)));
    }
    const long numLeaves = flat.getNumElements();
    for (long i = 0; i < numLeaves + 2 && numLeaves > 0 && numNodes > 0; ++i)
        line("leaf", i, flat.getName(i), flat.getDFSIdx(i), flat.getDataTypeId(i), flat.getOffset(i),
             qlsvUtf8FromUtf16(flat.getFullPathAsString(i, false)));
    for (long i = 0; i < std::min(raw.getNumElements(), 300L); ++i)
        line("value", i, raw.getDataTypeId(i), raw.getUnitId(i), raw.getOffset(i));
    return lines;
}
