// Creates the components of the model one by one, decodes a block with them and looks at an internal value.
#include <iostream>
#include <vector>

#include "TDecoder3GPU.h"

int main()
{
    TNumberFormat* state = TNumberFormat::create("Fix_12_3");
    TNumberFormat* branch = TNumberFormat::create("Fix_8_3");
    TInterleaver* interleaver = TInterleaver::create("3GPPLTE");
    TCalculationEngine* engine = TCalculationEngine::create("MOD#:16");
    engine->itsStateFormat = state;
    engine->itsBranchFormat = engine->itsInputFormat = branch;
    engine->initialise();
    TDecoder* decoder = TDecoder::create("3GPPPU:4");
    decoder->itsInterleaver = interleaver;
    decoder->itsEngine = engine;

    // Aligned words of the state format: -384 is -3. 44 positions of three values.
    std::vector<short> soft(3 * 44, -384);
    std::vector<unsigned char> hard;
    decoder->decode(soft, hard, 8);
    std::cout << hard.size() << " bits, the first ratio is " << state->real(decoder->itsLLR[0]) << '\n';

    delete decoder;
    delete interleaver;
    delete engine;
    delete branch;
    delete state;
}
