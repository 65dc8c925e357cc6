#pragma once
// Image files through OpenImageIO: the pictures zrender writes and compares, and the textures of
// model files.
//
// A picture is an ImageBuf of four channels, rows from the top down, as it goes to the file:
// 8-bit pictures hold straight colour, as the renderer writes it and as PNG, TIFF and JPEG store
// it; float pictures are premultiplied by alpha, as OpenEXR files and the compositors that read
// them expect. The file's format follows its extension.
#include <cstddef>
#include <string>

#include <OpenImageIO/imagebuf.h>

#include "rcShdPtr.h"
#include "sdTexture.h"

namespace Zr {

class ZrImageFile {
public:
    // How a file stores its pixels: 8-bit, half or float channels.
    enum class Storage { uint8, half, float32 };

    // The storage for path: OpenEXR files half (float32 with wantFloat), TIFF files 8-bit
    // (float32 with wantFloat), other formats 8-bit. Throws ZrHostError for an extension that
    // OpenImageIO cannot write, and for wantFloat with a format that stores no floats.
    static Storage storageFor(const std::string& path, bool wantFloat);

    // Writes the picture to path in the given storage, alpha dropped where the format has none.
    // The file appears whole or not at all. Throws ZrHostError naming the file.
    static void write(const std::string& path, const OIIO::ImageBuf& picture, Storage storage);

    // Reads a picture for comparison: straight colour as stored, four channels. Throws ZrHostError.
    static OIIO::ImageBuf read(const std::string& path);

    // How two pictures differ, every channel of every pixel compared with the given tolerance.
    struct Difference {
        bool sizesDiffer = false;
        long long pixelsDiffering = 0;
        double largestDifference = 0.0;
        bool any() const { return sizesDiffer || pixelsDiffering > 0; }
        std::string describe() const;
    };
    static Difference compare(const OIIO::ImageBuf& picture, const OIIO::ImageBuf& reference, float tolerance);

    // A texture from a file or from a file's bytes in memory (name gives the format by its
    // extension), straight colour, row 0 the bottom of the image as texture coordinates count.
    // Throws ZrHostError naming the file.
    static RCShdPtr<SdTexture> readTexture(const std::string& path);
    static RCShdPtr<SdTexture> readTexture(const std::string& name, const void* bytes, std::size_t size);
    // A texture of width x height 8-bit texels in the order blue, green, red, alpha, top row first.
    static RCShdPtr<SdTexture> textureOfTexels(unsigned int width, unsigned int height, const unsigned char* bgra);
};

}  // namespace Zr
