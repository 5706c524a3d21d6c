// morvik: the decoder, encoder and channel in JavaScript. morvik.d.ts says what each function takes and returns.
const ALGORITHMS = ["max-log", "scaled", "table"];
const STREAM_NAMES = ["systematic", "parity1", "parity2"];
const TAIL = 4;  // positions of a block behind its K
const DEFAULTS = {units: 2, algorithm: "scaled", iterations: 8, scale: "auto", seed: 1};
const MOST_BITS = 1 << 26;  // of a call: with soft values and results, they fit in the memory that a module can have

// A function that puts a vector onto the stack: what has no vectors refuses it.
const VECTORS = new Uint8Array([
    0, 97, 115, 109, 1, 0, 0, 0, 1, 5, 1, 96, 0, 1, 123, 3, 2, 1, 0, 10, 10, 1, 8, 0, 65, 0, 253, 15, 253, 98, 11]);

/** Whether WebAssembly has vectors here. */
const hasVectors = () => WebAssembly.validate(VECTORS);

/** Reads and compiles the module beside this file. */
async function compile({simd = hasVectors()} = {}) {
    const place = new URL(simd ? "morvik-simd.wasm" : "morvik.wasm", import.meta.url);
    if (place.protocol === "file:") {
        const {readFile} = await import("node:fs/promises");
        return WebAssembly.compile(await readFile(place));
    }
    return WebAssembly.compile(await (await fetch(place)).arrayBuffer());
}

/** Makes a decoder with encoder and channel. */
async function load({simd = hasVectors(), module} = {}) {
    const morvik = new Morvik();
    const instance = await WebAssembly.instantiate(module ?? await compile({simd}), morvik._imports());
    morvik._attach(instance.exports);
    return morvik;
}

// ---- Arguments

/** With the defaults for what is left out. */
function completed(options) {
    const given = Object.entries(options ?? {}).filter(([name, value]) => value !== undefined);
    return {...DEFAULTS, ...Object.fromEntries(given)};
}

function refuse(name, value, expected) {
    const shown = typeof value === "string" ? `"${value}"` : String(value);
    throw new RangeError(`${name} is ${shown}: expected ${expected}`);
}

function whole(name, value, least, most) {
    if (!Number.isSafeInteger(value) || value < least || value > most) {
        refuse(name, value, `a whole number from ${least} to ${most}`);
    }
    return value;
}

function thousandths(name, value, least, most) {
    const result = Math.round(1000 * value);
    if (typeof value !== "number" || !(value >= least && value <= most) || Math.abs(1000 * value - result) > 1e-6) {
        refuse(name, value, `a number from ${least} to ${most} with at most three decimals`);
    }
    return result;
}

/** The low and the high word of a number of 64 bits. */
function words(name, value) {
    const isNumber = typeof value === "bigint" || Number.isSafeInteger(value);
    if (!isNumber || BigInt(value) < 0n || BigInt(value) >= 1n << 64n) {
        refuse(name, value, "a whole number from 0 to 2^64 - 1");
    }
    return [Number(BigInt(value) & 0xFFFFFFFFn), Number(BigInt(value) >> 32n)];
}

function algorithmOf(value) {
    const number = typeof value === "number" ? value : ALGORITHMS.indexOf(value);
    if (!(number in ALGORITHMS)) {
        refuse("algorithm", value, "max-log, scaled or table, or 0, 1 or 2");
    }
    return number;
}

/** As many values as an array has. */
function lengthOf(name, values) {
    if (!Number.isSafeInteger(values?.length)) {
        refuse(name, values, "an array");
    }
    return values.length;
}

/** The lengths of the three streams, the first of them. */
function positionsOf(streams) {
    return STREAM_NAMES.map(name => lengthOf(name, streams?.[name]))[0];
}

/** Block numbers end with 2^64 - 1. */
function firstOf(value, count) {
    const [low, high] = words("first", value);
    if (BigInt(value) + BigInt(count) > 1n << 64n) {
        refuse("first", value, `at most 2^64 - ${count}, for ${count} blocks`);
    }
    return [low, high];
}

/** How many blocks one call takes. */
function mostBlocks(K) {
    return Math.floor(MOST_BITS / K);
}

