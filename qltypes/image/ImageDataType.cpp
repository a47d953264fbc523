#include "qltypes/image/ImageDataType.h"

#include <cstring>
#include <iterator>

#include "qlplatform/strings/EnumStrings.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace QLTypeSys {

namespace {

constexpr unsigned long cNumDims = 3; // rows, columns, channels

// clang-format off
constexpr EnumStr cColorFormatRows[] = {
    {"BGRA",      SSImageColorFormat_BGRA},
    {"RGB",       SSImageColorFormat_RGB},
    {"RGBA",      SSImageColorFormat_RGBA},
    {"Grayscale", SSImageColorFormat_Grayscale},
    {"CMYK",      SSImageColorFormat_CMYK},
    {"Spectral",  SSImageColorFormat_Spectral},
    {"Lab",       SSImageColorFormat_Lab},
    {"HSV",       SSImageColorFormat_HSV},
    {"YUV444",    SSImageColorFormat_YUV444},
    {"CFA",       SSImageColorFormat_CFA},
};
constexpr EnumStr cDataLayoutRows[] = { // kept: not in the order of the values
    {"RowMajorInterleaved", SSImageDataLayout_RowMajorInterleaved},
    {"ColumnMajorPlanar",   SSImageDataLayout_ColumnMajorPlanar},
};
constexpr EnumStr cBaseTypeRows[] = {
    {"double",  DATA_TYPE_ID_DOUBLE},
    {"single",  DATA_TYPE_ID_SINGLE},
    {"int8",    DATA_TYPE_ID_INT8},
    {"uint8",   DATA_TYPE_ID_UINT8},
    {"int16",   DATA_TYPE_ID_INT16},
    {"uint16",  DATA_TYPE_ID_UINT16},
    {"int32",   DATA_TYPE_ID_INT32},
    {"uint32",  DATA_TYPE_ID_UINT32},
    {"boolean", DATA_TYPE_ID_BOOLEAN},
};
// clang-format on

constexpr utEnumStrs cColorFormats = {std::size(cColorFormatRows), cColorFormatRows};
constexpr utEnumStrs cDataLayouts = {std::size(cDataLayoutRows), cDataLayoutRows};
constexpr utEnumStrs cBaseTypes = {std::size(cBaseTypeRows), cBaseTypeRows};

void checkNumChannels(unsigned long numChannels, SSImageColorFormat colorFormat) {
    const char* name = ImageDataType::ImageColorFormatIdToName(colorFormat);
    const long expected = ImageDataType::expectedNumChannels(colorFormat);
    if (expected == -1) {
        if (numChannels == 0) failure::raise(Quillane::DataType::InvalidImageTypeNumChannels2(0, name));
    } else if (numChannels != static_cast<unsigned long>(expected)) {
        failure::raise("Quillane:DataType", "InvalidImageTypeNumChannels", numChannels, name, expected);
    }
}

} // namespace

ImageDataType::ImageDataType(DataTypeTable*, int id, const std::string& name, unsigned long numChannels,
                             SSImageColorFormat colorFormat, SSImageDataLayout dataLayout, BuiltInDTypeId baseType)
    : DataType(id, name, dtSourceImage) {
    ImageProperties attributes;
    std::memset(&attributes, 0, sizeof attributes); // padding too: blocks are compared by their bytes
    attributes.numChannels = numChannels;
    attributes.colorFormat = colorFormat;
    attributes.dataLayout = dataLayout;
    attributes.baseType = baseType;
    DataType::setPropertiesSize(sizeof attributes);
    DataType::setProperties(&attributes);
    qualifier_ = dtqImage;
    checkNumChannels(numChannels, colorFormat);
}

ImageDataType::~ImageDataType() = default;

bool ImageDataType::isImage() const { return true; }

unsigned long ImageDataType::getNumChannels() const { return properties().numChannels; }
SSImageColorFormat ImageDataType::getColorFormat() const { return properties().colorFormat; }
SSImageDataLayout ImageDataType::getDataLayout() const { return properties().dataLayout; }
BuiltInDTypeId ImageDataType::getBaseType() const { return properties().baseType; }

