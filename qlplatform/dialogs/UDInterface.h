// What the type service needs of the engine's dialogs: objects that can be shown to host functions, and lists of texts.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"

/// An object of a dialog. An engine derives its own.
class QL_EXPORT UDInterface {
  public:
    virtual ~UDInterface();

    /// The object as the host language sees it; may be empty. The caller owns it.
    virtual txArrayPtr toHostArray() const = 0;
};

/// The kind of object that UDInterface stands for, as conversions ask for it.
class UDInterfaceType {
  public:
    /// The one object of this class.
    QL_EXPORT static const UDInterfaceType* getType();

  private:
    UDInterfaceType() = default;
};

/// The object as a host array, which the caller owns; null for a null object and for one that has no host form.
QL_EXPORT txArray_tag* uddtConvertToTorvex(const UDInterface* object, const UDInterfaceType* type);

/// A list of texts, each of which may be null.
class StringVector {
  public:
    /// Appends a copy of a NUL-terminated text; null is kept as null.
    void addElement(const char* text) { elements_.push_back(text ? std::optional<std::string>(text) : std::nullopt); }

    /// Number of texts, null ones included.
    std::size_t size() const { return elements_.size(); }

    /// Owned by the list; good until the list changes. Unchecked: `index` must be below size().
    const char* element(std::size_t index) const { return elements_[index] ? elements_[index]->c_str() : nullptr; }

  private:
    std::vector<std::optional<std::string>> elements_;
};
