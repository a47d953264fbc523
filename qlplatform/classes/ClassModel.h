// The class system of the host language: classes, their superclasses and packages, enumeration members.
//
// Classes come from sources. Classes that a program defines itself are in DefinedClass.h; an engine with classes of its
// own derives from COSClass, COSEnum and COSClassSource and adds its source. Objects as arrays are in Objects.h.
//
//   tcos::COSInterfacePtr found = tcos::COSClass::getClassInterface(tcos::internal::makeInterned("Gear"));
//   if (tcos::COSClass* gear = tcos::cosiToClass(found))
//       for (tcos::COSIterator members = gear->getEnumerationMembers(); members.hasMoreElements();) ...
//
// Operations of a class may throw anything. Process-wide state (sources, interned names) is unlocked.
#pragma once

#include <exception>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/services/QlFeature.h"

/// Classes may stand as enumeration types that derive from the storage type itself ("int16") and not only from
/// Quillane.IntEnumType. On by default.
extern QL_EXPORT QlFeature* QLFEAT_ControlStorageTypeForEnums;

namespace tcos {

class COSClass;
class COSEnum;

/// Anything that the class system hands out.
class QL_EXPORT COSInterface {
  public:
    virtual ~COSInterface();

    /// This object as a class, or null.
    virtual COSClass* asClass() { return nullptr; }
    /// This object as an enumeration member, or null.
    virtual COSEnum* asEnum() { return nullptr; }
};

/// A counted handle to an interface; may be null.
class COSInterfacePtr {
  public:
    COSInterfacePtr() = default;
    COSInterfacePtr(std::nullptr_t) {}
    template <class T> COSInterfacePtr(std::shared_ptr<T> object) : object_(std::move(object)) {}

    /// The interface, or null; owned by the handles.
    operator COSInterface*() const { return object_.get(); }
    /// The interface. Unchecked: it must not be null.
    COSInterface* operator->() const { return object_.get(); }

  private:
    std::shared_ptr<COSInterface> object_;
};

/// Raised when the next element of an absent or exhausted list is asked for.
class QL_EXPORT ENoElements : public std::exception {
  public:
    ~ENoElements() override;
    /// Says that there is no element.
    const char* what() const noexcept override;
};

/// A list that is read once from front to back; what a class of an engine's own hands out.
template <class T> class COSSequence {
  public:
    virtual ~COSSequence() = default;
    /// Whether there is an element that was not read yet.
    virtual bool hasMoreElements() const = 0;
    /// The next element. Asked only while there is one.
    virtual T nextElement() = 0;
};

/// A counted handle to a list, which may be absent. Copies share the place of reading.
template <class T> class COSElements {
  public:
    COSElements() = default;
    explicit COSElements(std::shared_ptr<COSSequence<T>> sequence) : sequence_(std::move(sequence)) {}
    explicit COSElements(std::vector<T> elements) : sequence_(std::make_shared<Stored>(std::move(elements))) {}

    /// False for an absent list.
    bool hasMoreElements() const { return sequence_ && sequence_->hasMoreElements(); }

    /// Raises ENoElements when there is none.
    T nextElement() const {
        if (!hasMoreElements()) throw ENoElements();
        return sequence_->nextElement();
    }

  private:
    class Stored final : public COSSequence<T> {
      public:
        explicit Stored(std::vector<T> elements) : elements_(std::move(elements)) {}
        bool hasMoreElements() const override { return next_ < elements_.size(); }
        T nextElement() override { return elements_[next_++]; }

      private:
        std::vector<T> elements_;
        std::size_t next_ = 0;
    };

    std::shared_ptr<COSSequence<T>> sequence_;
};

/// Names of superclasses.
using COSSuperclassList = COSElements<std::string>;
/// Interfaces, such as the members of an enumeration.
using COSIterator = COSElements<COSInterfacePtr>;

namespace internal {

/// A name that is stored once: equal names are one object. Kept for the life of the process.
class Interned {
  public:
    /// The empty identifier.
    Interned() = default;

    /// The name; good for the life of the process.
    const char* text() const { return text_; }
    /// Whether the name is empty.
    bool isEmpty() const { return *text_ == '\0'; }
    /// Whether the names are equal, by their addresses.
    bool operator==(const Interned& other) const { return text_ == other.text_; }

  private:
    friend QL_EXPORT Interned makeInterned(const std::string&);
    explicit Interned(const char* text) : text_(text) {}

    QL_EXPORT static const char emptyText[1];
    const char* text_ = emptyText;
};

/// The interned form of a name, which is stored when it is new.
QL_EXPORT Interned makeInterned(const std::string& name);

} // namespace internal

/// A class of the host language.
class QL_EXPORT COSClass : public COSInterface {
  public:
    ~COSClass() override;
    COSClass* asClass() override { return this; }

    /// Whether the class is an enumeration; false here.
    virtual bool isEnumeration() const { return false; }

    /// The name by which the class is found. Owned by the class.
    virtual const char* getName() const = 0;

    /// Names of the superclasses in the order of the definition; absent when it names none.
    virtual COSSuperclassList getSuperclasses() const { return {}; }

    /// The package that the class sits in; null for none.
    virtual COSInterfacePtr getPackage() const { return {}; }

    /// The members in the order of the definition, each a COSEnum; absent for what is no enumeration.
    virtual COSIterator getEnumerationMembers() const { return {}; }

    /// The class of that name, from the first source that knows it; null when none does. Exceptions of sources pass.
    static COSInterfacePtr getClassInterface(const internal::Interned& name);
};

/// A member of an enumeration.
class QL_EXPORT COSEnum : public COSInterface {
  public:
    ~COSEnum() override;
    COSEnum* asEnum() override { return this; }

    /// The name of the member. Owned by the member.
    virtual const char* getName() const = 0;

    /// The value: a scalar number, or a scalar object of the class over one. The caller owns it.
    virtual txArrayPtr getValue() const = 0;
};

/// A package of classes.
class QL_EXPORT COSPackage : public COSInterface {
  public:
    explicit COSPackage(std::string name) : name_(std::move(name)) {}
    ~COSPackage() override;
    /// The name of the package.
    const std::string& getName() const { return name_; }

  private:
    std::string name_;
};

/// A value of the host language as the class system passes it: a counted, unchanging array.
class COSValue {
  public:
    explicit COSValue(txArrayPtr array) : array_(std::move(array)) {}

    /// Owned by the value and its copies; may be null.
    txArray_tag* getHostArray() const { return array_.get(); }

  private:
    std::shared_ptr<txArray_tag> array_;
};

/// The class behind an interface, or null; null for null.
QL_EXPORT COSClass* cosiToClass(COSInterface* interface);

/// The enumeration member behind an interface, or null; null for null.
QL_EXPORT COSEnum* cosiToEnum(COSInterface* interface);

/// Where classes come from.
class QL_EXPORT COSClassSource {
  public:
    virtual ~COSClassSource();

    /// The class of that name; null when this source does not know it.
    virtual COSInterfacePtr findClass(const internal::Interned& name) = 0;
};

/// Adds a source, which is asked before those that were added earlier.
QL_EXPORT void addClassSource(std::shared_ptr<COSClassSource> source);

/// Takes a source back; one that was never added is no error.
QL_EXPORT void removeClassSource(const COSClassSource* source);

} // namespace tcos