const char* ImageDataType::ImageColorFormatIdToName(SSImageColorFormat colorFormat) {
    return utEnumStrs_EnumValue_to_string(&cColorFormats, colorFormat);
}
SSImageColorFormat ImageDataType::ImageColorFormatNameToId(const char* name) {
    return static_cast<SSImageColorFormat>(utOldEnumStrs_string_to_EnumValue(&cColorFormats, name));
}
const char* ImageDataType::ImageDataLayoutIdToName(SSImageDataLayout dataLayout) {
    return utEnumStrs_EnumValue_to_string(&cDataLayouts, dataLayout);
}
SSImageDataLayout ImageDataType::ImageDataLayoutNameToId(const char* name) {
    return static_cast<SSImageDataLayout>(utOldEnumStrs_string_to_EnumValue(&cDataLayouts, name));
}
const char* ImageDataType::ImageBaseTypeIdToName(BuiltInDTypeId baseType) {
    return utEnumStrs_EnumValue_to_string(&cBaseTypes, baseType);
}
BuiltInDTypeId ImageDataType::ImageBaseTypeNameToId(const char* name) {
    return static_cast<BuiltInDTypeId>(utOldEnumStrs_string_to_EnumValue(&cBaseTypes, name));
}

long ImageDataType::expectedNumChannels(SSImageColorFormat colorFormat) {
    switch (colorFormat) {
    case SSImageColorFormat_Grayscale:
    case SSImageColorFormat_CFA:
        return 1;
    case SSImageColorFormat_RGB:
    case SSImageColorFormat_Lab:
    case SSImageColorFormat_HSV:
    case SSImageColorFormat_YUV444:
        return 3;
    case SSImageColorFormat_BGRA:
    case SSImageColorFormat_RGBA:
    case SSImageColorFormat_CMYK:
        return 4;
    default:
        return -1;
    }
}

std::string ImageDataType::ComputeAnonymousName(SSImageColorFormat colorFormat, SSImageDataLayout dataLayout,
                                                BuiltInDTypeId baseType, unsigned long numChannels) {
    std::string name = std::string("Image_") + ImageColorFormatIdToName(colorFormat) +
                       (dataLayout == SSImageDataLayout_RowMajorInterleaved ? "_Row_" : "_Col_") +
                       ImageBaseTypeIdToName(baseType);
    if (colorFormat == SSImageColorFormat_Spectral) name += "_" + std::to_string(numChannels);
    return name;
}

void ImageDataType::RegisterCallbacks(DataTypeTable* table) {
    const int id = getId();
    const int storage = getStorageId();
    using failure::passOn;

    // A storage type without a size leaves the image without one.
    if (const int size = DtGetDataTypeSize(table, storage); size != -1) passOn(DtSetDataTypeSize(table, "", id, size));
    passOn(DtSetConstructFcn(table, "", id, DtGetConstructFcn(table, "", storage)));
    passOn(DtSetConstructFcnName(table, "", id, DtGetConstructFcnName(table, "", storage)));
    passOn(DtSetDestructFcn(table, "", id, DtGetDestructFcn(table, "", storage)));
    passOn(DtSetDestructFcnName(table, "", id, DtGetDestructFcnName(table, "", storage)));
    passOn(DtSetDeepCopyFcn(table, "", id, DtGetDeepCopyFcn(table, "", storage)));
    passOn(DtSetDeepCopyFcnName(table, "", id, DtGetDeepCopyFcnName(table, "", storage)));
    if (const SizeOfFcn sizeOfFcn = DtGetSizeOfFcn(table, storage)) {
        passOn(DtSetSizeOfFcn(table, id, sizeOfFcn));
        passOn(DtSetSizeOfFcnName(table, id, "getSizeFcn")); // kept: names from here on are not those of the storage
    }
    if (const ContainedDataFcn containedDataFcn = DtGetContainedDataFcn(table, storage)) {
        passOn(DtSetContainedDataFcn(table, id, containedDataFcn));
        passOn(DtSetContainedDataFcnName(table, id, "getDataFcn"));
        passOn(DtSetContainedDataType(table, id, getBaseType()));
        passOn(DtSetContainedDataNumDims(table, id, cNumDims));
        passOn(DtSetContainedDataDimsFcn(table, id, DtGetContainedDataDimsFcn(table, storage)));
        passOn(DtSetContainedDataDimsFcnName(table, id, "getDataDimsFcn"));
        passOn(DtSetUpdateContainedDataDimsFcn(table, id, DtGetUpdateContainedDataDimsFcn(table, storage)));
        passOn(DtSetUpdateContainedDataDimsFcnName(table, id, "updateDataDimsFcn"));
        passOn(DtSetDataConstructFcn(table, id, DtGetDataConstructFcn(table, storage)));
        passOn(DtSetDataConstructFcnName(table, id, "dataConstructFcn"));
    }
}

} // namespace QLTypeSys
