// The module in Node.js, against the command. MORVIK_PACKAGE is the folder of the package, MORVIK_COMMAND the command.
import assert from "node:assert/strict";
import {execFileSync} from "node:child_process";
import {mkdtempSync, readFileSync, readdirSync, rmSync, writeFileSync} from "node:fs";
import {tmpdir} from "node:os";
import {dirname, join, resolve} from "node:path";
import {after, test} from "node:test";
import {pathToFileURL} from "node:url";

const place = resolve(process.env.MORVIK_PACKAGE);
const exported = await import(pathToFileURL(join(place, "morvik.js")));
const {ALGORITHMS, Count, Morvik, load} = exported;
const command = resolve(process.env.MORVIK_COMMAND);
const folder = mkdtempSync(join(tmpdir(), "morvik-javascript-"));
after(() => rmSync(folder, {recursive: true}));
const forms = {vectors: await load({simd: true}), plain: await load({simd: false})};
const {vectors} = forms;

function run(...words) {
    return execFileSync(command, words, {cwd: folder, encoding: "utf8"});
}

function optionsOf({blockSize, units, algorithm, iterations, seed, scale = "auto"}) {
    return ["--block-size", blockSize, "--num-pu", units, "--algorithm", algorithm, "--iterations", iterations,
            "--seed", seed, "--scale", scale].map(String);
}

/** Rows of CSV as objects. */
function rowsOf(text) {
    const [head, ...lines] = text.trim().split("\n").map(line => line.split(","));
    return lines.map(line => Object.fromEntries(line.map((cell, i) => [head[i], cell])));
}

// From very bad to very good channels, with scales that clip.
const points = [
    {blockSize: 40, units: 2, algorithm: "max-log", iterations: 3, ebn0: 1.5, seed: 1},
    {blockSize: 512, units: 8, algorithm: "scaled", iterations: 8, ebn0: 0.75, seed: 7},
    {blockSize: 1056, units: 4, algorithm: "table", iterations: 5, ebn0: 0.333, seed: 2n ** 64n - 1n},
    {blockSize: 6144, units: 8, algorithm: "table", iterations: 2, ebn0: -2.25, seed: 36212},
    {blockSize: 104, units: 4, algorithm: "scaled", iterations: 1, ebn0: 9.999, seed: 0, scale: 60.5},
];

for (const [form, morvik] of Object.entries(forms)) {
    test(`the self-test passes with ${form}`, () => {
        const {passed, configurations, digest} = morvik.selfTest();
        assert.equal(digest, JSON.parse(run("selftest", "--json")).block_digest);
        assert.deepEqual([passed, configurations], [true, 18]);
    });

    for (const point of points) {
        test(`the counts are the command's: ${form}, K = ${point.blockSize}, ${point.algorithm}`, () => {
            const rules = {blockErrors: 20, maxBlocks: 150};
            run("ber", ...optionsOf(point), "--ebn0", String(point.ebn0), "--each-iteration", "--block-errors", "20",
                "--max-blocks", "150", "--quiet", "--overwrite", "--output", "rates.csv");
            const expected = rowsOf(readFileSync(join(folder, "rates.csv"), "utf8"));
            const count = morvik.count(point, rules);
            for (const first of [64, 0, 128]) {  // in any order
                count.take(morvik.simulate(point, first, 64));
            }
            assert.ok(count.isComplete);
            assert.equal(expected.length, point.iterations);
            for (const row of expected) {
                const found = count.result(Number(row.iterations));
                assert.deepEqual(
                    [found.blocks, found.bitErrors, found.blockErrors, found.clipped],
                    [row.blocks, row.bit_errors, row.block_errors, row.clipped_values].map(Number));
                for (const [mine, its] of [["ber", "ber"], ["berLow", "ber_low"], ["berHigh", "ber_high"], ["bler", "bler"],
                                           ["blerLow", "bler_low"], ["blerHigh", "bler_high"],
                                           ["clippedFraction", "clipped_fraction"]]) {
                    assert.equal(morvik.rateText(found[mine], 6), row[its], mine);
                }
            }
            count.end();
        });
    }
}

