#include "fuzz/TableModel.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <set>

namespace fuzz {

namespace {

constexpr const char* fixedNames[] = {"auto",     "double",  "single",  "int8",   "uint8",
                                      "int16",    "uint16",  "int32",   "uint32", "boolean",
                                      "fcn_call", "integer", "pointer", "action", "timer_uint32_pair"};
constexpr int fixedSizes[] = {8, 8, 4, 1, 1, 2, 2, 4, 4, 1, 0, 4, 8, 8, 8};

bool isIdentifier(const char* name) {
    if (!name || !*name || std::isdigit(static_cast<unsigned char>(*name))) return false;
    return std::all_of(name, name + std::strlen(name),
                       [](unsigned char c) { return c < 0x80 && (std::isalnum(c) || c == '_'); });
}

bool isFixedPointName(const std::string& name) { return name == "sfix16_En7" || name == "ufix8"; }

unsigned long roundedUp(unsigned long offset, unsigned long multiple) {
    while (offset % multiple != 0)
        ++offset;
    return offset;
}

} // namespace

long ModelElement::width() const {
    long product = 1;
    for (const long dimension : dims)
        product *= dimension;
    return product;
}

TableModel::TableModel() { reset(); }

void TableModel::reset() {
    types.resize(std::min<std::size_t>(types.size(), 15));
    for (int id = numTypes() - 1; id < 14; ++id) {
        const auto position = static_cast<std::size_t>(id + 1);
        const bool isBuiltIn = id <= DATA_TYPE_ID_BOOLEAN;
        ModelType& type = types.emplace_back();
        type.name = fixedNames[position];
        type.source = isBuiltIn ? dtSourceBuiltIn : dtSourcePredefined;
        type.qualifier = isBuiltIn ? QLTypeSys::dtqBuiltIn : QLTypeSys::dtqPredefined;
        type.size = fixedSizes[position];
        type.isLocked = true;
        type.storageId = id;
        type.hasDefaultGround = id != DATA_TYPE_ID_DOUBLE && id != DATA_TYPE_ID_SINGLE;
        type.groundHasNonZero = !isBuiltIn || id == DATA_TYPE_ID_AUTO;
        type.ground.assign(static_cast<std::size_t>(type.size), 0);
    }
    idsByName_.clear();
    for (int id = DATA_TYPE_ID_AUTO; isValid(id); ++id)
        idsByName_[at(id).name] = id;
}

// --- Questions -------------------------------------------------------------------------------------------------------

int TableModel::idOf(const std::string& name) const {
    const auto found = idsByName_.find(name);
    return found == idsByName_.end() ? DATA_TYPE_ID_INVALID : found->second;
}

int TableModel::end(int id) const {
    while (at(id).kind == ModelType::Kind::alias)
        id = at(id).thru;
    return id;
}

int TableModel::storageOf(int id) const { return at(end(id)).storageId; }

bool TableModel::reaches(int id, int other) const {
    std::vector<int> open = {id};
    std::set<int> seen; // a replacement may cut an alias's definition from its end, and the two may then meet
    while (!open.empty()) {
        const int step = open.back();
        open.pop_back();
        if (step == other) return true;
        if (!isValid(step) || !seen.insert(step).second) continue;
        for (const int next : dependsOn(step))
            open.push_back(next);
        if (at(step).kind == ModelType::Kind::alias) open.push_back(at(step).thru);
    }
    return false;
}

bool TableModel::chainPasses(int id, int other) const {
    do {
        id = at(id).aliasedTo;
    } while (id != DATA_TYPE_ID_INVALID && id != other);
    return id != DATA_TYPE_ID_INVALID;
}

bool TableModel::isLoop(int target, int id) const {
    bool found = target == id || chainPasses(target, id);
    for (int step = target; !found && at(step).kind == ModelType::Kind::alias;) {
        step = at(step).thru;
        found = step == id;
    }
    return found;
}

int TableModel::commonAncestor(int a, int b) const {
    const auto oneStep = [this](int id) { return at(id).kind == ModelType::Kind::alias ? at(id).thru : id; };
    if (a == b) return a;
    if (oneStep(a) != oneStep(b)) return DATA_TYPE_ID_INVALID;
    if (a == oneStep(a) || b == oneStep(a)) return oneStep(a);
    while (b != DATA_TYPE_ID_INVALID && b != a && !chainPasses(a, b))
        b = at(b).aliasedTo;
    return b;
}

std::vector<int> TableModel::dependsOn(int id) const {
    if (at(id).kind == ModelType::Kind::alias) return {at(id).aliasedTo};
    std::vector<int> ids;
    for (const ModelElement& element : at(id).elements)
        ids.push_back(element.typeId);
    return ids;
}

bool TableModel::isComplete(int id) const {
    const auto& elements = holderOf(id).elements;
    return std::all_of(elements.begin(), elements.end(),
                       [this](const ModelElement& e) { return isValid(e.typeId) && isComplete(e.typeId); });
}

// --- Registration ----------------------------------------------------------------------------------------------------

// What all registrations begin with. An `id` that is valid afterwards is the answer.
Refusal TableModel::startRegistration(const char* name, DataTypeSource source, int& existing, int& id) const {
    id = existing = DATA_TYPE_ID_INVALID;
    if (!isIdentifier(name)) return "InvalidDataType";
    existing = idOf(name);
    if (existing == DATA_TYPE_ID_INVALID || declines) return "";
    const DataTypeSource known = at(existing).source;
    if (source != dtSourceOpaque && known != dtSourceAnonymous && known != source)
        return "DataType_SameNameAsExistingType";
    id = existing;
    return "";
}

Refusal TableModel::enter(ModelType type, int existing, int& id) {
    const int newId = numTypes() - 1;
    const std::string name = type.name;
    if (name == vetoed) {
        idsByName_.erase(name); // also that of a record about to be replaced
        return "DataType_WithIntrinsicFixptName";
    }
    if (existing == DATA_TYPE_ID_INVALID) {
        type.storageId = newId;
        types.push_back(std::move(type));
        idsByName_.emplace(name, newId);
        id = newId;
    } else {
        type.storageId = at(existing).storageId;
        at(existing) = std::move(type);
        id = existing;
    }
    return "";
}

Refusal TableModel::registerPlain(const char* name, DataTypeSource source, int& id) {
    int existing;
    const Refusal refusal = startRegistration(name, source, existing, id);
    if (!refusal.empty() || id != DATA_TYPE_ID_INVALID) return refusal;
    ModelType type;
    type.name = name;
    type.source = source;
    if (isFixedPointName(name)) {
        if (source != dtSourceFixpt) return "DataType_WithIntrinsicFixptName";
        type.qualifier = QLTypeSys::dtqFixpt;
        type.isLocked = true;
    }
    if (source == dtSourceEnum) type.qualifier = QLTypeSys::dtqEnum;
    return enter(std::move(type), existing, id);
}

Refusal TableModel::registerStructure(const char* name, DataTypeSource source, int& id) {
    int existing;
    const Refusal refusal = startRegistration(name, source, existing, id);
    if (!refusal.empty() || id != DATA_TYPE_ID_INVALID) return refusal;
    ModelType type;
    type.kind = ModelType::Kind::structure;
    type.name = name;
    type.source = source;
    type.qualifier = QLTypeSys::dtqStruct;
    return enter(std::move(type), existing, id);
}

Refusal TableModel::registerAlias(const char* name, DataTypeSource source, int target, int& id) {
    id = DATA_TYPE_ID_INVALID;
    if (!isIdentifier(name)) return "InvalidDataType";
    if (!isValid(target)) return "UndefinedDataTypeToBeAliasedTo";
    int existing;
    const Refusal refusal = startRegistration(name, source, existing, id);
    if (!refusal.empty() || id != DATA_TYPE_ID_INVALID) return refusal;
    if (existing != DATA_TYPE_ID_INVALID && isLoop(target, existing)) return "DataTypeAliasLoop";
    ModelType type;
    type.kind = ModelType::Kind::alias;
    type.name = name;
    type.source = source;
    type.aliasedTo = target;
    type.thru = at(target).kind == ModelType::Kind::alias ? at(target).thru : target;
    type.size = at(type.thru).size;
    return enter(std::move(type), existing, id);
}

Refusal TableModel::registerOpaque(const std::string& name, int size, int& id) {
    int existing;
    const Refusal refusal = startRegistration(name.c_str(), dtSourceOpaque, existing, id);
    if (!refusal.empty() || id != DATA_TYPE_ID_INVALID) return refusal;
    if (size <= 0) return "InvalidDataTypeSize";
    id = numTypes() - 1;
    ModelType& type = types.emplace_back();
    type.name = name;
    type.source = dtSourceOpaque;
    type.size = size;
    type.isLocked = true;
    type.storageId = id;
    type.hasDefaultGround = true;
    type.ground.assign(static_cast<std::size_t>(size), 0);
    idsByName_.emplace(name, id); // the first record of a name keeps it
    return "";
}

Refusal TableModel::setAliasedTo(int id, int target) {
    ModelType& type = at(id);
    if (!isValid(target)) return "UndefinedDataTypeToBeAliasedTo";
    if (type.aliasedTo == target) return "";
    if (type.kind == ModelType::Kind::alias) return "InconsistentDataTypeIdAliasedTo";
    if (type.isLocked) return "CannotSetAliasForDefinedType";
    if (isLoop(target, id)) return "DataTypeAliasLoop";
    ModelType alias;
    alias.kind = ModelType::Kind::alias;
    alias.name = type.name;
    alias.source = type.source;
    alias.storageId = id;
    alias.aliasedTo = target;
    alias.thru = at(target).kind == ModelType::Kind::alias ? at(target).thru : target;
    alias.size = at(alias.thru).size;
    type = alias;
    idsByName_[alias.name] = id;
    return "";
}

// --- Properties ------------------------------------------------------------------------------------------------------

Refusal TableModel::setSize(int id, int size) {
    ModelType& type = at(id);
    if (id == DATA_TYPE_ID_AUTO) return "";
    if (type.kind == ModelType::Kind::alias) return "CannotSetPropertyOfAliasType";
    if (type.size != -1 && type.size != size && id != DATA_TYPE_ID_BOOLEAN) return "CannotModifyDataTypeSize";
    if (size <= 0) return "InvalidDataTypeSize";
    if (type.size != size) type.ground.assign(static_cast<std::size_t>(size), 0);
    type.size = size;
    type.hasDefaultGround = true;
    type.isLocked = true;
    return "";
}

Refusal TableModel::setGround(int id, unsigned char byte) {
    ModelType& type = at(id);
    if (id == DATA_TYPE_ID_AUTO) return "";
    if (type.kind == ModelType::Kind::alias) return "CannotSetPropertyOfAliasType";
    if (type.size == -1) return "CannotSetGroundRepBeforeSettingSize";
    const Ground ground(type.ground.size(), byte);
    if (!type.hasDefaultGround) return type.ground == ground ? "" : "CannotModifyDataTypeGroundRepresentation";
    type.ground = ground;
    type.hasDefaultGround = false;
    type.isLocked = true;
    return "";
}

Refusal TableModel::setStorageId(int id, int storageId) {
    ModelType& type = at(id);
    if (type.kind == ModelType::Kind::alias) return "CannotSetPropertyOfAliasType";
    if (storageId >= 9) return "IllegalDataTypeToBeStorageId";
    if (type.storageId != id) return type.storageId == storageId ? "" : "InconsistentDataTypeStorageId";
    if (id == DATA_TYPE_ID_AUTO) {
        type.isLocked = true;
        return "";
    }
    type.storageId = storageId;
    type.isLocked = true;
    return "";
}

// --- Layout ----------------------------------------------------------------------------------------------------------

Refusal TableModel::memoise(int id) {
    ModelType& type = at(id);
    if (type.flags) return "";
    ModelFlags flags;
    for (const ModelElement& element : type.elements) {
        if (!isValid(element.typeId)) return "InvalidDataTypeId";
        bool frames = element.samplingMode == 1;
        bool varDims = element.dimensionsMode == 1;
        if (isStructure(element.typeId)) {
            const int nested = end(element.typeId);
            const Refusal refusal = memoise(nested);
            if (!refusal.empty()) return refusal;
            const ModelFlags& inner = *at(nested).flags;
            const bool isScalar =
                std::all_of(element.dims.begin(), element.dims.end(), [](long dimension) { return dimension == 1; });
            flags.arrays |= !isScalar || varDims || inner.arrays;
            frames |= inner.frames;
            varDims |= inner.varDims;
            flags.complex |= inner.complex;
        } else {
            flags.complex |= element.signalType == 1;
        }
        flags.frames |= frames;
        flags.varDims |= varDims;
    }
    type.flags = flags;
    return "";
}

struct TableModel::Pass {
    std::vector<long> offsets; // as far as it came
    unsigned long offset = 0;
    long numFlat = 0, numRaw = 0, numDFS = 1;
    bool groundHasNonZero = false;
    Refusal refusal;
};

TableModel::Pass TableModel::passOver(int id) const {
    Pass pass;
    const auto& elements = at(id).elements;
    for (const ModelElement& element : elements) {
        const int typeId = element.typeId;
        if (!isValid(typeId)) {
            pass.refusal = "InvalidDataTypeId";
            break;
        }
        const int size = at(typeId).size;
        pass.groundHasNonZero |= holderOf(typeId).groundHasNonZero;
        const int step = at(typeId).kind == ModelType::Kind::alias ? at(typeId).thru : typeId;
        if (step <= DATA_TYPE_ID_BOOLEAN) {
            if (size != 0 && size % 2 == 0) {
                const unsigned long toEight = roundedUp(pass.offset, 8);
                pass.offset = std::min(toEight, roundedUp(pass.offset, static_cast<unsigned long>(size)));
            }
        } else {
            pass.offset = roundedUp(pass.offset, size > 7 ? 8 : size > 3 ? 4 : size > 1 ? 2 : 1);
        }
        pass.offsets.push_back(static_cast<long>(pass.offset));
        const long width = element.complexWidth();
        pass.offset += static_cast<unsigned long>(size) * static_cast<unsigned long>(width);
        if (isStructure(typeId)) {
            const ModelType& nested = holderOf(typeId);
            pass.numRaw += width * nested.numRaw;
            pass.numFlat += width * nested.numFlat;
            pass.numDFS += width * nested.numDFS + (width > 1 ? 1 : 0);
        } else {
            pass.numRaw += width;
            pass.numFlat += 1;
            pass.numDFS += 1;
        }
        if (&element == &elements.back()) pass.offset = roundedUp(pass.offset, 8);
        if (pass.offset > 0x7fffffff) {
            pass.refusal = "InvalidDataTypeSizeInDataTypeTable";
            break;
        }
    }
    return pass;
}

TableModel::Extent TableModel::extentOf(int id) const {
    const Pass pass = passOver(end(id));
    return pass.refusal.empty() ? Extent{pass.offset, pass.numDFS} : Extent{0, 0};
}

bool TableModel::isCounted(int id) const {
    if (!isStructure(id)) return true;
    const ModelType& type = holderOf(id);
    for (const ModelElement& element : type.elements)
        if (!isValid(element.typeId) || !isCounted(element.typeId)) return false;
    const Pass pass = passOver(end(id));
    return !type.elements.empty() && pass.refusal.empty() && type.numFlat == pass.numFlat &&
           type.numRaw == pass.numRaw && type.numDFS == pass.numDFS;
}

Refusal TableModel::layOut(int id) {
    const int structure = end(id);
    ModelType& type = at(structure);
    Refusal refusal = memoise(structure);
    if (!refusal.empty() || type.elements.empty()) return refusal;
    const Pass pass = passOver(structure);
    for (std::size_t i = 0; i < pass.offsets.size(); ++i)
        type.elements[i].offset = pass.offsets[i];
    if (!pass.refusal.empty()) return pass.refusal;
    type.numFlat = pass.numFlat;
    type.numRaw = pass.numRaw;
    type.numDFS = pass.numDFS;
    refusal = setSize(structure, static_cast<int>(pass.offset));
    if (!refusal.empty()) return refusal;
    type.groundHasNonZero = pass.groundHasNonZero;
    for (const ModelElement& element : type.elements) {
        const Ground& ground = holderOf(element.typeId).ground;
        const long size = at(element.typeId).size;
        // An alias keeps the size that its target had: of what took the target's place there may be fewer bytes.
        if (size <= 0 || std::ssize(ground) < size) continue;
        // Types without a size and widths below 0 let elements lie past the end.
        const long numBytes = std::min(size * element.complexWidth(), type.size - element.offset);
        for (long i = 0; numBytes >= size && i < numBytes; ++i)
            type.ground[static_cast<std::size_t>(element.offset + i)] = ground[static_cast<std::size_t>(i % size)];
    }
    return "";
}

} // namespace fuzz