function softOf(name, values) {
    return values instanceof Int8Array ? values : Int8Array.from(values, value => whole(name, value, -128, 127));
}

function bitsOf(name, bits, count) {
    const copy = Uint8Array.from(bits);
    if (copy.length !== count || !Array.prototype.every.call(bits, bit => bit === 0 || bit === 1)) {
        refuse(name, `${bits.length} values`, `${count} of 0 and 1`);
    }
    return copy;
}

// ---- The module

class Morvik {
    /** What the model wrote, a warning or the reason of a refusal. */
    messages = "";

    /** The functions of the system that the C library asks for. There are neither files nor an environment. */
    _imports() {
        const none = () => 0;
        const write = (descriptor, buffers, count, written) => {
            const view = new DataView(this._exports.memory.buffer);
            let bytes = 0;
            for (let i = 0; i < count; ++i) {
                const [from, length] = [view.getUint32(buffers + 8 * i, true), view.getUint32(buffers + 8 * i + 4, true)];
                this.messages += new TextDecoder().decode(new Uint8Array(view.buffer, from, length));
                bytes += length;
            }
            view.setUint32(written, bytes, true);
            return 0;
        };
        const time = (clock, precision, result) => {
            new DataView(this._exports.memory.buffer).setBigUint64(result, BigInt(Date.now()) * 1000000n, true);
            return 0;
        };
        const environment = (count, size) => {
            const view = new DataView(this._exports.memory.buffer);
            view.setUint32(count, 0, true);
            view.setUint32(size, 0, true);
            return 0;
        };
        return {
            env: {emscripten_notify_memory_growth: none},
            wasi_snapshot_preview1: {
                fd_write: write, fd_read: none, fd_seek: none, fd_close: none, clock_time_get: time,
                environ_sizes_get: environment, environ_get: none,
                proc_exit: () => { throw new Error(this.messages || "the model has ended"); },
            },
        };
    }

    _attach(exports) {
        this._exports = exports;
        exports._initialize();
        this.blockSizes = this._with([4 * 256], sizes => {
            const count = exports.morvikBlockSizes(sizes);
            return Array.from(new Uint32Array(exports.memory.buffer, sizes, count));
        });
    }

    /** Calls `use` with the addresses of new memory of these sizes, or of copies of these arrays. */
    _with(parts, use) {
        const places = [];
        try {
            for (const part of parts) {
                places.push(this._exports.malloc(typeof part === "number" ? part : part.byteLength));
                if (places.at(-1) === 0) {
                    throw new RangeError("no memory is left");
                }
            }
            parts.forEach((part, i) => typeof part === "number" || this._bytes(places[i], part.byteLength).set(
                new Uint8Array(part.buffer, part.byteOffset, part.byteLength)));
            return use(...places);
        } finally {
            places.forEach(place => this._exports.free(place));
        }
    }

    /** Memory grows in calls, so that a view lasts until the next one. */
    _bytes(place, length) {
        return new Uint8Array(this._exports.memory.buffer, place, length);
    }

    /** A copy of what lies there. */
    _copy(Type, place, length) {
        return new Type(this._exports.memory.buffer.slice(place, place + length * Type.BYTES_PER_ELEMENT));
    }

    _expectSuccess(status) {
        const text = this.messages.trim();
        this.messages = "";
        if (status !== 0) {
            throw new Error(text || `the decoder has refused a block: status ${status}`);
        }
    }

    _text(length, write) {
        return this._with([length], place => {
            write(place);
            const bytes = this._copy(Uint8Array, place, length);
            return new TextDecoder().decode(bytes.subarray(0, bytes.indexOf(0)));
        });
    }

    // ---- Options

    _blockSize(value) {
        if (!this.blockSizes.includes(value)) {
            const above = this.blockSizes.findIndex(size => size > value);
            const near = above > 0 ? `: ${this.blockSizes[above - 1]} and ${this.blockSizes[above]} are the nearest` : "";
            refuse("blockSize", value, `one of the 188 sizes from 40 to 6144${near}`);
        }
        return value;
    }

