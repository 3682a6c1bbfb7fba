#pragma once

#include <QString>

#include <cstdint>

class SgMaterial;
class SgRecordOutput;
class SgShape;
class SgTexture;

// Writes the materials block of a record that the host sends: i32 count, then per material the
// tags 'm', 'c', 's', 'g', 't', 'b' with the name, diffuse colour and its two image strings
// (folder of the image file, path of its JPEG copy), specular colour, inverted glossiness,
// opacity, bump strength and the bump image's two strings. Image copies are written as JPEG
// files on the way (see exportTextureAsJpeg).
class SgMaterialBlockWriter {
public:
    // The materials allowance of the record's measure: per material its name length plus 4158
    // (42 fixed bytes, five string counts and 1024 characters for each of the four image
    // strings). It holds only while image strings stay within 1024 characters and does not
    // count the block's own count field. O(materials); touches no file.
    static std::int64_t allowance(const SgShape &shape);

    // An upper bound of the block's real size from its real strings (count field included;
    // each copy path counted with the suffix it may gain), valid for paths of any length.
    // O(materials); touches no file.
    static std::int64_t measureStrings(const SgShape &shape);

    // Writes the block of `shape` at the cursor and returns the bytes written. Throws
    // SgRecordOverflow when the cursor has no room (nothing past its capacity is written).
    static std::int64_t write(const SgShape &shape, SgRecordOutput &output);

    // Copies the image of `texture` as a JPEG file into the temporary folder's "FacetorMaps"
    // sub-folder, named after the image's base name, and returns the copy's path. An image whose
    // copy already exists is not written again. Empty when the folder cannot be made, the image
    // cannot be loaded or the JPEG cannot be saved. When another image file of the same base
    // name was copied earlier in this process, the copy's name carries a suffix made from the
    // image's own path, so that two different images never share one copy.
    static QString exportTextureAsJpeg(const SgTexture *texture);

    // The path that exportTextureAsJpeg gives `texture` if it succeeds (no file is touched).
    static QString jpegCopyPath(const SgTexture *texture);

    // The characters a copy path may gain as a suffix beyond jpegCopyPath's answer at
    // measuring time (another material of the same record can claim the plain name first).
    static constexpr int kCopySuffixLength = 9;

    // The bytes that one image string may take without adding to the allowance.
    static constexpr int kImageStringAllowance = 1024;
};
