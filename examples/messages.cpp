// A decoder class that captures the library's output on the standard streams: errors become exceptions, warnings go to
// the caller.
#include <iostream>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

/// Captures a stream during its lifetime.
class Taken {
public:
    explicit Taken(std::ostream& stream) : itsStream(stream), itsBuffer(stream.rdbuf(itsText.rdbuf())) {}

    ~Taken()
    {
        itsStream.rdbuf(itsBuffer);
    }

    Taken(const Taken&) = delete;
    Taken& operator=(const Taken&) = delete;

    std::string text() const
    {
        return itsText.str();
    }

private:
    std::ostringstream itsText;
    std::ostream& itsStream;
    std::streambuf* itsBuffer;
};

class Decoder {
public:
    explicit Decoder(int units)
    {
        auto generics = veltra_ip_morvik_v1_0_get_default_generics();
        generics.C_NUM_PU = units;
        const Taken errors(std::cerr);
        itsState.reset(veltra_ip_morvik_v1_0_create_state(generics));
        if (itsState == nullptr) {
            throw std::invalid_argument(errors.text());
        }
    }

    /// The decisions of a block; `warnings` receives lines such as the one for a saturated value.
    std::vector<unsigned char> decode(const std::vector<int> (&streams)[3], unsigned iterations, std::string& warnings)
    {
        const auto size = static_cast<int>(streams[0].size());
        std::vector<unsigned char> bits(streams[0].size());
        veltra_ip_morvik_v1_0_outputs outputs = {};
        outputs.dout = bits.data();
        outputs.dout_alloc = static_cast<unsigned>(bits.size());
        const Taken errors(std::cerr);
        const Taken output(std::cout);
        if (veltra_ip_morvik_v1_0_bitacc_simulate(itsState.get(),
                                                  streams[0].data(),
                                                  streams[1].data(),
                                                  streams[2].data(),
                                                  size,
                                                  iterations,
                                                  0,
                                                  &outputs) != 0) {
            throw std::invalid_argument(errors.text());
        }
        warnings = output.text();
        bits.resize(outputs.dout_size);
        return bits;
    }

private:
    struct Destroy {
        void operator()(veltra_ip_morvik_v1_0_state* state) const
        {
            veltra_ip_morvik_v1_0_destroy_state(state);
        }
    };
    std::unique_ptr<veltra_ip_morvik_v1_0_state, Destroy> itsState;
};

int main()
{
    try {
        const Decoder decoder(3);
    } catch (const std::invalid_argument& error) {
        std::cout << "3 units: " << error.what();
    }

    Decoder decoder(8);
    std::vector<int> streams[3];
    for (std::vector<int>& stream : streams) {
        stream.assign(44, -24);
    }
    streams[1][7] = -200;
    std::string warnings;
    std::cout << decoder.decode(streams, 8, warnings).size() << " bits, and " << warnings;
    try {
        decoder.decode(streams, 16, warnings);
    } catch (const std::invalid_argument& error) {
        std::cout << "16 iterations: " << error.what();
    }
}
