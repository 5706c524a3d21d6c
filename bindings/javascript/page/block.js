// One block: wrong bits after each iteration, and its soft values where the core's segments and windows have them.
import {chosen, commandOf, decibelsIn, element, find, readSettings, showCommand, wholeIn, withMistakes} from "./form.js";

const MOST_BLOCK = 2 ** 53 - 1;
const SEARCHED = 6000000;     // bits, which take two seconds
const ROW_HEIGHT = 26;        // of a segment, in pixels
const STREAMS = ["systematic", "parity1", "parity2"];
const LARGEST_SOFT = 128;

class BlockView {
    constructor(morvik) {
        this._morvik = morvik;
        this._iteration = null;  // that is looked at; null: the last one
        this._place = null;      // the step that is looked at
        find("ebn0").addEventListener("input", () => this.show());
        find("block-number").addEventListener("input", () => this.show());
        find("block-before").addEventListener("click", () => this._go(-1));
        find("block-next").addEventListener("click", () => this._go(1));
        find("block-failing").addEventListener("click", () => this._search());
        for (const choice of document.querySelectorAll("input[name=values]")) {
            choice.addEventListener("change", () => this._draw());
        }
        matchMedia("(prefers-color-scheme: dark)").addEventListener("change", () => this._draw());
        addEventListener("resize", () => this._draw());
        this._listenToPointer(find("values"));
    }

    // ---- Which block

    _number() {
        return wholeIn("block-number", "The block", 0, MOST_BLOCK);
    }

    /** The settings with the ratio and the number of this block, or null. */
    _read() {
        const settings = readSettings(this._morvik);
        const own = withMistakes("block-mistake", () => ({ebn0: decibelsIn("ebn0", "The Eb/N0"), number: this._number()}));
        return settings && own && {...settings, ...own};
    }

    _go(by) {
        const number = withMistakes("block-mistake", () => this._number());
        if (number !== null) {
            find("block-number").value = Math.min(Math.max(number + by, 0), MOST_BLOCK);
            this.show();
        }
    }

    /** Goes to the next block that has wrong bits after the last iteration. */
    _search() {
        const settings = this._read();
        if (settings === null) {
            return;
        }
        const atOnce = 64;
        const {iterations, blockSize, number} = settings;
        const end = number + 1 + atOnce * Math.ceil(SEARCHED / blockSize / atOnce);
        for (let first = number + 1; first < end; first += atOnce) {
            const {counts} = this._morvik.simulate(settings, first, atOnce);
            for (let i = 0; i < atOnce; ++i) {
                if (counts[(i + 1) * iterations - 1] > 0) {
                    find("block-number").value = first + i;
                    this.show();
                    return;
                }
            }
        }
        find("block-number").value = end - 1;
        this.show();
        find("block-mistake").textContent = `None of the blocks ${number + 1} to ${end - 1} has wrong bits.`;
    }

    // ---- Decoding

    show() {
        const settings = this._read();
        find("block-content").hidden = settings === null;
        if (settings === null) {
            return;
        }
        this._decode(settings);
        this._tellOutcome();
        this._listErrors();
        this._draw();
        showCommand("block-command", `${commandOf(settings)} --ebn0 ${settings.ebn0} --replay 0:${settings.number}`);
    }

    _decode(settings) {
        const block = this._morvik.block({...settings, block: settings.number});
        const coded = this._morvik.encode(block.sent);
        this._settings = settings;
        this._cut = this._morvik.cut(settings.blockSize, settings.units);
        this._windowOf = new Array(settings.blockSize);
        for (const window of this._cut.windows) {
            this._windowOf.fill(window, window.first, window.last + 1);
        }
        this._clipped = block.clipped;
        this._received = Object.fromEntries(STREAMS.map(name => [name, {sent: coded[name], values: block[name]}]));
        this._decoded = this._morvik.decodeEach(block, settings).map(
            ({bits, ratios}) => ({wrong: bits.filter((bit, i) => bit !== block.sent[i]).length, ratios}));
        this._largest = this._decoded.reduce(
            (most, {ratios}) => ratios.reduce((before, ratio) => Math.max(before, Math.abs(ratio)), most), 1);
        this._iteration = this._iteration === null ? null : Math.min(this._iteration, settings.iterations);
        this._place = null;
    }

    /** Counted from 1. */
    _shownIteration() {
        return this._iteration ?? this._settings.iterations;
    }

