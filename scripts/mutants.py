"""Mutants: where the model is mutated, how, and which mutants have no observable effect."""

import pathlib
import re
import sys
from typing import NamedTuple

ROOT = pathlib.Path(__file__).resolve().parent.parent

# Where to mutate: files, and in them all functions or the named ones.
PLACES = {
    "rules/Arithmetic.h": None,
    "rules/BlockSizes.h": ["findBlockSize"],
    "rules/Correction.h": None,
    "rules/Cut.h": None,
    "rules/Formats.h": None,
    "rules/Interleaver.h": None,
    "rules/Schedule.h": None,
    "rules/SoftValues.h": None,
    "rules/Starts.h": None,
    "rules/Tail.h": None,
    "rules/Trellis.h": None,
    "rules/TrellisDecision.h": None,
    "src/TCalculationEngineModBase.cpp": ["forward", "backward", "ratios", "mod_gamma", "createLUT"],
    "src/TDecoder3G.cpp": ["extract", "appendParity", "interleaveSystematic",
                           "preparePermutation", "permutation", "calcSISO", "startExtrinsic", "calcIntrinsic",
                           "calcGamma", "calcAlpha", "calcBeta", "calcLLR", "calcExtrinsic", "setInitialState",
                           "hardDecisions"],
    "src/TDecoder3GPU.cpp": ["border", "allocate", "buildSegments", "calcGamma", "calcAlpha", "initialiseAlpha",
                             "calcBeta", "initialiseBeta", "runWindow", "windowStartingWhereEnds", "preCalcBetaTail"],
    "src/TNumberFormat.cpp": ["TNumberFormat", "place", "integer", "real"],
    "src/Batch.h": ["blockSize", "tag", "streamsOf"],
    "src/CoreInputs.h": ["forEachSoftValue"],
    "src/CoreInputs.cpp": ["truncateTag", "reportSaturation"],
    "src/SimulationCall.cpp": ["outputFault", "shortArray", "sendBy", "send", "deliver", "simulate", "countErrors"],
    "src/PathChoice.cpp": None,
    "src/ComponentPath.cpp": None,
    "src/LanePath.cpp": None,
    "src/MissedBlocks.cpp": None,
    "src/OriginalComponents.cpp": ["isNoTableOf", "areEqual", "dropTablesOfOtherSizes", "haveOwnTables", "twin"],
    "src/morvik_v1_0_bitacc_cmodel.cpp": ["create_default_state", "veltra_ip_morvik_v1_0_bitacc_simulate"],
    "lanes/Extrinsics.h": None,
    "lanes/InstructionSets.cpp": None,
    "lanes/Kernels.cpp": None,
    "lanes/LaneDecoder.cpp": None,
    "lanes/LaneOrder.h": None,
    "lanes/Layout.h": None,
    "lanes/Machine.h": None,
    "lanes/PairedStates.h": None,
    "lanes/Pass.h": None,
    "lanes/Rules.h": None,
    "lanes/SizeTables.cpp": None,
    "lanes/StatePass.h": None,
    "lanes/Transpose.h": None,
    "lanes/Words.h": None,
    "link/coding/BitMatrix.h": None,
    "link/coding/CodeBlocks.cpp": None,
    "link/coding/Crc.cpp": None,
    "link/coding/PackedBits.cpp": None,
    "link/coding/PackedBits.h": None,
    "link/coding/RateMatching.cpp": None,
    "link/coding/SoftValues.cpp": None,
    "link/coding/TransportBlock.cpp": None,
    "link/coding/TurboEncoder.cpp": None,
    "link/modulation/Demapper.cpp": None,
    "link/modulation/Mapper.cpp": None,
    "link/modulation/Modulation.cpp": None,
    "link/modulation/Modulation.h": None,
}

# Functions that choose how something is computed, never what: there, mistakes cost time alone.
SPEED_ALONE = {"lanes/Kernels.cpp": ["stepsRun"], "lanes/Machine.h": ["pairsStates"]}

