#include "zrPassImages.h"

#include <sstream>

#include <OpenImageIO/deepdata.h>
#include <OpenImageIO/imagebufalgo.h>

#include "zrCryptomatte.h"
#include "zrHostError.h"

namespace Zr {

namespace {

// The channels of each pass, in file order, with how many floats per pixel the outputs hold.
struct PassChannels {
    unsigned pass;
    std::vector<std::string> names;
    const std::vector<float>& (RsAuxOutputs::*values)() const;
};

const std::vector<PassChannels>& passChannels() {
    static const std::vector<PassChannels> channels{
        {ZrPassImages::depth, {"Z"}, &RsAuxOutputs::getZ},
        {ZrPassImages::normal, {"N.X", "N.Y", "N.Z"}, &RsAuxOutputs::getNormal},
        {ZrPassImages::position, {"P.X", "P.Y", "P.Z"}, &RsAuxOutputs::getPosition},
        {ZrPassImages::texCoord, {"UV.U", "UV.V"}, &RsAuxOutputs::getTexCoord},
        {ZrPassImages::ids, {"ObjectID"}, &RsAuxOutputs::getObjectId},
        {ZrPassImages::ids, {"MaterialID"}, &RsAuxOutputs::getMaterialId},
        // The library's rows, like v, count upwards: the rows alone are turned over.
        {ZrPassImages::motion, {"motion.u", "motion.v"}, &RsAuxOutputs::getMotion},
    };
    return channels;
}

}  // namespace

unsigned ZrPassImages::parse(const std::string& list) {
    unsigned passes = 0;
    std::istringstream in(list);
    for (std::string name; std::getline(in, name, ',');) {
        if (name == "z") passes |= depth;
        else if (name == "n") passes |= normal;
        else if (name == "p") passes |= position;
        else if (name == "uv") passes |= texCoord;
        else if (name == "id") passes |= ids;
        else if (name == "motion") passes |= motion;
        else if (name == "crypto") passes |= crypto;
        else throw ZrHostError("--passes: no pass named '" + name + "' (z, n, p, uv, id, motion, crypto)");
    }
    return passes;
}

ZrPassImages::ZrPassImages(unsigned passes, bool deep, int width, int height)
    : _passes(passes), _deep(deep), _width(width), _height(height) {}

std::unique_ptr<RsAuxOutputs> ZrPassImages::makeTileOutputs(const GeRectangle<int>& tile) const {
    if (_passes == 0 && !_deep) return nullptr;
    return std::make_unique<RsAuxOutputs>(tile, (_passes & ~unsigned(crypto)) != 0, _deep || (_passes & crypto) != 0);
}

void ZrPassImages::keepTile(std::unique_ptr<RsAuxOutputs> outputs) {
    const std::lock_guard<std::mutex> hold(_lock);
    if (outputs) _tiles.push_back(std::move(outputs));
}

OIIO::ImageBuf ZrPassImages::layers(const OIIO::ImageBuf& picture) const {
    std::vector<std::string> names{"R", "G", "B", "A"};
    std::vector<const PassChannels*> wanted;
    for (const PassChannels& p : passChannels())
        if ((_passes & p.pass) != 0) {
            wanted.push_back(&p);
            names.insert(names.end(), p.names.begin(), p.names.end());
        }
    // The ID mattes come last; every tile's scene names the IDs alike.
    std::vector<ZrCryptomatte> mattes;
    if ((_passes & crypto) != 0) {
        const RsAuxOutputs* any = _tiles.empty() ? nullptr : _tiles.front().get();
        const std::vector<std::string> none;
        mattes.emplace_back("CryptoObject", "object", any ? any->getObjectNames() : none, &RsDeepSample::_objectId);
        mattes.emplace_back("CryptoMaterial", "material", any ? any->getMaterialNames() : none,
                            &RsDeepSample::_materialId);
        for (const ZrCryptomatte& matte : mattes) {
            const std::vector<std::string> channels = matte.channelNames();
            names.insert(names.end(), channels.begin(), channels.end());
        }
    }
    const int firstMatte = static_cast<int>(names.size()) - static_cast<int>(mattes.size()) * ZrCryptomatte::kChannels;
    const int channels = static_cast<int>(names.size());
    OIIO::ImageSpec header(_width, _height, channels, OIIO::TypeDesc::FLOAT);
    header.channelnames = names;
    header.alpha_channel = 3;
    header.z_channel = (_passes & depth) != 0 ? 4 : -1;
    for (const ZrCryptomatte& matte : mattes) matte.describe(header);
    OIIO::ImageBuf image(header);
    OIIO::ImageBufAlgo::paste(image, 0, 0, 0, 0, picture);
    std::vector<float> row;
    for (const std::unique_ptr<RsAuxOutputs>& tile : _tiles) {
        const GeRectangle<int>& r = tile->getRegion();
        int first = 4;
        for (const PassChannels* p : wanted) {
            const int count = static_cast<int>(p->names.size());
            const std::vector<float>& values = ((*tile).*(p->values))();
            // A tile whose outputs had no motion target keeps motion 0.
            for (int y = r.y0; y < r.y1 && !values.empty(); ++y) {
                // The renderer's rows count upwards, the image's down.
                const OIIO::ROI roi(r.x0, r.x1, _height - 1 - y, _height - y, 0, 1, first, first + count);
                image.set_pixels(roi, OIIO::TypeDesc::FLOAT, &values[tile->indexOf(r.x0, y) * count]);
            }
            first += count;
        }
        if (mattes.empty()) continue;
        for (int y = r.y0; y < r.y1; ++y) {
            row.resize(std::size_t(r.x1 - r.x0) * mattes.size() * ZrCryptomatte::kChannels);
            float* values = row.data();
            for (int x = r.x0; x < r.x1; ++x) {
                const std::size_t i = tile->indexOf(x, y);
                const RsDeepSample* samples = tile->getDeepSamples().data() + tile->getDeepOffsets()[i];
                for (ZrCryptomatte& matte : mattes) {
                    matte.pixel(samples, tile->getDeepCounts()[i], values);
                    values += ZrCryptomatte::kChannels;
                }
            }
            const OIIO::ROI roi(r.x0, r.x1, _height - 1 - y, _height - y, 0, 1, firstMatte, channels);
            image.set_pixels(roi, OIIO::TypeDesc::FLOAT, row.data());
        }
    }
    return image;
}

OIIO::ImageBuf ZrPassImages::deepImage() const {
    OIIO::ImageSpec header(_width, _height, 8, OIIO::TypeDesc::FLOAT);
    header.channelnames = {"R", "G", "B", "A", "Z", "ZBack", "ObjectID", "MaterialID"};
    header.alpha_channel = 3;
    header.z_channel = 4;
    header.deep = true;
    OIIO::ImageBuf image(header);
    OIIO::DeepData& deep = *image.deepdata();
    const auto pixelOf = [this](int x, int y) { return std::int64_t(_height - 1 - y) * _width + x; };
    std::vector<unsigned int> counts(std::size_t(_width) * std::size_t(_height), 0);
    for (const std::unique_ptr<RsAuxOutputs>& tile : _tiles) {
        const GeRectangle<int>& r = tile->getRegion();
        for (int y = r.y0; y < r.y1; ++y)
            for (int x = r.x0; x < r.x1; ++x) counts[pixelOf(x, y)] = tile->getDeepCounts()[tile->indexOf(x, y)];
    }
    deep.set_all_samples(counts);
    for (const std::unique_ptr<RsAuxOutputs>& tile : _tiles) {
        const GeRectangle<int>& r = tile->getRegion();
        for (int y = r.y0; y < r.y1; ++y)
            for (int x = r.x0; x < r.x1; ++x) {
                const std::size_t i = tile->indexOf(x, y);
                const RsDeepSample* s = tile->getDeepSamples().data() + tile->getDeepOffsets()[i];
                const std::int64_t pixel = pixelOf(x, y);
                for (int k = 0; k < static_cast<int>(tile->getDeepCounts()[i]); ++k) {
                    const float values[8] = {s[k]._r,      s[k]._g,     s[k]._b,        s[k]._a,
                                             s[k]._zFront, s[k]._zBack, s[k]._objectId, s[k]._materialId};
                    for (int c = 0; c < 8; ++c) deep.set_deep_value(pixel, c, k, values[c]);
                }
            }
    }
    return image;
}

void ZrPassImages::writeExr(const std::string& path, const OIIO::ImageBuf& image) {
    OIIO::ImageBuf out(image.spec());
    out.copy(image);
    out.specmod().attribute("Software", "zrender");
    out.set_write_format(OIIO::TypeDesc::FLOAT);
    if (!out.write(path, OIIO::TypeDesc::FLOAT, "openexr")) {
        std::string reason = out.geterror();
        for (char& c : reason)
            if (c == '\n') c = ' ';
        throw ZrHostError(path + ": " + reason);
    }
}

}  // namespace Zr