    _tellOutcome() {
        const {blockSize, iterations} = this._settings;
        const {wrong} = this._decoded[iterations - 1];
        const right = this._decoded.findLastIndex(each => each.wrong > 0) + 2;
        const needed = right === 1 ? "after the first iteration" : `from iteration ${right} on`;
        find("block-outcome").textContent = (wrong > 0 ?
            `${wrong} of ${blockSize} bits are wrong after ${iterations} iterations` : `All ${blockSize} bits are right ${needed}`) +
            `; ${this._clipped} of ${3 * (blockSize + 4)} soft values were clipped.`;
    }

    _listErrors() {
        const {sent, values} = this._received.systematic;
        const hard = values.subarray(0, this._settings.blockSize).filter((value, i) => (value >= 0 ? 1 : 0) !== sent[i]).length;
        const counts = [hard, ...this._decoded.map(each => each.wrong)];
        const most = Math.max(1, ...counts);
        find("errors").replaceChildren(...counts.map((count, iteration) => {
            const bar = element("div", {class: "bar"});
            bar.style.height = `${Math.round(88 * count / most)}px`;
            const button = element(
                "button", {type: "button", class: count > 0 ? "some" : "none", "aria-pressed": "false"},
                element("span", {class: "room"}, element("span", {class: "count"}, String(count)), bar),
                element("small", {}, iteration === 0 ? "received" : String(iteration)));
            button.setAttribute("aria-label", `${count} wrong bits ${iteration === 0 ? "as received" : `after iteration ${iteration}`}`);
            button.addEventListener("click", () => this._choose(iteration));
            return element("li", {}, button);
        }));
    }

    /** 0 are the values received. */
    _choose(iteration) {
        const isLast = iteration === this._settings.iterations;
        this._iteration = iteration === 0 || isLast ? null : iteration;
        const wanted = iteration === 0 ? "systematic" : "ratios";
        document.querySelector(`input[name=values][value=${wanted}]`).checked = true;
        this._draw();
    }

    // ---- The picture

    /** What is shown: values, the bits that were sent, and the largest magnitude. */
    _shown() {
        const kind = chosen("values");
        return kind === "ratios" ?
            {kind, values: this._decoded[this._shownIteration() - 1].ratios, sent: this._received.systematic.sent, most: this._largest} :
            {kind, ...this._received[kind], most: LARGEST_SOFT};
    }

    _draw() {
        if (find("block-content").hidden || !this._settings) {
            return;
        }
        const shown = this._shown();
        const marked = shown.kind === "ratios" ? this._shownIteration() : shown.kind === "systematic" ? 0 : -1;
        find("errors").querySelectorAll("button").forEach(
            (button, i) => button.setAttribute("aria-pressed", String(i === marked)));
        this._paint(shown);
        this._drawWindows();
        this._describe(shown);
        this._look(this._place);
    }

    _paint({values, sent, most}) {
        const {segments, segmentLength} = this._cut;
        const canvas = find("values-picture");
        canvas.width = segmentLength;
        canvas.height = segments;
        canvas.style.height = `${ROW_HEIGHT * segments}px`;
        const style = getComputedStyle(document.documentElement);
        const [paper, right, wrong] = ["--minor", "--right", "--wrong"].map(name => rgb(style.getPropertyValue(name)));
        const picture = new ImageData(segmentLength, segments);
        for (let i = 0; i < segments * segmentLength; ++i) {
            const [full, least] = isRight(values[i], sent[i]) ? [right, 0.1] : [wrong, 0.4];
            const strength = least + (1 - least) * Math.sqrt(Math.min(1, Math.abs(values[i]) / most));
            full.forEach((level, c) => { picture.data[4 * i + c] = paper[c] + (level - paper[c]) * strength; });
            picture.data[4 * i + 3] = 255;
        }
        canvas.getContext("2d").putImageData(picture, 0, 0);
    }

    _drawWindows() {
        const {segmentLength, windows} = this._cut;
        const width = find("values").clientWidth;
        const across = step => step / segmentLength * width;
        const svg = (name, attributes, ...children) => {
            const made = document.createElementNS("http://www.w3.org/2000/svg", name);
            Object.entries(attributes).forEach(([key, value]) => made.setAttribute(key, value));
            made.append(...children);
            return made;
        };
        find("windows").replaceChildren(...windows.flatMap(({number, segment, first, last}) => {
            const [from, to] = [first, last + 1].map(step => across(step - segment * segmentLength));
            const y = segment * ROW_HEIGHT;
            const box = svg("rect", {x: from, y, width: to - from, height: ROW_HEIGHT, "data-window": number});
            return to - from < 26 ? [box] : [box, svg("text", {x: from + 5, y: y + 12}, String(number))];
        }));
    }