for (const point of points) {
    test(`a block is the command's, and so are its decisions: K = ${point.blockSize}`, () => {
        run("ber", ...optionsOf(point), "--ebn0", String(point.ebn0), "--replay", "0:5");
        const block = vectors.block({...point, block: 5});
        assert.equal(block.sent.join(""), readFileSync(join(folder, "point0.frame5.bits"), "utf8").trim());
        const rows = rowsOf(readFileSync(join(folder, "point0.frame5.csv"), "utf8"));
        for (const [stream, column] of [["systematic", "rsc1_sys"], ["parity1", "rsc1_par"], ["parity2", "rsc2_par"]]) {
            assert.deepEqual(Array.from(block[stream]), rows.map(row => Number(row[column])));
        }
        const decided = run("decode", "point0.frame5.csv", "--num-pu", String(point.units), "--algorithm", point.algorithm,
                            "--iterations", String(point.iterations));
        const each = vectors.decodeEach(block, point);
        assert.equal(each.length, point.iterations);
        assert.equal(each.at(-1).bits.join(""), decided.trim());
        const wrong = each.map(({bits}) => bits.filter((bit, i) => bit !== block.sent[i]).length);
        assert.deepEqual(wrong, Array.from(vectors.simulate(point, 5, 1).counts.subarray(0, point.iterations)));
        each.at(-1).ratios.forEach((ratio, i) => assert.equal(ratio >= 0 ? 1 : 0, each.at(-1).bits[i]));
    });

    test(`encoder and channel make a block's soft values: K = ${point.blockSize}`, () => {
        const {sent, ...received} = vectors.block({...point, block: 2n ** 40n});
        assert.deepEqual(vectors.channel(vectors.encode(sent), {...point, block: 2n ** 40n}), received);
    });
}

test("several blocks in one call decode as one by one", () => {
    const options = {blockSize: 48, ebn0: 0, units: 4};
    const blocks = [0, 1, 2].map(block => vectors.block({...options, block}));
    const joined = Object.fromEntries(["systematic", "parity1", "parity2"].map(
        name => [name, blocks.flatMap(block => Array.from(block[name]))]));
    const {bits, ratios} = vectors.decode(joined, options);
    blocks.forEach((block, i) => {
        const alone = vectors.decode(block, options);
        assert.deepEqual(bits.subarray(48 * i, 48 * (i + 1)), alone.bits);
        assert.deepEqual(ratios.subarray(48 * i, 48 * (i + 1)), alone.ratios);
    });
});

test("all sizes are cut as the command says", () => {
    assert.equal(vectors.blockSizes.length, 188);
    for (const blockSize of [40, 128, 512, 1536, 6144]) {
        for (const told of JSON.parse(run("info", String(blockSize), "--json")).divisions) {
            const cut = vectors.cut(blockSize, told.num_pu);
            assert.deepEqual([cut.segments, cut.segmentLength, cut.rows], [told.segments, told.segment_length, told.rows]);
            assert.deepEqual(cut.windows.map(({segment, row, first, last}) => ({segment, row, first, last})), told.windows);
        }
    }
});

test("the automatic scale is the command's", () => {
    assert.equal(vectors.scaleOf({blockSize: 512, ebn0: 1, algorithm: "scaled"}), 8);
    run("ber", "--block-size", "512", "--algorithm", "table", "--ebn0", "1", "--max-blocks", "1", "--quiet", "--output", "scale.csv");
    const [row] = rowsOf(readFileSync(join(folder, "scale.csv"), "utf8"));
    assert.equal(vectors.scaleOf({blockSize: 512, ebn0: 1, algorithm: 2}), Number(row.scale));
});

test("the installed package runs the examples of its documents", () => {
    const file = readdirSync(dirname(place)).find(name => name.endsWith(".tgz"));
    execFileSync("npm", ["install", "--offline", "--no-audit", "--no-fund", "--silent", join(dirname(place), file)], {cwd: folder});
    const documents = ["../../../docs/browser.md", "../package/README.md"];
    const text = documents.map(name => readFileSync(new URL(name, import.meta.url), "utf8")).join("");
    const examples = Array.from(text.matchAll(/^```js\n(.*?)^```/gms), found => found[1]);
    assert.equal(examples.length, 3);
    for (const example of examples) {
        writeFileSync(join(folder, "example.mjs"), example);
        const [, expected] = /\/\/ prints: (.*)/.exec(example);
        assert.equal(execFileSync(process.execPath, ["example.mjs"], {cwd: folder, encoding: "utf8"}), expected + "\n");
    }
});

test("a count takes each block once, and pieces that were sent as text", () => {
    const point = {blockSize: 40, ebn0: 0};
    const piece = (first, count) => {
        const {counts, ...rest} = vectors.simulate(point, first, count);
        return {...rest, counts: Array.from(counts)};
    };
    const count = vectors.count(point, {maxBlocks: 30, first: 100});
    for (const [first, blocks] of [[100, 10], [120, 10]]) {
        count.take(piece(first, blocks));
    }
    for (const [first, blocks] of [[100, 10], [105, 1], [109, 2], [115, 10], [95, 3], [90, 50]]) {
        assert.throws(() => count.take(piece(first, blocks)), new RegExp(`^RangeError: first is ${first}: .*not been taken`));
    }
    assert.equal(count.result().blocks, 10);
    assert.ok(count.take(piece(110, 10)));
    const whole = vectors.count(point, {maxBlocks: 30, first: 100});
    whole.take(vectors.simulate(point, 100, 30));
    assert.deepEqual(count.result(), whole.result());
    whole.end();
    for (const use of [() => whole.result(), () => whole.take(piece(130, 1))]) {
        assert.throws(use, /^Error: the count has been ended/);
    }
    whole.end();
});

