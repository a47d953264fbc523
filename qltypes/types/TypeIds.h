// Identifiers of data types, who registered a type, and what kind it is.
//
//   -10 no type, -1 auto, 0 to 8 the built-in types, 9 to 13 the predefined types, 14 and up types of clients.
// An identifier is valid in one table; those below 14 are the same in every table.
#pragma once

/// No such type: the answer of every lookup that fails; in records also "not aliased" and "nothing contained".
inline constexpr int DATA_TYPE_ID_INVALID = -10;

/// The auto type, which takes its type from elsewhere.
inline constexpr int DATA_TYPE_ID_AUTO = -1;

/// The nine built-in types; the values are their identifiers.
enum BuiltInDTypeId : int {
    DATA_TYPE_ID_DOUBLE = 0,
    DATA_TYPE_ID_SINGLE = 1,
    DATA_TYPE_ID_INT8 = 2,
    DATA_TYPE_ID_UINT8 = 3,
    DATA_TYPE_ID_INT16 = 4,
    DATA_TYPE_ID_UINT16 = 5,
    DATA_TYPE_ID_INT32 = 6,
    DATA_TYPE_ID_UINT32 = 7,
    DATA_TYPE_ID_BOOLEAN = 8,
};

/// Who registered a type. Values 2 and 7 are passed in by clients and get no special treatment.
enum DataTypeSource : int {
    dtSourceBuiltIn = 0,        ///< auto and built-in types
    dtSourcePredefined = 1,     ///< predefined types
    dtSourceEnum = 3,           ///< enumerations
    dtSourceOpaque = 4,         ///< opaque copies; passes any source check
    dtSourceFixpt = 5,          ///< fixed-point types; the only source that may register a fixed-point name
    dtSourceAnonymous = 6,      ///< anonymous structures; may be registered again from any source
    dtSourceDateTime = 8,       ///< date-time types
    dtSourceString = 9,         ///< string types
    dtSourceDynamicMatrix = 10, ///< dynamic matrix types
    dtSourceImage = 11,         ///< image types
};

namespace QLTypeSys {

/// The kind of a record.
enum DataTypeQualifier : int {
    dtqBuiltIn = 0, ///< built-in and auto
    dtqPredefined = 1,
    dtqFixpt = 2,
    dtqEnum = 3,
    dtqStruct = 4,
    dtqDateTime = 5,
    dtqString = 6,
    dtqDynamicMatrix = 7,
    dtqImage = 8,
    dtqUnspecified = 9, ///< a plain record
};

} // namespace QLTypeSys
