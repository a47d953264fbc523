#include "qlplatform/strings/DynamicStringPool.h"

#include <map>
#include <utility>

namespace stringutil {

DynamicStringPool& DynamicStringPool::GetPool(std::string_view name) {
    static std::map<std::string, DynamicStringPool, std::less<>> pools;
    const auto known = pools.find(name);
    return known != pools.end() ? known->second : pools[std::string(name)];
}

namespace {

// Made at load, so that it outlives the objects of clients that hold handles when the process ends.
[[maybe_unused]] const DynamicStringPool& globalPool = DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName);

} // namespace

void* DynamicStringPool::put(const void* key, std::u16string text) {
    std::u16string& held = texts_[key];
    held = std::move(text);
    return &held;
}

void DynamicStringPool::remove(const void* key) { texts_.erase(key); }

std::u16string& voidPtrToUStrRef(void* handle) { return *static_cast<std::u16string*>(handle); }

} // namespace stringutil
