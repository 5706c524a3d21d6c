// Error rates: the form of a sweep, its curves and its table.
import {commandOf, decibelsIn, element, find, grouped, readSettings, refuseField, showCommand, wholeIn, withMistakes} from "./form.js";
import {Sweep} from "./sweep.js";

const MOST_POINTS = 200;
const REDRAWN_EVERY = 150;  // milliseconds
// Colours of the first and the last curve of a family, and two between, on light and on dark.
const GRADIENTS = {
    ebn0: [[[149, 200, 62], [32, 163, 134], [43, 111, 172], [48, 24, 96]],
           [[72, 92, 190], [34, 148, 190], [86, 204, 140], [244, 240, 150]]],
    iterations: [[[245, 178, 50], [232, 106, 42], [186, 40, 66], [84, 12, 56]],
                 [[176, 48, 88], [226, 84, 64], [246, 154, 74], [252, 232, 160]]],
};

class RatesView {
    constructor(morvik, makeWorker) {
        this._morvik = morvik;
        this._makeWorker = makeWorker;
        this._sweep = null;
        this._isDue = false;
        this._colours = element("style");
        document.head.append(this._colours);
        find("workers").value = Math.max(1, Math.min(16, navigator.hardwareConcurrency ?? 2));
        find("sweep").addEventListener("submit", event => {
            event.preventDefault();
            this._sweep?.isRunning ? this._sweep.stop() : this._start();
        });
    }

    _start() {
        const settings = readSettings(this._morvik);
        const asked = withMistakes("sweep-mistake", () => ({
            ...placesIn(),
            rules: {
                blockErrors: wholeIn("block-errors", "The number of block errors", 1, 1000000000),
                maxBlocks: wholeIn("max-blocks", "The number of blocks", 1, 1000000000),
            },
            workers: wholeIn("workers", "The number of workers", 1, 64),
        }));
        if (settings === null || asked === null) {
            document.querySelector("#settings [aria-invalid], #sweep [aria-invalid]").focus();
            return;
        }
        find("start").textContent = "Stop";
        find("results").hidden = false;
        this._writeColours(settings.iterations, asked.places.length);
        this._sweep = new Sweep(this._morvik, this._makeWorker, {
            settings, ...asked, changed: () => this._redrawSoon(),
            ended: mistake => {
                find("start").textContent = "Simulate";
                find("sweep-mistake").textContent = mistake ?? "";
                this._redrawSoon();
            }});
        showCommand(
            "sweep-command",
            `${commandOf(settings)} --each-iteration --ebn0 ${asked.range} ` +
            `--block-errors ${asked.rules.blockErrors} --max-blocks ${asked.rules.maxBlocks}`);
        this._draw();
    }

    /** Settings have changed: what was simulated stays, but is no longer continued. */
    stop() {
        this._sweep?.stop();
    }

    _redrawSoon() {
        if (!this._isDue) {
            this._isDue = true;
            setTimeout(() => {
                this._isDue = false;
                this._draw();
            }, REDRAWN_EVERY);
        }
    }

    _draw() {
        dispatchEvent(new CustomEvent("curves", {detail: this._curves()}));
        find("rows").replaceChildren(...this._sweep.points.map((point, i) => this._row(point, i)));
        const {points, current, isRunning} = this._sweep;
        find("progress").textContent = isRunning ?
            `${points[current].options.ebn0} dB, point ${current + 1} of ${points.length}: ${Math.floor(100 * this._sweep.progress())} %` :
            current < points.length ? "Stopped." : "Complete.";
    }

    // ---- Curves, as the chart takes them

    _curves() {
        const {points, settings} = this._sweep;
        const rows = [];
        const rowOf = new Map();
        points.forEach((point, p) => point.results.forEach((result, i) => {
            rowOf.set(`${p} ${i}`, rows.length);
            rows.push(this._sample(result, p, i + 1));
        }));
        const counts = Array.from({length: settings.iterations}, (none, i) => i);
        const known = points.map((point, p) => p).filter(p => points[p].results.length > 0);
        const curve = (axis, index, title, samples) => ({
            index, title, reference: false, colour: `${axis}-${index}`, marker: index % 5, dash: 0, layer: 0, samples});
        const {blockSize, units, algorithm} = settings;
        const name = `K = ${blockSize}, ${units} units, ${algorithm}`;
        return {rows, views: [
            {axis: "ebn0", curves: known.length === 0 ? [] : counts.map(i => curve(
                "ebn0", i, `${name}, ${i + 1} iteration${i === 0 ? "" : "s"}`, known.map(p => rowOf.get(`${p} ${i}`))))},
            {axis: "iterations", curves: known.map(p => curve(
                "iterations", p, `${name}, ${decibels(points[p].options.ebn0)} dB`, counts.map(i => rowOf.get(`${p} ${i}`))))},
        ]};
    }

