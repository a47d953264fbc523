#include "qlplatform/services/QlFeature.h"

#include <algorithm>

namespace {

// Heads of the two lists; constant-initialised, so that flags of any library can register while it loads.
QlFeature* newestFeature = nullptr;
QlTestingHook* newestHook = nullptr;

template <class Switch> void unlink(Switch*& head, Switch* gone, Switch* Switch::*next) {
    for (Switch** link = &head; *link; link = &((*link)->*next)) {
        if (*link == gone) {
            *link = gone->*next;
            return;
        }
    }
}

template <class Switch> std::vector<Switch*> sortedByName(Switch* head, Switch* Switch::*next) {
    std::vector<Switch*> all;
    for (Switch* s = head; s; s = s->*next)
        all.push_back(s);
    std::sort(all.begin(), all.end(),
              [](const Switch* a, const Switch* b) { return std::string_view(a->name()) < b->name(); });
    return all;
}

template <class Switch> Switch* findByName(Switch* head, Switch* Switch::*next, std::string_view name) {
    for (Switch* s = head; s; s = s->*next)
        if (name == s->name()) return s;
    return nullptr;
}

} // namespace

QlFeature::QlFeature(const char* name, const char* description, const char* sourceFile, const char* group,
                     int numericId, int defaultState, Callback callback)
    : name_(name), description_(description), sourceFile_(sourceFile), group_(group), numericId_(numericId),
      defaultState_(defaultState), state_(defaultState), callback_(std::move(callback)), next_(newestFeature) {
    newestFeature = this;
}
QlFeature::~QlFeature() { unlink(newestFeature, this, &QlFeature::next_); }
QlFeature* QlFeature::find(std::string_view name) { return findByName(newestFeature, &QlFeature::next_, name); }
std::vector<QlFeature*> QlFeature::all() { return sortedByName(newestFeature, &QlFeature::next_); }

QlTestingHook::QlTestingHook(const char* name, const char* description, const char* sourceFile, const char* group,
                             int defaultState, Callback callback)
    : name_(name), description_(description), sourceFile_(sourceFile), group_(group), defaultState_(defaultState),
      state_(defaultState), callback_(std::move(callback)), next_(newestHook) {
    newestHook = this;
}
QlTestingHook::~QlTestingHook() { unlink(newestHook, this, &QlTestingHook::next_); }
QlTestingHook* QlTestingHook::find(std::string_view name) {
    return findByName(newestHook, &QlTestingHook::next_, name);
}
std::vector<QlTestingHook*> QlTestingHook::all() { return sortedByName(newestHook, &QlTestingHook::next_); }