# Replacements: operators with a space on both sides or at the end of their line, and words.
SWAPS = [("+", "-"), ("-", "+"), ("<", "<="), ("<=", "<"), (">", ">="), (">=", ">"), ("==", "!="), ("!=", "=="),
         ("&&", "||"), ("||", "&&"), ("*", "+"), ("/", "*"), ("^", "|"), ("&", "|"), ("|", "&"), ("<<", ">>"),
         (">>", "<<"), ("%", "/"), ("+=", "-="), ("-=", "+=")]
WORDS = [("add", "subtract"), ("subtract", "add"), ("addWrap", "subWrap"), ("subWrap", "addWrap"), ("odd", "even"),
         ("even", "odd"), ("one", "zero"), ("c1", "c2"), ("c2", "c1"), ("from", "to"), ("to", "from"),
         ("lo", "hi"), ("itsMin", "itsMax"), ("itsMinQ", "itsMaxQ"), ("itsMaxQ", "itsMinQ")]

# Equivalent mutants: for each file the reason, and the relevant part of each old and new line.
EQUIVALENT = {
    "rules/Arithmetic.h": [
        ("a value that equals the limit becomes the limit",
         [("value < lo ?", "value <= lo ?"), ("hi < value ?", "hi <= value ?")]),
    ],
    "rules/Trellis.h": [
        ("every bit that is not 0 is bit 1",
         [("predecessor(state, 1)", "predecessor(state, 2)"), ("bestPath<1>", "bestPath<2>"),
          ("successor(even, 1)", "successor(even, 2)"), ("successor(odd, 1)", "successor(odd, 2)")]),
        ("the two predecessors of a state are a pair and share a branch metric", [("branch(one);", "branch(zero);")]),
        ("an array with an element more",
         [("Metric, 4> pair", "Metric, 5> pair"), ("Metric one[2]", "Metric one[3]"), ("Metric zero[2]", "Metric zero[3]"),
          ("Wide x[3]", "Wide x[4]"), ("Wide p[3]", "Wide p[4]"), ("Wide q[3]", "Wide q[4]")]),
    ],
    "rules/Cut.h": [
        ("no block, for any number of units", [("constexpr Cut() : Cut(0, 1)", "constexpr Cut() : Cut(0, 2)")]),
        ("64 to 127 steps have no full row in front of their rest",
         [("itsLength < longestWindow ?", "itsLength <= longestWindow ?")]),
    ],
    "rules/Correction.h": [
        ("eight points resolve log2 8 - 3 = 0 fraction bits, as fewer do", [("log2Points > 2 ?", "log2Points > 3 ?")]),
    ],
    "rules/SoftValues.h": [
        ("a value that equals the limit becomes the limit", [("product > lo ?", "product >= lo ?")]),
    ],
    "src/TDecoder3G.cpp": [
        ("half of 1 is 0",
         [("itsExtrinsic.end(), short{0}", "itsExtrinsic.end(), short{1}"),
          ("itsExtrinsic[from[j]] : 0", "itsExtrinsic[from[j]] : 1")]),
    ],
    "src/TDecoder3GPU.cpp": [
        ("the first passes start from zeros whatever these columns hold, and store each of them; the last is the tail's",
         [("unsigned i = 0; i + 1 < starts.size()", new) for new in (
             "unsigned i = 1; i + 1 < starts.size()", "unsigned i = 0; i + 2 < starts.size()",
             "unsigned i = 0; i + 0 < starts.size()", "unsigned i = 0; i - 1 < starts.size()",
             "unsigned i = 0; i + 1 <= starts.size()")]),
    ],
    "src/TNumberFormat.cpp": [
        ("a value that equals the limit becomes the limit",
         [("q < itsMinQ", "q <= itsMinQ"), ("q > itsMaxQ", "q >= itsMaxQ")]),
        ("values that the constructor replaces",
         [("itsMin(0)", "itsMin(1)"), ("itsMax(0)", "itsMax(1)"), ("itsMask(0)", "itsMask(1)")]),
    ],
    "src/LanePath.cpp": [
        ("a last block of the same size is dropped again at once", [("K < lastK", "K <= lastK")]),
        ("load and decode set it before it is read",
         [("itsIterations = 0;", "itsIterations = 1;")]),
        ("room for more values than there are",
         [("values(3", "values(4")]),
    ],
    "src/SimulationCall.cpp": [
        ("blocks that are taken one by one give the same", [("b == 0 && firstAlone", "b == 0 || firstAlone")]),
    ],
    "src/ComponentPath.cpp": [
        ("room for more values than there are", [("reserve(3 *", "reserve(4 *")]),
        ("room for fewer values, which grows",
         [("itsSoft.reserve(3", "itsSoft.reserve(2"), ("itsSoft.reserve(3 *", "itsSoft.reserve(3 +")]),
    ],
    "src/MissedBlocks.cpp": [
        ("the three streams of a block are of one length", [("block.input[0].size()", "block.input[1].size()")]),
        ("a block of the same size writes what it left once more", [("back().K <= K", "back().K < K")]),
    ],
    "src/morvik_v1_0_bitacc_cmodel.cpp": [
        ("room for more tags than there are", [("tags_alloc = 1", "tags_alloc = 2")]),
    ],
    "lanes/Machine.h": [
        ("a value that equals the limit becomes the limit",
         [("< -32768 ? -32768", "< -32767 ? -32768"), ("> 32767 ? 32767", "> 32766 ? 32767"),
          ("copies[i] < -32768", "copies[i] <= -32768"), ("copies[i] > 32767", "copies[i] >= 32767")]),
        ("of an index word, the low five bits alone count",
         [("control[2 * lane + 1] = 0", "control[2 * lane + 1] = 1")]),
        ("vectors of eight lanes have one half",
         [("tileHalves = 1;", "tileHalves = 2;"), ("tileHalves = 1;", "tileHalves = 0;")]),
        ("which kernels lift branch metrics: the speed alone", [
            ("liftsBranches = sizeof(void*) == 4", "liftsBranches = sizeof(void*) == 5"),
            ("liftsBranches = sizeof(void*) == 4", "liftsBranches = sizeof(void*) == 3"),
            ("liftsBranches = sizeof(void*) == 4", "liftsBranches = sizeof(void*) != 4")]),
        ("more room, or a source that is not read",
         [("static constexpr unsigned sources = count / group;", "static constexpr unsigned sources = count * group;"),
          ("bytes = 2", "bytes = 3"), ("sources = 1;", "sources = 2;")]),
        ("beyond the input format as well",
         [("< -32768", "< -32769"), ("? -32768", "? -32769"), ("? -32768", "? -32767"), ("> 32767 ?", "> 32768 ?"),
          ("? 32767 :", "? 32768 :"), ("? 32767 :", "? 32766 :"), ("? -32768", "? +32768")]),
        ("a lane more: its control is written again or spare, its value no part of the vector",
         [("for (unsigned lane = 0; lane < count; ++lane) {", "for (unsigned lane = 0; lane <= count; ++lane) {"),
          ("control[2 * lane + 1] = 0;", "control[3 * lane + 1] = 0;"), ("+ 1] = 0;", "+ 2] = 0;")]),
        ("the speed alone",
         [("tileHalves = 2;", "tileHalves = 1;"), ("== 8;  //", "== 9;  //"), ("== 8;  //", "== 7;  //"),
          ("== 8;  //", "!= 8;  //")]),
        ("a value more, of the tail, which is dropped", [("copies[8]", "copies[9]")]),
        ("the last two entries of the table are 0", [
            ("int drops = correctionEntries - 1", "int drops = correctionEntries - 2"), ("reach - 1)", "reach - 2)"),
            ("reach - 1, difference)", "reach - 2, difference)")]),
        ("beyond either end of the table stands its last entry, up to a step away", [
            ("reach - 1)", "reach - 0)"), ("reach - 1)", "reach + 1)"), ("reach - 1, difference)", "reach - 0, difference)"),
            ("reach - 1, difference)", "reach + 1, difference)")]),
        ("the general form of the same instruction", [("i == 0 && j == 1", "i == 0 && j == 2")]),
        ("both halves of the vector are the same", [("part<count, 0>(permute", "part<count, 1>(permute")]),
        ("where both are the upper halves, a and b are one vector", [("(2 + j) << 4", "(2 - j) << 4")]),
        ("four values more, which are dropped", [("quads[2]", "quads[3]")]),
    ],
    "link/coding/CodeBlocks.cpp": [
        ("the size of no block", [("count, 0, plus->K", "count, 1, plus->K")]),
    ],
    "link/coding/Crc.cpp": [
        ("the remainder of a byte of zeros is 0", [("byte = 0;", "byte = 1;")]),
    ],
    "link/coding/PackedBits.cpp": [
        ("copies the same bits in other parts", [
            ("% 64 != 0 && count > 0", "% 64 != 0 && count > 1"), ("% 64 != 0 && count > 0", "% 64 != 0 || count > 0")]),
        ("the rest is packed bit by bit", [("count / 8 * 8", "count / 9 * 8"), ("count / 8 * 8", "count / 8 * 7")]),
    ],
    "link/coding/PackedBits.h": [
        ("set later", [("words = 0;", "words = 1;")]),
    ],
    "link/coding/TransportBlock.cpp": [
        ("a word in front of each row that nobody reads", [("itsWordOffsets.push_back(0)", "itsWordOffsets.push_back(1)")]),
        ("adds 0", [("r > shorter ?", "r >= shorter ?")]),
        ("there is no code block of that kind", [("kind < itsKinds.size()", "kind <= itsKinds.size()")]),
        ("code blocks are encoded one by one", [("== TurboEncoder::blocksAtOnce", "!= TurboEncoder::blocksAtOnce")]),
        ("copies no bit", [("first < bits", "first <= bits"), ("end > itsBlocks.bits", "end >= itsBlocks.bits")]),
        ("every word is written over", [("coded.words, 0)", "coded.words, 1)")]),
    ],
    "link/modulation/Demapper.cpp": [
        ("written over", [("bits = 0;", "bits = 1;"), ("largest = 0;", "largest = 1;")]),
        ("of numbers that are all 0, the next larger one", [("most = 0;", "most = 1;")]),
        ("a bound with room", [
            ("4096 *", "4097 *"), ("4096 *", "4095 *"), ("gain + 1)", "gain + 2)"), ("gain * gain + gain +", "gain * gain - gain +"),
            ("gain) < most", "gain) <= most"), ("nullptr ? 1 : largestOf", "nullptr ? 2 : largestOf")]),
        ("levels are odd, their number is even", [
            ("level < levels", "level <= levels"), ("rest < 0", "rest < 1"), ("rest < 0", "rest <= 0")]),
    ],
    "link/modulation/Modulation.h": [
        ("listed twice, a modulation is found at its first place; tests have the list of their own compilation",
         [("Modulation, 5>", "Modulation, 6>")]),
    ],
    "link/coding/RateMatching.cpp": [
        ("an array with more elements", [("3 * mostPositions>", "4 * mostPositions>")]),
        ("still more than any position", [("null = 0xFFFF", "null = 0xff7f")]),
        ("K + 4 is 4, 12, 20 or 28 more than a multiple of the 32 columns",
         [("columns - 1) / columns", "columns - 2) / columns"), ("columns - 1) / columns", "columns - 0) / columns"),
          ("columns - 1) / columns", "columns + 1) / columns")]),
        ("set later", [("itsRows(0)", "itsRows(1)")]),
        ("nothing is cut off", [("bufferSize < buffer.size()", "bufferSize <= buffer.size()")]),
        ("every value is written again", [("count < size()", "count <= size()")]),
        ("positions 0 and 1 of a stream are dummy bits in every block size",
         [("written + 1 : 0", "written + 1 : 1"), ("unsigned i = 1; i < total", "unsigned i = 0; i < total")]),
    ],
    "link/coding/TurboEncoder.cpp": [
        ("the interleaver with an element more", [("unsigned i = 0; i < K", "unsigned i = 0; i <= K")]),
        ("K + 4 is 4 more than a multiple of 8", [("Positions + 63)", "Positions + 64)"), ("Positions + 63)", "Positions + 62)")]),
        ("room for more bits than there are", [("size_t{64} * itsWords", "size_t{65} * itsWords")]),
        ("the streams have the same size", [("streams[0].bits.size()", "streams[1].bits.size()")]),
        ("bits behind the end of a row", [("matrix.end(), 0)", "matrix.end(), 1)")]),
    ],
    "rules/Interleaver.h": [
        ("no address but the first is 0, and no difference is",
         [("a + b >=", "a + b >")]),
    ],
    "src/Batch.h": [
        ("neither 0 nor 1 is a block size",
         [("dinSize <", "dinSize <="), ("? 0", "? 1")]),
    ],
    "src/CoreInputs.h": [
        ("what is reported exceeds the format",
         [("excess >", "excess >=")]),
    ],
    "src/OriginalComponents.cpp": [
        ("the tables of a twin are dropped together",
         [("|| isNoTableOf(made.itsAlphaSegment,", "&& isNoTableOf(made.itsAlphaSegment,")]),
    ],
    "lanes/InstructionSets.cpp": [
        ("another kernel decodes: the speed alone",
         [("instructionSet.kernelCount - 1;", "instructionSet.kernelCount - 2;"), ("< blocks)", "<= blocks)")]),
    ],
    "lanes/Kernels.cpp": [
        ("fewer windows side by side, or more that may be: the speed alone",
         [("windows > 2 &&", "windows > 1 &&"), ("windows > 2 &&", "windows >= 2 &&"), ("windows > 2 &&", "windows > 2 ||"),
          ("abreast == 2", "abreast == 3"), ("abreast == 2", "abreast == 1"), ("abreast == 2", "abreast != 2"),
          ("5 * run", "6 * run"), ("5 * run", "4 * run"), ("5 * run", "5 + run"), ("run <= 7", "run <= 8"),
          ("run <= 7", "run <= 6"), ("run <= 7", "run < 7"), ("7 * workspace", "7 + workspace"),
          ("abreast / 2);", "abreast / 3);"), ("abreast / 2);", "abreast / 1);"), ("abreast / 2);", "abreast * 2);"),
          ("run <= stepsRun", "run < stepsRun")]),
        ("one vector more, into spare room",
         [("= 0; at <", "= 0; at <=")]),
        ("a kernel with more lanes decodes: the speed alone", [("kernel = {1,", "kernel = {0,")]),
        ("a slice of one lane is not permuted, and no state of a forward recursion is kept: room alone", [
            ("1,  // groupLanes", "2,  // groupLanes"), ("0,  // permutationBytes", "1,  // permutationBytes"),
            ("0,  // forwardBytes", "1,  // forwardBytes")]),
        ("the forward recursion runs one window at a time",
         [("vectors, 1,", "vectors, 2,")]),
        ("the speed alone", [
            ("RuleOf<count>::corrects ? 1 : 0", "RuleOf<count>::corrects ? 1 : 1"),
            ("RuleOf<count>::corrects ? 1 : 0", "RuleOf<count>::corrects ? 0 : 0"), ("abreast > 1)", "abreast > 2)")]),
    ],
    "lanes/LaneDecoder.cpp": [
        ("spare room between the arrays",
         [("kernel.slotBytes / 2);", "kernel.slotBytes / 1);"), ("kernel.slotBytes /", "kernel.slotBytes *"),
          ("layout.take<std::int16_t>(kernel.forwardBytes / 2);", "layout.take<std::int16_t>(kernel.forwardBytes / 1);"),
          ("layout.take<std::int16_t>(kernel.forwardBytes /", "layout.take<std::int16_t>(kernel.forwardBytes *")]),
        ("no size of a block that is loaded",
         [("itsBlocks = 0;", "itsBlocks = 1;")]),
        ("an element more, and room for it",
         [("slices[3]", "slices[4]"), ("+ tailPositions);", "- tailPositions);")]),
        ("the parity of a pass",
         [("rules::constituentOf(to -", "rules::constituentOf(to +")]),
        ("columns that are handed on before they are read",
         [("std::fill_n(alpha, states * lanes, std::int16_t{0});", "std::fill_n(alpha, states * lanes, std::int16_t{1});"),
          ("std::fill_n(alpha, states *", "std::fill_n(alpha, states +"), ("+ states *", "+ states +")]),
    ],
    "lanes/StatePass.h": [
        ("either tile has eight vectors", [("Tile<1>::size", "Tile<2>::size")]),
        ("more room than is used", [
            ("longestWindow * 4", "longestWindow * 5"), ("slotBytes = 2 *", "slotBytes = 3 *"),
            ("slotsWords / longestWindow", "slotsWords * longestWindow")]),
        ("g[2] is g[1]", [("lanesOf(g[0], g[1]", "lanesOf(g[0], g[2]")]),
        ("every bit that is not 0 is bit 1", [
            ("predecessor(state, 1)...>", "predecessor(state, 2)...>"), ("successor(state, 1)...>", "successor(state, 2)...>")]),
    ],
    "lanes/PairedStates.h": [
        ("every bit that is not 0 is bit 1", [("predecessor(x, 1)", "predecessor(x, 2)"), ("predecessor(y, 1)", "predecessor(y, 2)")]),
    ],
    "lanes/Rules.h": [
        ("an array with an element more", [("half[2]", "half[3]")]),
        ("g[2] is g[1]", [("g[0] + g[1]", "g[0] + g[2]")]),
        ("of pairs 1 and 3, which half", [
            ("half[pair / 2] = rule", "half[pair / 3] = rule"), ("decide(half[pair / 2]", "decide(half[pair / 3]")]),
    ],
    "lanes/Layout.h": [
        ("spare room between the arrays",
         [("line - 1)", "line - 2)"), ("line - 1)", "line - 0)"), ("+ line -", "- line -"), ("+ line -", "+ line +"),
          ("5 * line;", "6 * line;"), ("5 * line;", "4 * line;")]),
        ("std::align only checks this size",
         [("line, 1, base,", "line, 2, base,"), ("line, 1, base,", "line, 0, base,")]),
        ("no array lies in the stagger behind the last one", [
            ("storage.size() < measured.itsSize + line", "storage.size() < measured.itsSize - line"),
            ("storage.size() < measured.itsSize + line", "storage.size() <= measured.itsSize + line"),
            ("Storage(measured.itsSize + line)", "Storage(measured.itsSize - line)")]),
    ],
    "lanes/SizeTables.cpp": [
        ("spare room between the arrays",
         [("(kernel.lanes /", "(kernel.lanes *"), ("+ fetchAhead)", "- fetchAhead)")]),
        ("border columns have no low bits",
         [("0 ? -1 :", "0 ? -2 :"), ("? -1 : 0;", "? -1 : 1;"), ("- 1 ? -1", "- 1 ? -2")]),
        ("an element more", [
            ("from[2] =", "from[3] ="), ("segment = 0; segment < segments", "segment = 0; segment <= segments")]),
        ("segment 0 of a block is in its lane 0, as set before",
         [("segment = 0; segment < segments", "segment = 1; segment < segments"),
          ("lane = 0; lane < itsKernel.lanes", "lane = 1; lane < itsKernel.lanes")]),
        ("counted modulo a power of two", [("(segment + segments - 1)", "(segment - segments - 1)")]),
    ],
    "lanes/Pass.h": [
        ("room alone",
         [("2 * wide;", "3 * wide;"), ("slotBytes = 2", "slotBytes = 3")]),
        ("replaced in the next line",
         [("v, 0, {},", "v, 1, {},")]),
        ("no window has a single step",
         [("(next.length != 0)", "(next.length != 1)"), ("end > 0;)", "end > 1;)")]),
        ("a turn of no step", [("begin < windows.length; begin", "begin <= windows.length; begin")]),
        ("prefetches alone",
         [("+ sources[fetchAhead", "- sources[fetchAhead"), ("sources[fetchAhead *", "sources[fetchAhead +")]),
        ("g[2] is g[1]", [("{g[0], g[1]}", "{g[0], g[2]}")]),
        ("state 0 is 0 in border columns; a column more, into spare room",
         [("0; state", "1; state"), ("< states;", "<= states;")]),
        ("windows of one length may run side by side or not: the speed alone",
         [("r + 1 < w.windows &&", "r + 2 < w.windows &&"), ("r + 1 < w.windows &&", "r + 0 < w.windows &&"),
          ("r + 1 < w.windows &&", "r + 1 <= w.windows &&"), ("lengthOf(r + 1)", "lengthOf(r + 2)"),
          ("r + 1 < w.windows &&", "r - 1 < w.windows &&")]),
        ("a column more, into room that is written later",
         [("for (unsigned v = 0; v < vectors; ++v) {", "for (unsigned v = 0; v <= vectors; ++v) {")]),
        ("metrics stay in bounds around any state", [("stored(m[0])", "stored(m[1])")]),
        ("which kernels lift branch metrics: the speed alone", [
            ("!paired && abreast == 1;", "!paired && abreast == 2;"), ("!paired && abreast == 1;", "!paired && abreast == 0;"),
            ("!paired && abreast == 1;", "!paired && abreast != 1;")]),
        ("the place of the joint values of a slot: room, and the speed", [
            ("paired && abreast == 1 ?", "paired && abreast == 2 ?"), ("paired && abreast == 1 ?", "paired && abreast == 0 ?"),
            ("paired && abreast == 1 ?", "paired && abreast != 1 ?"), ("paired && abreast == 1 ?", "paired || abreast == 1 ?"),
            ("? 2 * wide : wide", "? 3 * wide : wide"), ("? 2 * wide : wide", "? 1 * wide : wide")]),
        ("g[2] is g[1]", [("join(sums[0], sums[1])", "join(sums[0], sums[2])")]),
    ],
    "lanes/Transpose.h": [
        ("the last eight steps either way",
         [("< steps;", "<= steps;"), ("<= steps", "< steps")]),
        ("the low bits of soft values",
         [("any = 0;", "any = 1;")]),
        ("ratios are below 2^14",
         [(">> 15) +", ">> 14) +")]),
        ("rounded down to the number of halves",
         [("8; ++half)", "7; ++half)")]),
        ("a row more, which is written again, or spare room",
         [("for (unsigned i = 0; i < BestTile::size; ++i) {", "for (unsigned i = 0; i <= BestTile::size; ++i) {")]),
        ("the last eight steps may overlap those before them", [("next += 8", "next += 7"), ("next + 8 <=", "next + 9 <=")]),
        ("segments have an even number of steps, and so have the windows of a single one", [("next + 8 <=", "next + 7 <=")]),
    ],
    "lanes/Words.h": [
        ("of equal values",
         [("{a.v > b.v", "{a.v >= b.v"), ("{a.v < b.v", "{a.v <= b.v")]),
    ],
}


