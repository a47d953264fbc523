#include "tests/structures/SlowViews.h"

#include <climits>
#include <cmath>

namespace structures {

namespace {

long widthOf(const StructElement& e) {
    long width = 1;
    for (unsigned long i = 0; i < e.numDims; ++i)
        width *= e.dims[i];
    return width;
}

long complexWidthOf(const StructElement& e) { return widthOf(e) * (e.signalType == 1 ? 2 : 1); }

int narrow(long value) { return value == LONG_MAX ? 0x7ffffffe : static_cast<int>(value); }

} // namespace

const StructDataType& SlowViews::record(int id) const {
    return static_cast<const StructDataType&>(*table_.getDataTypeAliasedThruTo(id));
}

bool SlowViews::isLeaf(int typeId) const {
    return typeId == -1 || !table_.getDataTypeAliasedThruTo(typeId)->getIsType(QLTypeSys::dtqStruct);
}

int SlowViews::sizeOf(int typeId) const {
    return table_.getDataTypeAt(static_cast<unsigned long>(typeId + 1))->getSize();
}

const StructElement* SlowViews::make(std::unique_ptr<StructElement> element) {
    const StructElement* const raw = element.get();
    made_[raw] = std::move(element);
    return raw;
}

void SlowViews::clear(int id) {
    for (auto& [key, answers] : answers_)
        if (key.first == &record(id)) answers.clear();
}

void SlowViews::forgetLeaves(const QLTypeSys::DataType* deleted) {
    std::erase_if(leaves_, [deleted](const auto& entry) {
        return static_cast<const void*>(entry.first) == static_cast<const void*>(deleted);
    });
}

// --- Immediate -------------------------------------------------------------------------------------------------------

long SlowViews::immediateRawIdx(int id, long element) const {
    long raw = 0;
    for (long i = 0; i < element; ++i) {
        const StructElement& e = *record(id).getElements()[static_cast<std::size_t>(i)];
        raw += isLeaf(e.dataTypeId) ? complexWidthOf(e) : widthOf(e) * record(e.dataTypeId).getNumRawElements();
    }
    return raw;
}

int SlowViews::padding(int id, long element) const {
    const auto& elements = record(id).getElements();
    const StructElement& e = *elements[static_cast<std::size_t>(element)];
    const bool isLast = element + 1 == static_cast<long>(elements.size());
    const long next = isLast ? record(id).getSize() : elements[static_cast<std::size_t>(element) + 1]->offset;
    return narrow(next - e.offset - complexWidthOf(e) * sizeOf(e.dataTypeId));
}

// --- Depth-first -----------------------------------------------------------------------------------------------------

SlowViews::Place SlowViews::place(int id, long idx) const {
    const long n = numDFS(id);
    const Place root{-1, 0, id, -1};
    if (idx == 0 || n <= 0) return root;
    const double q = std::floor(static_cast<double>(idx) / static_cast<double>(n));
    if (q > 0) return {-1, static_cast<long>(q), id, static_cast<long>(q) * n};
    long k = 0;
    const auto& elements = record(id).getElements();
    for (std::size_t i = 0; i < elements.size(); ++i) {
        const StructElement& e = *elements[i];
        const long at = static_cast<long>(i);
        if (isLeaf(e.dataTypeId)) {
            k += 1;
            if (k == idx) return {at, 0, e.dataTypeId, k};
            continue;
        }
        const long w = widthOf(e);
        const long m = numDFS(e.dataTypeId);
        if (w <= 1) {
            if (k + m >= idx) return {at, 0, e.dataTypeId, k + 1};
            k += m;
        } else {
            if (k + 1 == idx) return {at, -1, e.dataTypeId, -1};
            if (k + 1 + w * m >= idx) {
                const long instance = (idx - k - 2) / m;
                return {at, instance, e.dataTypeId, k + 2 + m * instance};
            }
            k += w * m + 1;
        }
    }
    return root;
}

const StructElement* SlowViews::element(int id, long idx) {
    if (const StructElement* known = answer(id, idx).element) return known;
    const Place p = place(id, idx);
    const StructElement* found;
    if (p.base < 0 && p.immediate < 0) {
        auto root = std::make_unique<StructElement>();
        root->dataTypeId = id;
        root->setNumDimensions(1);
        root->setDimension(0, 1);
        root->unitId = root->signalType = root->samplingMode = root->dimensionsMode = 0;
        found = make(std::move(root));
    } else if (p.base < 0 || isLeaf(p.typeId)) {
        found = record(id).getElements()[static_cast<std::size_t>(p.immediate)];
    } else if (idx != p.base || p.immediate < 0) {
        found = element(p.typeId, idx - p.base);
    } else {
        const StructElement& root = *element(p.typeId, 0);
        auto head = std::make_unique<StructElement>();
        head->name = record(id).getElements()[static_cast<std::size_t>(p.immediate)]->name;
        head->signalType = head->samplingMode = head->dimensionsMode = 0;
        head->dataTypeId = root.dataTypeId;
        head->setNumDimensions(1);
        head->setDimension(0, root.dims[0]);
        head->symbDimsId = root.symbDimsId;
        head->unitId = root.unitId;
        head->min = root.min;
        head->max = root.max;
        found = make(std::move(head));
    }
    return answer(id, idx).element = found;
}

long SlowViews::offset(int id, long idx) {
    if (const long known = answer(id, idx).offset; known != -1) return known;
    const Place p = place(id, idx);
    long value = p.instance > 0 ? p.instance * sizeOf(p.typeId) : 0;
    if (p.immediate >= 0) value += record(id).getElements()[static_cast<std::size_t>(p.immediate)]->offset;
    if (p.base >= 0 && !isLeaf(p.typeId)) value += offset(p.typeId, idx - p.base);
    return answer(id, idx).offset = value;
}

long SlowViews::varDimsOffset(int id, long idx) {
    if (const long known = answer(id, idx).varDimsOffset; known != -1) return known;
    const Place p = place(id, idx);
    long value = 0;
    if (p.immediate >= 0) value += record(id).getElements()[static_cast<std::size_t>(p.immediate)]->varDimsOffset;
    if (p.base >= 0 && !isLeaf(p.typeId)) value += varDimsOffset(p.typeId, idx - p.base);
    return answer(id, idx).varDimsOffset = value;
}

long SlowViews::rawElementIdx(int id, long idx) {
    long raw = 0;
    for (long i = 0; i < idx; ++i)
        if (const StructElement& e = *element(id, i); isLeaf(e.dataTypeId)) raw += complexWidthOf(e);
    return raw;
}

SlowViews::Parent SlowViews::parent(int id, long idx) const {
    const Place p = place(id, idx);
    if (p.base < 0 && p.immediate < 0) return {-10, -1};
    if (p.base < 0 || isLeaf(p.typeId)) return {id, p.immediate};
    if (idx == p.base && p.immediate >= 0) return {id, p.immediate};
    return parent(p.typeId, idx - p.base);
}

SlowViews::Path SlowViews::path(int id, long idx, bool fromRoot) const {
    Path made;
    if (fromRoot && idx < numDFS(id)) made.emplace_back("", 0);
    const Place p = place(id, idx);
    std::string name;
    long shown = p.instance >= 0 ? p.instance : -1;
    if (p.immediate >= 0) {
        const StructElement& e = *record(id).getElements()[static_cast<std::size_t>(p.immediate)];
        name = e.name;
        if (widthOf(e) == 1) shown = -1;
    }
    if (isLeaf(p.typeId)) shown = -1;
    made.emplace_back(name, shown);
    if (p.base < 0) {
        if (name.empty()) made.pop_back();
        return made;
    }
    if (isLeaf(p.typeId)) return made;
    const Path rest = path(p.typeId, idx - p.base, false);
    made.insert(made.end(), rest.begin(), rest.end());
    return made;
}

std::string SlowViews::text(const Path& path, const std::string& prefix) {
    std::string made = prefix;
    if (path.empty()) return made;
    std::size_t i = 0;
    if (path[0].first.empty()) {
        made += "(" + std::to_string(path[0].second) + ")";
        i = 1;
    } else if (!prefix.empty()) {
        made += ".";
    }
    for (; i < path.size(); ++i) {
        if (i != 0) made += ".";
        made += path[i].first;
        if (path[i].second != -1) made += "(" + std::to_string(path[i].second) + ")";
    }
    return made;
}

long SlowViews::descendant(int id, long ancestor, long idx) {
    if (ancestor > idx) return -1;
    if (ancestor == idx) return 0;
    const StructElement& e = *element(id, ancestor);
    long m = isLeaf(e.dataTypeId) ? 0 : numDFS(e.dataTypeId);
    if (m == 0) return -1;
    if (const long w = widthOf(e); w > 1) m = m * w + 1;
    return ancestor + m <= idx ? -1 : idx - ancestor;
}

// --- Flat ------------------------------------------------------------------------------------------------------------

const std::vector<long>& SlowViews::leaves(int id) {
    std::vector<long>& leaves = leaves_[&record(id)];
    if (leaves.empty())
        for (long i = 0; i < numDFS(id); ++i)
            if (isLeaf(element(id, i)->dataTypeId)) leaves.push_back(i);
    return leaves;
}

long SlowViews::dfsIdx(int id, long flatIdx) {
    const std::vector<long>& all = leaves(id);
    if (flatIdx < static_cast<long>(all.size())) return all[static_cast<std::size_t>(flatIdx)];
    const long n = record(id).getNumFlatElements();
    if (n == 0 || flatIdx % n >= static_cast<long>(all.size())) return -1;
    return flatIdx / n * numDFS(id) + all[static_cast<std::size_t>(flatIdx % n)];
}

long SlowViews::flatElementIdx(int id, long idx) {
    const std::vector<long>& all = leaves(id);
    const long m = numDFS(id);
    const long q = idx >= m ? idx / m : 0;
    const long r = idx >= m ? idx % m : idx;
    std::size_t p = 0;
    while (p < all.size() && all[p] != r)
        ++p;
    const long n = record(id).getNumFlatElements();
    return static_cast<long>(p) == n ? -1 : q * n + static_cast<long>(p);
}

// --- Raw -------------------------------------------------------------------------------------------------------------

SlowViews::Place SlowViews::rawPlace(int id, long rawIdx) const {
    Place p{0, 0, -10, 0};
    const auto& elements = record(id).getElements();
    for (std::size_t i = 0; i < elements.size(); ++i) {
        const StructElement& e = *elements[i];
        p.immediate = static_cast<long>(i);
        p.typeId = e.dataTypeId;
        const long span =
            isLeaf(e.dataTypeId) ? complexWidthOf(e) : widthOf(e) * record(e.dataTypeId).getNumRawElements();
        if (p.base + span > rawIdx) break;
        p.base += span;
    }
    return p;
}

int SlowViews::rawTypeId(int id, long rawIdx) const {
    const Place p = rawPlace(id, rawIdx);
    if (isLeaf(p.typeId)) return p.typeId;
    return rawTypeId(p.typeId, (rawIdx - p.base) % record(p.typeId).getNumRawElements());
}

int SlowViews::rawUnitId(int id, long rawIdx) const {
    const Place p = rawPlace(id, rawIdx);
    if (isLeaf(p.typeId)) return record(id).getElements()[static_cast<std::size_t>(p.immediate)]->unitId;
    return rawUnitId(p.typeId, (rawIdx - p.base) % record(p.typeId).getNumRawElements());
}

long SlowViews::rawOffset(int id, long rawIdx) const {
    const Place p = rawPlace(id, rawIdx);
    const long own = record(id).getElements()[static_cast<std::size_t>(p.immediate)]->offset;
    const long r = rawIdx - p.base;
    if (isLeaf(p.typeId)) return own + r * sizeOf(p.typeId);
    const long m = record(p.typeId).getNumRawElements();
    return own + r / m * sizeOf(p.typeId) + rawOffset(p.typeId, r % m);
}

} // namespace structures