    _describe({kind, values, sent}) {
        const {segments, segmentLength, rows, windows} = this._cut;
        const {blockSize, units} = this._settings;
        const what = kind === "ratios" ? `Log-likelihood ratios after iteration ${this._shownIteration()}` :
            `Received values of ${find("values").parentNode.querySelector(`input[value=${kind}]`).parentNode.textContent.toLowerCase()}`;
        let wrong = 0;
        for (let i = 0; i < blockSize; ++i) {
            wrong += isRight(values[i], sent[i]) ? 0 : 1;
        }
        const counted = (count, name) => `${count} ${name}${count === 1 ? "" : "s"}`;
        find("values-text").textContent =
            `${what}: ${wrong} of ${blockSize} have the wrong sign. ${units} units cut the block into ` +
            `${counted(segments, "segment")} of ${segmentLength} steps, a line each, and ${counted(windows.length, "window")} ` +
            `in ${counted(rows, "row")}. The numbers are the order of the backward recursion.`;
    }

    // ---- The value that is looked at

    _listenToPointer(area) {
        const at = event => {
            const box = area.getBoundingClientRect();
            const {segments, segmentLength} = this._cut;
            const step = Math.floor((event.clientX - box.left) / box.width * segmentLength);
            const segment = Math.floor((event.clientY - box.top) / ROW_HEIGHT);
            const isWithin = step >= 0 && step < segmentLength && segment >= 0 && segment < segments;
            this._look(isWithin ? segment * segmentLength + step : null);
        };
        area.addEventListener("pointermove", at);
        area.addEventListener("pointerdown", at);
        area.addEventListener("pointerleave", event => event.pointerType === "mouse" && this._look(null));
        area.addEventListener("blur", () => this._look(null));
        area.addEventListener("keydown", event => {
            const length = this._cut.segmentLength;
            const by = {ArrowLeft: -1, ArrowRight: 1, ArrowUp: -length, ArrowDown: length}[event.key];
            if (by !== undefined) {
                event.preventDefault();
                const next = this._place === null ? 0 : this._place + by;
                this._look(next >= 0 && next < this._settings.blockSize ? next : this._place);
            } else if (event.key === "Escape") {
                this._look(null);
            }
        });
    }

    _look(place) {
        this._place = place;
        find("windows").querySelector(".marked")?.classList.remove("marked");
        find("value-tip").hidden = place === null;
        if (place === null) {
            return;
        }
        const {kind, values, sent} = this._shown();
        const {number, segment, row, unit, thread} = this._windowOf[place];
        const value = kind === "ratios" ? values[place] / 128 : values[place] / 8;
        const tip = find("value-tip");
        tip.replaceChildren(
            element("strong", {}, `Step ${place}: sent ${sent[place]}, ${kind === "ratios" ? "ratio" : "value"} ${value}`.replace("-", "−")),
            `Segment ${segment}, window ${number} (row ${row}); unit ${unit}, thread ${thread}`);
        const mark = find("windows").querySelector(`[data-window="${number}"]`);
        mark.classList.add("marked");
        mark.parentNode.append(mark);
        this._placeTip(tip, place);
    }

    _placeTip(tip, place) {
        const {segmentLength} = this._cut;
        const area = find("values");
        const x = (place % segmentLength + 0.5) / segmentLength * area.clientWidth;
        const y = (Math.floor(place / segmentLength) + 1) * ROW_HEIGHT;
        tip.style.left = `${Math.max(0, Math.min(x + 12, area.clientWidth - tip.offsetWidth))}px`;
        tip.style.top = `${y + 6}px`;
    }
}

/** The core decides 0 for -1 and below, 1 otherwise. */
function isRight(value, bit) {
    return (value >= 0 ? 1 : 0) === bit;
}

/** The three levels of #rrggbb. */
function rgb(text) {
    return [1, 3, 5].map(i => parseInt(text.trim().slice(i, i + 2), 16));
}

export {BlockView};
