// What is typed, as numbers. A field that holds something else is marked, and the reason stands below the form.
const find = id => document.getElementById(id);

function element(name, attributes = {}, ...children) {
    const made = document.createElement(name);
    for (const [key, value] of Object.entries(attributes)) {
        made.setAttribute(key, value);
    }
    made.append(...children);
    return made;
}

class Mistake extends Error {}

function refuseField(input, text) {
    input.setAttribute("aria-invalid", "true");
    throw new Mistake(text);
}

function textOf(id, what) {
    const input = find(id);
    input.removeAttribute("aria-invalid");
    const text = input.value.trim().replace("−", "-");
    if (text === "") {
        refuseField(input, `${what} is missing.`);
    }
    return text;
}

function wholeIn(id, what, least, most) {
    const text = textOf(id, what);
    const value = Number(text);
    if (!/^\d+$/.test(text) || value < least || value > most) {
        refuseField(find(id), `${what} “${text}” is not possible. Choose a whole number from ${least} to ${most}.`);
    }
    return value;
}

/** A whole number of up to 64 bits. */
function wideIn(id, what) {
    const text = textOf(id, what);
    if (!/^\d{1,20}$/.test(text) || BigInt(text) >= 1n << 64n) {
        refuseField(find(id), `${what} “${text}” is not possible. Choose a whole number from 0 to 18446744073709551615.`);
    }
    return BigInt(text);
}

function decibelsIn(id, what, least = -50, most = 50) {
    const text = textOf(id, what);
    const value = Number(text);
    if (!/^-?\d+(\.\d{1,3})?$/.test(text) || value < least || value > most) {
        refuseField(find(id), `${what} “${text}” is not possible. Choose ${least} to ${most} dB, with at most three decimals.`);
    }
    return value;
}

function blockSizeIn(id, sizes) {
    const text = textOf(id, "The block size");
    const value = Number(text);
    if (!/^\d+$/.test(text) || !sizes.includes(value)) {
        const above = sizes.findIndex(size => size > value);
        const near = above > 0 ? `${sizes[above - 1]} and ${sizes[above]} are the nearest of LTE’s 188` :
            "LTE has 188, from 40 to 6144";
        refuseField(find(id), `The block size “${text}” does not exist: ${near}.`);
    }
    return value;
}

function chosen(name) {
    return document.querySelector(`input[name=${name}]:checked`).value;
}

/** Does what may find a mistake in what was typed, and shows it. */
function withMistakes(id, act) {
    try {
        const result = act();
        find(id).textContent = "";
        return result;
    } catch (error) {
        if (!(error instanceof Mistake)) {
            throw error;
        }
        find(id).textContent = error.message;
        return null;
    }
}

/** The settings, or null. */
function readSettings(morvik) {
    return withMistakes("settings-mistake", () => ({
        blockSize: blockSizeIn("block-size", morvik.blockSizes),
        units: Number(chosen("units")),
        algorithm: chosen("algorithm"),
        iterations: wholeIn("iterations", "The number of iterations", 1, 15),
        seed: wideIn("seed", "The seed"),
    }));
}

/** The options that the command shares with the page. */
function commandOf({blockSize, units, algorithm, iterations, seed}) {
    return `morvik ber --block-size ${blockSize} --num-pu ${units} --algorithm ${algorithm} ` +
        `--iterations ${iterations} --seed ${seed}`;
}

/** Shows a command that may wrap between its words, but not at a hyphen. */
function showCommand(id, text) {
    find(id).replaceChildren(...text.split(" ").flatMap(word => [element("span", {}, word), " "]).slice(0, -1));
}

/** A count with its thousands apart. */
const grouped = count => String(count).replace(/\B(?=(\d{3})+$)/g, "\u202f");

export {chosen, commandOf, decibelsIn, element, find, grouped, readSettings, refuseField, showCommand, wholeIn, withMistakes};