    /** A core's configuration, checked. */
    _core(options) {
        const {units, algorithm, iterations} = completed(options);
        if (![2, 4, 8].includes(units)) {
            refuse("units", units, "2, 4 or 8");
        }
        return {units, algorithm: algorithmOf(algorithm), iterations: whole("iterations", iterations, 1, 15)};
    }

    /** A channel, as the module takes it. */
    _point(options) {
        const {blockSize, algorithm, ebn0, scale, seed} = completed(options);
        const K = this._blockSize(blockSize);
        const milliDecibels = thousandths("ebn0", ebn0, -50, 50);
        const milliScale = scale === "auto" ?
            this._exports.morvikDefaultScale(algorithmOf(algorithm), K, milliDecibels) :
            whole("scale in thousandths", thousandths("scale", scale, 0, 1000), 1, 1000000);
        return new Uint32Array([K, milliDecibels, milliScale, ...words("seed", seed)]);
    }

    // ---- Blocks

    encode(bits) {
        const K = this._blockSize(lengthOf("bits", bits));
        const length = K + TAIL;
        return this._with([bitsOf("bits", bits, K), 3 * length], (from, to) => {
            this._exports.morvikEncode(K, from, to);
            return this._streams(Uint8Array, to, length);
        });
    }

    _streams(Type, place, length) {
        const at = stream => this._copy(Type, place + stream * length, length);
        return {systematic: at(0), parity1: at(1), parity2: at(2)};
    }

    scaleOf(options) {
        return this._point(options)[2] / 1000;
    }

    channel(coded, options) {
        const point = this._point({blockSize: positionsOf(coded) - TAIL, ...options});
        const length = point[0] + TAIL;
        const bits = new Uint8Array(3 * length);
        STREAM_NAMES.forEach((name, i) => bits.set(bitsOf(name, coded[name], length), i * length));
        return this._with([point, bits, 3 * length], (at, from, to) => {
            const clipped = this._exports.morvikSend(at, from, ...words("block", options.block ?? 0), to);
            return {...this._streams(Int8Array, to, length), clipped};
        });
    }

    block(options) {
        const point = this._point(options);
        const length = point[0] + TAIL;
        return this._with([point, point[0], 3 * length], (at, sent, soft) => {
            const clipped = this._exports.morvikBlock(at, ...words("block", options.block ?? 0), sent, soft);
            return {sent: this._copy(Uint8Array, sent, point[0]), ...this._streams(Int8Array, soft, length), clipped};
        });
    }

    decode(soft, options) {
        const {units, algorithm, iterations} = this._core(options);
        const positions = positionsOf(soft);
        const K = this._blockSize(options?.blockSize ?? positions - TAIL);
        const blocks = positions / (K + TAIL);
        for (const name of STREAM_NAMES) {
            if (soft[name].length !== positions || !Number.isInteger(blocks) || blocks > mostBlocks(K)) {
                refuse(name, `${soft[name].length} values`,
                       `K + 4 = ${K + TAIL} for each of up to ${mostBlocks(K)} blocks, as many in each stream`);
            }
        }
        const values = new Int8Array(3 * positions);
        STREAM_NAMES.forEach((name, i) => values.set(softOf(name, soft[name]), i * positions));
        return this._with([values, blocks * K, 2 * blocks * K], (from, bits, ratios) => {
            this._expectSuccess(
                this._exports.morvikDecode(units, algorithm, K, iterations, blocks, from, bits, ratios));
            return {bits: this._copy(Uint8Array, bits, blocks * K), ratios: this._copy(Int16Array, ratios, blocks * K)};
        });
    }

    decodeEach(soft, options) {
        const {iterations} = this._core(options);
        return Array.from({length: iterations}, (none, i) => this.decode(soft, {...options, iterations: i + 1}));
    }

    cut(blockSize, units = DEFAULTS.units) {
        const K = this._blockSize(blockSize);
        this._core({units});
        return this._with([24], place => {
            const read = () => this._copy(Uint32Array, place, 6);
            this._exports.morvikCut(K, units, place);
            const [segments, segmentLength, rows, unitsAtWork] = read();
            const windows = Array.from({length: segments * rows}, (none, number) => {
                this._exports.morvikWindow(K, units, number, place);
                const [segment, row, first, last, unit, thread] = read();
                return {number, segment, row, first, last, unit, thread};
            });
            return {segments, segmentLength, rows, unitsAtWork, windows};
        });
    }

