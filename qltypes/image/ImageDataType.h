// The type record of an image: colour format, data layout, base type and channels. A value of an image type is a value
// of another type, its storage type, from which the record borrows size and functions.
//
//   const int id = table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_RowMajorInterleaved,
//                                              DATA_TYPE_ID_UINT8); // "Image_RGB_Row_uint8"
//
// The hook "ImageTypeImplementation" chooses the storage at registration: 0 a dynamic matrix of rank 3 of the base
// type, 1 the custom type "cv_Mat".
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qltypes/types/DataType.h"
#include "qltypes/types/TypeIds.h"

/// Colour formats, each with the number of channels that it has.
enum SSImageColorFormat : int {
    SSImageColorFormat_BGRA = 0,      ///< 4
    SSImageColorFormat_RGB = 1,       ///< 3
    SSImageColorFormat_RGBA = 2,      ///< 4
    SSImageColorFormat_Grayscale = 3, ///< 1
    SSImageColorFormat_CMYK = 4,      ///< 4
    SSImageColorFormat_Spectral = 5,  ///< any but 0
    SSImageColorFormat_Lab = 6,       ///< 3
    SSImageColorFormat_HSV = 7,       ///< 3
    SSImageColorFormat_YUV444 = 8,    ///< 3
    SSImageColorFormat_CFA = 9,       ///< 1
};

/// How pixels lie in memory.
enum SSImageDataLayout : int {
    SSImageDataLayout_ColumnMajorPlanar = 0,
    SSImageDataLayout_RowMajorInterleaved = 1,
};

namespace QLTypeSys {

class DataTypeTable;

/// The property block of an image type.
struct ImageProperties {
    /// Number of channels of a pixel.
    unsigned long numChannels;
    /// What the channels mean.
    SSImageColorFormat colorFormat;
    /// How pixels lie in memory.
    SSImageDataLayout dataLayout;
    /// The type of one channel of one pixel.
    BuiltInDTypeId baseType;
};

/// The record of an image type.
class QL_EXPORT ImageDataType : public DataType {
  public:
    /// Raises `InvalidImageTypeNumChannels` when the format has another number of channels, and
    /// `InvalidImageTypeNumChannels2` for 0 channels of a format that may have any.
    ImageDataType(DataTypeTable* table, int id, const std::string& name, unsigned long numChannels,
                  SSImageColorFormat colorFormat, SSImageDataLayout dataLayout, BuiltInDTypeId baseType);
    ~ImageDataType() override;

    bool isImage() const override;

    /// Number of channels of a pixel.
    unsigned long getNumChannels() const;
    /// What the channels mean.
    SSImageColorFormat getColorFormat() const;
    /// How pixels lie in memory.
    SSImageDataLayout getDataLayout() const;
    /// The type of one channel of one pixel.
    BuiltInDTypeId getBaseType() const;

    // Names and values. The empty text for an unknown value, -1 for an unknown or null name.
    static const char* ImageColorFormatIdToName(SSImageColorFormat colorFormat);
    static SSImageColorFormat ImageColorFormatNameToId(const char* name);
    static const char* ImageDataLayoutIdToName(SSImageDataLayout dataLayout);
    static SSImageDataLayout ImageDataLayoutNameToId(const char* name);
    static const char* ImageBaseTypeIdToName(BuiltInDTypeId baseType);
    static BuiltInDTypeId ImageBaseTypeNameToId(const char* name);

    /// The number of channels that the format has; -1 for any, and for an unknown format.
    static long expectedNumChannels(SSImageColorFormat colorFormat);

    /// "Image_", the format, "_Row_" for the layout 1 or "_Col_" for any other, and the base type; for Spectral also
    /// "_" and the number of channels.
    static std::string ComputeAnonymousName(SSImageColorFormat colorFormat, SSImageDataLayout dataLayout,
                                            BuiltInDTypeId baseType, unsigned long numChannels);

    /// Copies size and functions of the storage type to this record, which must stand in the table. The function that
    /// updates a single dimension is not copied: an image is resized as a whole.
    void RegisterCallbacks(DataTypeTable* table);

  private:
    const ImageProperties& properties() const { return *static_cast<const ImageProperties*>(getProperties()); }
};

} // namespace QLTypeSys
