// Aliases, replacement, storage identifiers and custom types.
#include <cstdio>

#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/AliasDataType.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/NameIndex_internal.h"

namespace QLTypeSys {

namespace {

constexpr const char* general = "QuillaneTypes:general";

// Whether the type, once it is an alias of the target, would come back to itself: by what it names or by where it ends,
// which a replacement may have parted.
bool isLoop(const DataTypeTable& table, int id, int target) {
    if (target == id || table.alreadyAliasedToDirectlyOrIndirectly(target, id)) return true;
    const auto endOf = [&](int step) {
        return table.getDataTypeAt(static_cast<unsigned long>(step + 1))->getIdAliasedThruTo();
    };
    int step = target;
    while (step != id && endOf(step) != step)
        step = endOf(step);
    return step == id;
}

} // namespace

int DataTypeTable::registerAliasDataType(const char* name, DataTypeSource source, int aliasedTo,
                                         const char* blockName) {
    validateDataTypeName(name);
    if (!isDataTypeIdValid(aliasedTo))
        failure::raise(QuillaneTypes::general::UndefinedDataTypeToBeAliasedTo(name, aliasedTo));
    int existing;
    if (isRegisteredAlready(name, source, existing)) return existing;
    const DataType* target = recordAt(aliasedTo);
    // About to replace a record that the target reaches: the new alias would stand for itself.
    if (existing != DATA_TYPE_ID_INVALID && isLoop(*this, existing, aliasedTo))
        failure::raise(general, "DataTypeAliasLoop", name, target->getName());
    const DataType* thru = recordAt(target->getIdAliasedThruTo());
    return enter(std::make_unique<AliasDataType>(nextId(), name, source, target, thru), existing, blockName);
}

int DataTypeTable::registerOpaqueDataType(const DataType* source, const char*) {
    const char* name = source->getName();
    validateDataTypeName(name);
    int existing;
    if (isRegisteredAlready(name, dtSourceOpaque, existing)) return existing;
    auto record = std::make_unique<DataType>(nextId(), name, dtSourceOpaque);
    record->setSize(source->getSize());
    record->setConstructFcn(source->getConstructFcn());
    record->setDestructFcn(source->getDestructFcn());
    record->setDeepCopyFcn(source->getDeepCopyFcn());
    if (const SerializeFcn f = source->getSerializeFcn()) record->setSerializeFcn(f);
    if (const DeserializeFcn f = source->getDeserializeFcn()) record->setDeserializeFcn(f);
    if (const SerializeSizeFcn f = source->getSerializeSizeFcn()) record->setSerializeSizeFcn(f);
    record->setConstructFcnName(source->getConstructFcnName());
    record->setDestructFcnName(source->getDestructFcnName());
    record->setDeepCopyFcnName(source->getDeepCopyFcnName());
    if (!source->getSerializeFcnName().empty()) record->setSerializeFcnName(source->getSerializeFcnName());
    if (!source->getDeserializeFcnName().empty()) record->setDeserializeFcnName(source->getDeserializeFcnName());
    if (!source->getSerializeSizeFcnName().empty()) record->setSerializeSizeFcnName(source->getSerializeSizeFcnName());
    addDataType(record.get()); // kept: no client check and no replacement, also under an existing name
    return record.release()->getId();
}

void DataTypeTable::replaceDataType(DataType* old, DataType* replacement) {
    const int id = old->getId();
    const std::string oldName = old->getName();
    dataTypeIdsByName_->assign(replacement->getName(), id); // may run out of memory; nothing behind it can
    dataTypes_[static_cast<std::size_t>(id + 1)] = replacement;
    for (DataType* record : dataTypes_) {
        if (record->getIdAliasedTo() != DATA_TYPE_ID_INVALID) {
            if (record->getIdAliasedTo() == id) record->updateAliasedToType(replacement);
            if (record->getIdAliasedThruTo() == id) record->updateAliasedThruToType(replacement);
        }
        clearStructureCaches(record);
    }
    replacement->id_ = id;
    replacement->storageId_ = old->storageId_;
    dataTypes_.pop_back();
    if (oldName != replacement->getName()) dataTypeIdsByName_->erase(oldName);
    delete old;
}

void DataTypeTable::setDataTypeIdAliasedTo(int id, int target) {
    DataType* record = recordAt(id);
    if (!isDataTypeIdValid(target))
        failure::raise(QuillaneTypes::general::UndefinedDataTypeToBeAliasedTo(record->getName(), target));
    const int present = record->getIdAliasedTo();
    if (present == target) return;
    if (present != DATA_TYPE_ID_INVALID)
        failure::raise(general, "InconsistentDataTypeIdAliasedTo", record->getName(), recordAt(target)->getName(),
                       recordAt(present)->getName());
    if (record->getAliasedToLocked()) failure::raise(general, "CannotSetAliasForDefinedType", record->getName());
    if (isLoop(*this, id, target))
        failure::raise(general, "DataTypeAliasLoop", record->getName(), recordAt(target)->getName());
    const DataType* thru = recordAt(recordAt(target)->getIdAliasedThruTo());
    auto made = std::make_unique<AliasDataType>(record, recordAt(target), thru);
    dataTypeIdsByName_->assign(made->getName(), id);
    AliasDataType* const alias = made.release();
    dataTypes_[static_cast<std::size_t>(id + 1)] = alias;
    for (DataType* other : dataTypes_) {
        if (other->getIdAliasedTo() != other->getId() && other->getIdAliasedTo() == id)
            other->updateAliasedToType(alias);
        // kept: an alias that ended here now ends at the new alias and forwards in two hops
        if (other->getIdAliasedThruTo() == id) other->updateAliasedThruToType(alias);
    }
    noteStructureEdit();                // an element of this type may be a nested structure now
    if (record->getIsType(dtqStruct)) { // its elements go: views of structures around it may have answered with them
        for (DataType* other : dataTypes_)
            clearStructureCaches(other);
    }
    delete record;
}

bool DataTypeTable::alreadyAliasedToDirectlyOrIndirectly(int id, int target) const {
    do {
        id = getDataTypeIdAliasedTo(id);
    } while (id != DATA_TYPE_ID_INVALID && id != target);
    return id != DATA_TYPE_ID_INVALID;
}

int DataTypeTable::getDataTypeIdCommonAncestor(int a, int b) const {
    if (a == b) return a;
    const int end = recordAt(a)->getIdAliasedThruTo();
    if (end != recordAt(b)->getIdAliasedThruTo()) return DATA_TYPE_ID_INVALID;
    if (a == end || b == end) return end;
    const auto markWalkFromA = [&](bool visited) {
        for (int id = a; id != DATA_TYPE_ID_INVALID; id = getDataTypeIdAliasedTo(id))
            recordAt(id)->setVisitFlag(visited);
    };
    markWalkFromA(true);
    int found = b; // chains that a replacement cut apart share no record: the walk then ends at -10
    while (found != DATA_TYPE_ID_INVALID && !recordAt(found)->getVisitFlag())
        found = getDataTypeIdAliasedTo(found);
    markWalkFromA(false);
    return found;
}

void DataTypeTable::setDataTypeStorageId(int id, int storageId) {
    DataType* record = recordAt(id);
    if (record->getIdAliasedTo() != DATA_TYPE_ID_INVALID)
        failure::raise(QuillaneTypes::general::CannotSetPropertyOfAliasType("StorageId", record->getName()));
    if (storageId >= 9 && !DtIsImageType(this, id)) // negative ids pass (kept)
        failure::raise(general, "IllegalDataTypeToBeStorageId", record->getName(), recordAt(storageId)->getName());
    const int present = record->getStorageId();
    if (present == record->getId()) {
        record->setStorageId(storageId);
        record->setAliasedToLocked(true);
    } else if (present != storageId) {
        failure::raise(general, "InconsistentDataTypeStorageId", record->getName(), recordAt(storageId)->getName(),
                       recordAt(present)->getName());
    }
}

// --- Custom types ----------------------------------------------------------------------------------------------------

bool DataTypeTable::hasCustomDataTypeCallback(const char* name) const {
    return name && customDataTypeCallbacks_.find(name) != customDataTypeCallbacks_.end();
}

void DataTypeTable::insertCustomDataTypeCallback(const char* name, CustomDataTypeCallback callback) {
    customDataTypeCallbacks_.emplace(name, callback);
}

int DataTypeTable::executeCustomDataTypeCallback(const char* name) {
    return customDataTypeCallbacks_[name](this, name);
}

std::vector<std::string> DataTypeTable::getAllCustomDataTypeName() const {
    std::vector<std::string> names;
    for (const auto& entry : customDataTypeCallbacks_)
        names.push_back(entry.first);
    return names;
}

void DataTypeTable::insertCustomDataTypeHeaderFilePair(const std::string& type, const std::string& header) {
    customDataTypeHeaderFiles_.emplace(type, header);
}

std::string DataTypeTable::getHeaderFileForCustomType(const std::string& type) const {
    const auto found = customDataTypeHeaderFiles_.find(type);
    return found != customDataTypeHeaderFiles_.end() ? found->second : "\"\"";
}

} // namespace QLTypeSys