    _sample(result, point, iterations) {
        const {ebn0} = this._sweep.points[point].options;
        const isLast = iterations === this._sweep.settings.iterations;
        return {
            row: isLast ? `p${point}` : `p${point}-${iterations}`, ebn0, esn0: null, place: decibels(ebn0), iterations,
            ber: this._rate(result.ber, result.berLow, result.berHigh),
            bler: this._rate(result.bler, result.blerLow, result.blerHigh), bits: null,
            counts: [["Blocks", grouped(result.blocks)], ["Bit errors", grouped(result.bitErrors)],
                     ["Block errors", grouped(result.blockErrors)], ["Clipped", this._morvik.rateText(result.clippedFraction)]]};
    }

    /** Without an error there is a bound alone. */
    _rate(value, low, high) {
        const text = rate => this._morvik.rateText(rate);
        return value === 0 ?
            {value, low, high, below: true, text: `< ${text(high)}`, interval: "no error seen"} :
            {value, low, high, below: false, text: text(value), interval: `${text(low)} … ${text(high)}`};
    }

    // ---- The table

    _row(point, index) {
        const cell = text => element("td", {}, text);
        const result = point.results.at(-1);
        if (result === undefined) {
            return element("tr", {class: "waiting"}, cell(decibels(point.options.ebn0)), ...Array.from({length: 8}, () => cell("–")));
        }
        const {ber, bler, counts} = this._sample(result, index, this._sweep.settings.iterations);
        return element(
            "tr", {id: `p${index}`}, cell(decibels(point.options.ebn0)), cell(ber.text), cell(ber.interval), cell(bler.text),
            cell(bler.interval), ...counts.map(([name, text]) => cell(text)));
    }

    _writeColours(iterations, points) {
        const side = dark => [["ebn0", iterations], ["iterations", points]].flatMap(([axis, count]) => Array.from(
            {length: count}, (none, i) => `--${axis}-${i}: ${colourAt(GRADIENTS[axis][dark], count > 1 ? i / (count - 1) : 0.66)};`)).join(" ");
        this._colours.textContent =
            `:root { ${side(0)} }\n@media screen and (prefers-color-scheme: dark) { :root { ${side(1)} } }`;
    }
}

/** The places of a sweep in dB, and as the command takes them. Steps are counted in thousandths, as those of the command. */
function placesIn() {
    const from = decibelsIn("from", "The start");
    const to = decibelsIn("to", "The end");
    const step = decibelsIn("step", "The step", 0, 100);
    if (to < from) {
        refuseField(find("to"), `The end, ${to} dB, lies below the start, ${from} dB.`);
    }
    if (step === 0 && to > from) {
        refuseField(find("step"), "The step is 0: the end is never reached.");
    }
    const [first, last, by] = [from, to, step].map(value => Math.round(1000 * value));
    const count = by === 0 ? 1 : Math.floor((last - first) / by) + 1;
    if (count > MOST_POINTS) {
        refuseField(find("step"), `These are ${count} points: at most ${MOST_POINTS} are simulated.`);
    }
    const places = Array.from({length: count}, (none, i) => (first + i * by) / 1000);
    return {places, range: count > 1 ? `${from}:${step}:${to}` : String(from)};
}

/** Two decimals, three where they are needed. */
function decibels(value) {
    const needsThree = Math.round(1000 * value) % 10 !== 0;
    return value.toFixed(needsThree ? 3 : 2).replace("-", "−");
}

/** The colour at a place of a gradient, 0 to 1. */
function colourAt(gradient, place) {
    const scaled = place * (gradient.length - 1);
    const from = Math.min(Math.floor(scaled), gradient.length - 2);
    const levels = gradient[from].map((level, c) => Math.round(level + (gradient[from + 1][c] - level) * (scaled - from)));
    return `rgb(${levels.join(", ")})`;
}

export {RatesView};
