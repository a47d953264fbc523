// Sequences of operations on a table, its aliases and structures, arguments that are refused included. After each step
// the table is what the model says, and views answer what the slow views of the tests answer.
//
// An operation is one byte, and its arguments follow.
#include <memory>
#include <optional>

#include "fuzz/Decoder.h"
#include "fuzz/Fuzz.h"
#include "fuzz/TableModel.h"
#include "qlplatform/services/Diagnostics.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "tests/structures/SlowViews.h"
#include "tests/types/ClientTable.h"

namespace {

using namespace fuzz;
using structures::SlowViews;

constexpr const char* names[] = {"A",      "B",    "C",     "D",    "E",   "F",      "G",       "H", "sfix16_En7",
                                 "double", "auto", "ufix8", "1bad", "x y", "action", "boolean", "",  nullptr};
constexpr int numGoodNames = 8;
constexpr DataTypeSource sources[] = {DataTypeSource(2), DataTypeSource(7), dtSourceFixpt,
                                      dtSourceAnonymous, dtSourceEnum,      dtSourceOpaque};
constexpr int sizes[] = {1, 2, 3, 4, 5, 6, 7, 8, 12, 17, 0, -1, -5};
constexpr long dimensions[] = {0, 1, 2, 3, 4, 5, 1L << 20, 1L << 31, -1};
constexpr int numSmallDimensions = 6;

class Session {
  public:
    explicit Session(Decoder& in) : in_(in), client_(table_.install()) { slow_ = std::make_unique<SlowViews>(table_); }

    void run() {
        constexpr int mostSteps = 200;
        for (int step = 0; step < mostSteps && !in_.isAtEnd() && model_.numTypes() < 60; ++step) {
            doOne();
            if (step % 4 == 0) checkTypes();
        }
        checkTypes();
    }

  private:
    // --- Arguments ---------------------------------------------------------------------------------------------------

    const char* anyName() {
        const int pick = in_.byte();
        return names[pick < 224 ? pick % numGoodNames : pick % static_cast<int>(std::size(names))];
    }
    DataTypeSource anySource() {
        const int pick = in_.byte();
        return sources[pick < 192 ? 0 : pick % static_cast<int>(std::size(sources))];
    }
    int anyType() { return in_.below(model_.numTypes()) - 1; }
    // Often of a client, sometimes no type of the table.
    int anyId() {
        const int pick = in_.byte();
        constexpr int invalid[] = {DATA_TYPE_ID_INVALID, -2, 1000, 2147483647, -2147483647};
        if (pick >= 250) return invalid[pick % 5];
        return pick % model_.numTypes() - 1;
    }
    // A structure or an alias of one, or -10.
    int anyStructure() {
        const int first = in_.below(model_.numTypes());
        for (int i = 0; i < model_.numTypes(); ++i) {
            const int id = (first + i) % model_.numTypes() - 1;
            if (model_.isStructure(id)) return id;
        }
        return DATA_TYPE_ID_INVALID;
    }

    // --- Steps -------------------------------------------------------------------------------------------------------

    void doOne() {
        switch (in_.below(24)) {
        case 0:
        case 1:
            return registerPlain();
        case 2:
        case 3:
            return registerStructure();
        case 4:
        case 5:
            return registerAlias();
        case 6:
            return registerOpaque();
        case 7:
        case 8:
            return setAliasedTo();
        case 9:
            return setSize();
        case 10:
            return setGround();
        case 11:
            return setStorageId();
        case 12:
            model_.declines = table_.declines = in_.below(3) == 0;
            return;
        case 13: {
            const char* const name = anyName();
            model_.vetoed = client_->vetoed = in_.below(3) == 0 && name ? name : "-";
            return;
        }
        case 14:
            if (in_.below(4) == 0) reset();
            return;
        case 15:
        case 16:
        case 17:
            return changeElement();
        case 18:
        case 19:
            return layOut();
        case 20:
            return compareTwo();
        default:
            return ask();
        }
    }

