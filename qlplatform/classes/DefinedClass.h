// Classes that a program defines itself.
//
//   auto gear = std::make_shared<tcos::DefinedClass>("Gear", tcos::ClassKind::enumeration);
//   gear->derivesFrom("Quillane.IntEnumType").addMember("Park", 0).addMember("Drive", 1);
//   tcos::defineClass(gear); // found by name; the host function "Gear" makes objects of it
#pragma once

#include <cstdint>

#include "qlplatform/classes/ClassModel.h"

namespace tcos {

/// Whether a class has members to choose from.
enum class ClassKind { plain, enumeration };

/// A class that is filled in by its maker. Changing it while someone walks its lists is not allowed.
class QL_EXPORT DefinedClass : public COSClass {
  public:
    DefinedClass(std::string name, ClassKind kind);
    ~DefinedClass() override;

    /// Appends a superclass.
    DefinedClass& derivesFrom(std::string superclass);
    /// Puts the class into a package.
    DefinedClass& insidePackage(std::string package);

    /// A member whose value is of the integer class that the class derives from first, else int32. The value must fit.
    DefinedClass& addMember(std::string name, std::int32_t value);

    /// A member with a value of any numeric class or a logical one. Raises `NoMemberValue` when it is no such scalar.
    DefinedClass& addMember(std::string name, txArrayPtr value);

    bool isEnumeration() const override { return kind_ == ClassKind::enumeration; }
    const char* getName() const override { return name_.c_str(); }
    COSSuperclassList getSuperclasses() const override { return COSSuperclassList(superclasses_); }
    COSInterfacePtr getPackage() const override { return package_; }
    /// The value of each member is an object of this class.
    COSIterator getEnumerationMembers() const override { return COSIterator(members_); }

    /// Objects of this enumeration from numbers, each of which must be the value of a member; where members have
    /// complex values, their real parts count. Raises `NoSuchMember` for the first number that is none.
    txArrayPtr objectsFrom(const txArray_tag* numbers) const;

  private:
    std::string name_;
    ClassKind kind_;
    std::vector<std::string> superclasses_;
    COSInterfacePtr package_;
    std::vector<COSInterfacePtr> members_;
};

/// Makes the class known under its name, in place of one that was defined so before; an enumeration also becomes the
/// host function of that name, which makes objects from numbers.
QL_EXPORT void defineClass(std::shared_ptr<DefinedClass> defined);

/// Takes a definition back, and the host function with it; an unknown name is no error.
QL_EXPORT void removeClass(const std::string& name);

} // namespace tcos
