#include "sim/StoredImage.h"

#include <bit>
#include <cstring>

#include "sim/ReceiverPhysics.h"

namespace sim {
namespace {

constexpr double compressionLevels[] = {0.05, 0.1, 0.2, 0.5};

void appendBytes(std::vector<std::uint16_t>& image, const unsigned char* bytes, std::size_t n) {
    for (std::size_t i = 0; i < n; i += 2) {
        image.push_back(static_cast<std::uint16_t>(bytes[i] | (bytes[i + 1] << 8)));
    }
}

template <class T>
void appendValue(std::vector<std::uint16_t>& image, T value) {
    unsigned char bytes[sizeof(T)];
    std::memcpy(bytes, &value, sizeof(T));
    if constexpr (std::endian::native == std::endian::big) {
        for (std::size_t i = 0; i < sizeof(T) / 2; ++i) {
            std::swap(bytes[i], bytes[sizeof(T) - 1 - i]);
        }
    }
    appendBytes(image, bytes, sizeof(T));
}

}  // namespace

std::vector<std::uint16_t> makeStoredImage(const std::string& receiver,
                                           const ReceiverParameters& physics, long records) {
    std::vector<std::uint16_t> image;
    image.reserve(11 + 28 * static_cast<std::size_t>(records));
    image.push_back(1);
    appendValue(image, static_cast<std::uint32_t>(records));
    image.push_back(4);
    unsigned char name[2] = {static_cast<unsigned char>(receiver.size() > 0 ? receiver[0] : 0),
                             static_cast<unsigned char>(receiver.size() > 1 ? receiver[1] : 0)};
    appendBytes(image, name, 2);
    appendValue(image, 25.0f);
    appendValue(image, -3.0f);
    appendValue(image, 30.0f);
    const double start = 10e6;
    const double stop = 26.5e9;
    for (long i = 0; i < records; ++i) {
        double f = records > 1 ? start + (stop - start) * static_cast<double>(i) /
                                             static_cast<double>(records - 1)
                               : start;
        appendValue(image, f);
        for (double x : compressionLevels) {
            double input = compressionInputPowerDbm(physics, x, f);
            appendValue(image, static_cast<float>(input - x));
            appendValue(image, static_cast<float>(-x));
            appendValue(image, static_cast<float>(-physics.amPmDegPerDb * x));
        }
    }
    return image;
}

std::vector<std::uint16_t> makeStoredBlock(const std::string& receiver,
                                           const ReceiverParameters& physics, long words) {
    long records = words > 11 ? (words - 11 + 27) / 28 : 0;
    std::vector<std::uint16_t> image = makeStoredImage(receiver, physics, records);
    image.resize(static_cast<std::size_t>(words));
    return image;
}

}  // namespace sim