class Mutant(NamedTuple):
    file: str
    line: int  # from 0
    original: str
    changed: str

    @property
    def place(self):
        return f"{self.file}:{self.line + 1}"


def function_lines(text, name):
    """The lines of the functions of that name: from a line with the name and an opening parenthesis, without a
    semicolon at its end, to the closing brace in the same column as the opening one."""
    lines = text.split("\n")
    found = set()
    for start, line in enumerate(lines):
        if not re.search(rf"\b{name}\(", line) or line.startswith("//") or line.rstrip().endswith(";"):
            continue
        opening = next((i for i in range(start, min(start + 14, len(lines))) if re.fullmatch(r" *\{", lines[i])), None)
        if opening is None or any(";" in lines[i] for i in range(start, opening)):
            continue
        closing = lines[opening].replace("{", "}")
        end = next(i for i in range(opening, len(lines)) if lines[i] == closing)
        found.update(range(start, end))
    assert found, f"no function {name}"
    return found


def code(line):
    """The line with comments and strings blanked, so that nothing in them is mutated."""
    line = re.sub(r'"[^"]*"', lambda m: " " * len(m.group()), line)
    return re.sub(r"//.*", lambda m: " " * len(m.group()), line)


def mutations(line):
    """Places and replacements: start, end, new text."""
    text = code(line)
    if text.lstrip().startswith(("#", "template")):
        return
    for match in re.finditer(r"(?<![\w.])\d+(?=[UL]*\b)(?![\w]*\.)", text):
        value = int(match.group())
        yield match.start(), match.end(), str(value + 1)
        if value > 0:
            yield match.start(), match.end(), str(value - 1)
    for match in re.finditer(r"\b\d+\.\d+", text):
        value = float(match.group())
        for new in (0.5 * value, 2 * value) if value != 0 else (1.0,):
            yield match.start(), match.end(), repr(new)
    for match in re.finditer(r"0x[0-9A-F]+", text):
        yield match.start(), match.end(), hex(int(match.group(), 16) ^ 0x80)
    for old, new in SWAPS:
        for match in re.finditer(rf"(?<= ){re.escape(old)}(?= |$)", text):
            yield match.start(), match.end(), new
    for match in re.finditer(r"(?<=[(\[{, ])-(?=[\w(])", text):
        yield match.start(), match.end(), "+"
    for match in re.finditer(r"\+\+|--", text):
        yield match.start(), match.end(), "--" if match.group() == "++" else "++"
    for match in re.finditer(r"~(?=[\w(])", text):
        yield match.start(), match.end(), ""
    for old, new in WORDS:
        for match in re.finditer(rf"(?<![\w:]){old}\b(?!:)", text):
            yield match.start(), match.end(), new


