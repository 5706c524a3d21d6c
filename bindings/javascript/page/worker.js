// Simulates pieces of error-rate runs, one after the other.
import {load} from "../package/morvik.js";

let morvik = null;
onmessage = async ({data}) => {
    if (data.module) {
        morvik = load(data);
        return;
    }
    const {run, options, first, count} = data;
    try {
        const piece = (await morvik).simulate(options, first, count);
        postMessage({run, piece}, [piece.counts.buffer]);
    } catch (error) {
        postMessage({run, mistake: error.message});
    }
};