    // Runs an operation of the table; what it raises, or the diagnostic that it returns, must be what the model says.
    template <class Work> void expect(const Refusal& refusal, Work work) {
        qlsvDiagnosticImpl* returned = nullptr;
        Refusal found;
        try {
            if constexpr (std::is_void_v<decltype(work())>)
                work();
            else
                returned = work();
            if (returned) found = returned->item(0).leaf;
        } catch (const foundation::core::except::IException& e) {
            found = e.diagnostic()->item(0).leaf;
        }
        qlsvDiscardDiagnostic(returned);
        if (found != refusal) std::fprintf(stderr, "refusal '%s', not '%s'\n", found.c_str(), refusal.c_str());
        claim(found == refusal, "an operation ends as told");
        if (!refusal.empty()) checkTypes(); // as they were
    }

    const QLTypeSys::DataType* recordOf(int id) { return table_.getDataTypeAt(static_cast<unsigned long>(id + 1)); }

    // Another record took the place of this one: all views answer anew, and its leaves are gone.
    void forget(const QLTypeSys::DataType* old) {
        slow_->clearAll();
        slow_->forgetLeaves(old);
    }

    // The fixed types are a client's own to replace: nothing else would be right any more.
    bool wouldReplaceFixed(const char* name) const {
        const int id = name ? model_.idOf(name) : DATA_TYPE_ID_INVALID;
        return model_.declines && id != DATA_TYPE_ID_INVALID && id < 14;
    }

    template <class Model, class Table> void registerAs(const char* name, Model inModel, Table inTable) {
        if (wouldReplaceFixed(name)) return;
        const int existing = name ? model_.idOf(name) : DATA_TYPE_ID_INVALID;
        const bool replaces = model_.declines && existing != DATA_TYPE_ID_INVALID;
        const QLTypeSys::DataType* const old = replaces ? recordOf(existing) : nullptr;
        int expected = DATA_TYPE_ID_INVALID, found = DATA_TYPE_ID_INVALID;
        const Refusal refusal = inModel(expected);
        expect(refusal, [&] { inTable(found); });
        claim(expected == found, "a registration answers the identifier");
        if (replaces && refusal.empty()) forget(old);
    }

    void registerPlain() {
        const char* const name = anyName();
        const DataTypeSource source = anySource();
        registerAs(
            name, [&](int& id) { return model_.registerPlain(name, source, id); },
            [&](int& id) { id = table_.registerDataType(name, source, nullptr); });
    }

    void registerStructure() {
        const char* const name = anyName();
        const DataTypeSource source = anySource();
        int id = DATA_TYPE_ID_INVALID;
        registerAs(
            name, [&](int& made) { return model_.registerStructure(name, source, made); },
            [&](int& made) { id = made = table_.registerStructDataType(name, source, nullptr); });
        // It gets its elements once.
        if (id == DATA_TYPE_ID_INVALID || model_.at(id).kind != ModelType::Kind::structure) return;
        if (!model_.at(id).elements.empty()) return;
        const int numElements = in_.below(5);
        model_.at(id).elements.resize(static_cast<std::size_t>(numElements));
        expect(numElements == 0 ? "InvalidDataTypeNumElements" : "",
               [&] { return DtSetDataTypeNumElements(&table_, "", id, numElements); });
        for (int i = 0; i < numElements; ++i)
            setElement(id, i);
    }

    void registerAlias() {
        const char* const name = anyName();
        const DataTypeSource source = anySource();
        const int target = anyId();
        const int existing = name ? model_.idOf(name) : DATA_TYPE_ID_INVALID;
        if (model_.declines && existing != DATA_TYPE_ID_INVALID && wouldContainItself(existing, target)) return;
        registerAs(
            name, [&](int& id) { return model_.registerAlias(name, source, target, id); },
            [&](int& id) { id = table_.registerAliasDataType(name, source, target, nullptr); });
    }

    // Whether the type, once it is an alias of the target, would be an element of itself: nothing guards against that.
    bool wouldContainItself(int id, int target) const {
        return model_.isValid(target) && model_.reaches(target, id) && !model_.isLoop(target, id);
    }

