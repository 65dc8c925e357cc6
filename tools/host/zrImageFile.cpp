#include "zrImageFile.h"

#include <cstdio>
#include <filesystem>
#include <memory>
#include <sstream>
#include <vector>

#include <OpenImageIO/filesystem.h>
#include <OpenImageIO/imagebufalgo.h>
#include <OpenImageIO/imageio.h>

#include "zrHostError.h"

namespace Zr {

namespace {

std::string lastError(const std::string& fallback) {
    std::string error = OIIO::geterror();
    for (char& c : error) if (c == '\n') c = ' ';
    return error.empty() ? fallback : error;
}

std::string extensionOf(const std::string& path) {
    std::string extension = std::filesystem::path(path).extension().string();
    for (char& c : extension) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return extension;
}

// Straight colour as stored: no premultiplication on reading.
OIIO::ImageSpec unassociatedConfig() {
    OIIO::ImageSpec config;
    config.attribute("oiio:UnassociatedAlpha", 1);
    return config;
}

RCShdPtr<SdTexture> readTextureFrom(std::unique_ptr<OIIO::ImageInput> input, const std::string& name) {
    if (!input) throw ZrHostError(name + ": " + lastError("cannot read the image"));
    const OIIO::ImageSpec& header = input->spec();
    const int width = header.width;
    const int height = header.height;
    const int channels = header.nchannels;
    if (width <= 0 || height <= 0 || channels <= 0 || static_cast<long long>(width) * height > (1LL << 28))
        throw ZrHostError(name + ": an image of " + std::to_string(width) + "x" + std::to_string(height) +
                          " pixels cannot be a texture");
    std::vector<float> pixels(static_cast<std::size_t>(width) * height * channels);
    if (!input->read_image(0, 0, 0, channels, OIIO::TypeDesc::FLOAT, pixels.data()))
        throw ZrHostError(name + ": " + input->geterror());
    std::vector<CoRgbaColorTyped<float>> texels(static_cast<std::size_t>(width) * height);
    for (int y = 0; y < height; ++y) {
        // The file's top row is the texture's last: texture coordinates count upwards.
        const float* row = &pixels[static_cast<std::size_t>(height - 1 - y) * width * channels];
        for (int x = 0; x < width; ++x) {
            const float* p = row + static_cast<std::size_t>(x) * channels;
            CoRgbaColorTyped<float>& t = texels[static_cast<std::size_t>(y) * width + x];
            if (channels < 3) t = {p[0], p[0], p[0], channels == 2 ? p[1] : 1.0f};
            else t = {p[0], p[1], p[2], channels >= 4 ? p[3] : 1.0f};
        }
    }
    return makeShared<SdTexture>(width, height, std::move(texels));
}

}  // namespace

ZrImageFile::Storage ZrImageFile::storageFor(const std::string& path, bool wantFloat) {
    const std::string extension = extensionOf(path);
    if (extension.empty()) throw ZrHostError(path + ": the output needs an extension that names its format");
    std::unique_ptr<OIIO::ImageOutput> output = OIIO::ImageOutput::create(path);
    if (!output) throw ZrHostError(path + ": no image format writes \"" + extension + "\" files");
    std::error_code error;
    const std::filesystem::path folder = std::filesystem::path(path).parent_path();
    if (!folder.empty() && !std::filesystem::is_directory(folder, error))
        throw ZrHostError(path + ": no such folder " + folder.string());
    if (extension == ".exr") return wantFloat ? Storage::float32 : Storage::half;
    if (!wantFloat) return Storage::uint8;
    if (extension == ".tif" || extension == ".tiff") return Storage::float32;
    throw ZrHostError(path + ": float pixels need an OpenEXR or TIFF output");
}

void ZrImageFile::write(const std::string& path, const OIIO::ImageBuf& picture, Storage storage) {
    std::unique_ptr<OIIO::ImageOutput> output = OIIO::ImageOutput::create(path);
    if (!output) throw ZrHostError(path + ": " + lastError("no image format writes this extension"));
    const OIIO::TypeDesc type = storage == Storage::half      ? OIIO::TypeDesc::HALF
                                : storage == Storage::float32 ? OIIO::TypeDesc::FLOAT
                                                              : OIIO::TypeDesc::UINT8;
    const bool keepAlpha = output->supports("alpha");
    OIIO::ImageBuf pixels = keepAlpha ? picture : OIIO::ImageBufAlgo::channels(picture, 3, {});
    OIIO::ImageSpec header(picture.spec().width, picture.spec().height, keepAlpha ? 4 : 3, type);
    if (keepAlpha) header.alpha_channel = 3;
    if (storage == Storage::uint8) header.attribute("oiio:UnassociatedAlpha", 1);
    header.attribute("Software", "zrender");

    // The pixels go to a file beside the output first, which then takes its place: a failed or
    // interrupted write leaves no half-written picture.
    const std::filesystem::path target(path);
    const std::filesystem::path partial =
        target.parent_path() / (target.stem().string() + ".partial" + target.extension().string());
    std::vector<float> values(static_cast<std::size_t>(header.width) * header.height * header.nchannels);
    bool written = pixels.get_pixels(pixels.roi(), OIIO::TypeDesc::FLOAT, values.data());
    written = written && output->open(partial.string(), header);
    written = written && output->write_image(OIIO::TypeDesc::FLOAT, values.data());
    const std::string error = output->geterror();
    written = output->close() && written;
    std::error_code ignored;
    if (!written) {
        std::filesystem::remove(partial, ignored);
        std::string reason = error.empty() ? lastError("cannot write the file") : error;
        for (char& c : reason) if (c == '\n') c = ' ';
        throw ZrHostError(path + ": " + reason);
    }
    std::error_code renameError;
    std::filesystem::rename(partial, target, renameError);
    if (renameError) {
        std::filesystem::remove(partial, ignored);
        throw ZrHostError(path + ": " + renameError.message());
    }
}

OIIO::ImageBuf ZrImageFile::read(const std::string& path) {
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error)) throw ZrHostError(path + ": no such file (or not a file)");
    const OIIO::ImageSpec config = unassociatedConfig();
    OIIO::ImageBuf file(path, 0, 0, nullptr, &config);
    OIIO::ImageBuf picture;
    if (!file.read(0, 0, true, OIIO::TypeDesc::FLOAT) ||
        !OIIO::ImageBufAlgo::channels(picture, file, 4, {0, 1, 2, 3}, {0.0f, 0.0f, 0.0f, 1.0f}))
        throw ZrHostError(path + ": " + (file.has_error() ? file.geterror() : lastError("cannot read the image")));
    return picture;
}

