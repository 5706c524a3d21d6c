// The self-test of compiled modules: self_check.mjs MODULE.wasm...
import {readFile} from "node:fs/promises";
import {load} from "../package/morvik.js";

for (const file of process.argv.slice(2)) {
    const morvik = await load({module: await WebAssembly.compile(await readFile(file))});
    const {passed, configurations, digest} = morvik.selfTest();
    console.log(`${file}: blocks ${digest}, ${configurations} of 18 configurations right`);
    process.exitCode ||= passed ? 0 : 1;
}