    void registerOpaque() {
        const char* const name = names[in_.below(numGoodNames)];
        const int size = sizes[in_.below(static_cast<int>(std::size(sizes)))];
        QLTypeSys::DataType source(14, name, DataTypeSource(2));
        if (size > 0) source.setSize(size);
        int expected, found = DATA_TYPE_ID_INVALID;
        expect(model_.registerOpaque(name, size, expected),
               [&] { found = table_.registerOpaqueDataType(&source, nullptr); });
        claim(expected == found, "an opaque copy has the identifier");
    }

    void setAliasedTo() {
        const int id = anyType();
        const int target = anyId();
        if (wouldContainItself(id, target)) return;
        const bool wasStructure = model_.at(id).kind == ModelType::Kind::structure;
        const QLTypeSys::DataType* const old = recordOf(id);
        const Refusal refusal = model_.setAliasedTo(id, target);
        expect(refusal, [&] { table_.setDataTypeIdAliasedTo(id, target); });
        if (wasStructure && model_.at(id).kind == ModelType::Kind::alias) forget(old);
    }

    void setSize() {
        const int id = anyType();
        const int size = sizes[in_.below(static_cast<int>(std::size(sizes)))];
        expect(model_.setSize(id, size), [&] { return DtSetDataTypeSize(&table_, nullptr, id, size); });
    }

    void setGround() {
        const int id = anyType();
        const auto byte = static_cast<unsigned char>(in_.byte());
        const Ground ground(model_.at(id).ground.size() + 1, byte); // a place, also for a type of no bytes
        expect(model_.setGround(id, byte), [&] { return DtSetDataTypeGround(&table_, nullptr, id, ground.data()); });
    }

    void setStorageId() {
        const int id = anyType();
        const int storageId = anyType();
        expect(model_.setStorageId(id, storageId),
               [&] { return DtSetDataTypeStorageId(&table_, nullptr, id, storageId); });
    }

    void reset() {
        slow_ = std::make_unique<SlowViews>(table_);
        model_.reset();
        ++model_.resets;
        table_.resetToBuiltin();
    }

    // --- Elements ----------------------------------------------------------------------------------------------------

    void setElement(int id, int index) {
        const int structure = model_.end(id);
        ModelElement& element = model_.at(structure).elements[static_cast<std::size_t>(index)];
        StructElement& record =
            *DtGetStructDataTypeObject(&table_, structure)->getElements()[static_cast<std::size_t>(index)];
        const int typeId = anyId();
        if (!model_.reaches(typeId, structure)) {
            element.typeId = typeId;
            record.setDataTypeId(typeId);
        }
        const int how = in_.byte();
        element.signalType = how % 2;
        element.samplingMode = how / 2 % 2;
        element.dimensionsMode = how / 4 % 2;
        DtSetDataTypeElementSignalType(&table_, nullptr, structure, index, element.signalType);
        DtSetDataTypeElementSamplingMode(&table_, nullptr, structure, index, element.samplingMode);
        DtSetDataTypeElementDimensionsMode(&table_, nullptr, structure, index, element.dimensionsMode);
        element.name = std::string(1, static_cast<char>('a' + how / 8 % 4));
        record.setName(element.name.c_str());
        setDimensions(structure, index, element);
    }

    void setDimensions(int structure, int index, ModelElement& element) {
        const int how = in_.byte();
        element.dims.resize(static_cast<std::size_t>(how % 4), 0);
        DtSetDataTypeElementNumDimensions(&table_, nullptr, structure, index, how % 4);
        for (std::size_t i = 0; i < element.dims.size(); ++i) {
            const int pick = in_.byte();
            // One large dimension is enough to be too large.
            const bool isSmall = pick < 200 || i > 0;
            const int numChoices = isSmall ? numSmallDimensions : static_cast<int>(std::size(dimensions));
            element.dims[i] = dimensions[pick % numChoices];
            DtSetDataTypeElementDimension(&table_, nullptr, structure, index, static_cast<long>(i), element.dims[i]);
        }
    }

    void changeElement() {
        const int id = anyStructure();
        if (id == DATA_TYPE_ID_INVALID) return;
        const auto numElements = static_cast<int>(model_.holderOf(id).elements.size());
        if (numElements > 0) setElement(id, in_.below(numElements));
    }