def all_mutants():
    """In a list. An entry of the tables above that nothing matches any more is an error."""
    mutants = list(mutants_of_places())
    for file, reasons in EQUIVALENT.items():
        for old, new in (pair for _, pairs in reasons for pair in pairs):
            if not any(mutant.file == file and is_replaced(mutant, old, new) for mutant in mutants):
                sys.exit(f"mutants.py: EQUIVALENT: {file} has no mutant that makes {new!r} of {old!r}")
    return mutants


def declaration_lines(lines):
    """The lines of aliases, which say which kernels there are, and of assertions, from the first to that with the semicolon."""
    found = set()
    for start, line in enumerate(lines):
        if line.lstrip().startswith(("using ", "static_assert")):
            end = next(i for i in range(start, len(lines)) if lines[i].rstrip().endswith(";"))
            found.update(range(start, end + 1))
    return found


def mutants_of_places():
    for name, functions in PLACES.items():
        text = (ROOT / name).read_text()
        lines = text.split("\n")
        numbers = range(len(lines)) if functions is None else sorted(
            set().union(*(function_lines(text, function) for function in functions)))
        skipped = declaration_lines(lines).union(*(function_lines(text, function) for function in SPEED_ALONE.get(name, [])))
        for number in sorted(set(numbers) - skipped):
            for start, end, new in mutations(lines[number]):
                yield Mutant(name, number, lines[number], lines[number][:start] + new + lines[number][end:])


def is_replaced(mutant, old, new):
    return old in mutant.original and mutant.original.replace(old, new) == mutant.changed


def equivalent(mutant):
    return any(is_replaced(mutant, old, new) for _, pairs in EQUIVALENT.get(mutant.file, []) for old, new in pairs)
