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

    // An upper bound of the block's real size from its real strings (count field included),
    // valid for paths of any length. O(materials); touches no file.
    static std::int64_t measureStrings(const SgShape &shape);

    // Writes the block of `shape` at the cursor and returns the bytes written. Throws
    // SgRecordOverflow when the cursor has no room (nothing past its capacity is written).
    static std::int64_t write(const SgShape &shape, SgRecordOutput &output);

    // Copies the image of `texture` as a JPEG file into the temporary folder's "FacetorMaps"
    // sub-folder and returns the copy's path. The copy's name is the image's base name made
    // ASCII-safe (other characters become '_'), '-', eight hex digits of a hash of the image's
    // absolute path and ".jpg": the modeler reads the path as 8-bit text, and two different
    // images never share a copy, in this run or a later one. A copy that exists and is not
    // older than its image is not written again. Empty when the folder cannot be made, the
    // image cannot be loaded or the JPEG cannot be saved.
    static QString exportTextureAsJpeg(const SgTexture *texture);

    // The path that exportTextureAsJpeg gives `texture` (no file is touched).
    static QString jpegCopyPath(const SgTexture *texture);

    // The bytes that one image string may take without adding to the allowance.
    static constexpr int kImageStringAllowance = 1024;
};
