// The page: loads the module that it holds and keeps what it shows in step with the settings.
import {hasVectors, load} from "../package/morvik.js";
import {BlockView} from "./block.js";
import {element, find} from "./form.js";
import {RatesView} from "./rates.js";

/** What the page holds is compressed and written as base64. */
async function heldModule(name) {
    const bytes = Uint8Array.from(atob(find(`module-${name}`).textContent), letter => letter.charCodeAt(0));
    const stream = new Blob([bytes]).stream().pipeThrough(new DecompressionStream("gzip"));
    return WebAssembly.compile(await new Response(stream).arrayBuffer());
}

async function start() {
    const simd = hasVectors();
    const module = await heldModule(simd ? "simd" : "plain");
    const morvik = await load({module});
    const workerPlace = URL.createObjectURL(new Blob([find("worker").textContent], {type: "text/javascript"}));
    const block = new BlockView(morvik);
    const rates = new RatesView(morvik, () => {
        const worker = new Worker(workerPlace);
        worker.postMessage({module});
        return worker;
    });
    find("block-sizes").replaceChildren(...morvik.blockSizes.map(size => element("option", {value: size})));
    find("settings").addEventListener("submit", event => event.preventDefault());
    find("settings").addEventListener("input", () => {
        rates.stop();
        block.show();
    });
    find("footer").textContent = `morvik @VERSION@, ${simd ? "with" : "without"} the vectors of WebAssembly. Seeds and block numbers give the same bits as the command’s.`;
    block.show();
    document.body.dataset.ready = "true";
}

start().catch(error => {
    find("settings-mistake").textContent = `The decoder could not be started: ${error.message}`;
});
