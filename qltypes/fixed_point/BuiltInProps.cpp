#include "qltypes/fixed_point/BuiltInProps.h"

#include "qltypes/host/Failure_internal.h"

namespace FXP {

namespace {

struct BuiltInRow {
    const char* name;
    fxpDataTypeProp props;
};

// clang-format off
constinit const BuiltInRow builtInRows[numBuiltInProps] = {
    {"double",  {FXP_DT_DOUBLE,  1, 64, 11, 0, 1.0, 0.0, 0}},
    {"single",  {FXP_DT_SINGLE,  1, 32,  8, 0, 1.0, 0.0, 0}},
    {"int8",    {FXP_DT_FIXPT,   1,  8,  0, 0, 1.0, 0.0, 0}},
    {"uint8",   {FXP_DT_FIXPT,   0,  8,  0, 0, 1.0, 0.0, 0}},
    {"int16",   {FXP_DT_FIXPT,   1, 16,  0, 0, 1.0, 0.0, 0}},
    {"uint16",  {FXP_DT_FIXPT,   0, 16,  0, 0, 1.0, 0.0, 0}},
    {"int32",   {FXP_DT_FIXPT,   1, 32,  0, 0, 1.0, 0.0, 0}},
    {"uint32",  {FXP_DT_FIXPT,   0, 32,  0, 0, 1.0, 0.0, 0}},
    {"boolean", {FXP_DT_BOOLEAN, 0,  8,  0, 0, 1.0, 0.0, 0}},
};
// clang-format on

const BuiltInRow& rowOf(int id) {
    if (id < 0 || id >= numBuiltInProps)
        QLTypeSys::failure::raise(QuillaneTypes::general::InvalidBuiltinDataTypeId(id));
    return builtInRows[id];
}

} // namespace

const fxpDataTypeProp& getBuiltInProps(int id) { return rowOf(id).props; }

const char* getBuiltInName(int id) { return rowOf(id).name; }

const fxpDataTypeProp* findBuiltInProps(std::string_view name) {
    for (const BuiltInRow& row : builtInRows)
        if (name == row.name) return &row.props;
    return nullptr;
}

} // namespace FXP