test("calls that are as large as they may be find memory", () => {
    for (const [blockSize, count] of [[40, 1677721], [6144, 10922]]) {
        const {counts} = vectors.simulate({blockSize, ebn0: 5, iterations: 1}, 0, count);
        assert.equal(counts.length, 2 * count);
    }
});

test("every function is declared, and every declared one is there", () => {
    const text = readFileSync(join(place, "morvik.d.ts"), "utf8");
    const membersOf = name => new RegExp(`^export declare class ${name} \\{\n(.*?)^\\}`, "ms").exec(text)[1];
    for (const of of [Morvik, Count]) {
        const declared = Array.from(membersOf(of.name).matchAll(/^    (\w+)\(/gm), found => found[1]);
        const there = Object.getOwnPropertyNames(of.prototype).filter(name => name !== "constructor" && !name.startsWith("_"));
        assert.deepEqual(declared.sort(), there.sort());
    }
    const names = Array.from(text.matchAll(/^export declare (?:class|const|function) (\w+)/gm), found => found[1]);
    assert.deepEqual(names.sort(), Object.keys(exported).sort());
});

test("what is not allowed is refused by name", () => {
    const good = {blockSize: 40, ebn0: 0};
    const refusals = [
        [/^blockSize is 41: .*40 and 48 are the nearest/, {blockSize: 41}],
        [/^blockSize is "512"/, {blockSize: "512"}],
        [/^blockSize is undefined/, {blockSize: undefined}],
        [/^units is 3: expected 2, 4 or 8/, {units: 3}],
        [/^algorithm is "best"/, {algorithm: "best"}],
        [/^algorithm is "toString"/, {algorithm: "toString"}],
        [/^algorithm is 3/, {algorithm: 3}],
        [/^iterations is 0/, {iterations: 0}],
        [/^iterations is 16/, {iterations: 16}],
        [/^iterations is 1.5/, {iterations: 1.5}],
        [/^ebn0 is NaN/, {ebn0: NaN}],
        [/^ebn0 is 0.0001/, {ebn0: 0.0001}],
        [/^ebn0 is 51/, {ebn0: 51}],
        [/^ebn0 is "1"/, {ebn0: "1"}],
        [/^scale/, {scale: 0}],
        [/^scale/, {scale: Infinity}],
        [/^seed is -1/, {seed: -1}],
        [/^seed is 18446744073709551616/, {seed: 2n ** 64n}],
        [/^seed is "1"/, {seed: "1"}],
    ];
    for (const [message, options] of refusals) {
        assert.throws(() => vectors.simulate({...good, ...options}, 0, 1), error => error instanceof RangeError && message.test(error.message));
    }
    assert.throws(() => vectors.simulate(good, 0, 0), /^RangeError: count is 0/);
    assert.throws(() => vectors.encode(new Array(40).fill(2)), /^RangeError: bits/);
    assert.throws(() => vectors.encode([1, 0]), /^RangeError: blockSize is 2/);
    const block = vectors.block(good);
    assert.throws(() => vectors.decode({...block, parity1: [1]}), /^RangeError: parity1/);
    assert.throws(() => vectors.decode({...block, parity2: new Array(44).fill(128)}), /^RangeError: parity2 is 128/);
    assert.throws(() => vectors.decode({systematic: block.systematic}), /^RangeError: parity1 is undefined: expected an array/);
    assert.throws(() => vectors.decode(), /^RangeError: systematic is undefined/);
    assert.throws(() => vectors.encode(), /^RangeError: bits is undefined/);
    assert.throws(() => vectors.simulate({...good, blockSize: 6144}, 0, 10923), /^RangeError: count is 10923: .* to 10922/);
    assert.throws(() => vectors.simulate(good, 2n ** 64n - 1n, 2), /^RangeError: first is 18446744073709551615: expected at most 2\^64 - 2/);
    assert.throws(() => vectors.rateText(0.1, 40), /^RangeError: decimals is 40/);
    const count = vectors.count(good);
    assert.ok(Number.isNaN(count.result().ber));
    assert.throws(() => count.take({first: 0, count: 2, counts: new Uint32Array(3)}), /^RangeError: counts/);
    assert.throws(() => count.result(9), /^RangeError: iteration is 9/);
    count.end();
    assert.deepEqual(vectors.decode(block, {units: undefined}), vectors.decode(block, {units: 2}));
    assert.deepEqual(ALGORITHMS, ["max-log", "scaled", "table"]);
});
