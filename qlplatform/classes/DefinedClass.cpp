#include "qlplatform/classes/DefinedClass.h"

#include <algorithm>
#include <complex>
#include <cstdio>
#include <map>

#include "qlplatform/arrays/Casts_internal.h"
#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"

namespace tcos {

namespace {

constexpr const char* category = "Quillane:Classes";
constexpr MessageText texts[] = {
    {category, "NoSuchMember", "enumeration '{0}' has no member with value {1}"},
    {category, "NoMemberValue", "member '{1}' of enumeration '{0}' needs a scalar number as value"},
    {category, "WrongNumberOfArguments", "enumeration '{0}' makes objects from 1 array, not from {1}"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

class Member final : public COSEnum {
  public:
    Member(std::string name, txArrayPtr value) : name_(std::move(name)), value_(std::move(value)) {}
    const char* getName() const override { return name_.c_str(); }
    txArrayPtr getValue() const override { return TxArrayUtil::SafeCreateSharedCopy(value_.get()); }

  private:
    std::string name_;
    txArrayPtr value_;
};

class DefinedClasses final : public COSClassSource {
  public:
    COSInterfacePtr findClass(const internal::Interned& name) override {
        const auto found = classes.find(name.text());
        return found == classes.end() ? COSInterfacePtr() : COSInterfacePtr(found->second);
    }

    std::map<std::string, std::shared_ptr<DefinedClass>, std::less<>> classes;
};

DefinedClasses& definedClasses() {
    static DefinedClasses* const instance = [] {
        auto added = std::make_shared<DefinedClasses>();
        addClassSource(added);
        return added.get();
    }();
    return *instance;
}

txClassID storageClassOf(const std::vector<std::string>& superclasses) {
    static const std::map<std::string, txClassID> storageClasses = {
        {"int8", txClassInt8}, {"uint8", txClassUint8}, {"int16", txClassInt16}, {"uint16", txClassUint16}};
    const auto found = superclasses.empty() ? storageClasses.end() : storageClasses.find(superclasses.front());
    return found == storageClasses.end() ? txClassInt32 : found->second;
}

std::string textOf(double number) {
    char text[32];
    std::snprintf(text, sizeof text, "%.15g", number);
    return text;
}

void makeObjects(const DefinedClass& enumeration, qlsvOutputs outputs, qlsvInputs inputs) {
    if (inputs.size() != 1 || outputs.size() != 1)
        hostservices::raise(category, "WrongNumberOfArguments", std::string(enumeration.getName()),
                            static_cast<long>(inputs.size()));
    outputs[0] = enumeration.objectsFrom(inputs[0]);
}

} // namespace

DefinedClass::DefinedClass(std::string name, ClassKind kind) : name_(std::move(name)), kind_(kind) {}
DefinedClass::~DefinedClass() = default;

DefinedClass& DefinedClass::derivesFrom(std::string superclass) {
    superclasses_.push_back(std::move(superclass));
    return *this;
}

DefinedClass& DefinedClass::insidePackage(std::string package) {
    package_ = std::make_shared<COSPackage>(std::move(package));
    return *this;
}

DefinedClass& DefinedClass::addMember(std::string name, std::int32_t value) {
    const txArrayPtr number(txCreateRow<std::int32_t>({value}));
    return addMember(std::move(name), hostarray::cast(number.get(), storageClassOf(superclasses_)));
}

DefinedClass& DefinedClass::addMember(std::string name, txArrayPtr value) {
    const bool isNumber = txGetElementSize(value.get()) != 0 && txGetClassID(value.get()) != txClassChar;
    if (!isNumber || txGetNumberOfElements(value.get()) != 1)
        hostservices::raise(category, "NoMemberValue", name_, std::move(name));
    txArrayPtr object(omCreateObjectArray(name_.c_str(), value.release()));
    members_.emplace_back(std::make_shared<Member>(std::move(name), std::move(object)));
    return *this;
}

txArrayPtr DefinedClass::objectsFrom(const txArray_tag* numbers) const {
    using Complex = std::complex<double>;
    std::vector<Complex> known;
    txClassID storage = txClassInt32;
    bool isComplex = false;
    for (const COSInterfacePtr& member : members_) {
        const txArrayPtr object = cosiToEnum(member)->getValue();
        const txArray_tag* value = omGetUnderlyingArray(object.get());
        if (known.empty()) storage = txGetClassID(value);
        isComplex = isComplex || txIsComplex(value);
        const txArrayPtr wide = hostarray::withImaginaryPart(hostarray::cast(value, txClassDouble).get());
        known.push_back(txGetElements<Complex>(wide.get()).front());
    }

    const txArrayPtr wanted = hostarray::realPart(hostarray::cast(numbers, txClassDouble).get());
    txArrayPtr values(
        txCreateNumericMatrix(txGetNumRows(wanted.get()), txGetNumColumns(wanted.get()), txClassDouble, true));
    const auto found = txGetWritableElements<Complex>(values.get());
    const auto numbersAsDouble = txGetElements<double>(wanted.get());
    std::transform(numbersAsDouble.begin(), numbersAsDouble.end(), found.begin(), [&](double number) {
        const auto member =
            std::find_if(known.begin(), known.end(), [number](Complex value) { return value.real() == number; });
        if (member == known.end()) hostservices::raise(category, "NoSuchMember", name_, textOf(number));
        return *member;
    });
    if (!isComplex) values = hostarray::realPart(values.get());
    return txArrayPtr(omCreateObjectArray(name_.c_str(), hostarray::cast(values.get(), storage).release()));
}

void defineClass(std::shared_ptr<DefinedClass> defined) {
    const std::string name = defined->getName();
    qlsvHostFunction constructor;
    if (defined->isEnumeration())
        constructor = [defined](qlsvOutputs outputs, qlsvInputs inputs) { makeObjects(*defined, outputs, inputs); };
    qlsvSetHostFunction(name, std::move(constructor));
    definedClasses().classes[name] = std::move(defined);
}

void removeClass(const std::string& name) {
    if (definedClasses().classes.erase(name)) qlsvSetHostFunction(name, {});
}

} // namespace tcos