    // ---- Error rates

    simulate(options, first, count) {
        const {units, algorithm, iterations} = this._core(options);
        const at = this._point(options);
        whole("count", count, 1, mostBlocks(at[0]));
        const begin = firstOf(first, count);
        return this._with([at, 4 * count * (iterations + 1)], (point, counts) => {
            this._expectSuccess(this._exports.morvikSimulate(
                point, units, algorithm, iterations, ...begin, count, counts));
            return {first, count, counts: this._copy(Uint32Array, counts, count * (iterations + 1))};
        });
    }

    count(options, {blockErrors = 100, maxBlocks = 1000000, first = 0} = {}) {
        const {iterations} = this._core(options);
        const K = this._blockSize(options.blockSize);
        return new Count(this, K, iterations, first, this._exports.morvikCountBegin(
            K, iterations, whole("blockErrors", blockErrors, 1, Number.MAX_SAFE_INTEGER),
            whole("maxBlocks", maxBlocks, 1, Number.MAX_SAFE_INTEGER), ...words("first", first)));
    }

    rateText(rate, decimals = 2) {
        return this._text(32, place => this._exports.morvikRateText(rate, whole("decimals", decimals, 0, 20), place));
    }

    selfTest() {
        let right = 0;
        const digest = this._text(17, place => { right = this._exports.morvikSelfTest(place); });
        return {passed: right === 18, configurations: right, digest};
    }
}

/** What has been counted of a point. */
class Count {
    isComplete = false;

    constructor(morvik, K, iterations, first, place) {
        Object.assign(this, {_morvik: morvik, blockSize: K, iterations, first, _place: place});
        this._taken = [[0n, BigInt(first)]];  // ranges of blocks, those before the first as well
    }

    take({first, count, counts}) {
        whole("count", count, 1, MOST_BITS);
        if (lengthOf("counts", counts) !== count * (this.iterations + 1)) {
            refuse("counts", `${counts.length} values`, `those of ${this.iterations} iterations and ${count} blocks`);
        }
        const numbers = counts instanceof Uint32Array ?
            counts : Uint32Array.from(counts, number => whole("counts", number, 0, 2 ** 32 - 1));
        const [place, begin] = [this._begun(), firstOf(first, count)];
        this._noteTaken(first, count);
        this.isComplete = this._morvik._with(
            [numbers], from => this._morvik._exports.morvikCountTake(place, ...begin, count, from)) !== 0;
        return this.isComplete;
    }

    /** No block is counted twice. */
    _noteTaken(first, count) {
        const [from, to] = [BigInt(first), BigInt(first) + BigInt(count)];
        if (this._taken.some(([begin, end]) => from < end && begin < to)) {
            refuse("first", first, `${count} blocks from ${this.first} on that have not been taken`);
        }
        const isApart = ([begin, end]) => end !== from && begin !== to;
        const joined = [[from, to], ...this._taken.filter(range => !isApart(range))].flat().sort((a, b) => (a < b ? -1 : 1));
        this._taken = [...this._taken.filter(isApart), [joined[0], joined.at(-1)]];
    }

    /** Where the module keeps it. */
    _begun() {
        if (this._place === 0) {
            throw new Error("the count has been ended");
        }
        return this._place;
    }

    result(iteration = this.iterations) {
        whole("iteration", iteration, 1, this.iterations);
        return this._morvik._with([80], place => {
            this._morvik._exports.morvikCountRow(this._begun(), iteration, place);
            const [blocks, bitErrors, blockErrors, clipped, ber, berLow, berHigh, bler, blerLow, blerHigh] =
                this._morvik._copy(Float64Array, place, 10);
            return {
                blocks, bitErrors, blockErrors, clipped, clippedFraction: clipped / (blocks * 3 * (this.blockSize + TAIL)),
                ber, berLow, berHigh, bler, blerLow, blerHigh};
        });
    }

    end() {
        this._morvik._exports.morvikCountEnd(this._place);
        this._place = 0;
    }
}

export {ALGORITHMS, Count, Morvik, compile, hasVectors, load};
