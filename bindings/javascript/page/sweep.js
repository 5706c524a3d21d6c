// A sweep over Eb/N0: hands pieces of each point to workers and counts them in the order of their blocks, so that the
// counts are those of the command whatever the workers do.

const LANES_AT_ONCE = 64;  // blocks that the encoder takes at once, and the decoder from 1024 bits on

class Sweep {
    /** Calls `changed` after each piece, and `ended` with a mistake or without one. */
    constructor(morvik, makeWorker, {settings, places, rules, workers, changed, ended}) {
        Object.assign(this, {settings, rules, _morvik: morvik, _changed: changed, _ended: ended});
        this.points = places.map(ebn0 => ({options: {...settings, ebn0}, count: null, results: []}));
        this._piece = LANES_AT_ONCE * Math.max(1, Math.floor(1024 / settings.blockSize));
        this._current = -1;
        this._workers = Array.from({length: workers}, () => this._start(makeWorker()));
        this._nextPoint();
        this._workers.forEach(worker => this._handOut(worker));
    }

    get isRunning() {
        return this._workers.length > 0;
    }

    _start(worker) {
        worker.onmessage = ({data}) => this._take(worker, data);
        worker.onerror = event => this._end(event.message || "A worker could not be started.");
        return worker;
    }

    _nextPoint() {
        this._current += 1;
        const point = this.points[this._current];
        if (point === undefined) {
            this._end();
            return;
        }
        point.count = this._morvik.count(point.options, this.rules);
        this._next = 0;
    }

    _handOut(worker) {
        const {maxBlocks} = this.rules;
        const count = Math.min(this._piece, Math.max(1, maxBlocks - this._next));
        worker.postMessage({run: this._current, options: this.points[this._current].options, first: this._next, count});
        this._next += count;
    }

    /** Pieces of a point that has ended do not count. */
    _take(worker, {run, piece, mistake}) {
        if (mistake !== undefined) {
            this._end(mistake);
            return;
        }
        if (!this.isRunning) {
            return;
        }
        if (run === this._current) {
            this._count(this.points[run], piece);
        }
        if (this.isRunning) {
            this._handOut(worker);
        }
    }

    _count(point, piece) {
        point.count.take(piece);
        const blocks = point.count.result().blocks;
        if (blocks > 0) {
            const {iterations} = this.settings;
            point.results = Array.from({length: iterations}, (none, i) => point.count.result(i + 1));
        }
        if (point.count.isComplete) {
            point.count.end();
            point.count = null;
            this._nextPoint();
        }
        this._changed();
    }

    _end(mistake) {
        this._workers.forEach(worker => worker.terminate());
        this._workers = [];
        for (const point of this.points) {
            point.count?.end();
            point.count = null;
        }
        this._ended(mistake);
    }

    stop() {
        if (this.isRunning) {
            this._end();
        }
    }

    /** 0 to 1, of the point that is simulated. */
    progress() {
        const result = this.points[this._current]?.results.at(-1);
        return result ? Math.max(result.blocks / this.rules.maxBlocks, result.blockErrors / this.rules.blockErrors) : 0;
    }

    get current() {
        return this._current;
    }
}

export {Sweep};