ZrImageFile::Difference ZrImageFile::compare(const OIIO::ImageBuf& picture, const OIIO::ImageBuf& reference,
                                             float tolerance) {
    Difference difference;
    if (picture.spec().width != reference.spec().width || picture.spec().height != reference.spec().height) {
        difference.sizesDiffer = true;
        return difference;
    }
    const OIIO::ImageBufAlgo::CompareResults result =
        OIIO::ImageBufAlgo::compare(picture, reference, tolerance, tolerance);
    difference.pixelsDiffering = static_cast<long long>(result.nfail);
    difference.largestDifference = result.maxerror;
    return difference;
}

std::string ZrImageFile::Difference::describe() const {
    std::ostringstream os;
    if (sizesDiffer) os << "the pictures differ in size";
    else if (!any()) os << "the pictures are equal (largest difference " << largestDifference << ")";
    else os << pixelsDiffering << " pixels differ, by up to " << largestDifference << " in a channel";
    return os.str();
}

RCShdPtr<SdTexture> ZrImageFile::readTexture(const std::string& path) {
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error)) throw ZrHostError(path + ": no such file (or not a file)");
    const OIIO::ImageSpec config = unassociatedConfig();
    return readTextureFrom(OIIO::ImageInput::open(path, &config), path);
}

RCShdPtr<SdTexture> ZrImageFile::readTexture(const std::string& name, const void* bytes, std::size_t size) {
    OIIO::Filesystem::IOMemReader memory(bytes, size);
    const OIIO::ImageSpec config = unassociatedConfig();
    return readTextureFrom(OIIO::ImageInput::open(name, &config, &memory), name);
}

RCShdPtr<SdTexture> ZrImageFile::textureOfTexels(unsigned int width, unsigned int height, const unsigned char* bgra) {
    if (width == 0 || height == 0) throw ZrHostError("an embedded texture has no texels");
    std::vector<CoRgbaColorTyped<float>> texels(static_cast<std::size_t>(width) * height);
    for (unsigned int y = 0; y < height; ++y) {
        for (unsigned int x = 0; x < width; ++x) {
            const unsigned char* p = bgra + 4 * (static_cast<std::size_t>(height - 1 - y) * width + x);
            texels[static_cast<std::size_t>(y) * width + x] = {p[2] / 255.0f, p[1] / 255.0f, p[0] / 255.0f,
                                                               p[3] / 255.0f};
        }
    }
    return makeShared<SdTexture>(static_cast<int>(width), static_cast<int>(height), std::move(texels));
}

}  // namespace Zr
