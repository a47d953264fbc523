// The pool that holds the texts of string signals. A signal holds only a handle; the text is found by the address of
// the signal, which therefore must not move while it holds one.
//
//   auto& pool = stringutil::DynamicStringPool::GetPool(stringutil::DynamicStringPool::GlobalPoolName);
//   void* slot = pool.put(&slot, u"on");
//   stringutil::voidPtrToUStrRef(slot) += u"line";
//   pool.remove(&slot);
//
// Pools are process-wide and unlocked: callers serialise.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>

#include "qlplatform/Export.h"

namespace stringutil {

/// UTF-16 texts by key. A pool frees what remains in it when the process ends.
class QL_EXPORT DynamicStringPool {
  public:
    /// The name of the pool that the type service uses.
    static constexpr char GlobalPoolName[] = "global";

    DynamicStringPool() = default;
    DynamicStringPool(const DynamicStringPool&) = delete;
    DynamicStringPool& operator=(const DynamicStringPool&) = delete;

    /// The pool of that name, made at its first use.
    static DynamicStringPool& GetPool(std::string_view name);

    /// Stores the text under the key and returns its handle, which is good until the key is removed. A key that holds a
    /// text already keeps its handle and gets the new text.
    void* put(const void* key, std::u16string text);

    /// Drops what is stored under the key, if anything.
    void remove(const void* key);

    /// The number of texts held.
    std::size_t size() const { return texts_.size(); }

  private:
    std::unordered_map<const void*, std::u16string> texts_; // nodes do not move: a handle is the text's address
};

/// The text behind a handle. Unchecked: `handle` must come from a pool that still holds it.
QL_EXPORT std::u16string& voidPtrToUStrRef(void* handle);

} // namespace stringutil
