// Feature flags and testing hooks: named process-wide switches, read at each use and changeable at run time.
//
//   if (QLFEAT_EnableEffectiveDataType->state() != 0) ...
//   if (QlFeature* f = QlFeature::find("QLImageType")) f->setState(1);
#pragma once

#include <functional>
#include <string_view>
#include <vector>

#include "qlplatform/Export.h"

/// A feature flag. Objects have static storage; strings are not copied. Process-wide and unlocked.
class QL_EXPORT QlFeature {
  public:
    /// A function to be told of a change.
    using Callback = std::function<void(QlFeature&)>;

    QlFeature(const char* name, const char* description, const char* sourceFile, const char* group, int numericId,
              int defaultState, Callback callback);
    ~QlFeature();
    QlFeature(const QlFeature&) = delete;
    QlFeature& operator=(const QlFeature&) = delete;

    /// The name by which the flag is found.
    const char* name() const { return name_; }
    /// What the flag does, in a sentence.
    const char* description() const { return description_; }
    /// The file that defines the flag.
    const char* sourceFile() const { return sourceFile_; }
    /// The flags that this one belongs with.
    const char* group() const { return group_; }
    /// The number of the flag.
    int numericId() const { return numericId_; }
    /// The state at the start of the process.
    int defaultState() const { return defaultState_; }

    /// The present state; any value but 0 means on.
    int state() const { return state_; }

    /// Stores the state; the callback is not called.
    void setState(int state) { state_ = state; }

    /// What a writer calls after it changed the state; empty unless a client set one.
    const Callback& callback() const { return callback_; }
    void setCallback(Callback callback) { callback_ = std::move(callback); }

    /// The flag of that name, or null.
    static QlFeature* find(std::string_view name);
    /// All flags that exist, in order of their names.
    static std::vector<QlFeature*> all();

  private:
    const char* name_;
    const char* description_;
    const char* sourceFile_;
    const char* group_;
    int numericId_;
    int defaultState_;
    int state_;
    Callback callback_;
    QlFeature* next_; // the flag made before this one; not owned
};

/// A testing hook: a switch without a numeric id, used by tests and clients to choose a behaviour.
class QL_EXPORT QlTestingHook {
  public:
    /// A function to be told of a change.
    using Callback = std::function<void(QlTestingHook&)>;

    QlTestingHook(const char* name, const char* description, const char* sourceFile, const char* group,
                  int defaultState, Callback callback);
    ~QlTestingHook();
    QlTestingHook(const QlTestingHook&) = delete;
    QlTestingHook& operator=(const QlTestingHook&) = delete;

    /// The name by which the hook is found.
    const char* name() const { return name_; }
    /// What the hook does, in a sentence.
    const char* description() const { return description_; }
    /// The file that defines the hook.
    const char* sourceFile() const { return sourceFile_; }
    /// The hooks that this one belongs with.
    const char* group() const { return group_; }
    /// The state at the start of the process.
    int defaultState() const { return defaultState_; }
    /// The present state; what it means is told in the description.
    int state() const { return state_; }
    /// Stores the state; the callback is not called.
    void setState(int state) { state_ = state; }
    /// What a writer calls after it changed the state; empty unless a client set one.
    const Callback& callback() const { return callback_; }

    /// The hook of that name, or null.
    static QlTestingHook* find(std::string_view name);
    /// All hooks that exist, in order of their names.
    static std::vector<QlTestingHook*> all();

  private:
    const char* name_;
    const char* description_;
    const char* sourceFile_;
    const char* group_;
    int defaultState_;
    int state_;
    Callback callback_;
    QlTestingHook* next_; // the hook made before this one; not owned
};
