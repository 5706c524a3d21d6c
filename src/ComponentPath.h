// ComponentPath: decodes blocks with the state's components, one at a time.
#ifndef MORVIK_SRC_COMPONENTPATH_H
#define MORVIK_SRC_COMPONENTPATH_H

#include <vector>

#include "BlockPath.h"
#include "DecoderState.h"

class ComponentPath : public BlockPath {
public:
    explicit ComponentPath(veltra_ip_morvik_v1_0_state& state) : itsState(state) {}

    /// Takes one block and interleaves its three streams, position by position, into aligned soft values.
    unsigned take(const morvik::simulation_call::Batch& batch, std::size_t first, unsigned most) override;

    morvik::simulation_call::Status decode(unsigned iterations) override;
    morvik::simulation_call::Status countErrors(unsigned iterations,
                                                const std::uint8_t* sent,
                                                std::uint32_t* errors) override;
    std::size_t blockSize() const override;
    void decisions(std::uint8_t* to) override;
    void ratios(std::int16_t* to) override;

private:
    veltra_ip_morvik_v1_0_state& itsState;
    unsigned itsBlockSize = 0;  ///< K of the block taken
    std::vector<short> itsSoft;
    std::vector<unsigned char> itsHard;
};

#endif
