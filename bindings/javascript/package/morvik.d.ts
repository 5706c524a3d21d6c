/** A bit-accurate model of a hardware turbo decoder for the 3GPP LTE turbo code, with encoder and channel. */

/** max-log-MAP; the same with extrinsic values times 0.75; with a correction table. Numbers are C_ALGORITHM_TYPE. */
export type Algorithm = "max-log" | "scaled" | "table" | 0 | 1 | 2;

/** A core. */
export interface CoreOptions {
    /** Processing units; 2 by default. */
    units?: 2 | 4 | 8;
    /** "scaled" by default. */
    algorithm?: Algorithm;
    /** Full iterations, 1 to 15; 8 by default. */
    iterations?: number;
}

/** BPSK over white Gaussian noise, and the quantiser behind it. */
export interface ChannelOptions {
    /** Eb/N0 in dB, -50 to 50, with at most three decimals. */
    ebn0: number;
    /** The soft value for amplitude 1, above 0 and up to 1000; "auto", the default, suits the algorithm. */
    scale?: number | "auto";
    /** For "auto". */
    algorithm?: Algorithm;
    /** 0 to 2^64 - 1; 1 by default, as the command's. */
    seed?: number | bigint;
}

export interface PointOptions extends CoreOptions, ChannelOptions {
    /** K: one of the 188 sizes. */
    blockSize: number;
    algorithm?: Algorithm;
}

/** The three streams of blocks: K + 4 positions of each block, the tail in the last four. */
export interface Streams<Values> {
    systematic: Values;
    parity1: Values;
    parity2: Values;
}

/** Soft values, -128 to 127, positive for bit 1, in eighths. */
export interface Received extends Streams<Int8Array> {
    /** How many of them were clipped. */
    clipped: number;
}

export interface Decoded {
    /** K bits of each block, each 0 or 1. */
    bits: Uint8Array;
    /** The log-likelihood ratios of the last pass, in units of 1/128, multiples of 16, positive for bit 1. */
    ratios: Int16Array;
}

/** A window of the backward recursion, from trellis step `first` to `last`. */
export interface Window {
    number: number;
    segment: number;
    row: number;
    first: number;
    last: number;
    unit: number;
    thread: number;
}

/** How the core divides a block. Windows are in the order of the backward recursion. */
export interface Cut {
    segments: number;
    segmentLength: number;
    /** Windows of each segment. */
    rows: number;
    unitsAtWork: number;
    windows: Window[];
}

/** What was counted in blocks `first` to `first` + `count` - 1. */
export interface Piece {
    first: number | bigint;
    count: number;
    /** The wrong bits of each block after each iteration, then the clipped soft values of each block. */
    counts: Uint32Array;
}

export interface Rules {
    /** End with the block error of this number; 100 by default. */
    blockErrors?: number;
    /** End with the block of this number; 1000000 by default. */
    maxBlocks?: number;
    /** The number of the first block; 0 by default. */
    first?: number | bigint;
}

/** Error rates with bounds of 95 % confidence, as the command's. Without blocks, rates are not numbers. */
export interface Result {
    blocks: number;
    bitErrors: number;
    blockErrors: number;
    clipped: number;
    clippedFraction: number;
    ber: number;
    berLow: number;
    berHigh: number;
    bler: number;
    blerLow: number;
    blerHigh: number;
}

/** Counts the blocks of a point in the order of their numbers until a rule ends it. */
export declare class Count {
    readonly blockSize: number;
    readonly iterations: number;
    readonly isComplete: boolean;
    /** Takes a piece that `simulate` made of the same options; pieces may come in any order, each block once. Returns
     *  isComplete. */
    take(piece: Piece): boolean;
    /** The counts after an iteration, by default the last one. */
    result(iteration?: number): Result;
    /** Frees it; it can no longer be used. */
    end(): void;
}

/** All functions throw RangeError for what is not allowed. */
export declare class Morvik {
    /** The 188 block sizes. */
    readonly blockSizes: number[];

    /** The coded bits of K bits. */
    encode(bits: ArrayLike<number> & Iterable<number>): Streams<Uint8Array>;

    /** A numbered block of a simulation: random bits, and what the decoder receives of them. */
    block(options: PointOptions & {block?: number | bigint}): Received & {sent: Uint8Array};

    /** What the decoder receives of coded bits with the noise of a numbered block. */
    channel(coded: Streams<Uint8Array>, options: ChannelOptions & {block?: number | bigint}): Received;

    /** The soft value for amplitude 1 that `block`, `channel` and `simulate` use. */
    scaleOf(options: PointOptions): number;

    /** Decodes a block; with `blockSize`, all blocks that the streams hold one after the other, at most 2^26 bits. */
    decode(soft: Streams<ArrayLike<number> & Iterable<number>>, options?: CoreOptions & {blockSize?: number}): Decoded;

    /** The decisions and ratios after each iteration. */
    decodeEach(soft: Streams<ArrayLike<number> & Iterable<number>>, options?: CoreOptions & {blockSize?: number}): Decoded[];

    cut(blockSize: number, units?: 2 | 4 | 8): Cut;

    /** Makes and decodes `count` numbered blocks from `first` on, at most 2^26 bits. */
    simulate(options: PointOptions, first: number | bigint, count: number): Piece;

    /** Begins to count a point. */
    count(options: PointOptions, rules?: Rules): Count;

    /** A rate as the command writes it: 1.23e-04. */
    rateText(rate: number, decimals?: number): string;

    /** Decodes the blocks of `morvik selftest` in all nine configurations, by the lanes and by the components. */
    selfTest(): {passed: boolean; configurations: number; digest: string};
}

/** Names of the algorithms, by their numbers. */
export declare const ALGORITHMS: readonly ["max-log", "scaled", "table"];

/** Whether WebAssembly has vectors here. */
export declare function hasVectors(): boolean;

/** Compiles the module beside this file: with vectors where there are any, unless told otherwise. */
export declare function compile(options?: {simd?: boolean}): Promise<WebAssembly.Module>;

/** Makes a model, of a compiled module if one is given: workers can share it. */
export declare function load(options?: {simd?: boolean; module?: WebAssembly.Module}): Promise<Morvik>;