    void layOut() {
        constexpr unsigned long mostBytes = 2000;
        constexpr long mostNodes = 300;
        const int id = anyStructure();
        if (id == DATA_TYPE_ID_INVALID) return;
        const TableModel::Extent extent = model_.extentOf(id);
        if (extent.size > mostBytes || extent.numDFS > mostNodes) return; // well-formed, and slow
        expect(model_.layOut(id), [&] { return DtComputeDerivedStructAttributes(&table_, id); });
    }

    // --- Questions ---------------------------------------------------------------------------------------------------

    void compareTwo() {
        const int a = anyType(), b = anyType();
        claim(table_.getDataTypeIdCommonAncestor(a, b) == model_.commonAncestor(a, b), "the common ancestor");
        claim(table_.alreadyAliasedToDirectlyOrIndirectly(a, b) == model_.chainPasses(a, b), "the alias chain");
    }

    void ask() {
        const int id = anyStructure();
        const int what = in_.below(12);
        const int at = in_.twoBytes();
        if (id == DATA_TYPE_ID_INVALID || !model_.isComplete(id)) return;
        const long numNodes = model_.holderOf(id).numDFS;
        if (numNodes <= 0) return; // indices presume a finished structure
        const long idx = at % (2 * numNodes + 3);
        const QLTypeSys::DFSElementAccess dfs(&table_, id);
        switch (what) {
        case 0:
        case 1:
            return compareElements(dfs.getStructElement(idx), slow_->element(id, idx));
        case 2:
        case 3:
            return claim(dfs.getOffset(idx) == slow_->offset(id, idx), "the offset of a node");
        case 4: {
            SlowViews::Path path;
            dfs.getFullPath(idx, at % 2, path);
            return claim(path == slow_->path(id, idx, at % 2), "the path of a node");
        }
        case 5: {
            SlowViews::Place place;
            dfs.computeDataTypeIdAndIndex(idx, &place.immediate, &place.instance, &place.typeId, &place.base);
            return claim(place == slow_->place(id, idx), "the place of a node");
        }
        case 6:
            return claimSame([&] { return dfs.getRawElementIdx(idx); }, [&] { return slow_->rawElementIdx(id, idx); },
                             "the raw index of a node");
        case 7:
            return claim(dfs.getFlatElementIdx(idx) == slow_->flatElementIdx(id, idx), "the flat index of a node");
        case 8: {
            SlowViews::Parent parent;
            dfs.getImmediateParentDTypeIdAndOffset(idx, parent.typeId, parent.element);
            return claim(parent == slow_->parent(id, idx), "the parent of a node");
        }
        case 9:
            return claim(QLTypeSys::FlatElementAccess(&table_, id).getDFSIdx(idx) == slow_->dfsIdx(id, idx),
                         "the node of a leaf");
        case 10:
            return askImmediate(id);
        default:
            return askRaw(id, at);
        }
    }

    // An element that was kept for a view may have lost its type since: then both refuse.
    template <class Ours, class Slow> void claimSame(Ours ours, Slow slow, const char* what) {
        const auto outcomeOf = [](auto question) -> std::optional<long> {
            try {
                return question();
            } catch (const foundation::core::except::IException&) {
                return std::nullopt;
            }
        };
        claim(outcomeOf(ours) == outcomeOf(slow), what);
    }

    void compareElements(const StructElement* found, const StructElement* expected) {
        claim(slow_->isMade(expected) || found == expected, "a node's declared element");
        claim(found->name == expected->name && found->dataTypeId == expected->dataTypeId &&
                  found->getWidth() == expected->getWidth(),
              "a node's element");
    }

    void askImmediate(int id) {
        const QLTypeSys::ImmediateElementAccess view(&table_, id);
        for (long i = 0; i < view.getNumElements(); ++i) {
            claim(view.getPadding(i) == slow_->padding(id, i), "padding");
            claim(view.getRawElementIdx(i) == slow_->immediateRawIdx(id, i), "the raw index of an element");
        }
    }

