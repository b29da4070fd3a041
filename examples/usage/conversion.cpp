// Converting sample buffers: the factory picks the kernel for a pair of descriptors.
#include <vrkframework/basic/kubo/kubo.h>

#include <cstdint>
#include <memory>
#include <vector>

using kora::kubo::DataType;

int main() {
    const kora::kubo::PromoteFactory factory;

    // 32R to 8U rounds half away from zero and saturates at both ends.
    const std::vector<float> real{-3.0f, 2.5f, 254.5f, 1e9f};
    std::vector<std::uint8_t> bytes(real.size());
    std::unique_ptr<typeconv::IPromote> toBytes(
        factory.Create(DataType::Type32R, DataType::Type8U));
    toBytes->Promote(real.data(), bytes.data(), static_cast<unsigned int>(real.size()));

    // 12-bit packed samples (most significant bit first) unpacked to 16U.
    const DataType packed12(12, false, false, 12, 0, false);
    const std::uint8_t stream[] = {0xAB, 0xC1, 0x23};
    std::uint16_t samples[2];
    std::unique_ptr<typeconv::IPromote> unpack(factory.Create(packed12, DataType::Type16U));
    unpack->Promote(stream, samples, 2);

    const bool ok = bytes == std::vector<std::uint8_t>{0, 3, 255, 255} && samples[0] == 0xABC &&
                    samples[1] == 0x123;
    return ok ? 0 : 1;
}
