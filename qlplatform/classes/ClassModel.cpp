#include "qlplatform/classes/ClassModel.h"

#include <algorithm>
#include <unordered_set>

namespace {

QlFeature controlStorageTypeForEnums("ControlStorageTypeForEnums", "Enumerations may derive from their storage type",
                                     "ClassModel", "Class system", 1, 1, {});

// Both live as long as the process, so that classes can be asked for while it ends.
std::unordered_set<std::string>& internedNames() {
    static auto* const names = new std::unordered_set<std::string>;
    return *names;
}
std::vector<std::shared_ptr<tcos::COSClassSource>>& classSources() {
    static auto* const sources = new std::vector<std::shared_ptr<tcos::COSClassSource>>;
    return *sources;
}

} // namespace

QlFeature* QLFEAT_ControlStorageTypeForEnums = &controlStorageTypeForEnums;

namespace tcos {

COSInterface::~COSInterface() = default;
COSClass::~COSClass() = default;
COSEnum::~COSEnum() = default;
COSPackage::~COSPackage() = default;
COSClassSource::~COSClassSource() = default;
ENoElements::~ENoElements() = default;
const char* ENoElements::what() const noexcept { return "the list has no further elements"; }

const char internal::Interned::emptyText[1] = "";

internal::Interned internal::makeInterned(const std::string& name) {
    return name.empty() ? Interned() : Interned(internedNames().insert(name).first->c_str());
}

COSInterfacePtr COSClass::getClassInterface(const internal::Interned& name) {
    const auto sources = classSources(); // a source may add or remove others while it is asked
    for (auto source = sources.rbegin(); source != sources.rend(); ++source)
        if (COSInterfacePtr found = (*source)->findClass(name)) return found;
    return {};
}

COSClass* cosiToClass(COSInterface* interface) { return interface ? interface->asClass() : nullptr; }
COSEnum* cosiToEnum(COSInterface* interface) { return interface ? interface->asEnum() : nullptr; }

void addClassSource(std::shared_ptr<COSClassSource> source) { classSources().push_back(std::move(source)); }

void removeClassSource(const COSClassSource* source) {
    std::erase_if(classSources(), [source](const auto& added) { return added.get() == source; });
}

} // namespace tcos