    void askRaw(int id, int at) {
        const long numValues = model_.holderOf(id).numRaw;
        if (!model_.isCounted(id) || numValues <= 0) return;
        const long idx = at % numValues;
        const QLTypeSys::RawElementAccess raw(&table_, id);
        claim(raw.getDataTypeId(idx) == slow_->rawTypeId(id, idx), "the type of a value");
        claim(raw.getOffset(idx) == slow_->rawOffset(id, idx), "the offset of a value");
    }

    // --- The whole table ---------------------------------------------------------------------------------------------

    void checkTypes() {
        claim(table_.getNumDataTypes() == model_.numTypes(), "the number of types");
        claim(client_->resets == model_.resets, "resets reach the client");
        for (const char* const name : names)
            claim(table_.getDataTypeId(name) == (name ? model_.idOf(name) : DATA_TYPE_ID_INVALID), "names");
        for (int id = DATA_TYPE_ID_AUTO; model_.isValid(id); ++id)
            checkType(id);
    }

    void checkType(int id) {
        const ModelType& type = model_.at(id);
        const QLTypeSys::DataType& record = *recordOf(id);
        const bool isAlias = type.kind == ModelType::Kind::alias;
        claim(record.getId() == id && record.getName() == type.name, "identity");
        claim(record.getDataTypeSource() == type.source && record.getType() == type.qualifier, "source and kind");
        claim(DtGetDataTypeSize(&table_, id) == type.size, "the size");
        claim(record.getAliasedToLocked() == type.isLocked, "whether it can become an alias");
        claim(record.getIdAliasedTo() == (isAlias ? type.aliasedTo : DATA_TYPE_ID_INVALID), "what it stands for");
        claim(record.getIdAliasedThruTo() == (isAlias ? type.thru : id), "where it ends");
        claim(table_.getDataTypeAliasedThruTo(id)->getId() == model_.end(id), "where the chain ends");
        claim(record.getStorageId() == model_.storageOf(id), "how it is stored");
        claim(record.dependsOn() == model_.dependsOn(id), "what it depends on");
        checkGround(record, model_.holderOf(id));
        if (type.kind == ModelType::Kind::structure) checkStructure(static_cast<const StructDataType&>(record), type);
    }

    void checkGround(const QLTypeSys::DataType& record, const ModelType& holder) {
        claim(record.getDefaultGround() == holder.hasDefaultGround, "whether the ground is the default");
        claim(record.groundHasNonZeroStoredValue() == holder.groundHasNonZero, "what is said of the ground");
        const auto* const ground = static_cast<const unsigned char*>(record.getGround());
        if (holder.ground.empty()) return;
        claim(ground && std::equal(holder.ground.begin(), holder.ground.end(), ground), "the ground");
    }

    void checkStructure(const StructDataType& record, const ModelType& type) {
        claim(record.getNumFlatElements() == type.numFlat && record.getNumRawElements() == type.numRaw &&
                  record.getNumDFSElements() == type.numDFS,
              "the counts");
        const ModelFlags flags = type.flags.value_or(ModelFlags{});
        claim(record.hasFrameBasedElements() == flags.frames && record.hasVarDims() == flags.varDims &&
                  record.hasAOB() == flags.arrays && record.hasComplexData() == flags.complex,
              "the flags");
        claim(record.getElements().size() == type.elements.size(), "the elements");
        for (std::size_t i = 0; i < type.elements.size(); ++i) {
            const StructElement& element = *record.getElements()[i];
            const ModelElement& expected = type.elements[i];
            claim(element.name == expected.name && element.dataTypeId == expected.typeId &&
                      element.offset == expected.offset && element.signalType == expected.signalType &&
                      element.samplingMode == expected.samplingMode &&
                      element.dimensionsMode == expected.dimensionsMode &&
                      std::equal(element.dims, element.dims + element.numDims, expected.dims.begin(),
                                 expected.dims.end()),
                  "an element");
        }
    }

    Decoder& in_;
    testsupport::ClientTable table_;
    boost::shared_ptr<testsupport::RecordingClient> client_;
    TableModel model_;
    std::unique_ptr<SlowViews> slow_;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    Decoder in(data, size);
    Session(in).run();
    return 0;
}
