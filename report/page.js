// Draws the curves of the report, and shows the figures of the point that is looked at. A page whose curves grow hands
// over new ones as the details of an event "curves".
"use strict";
(() => {
    const chart = document.getElementById("chart");
    const tip = document.getElementById("tip");
    const bars = document.getElementById("bars");
    const legend = document.getElementById("legend");
    const lowered = (dy, text) => element("tspan", {dy, "font-size": 10}, text);
    const axisOf = {
        ebn0: {
            name: "Eb/N0", of: sample => sample.ebn0, text: sample => `${sample.place} dB`, finest: 0, apart: 70, words: "Eb/N0 in dB",
            label: () => ["E", lowered(3, "b"), element("tspan", {dy: -3}, "/N"), lowered(3, "0"),
                          element("tspan", {dy: -3}, " (dB)")]},
        esn0: {
            name: "Es/N0", of: sample => sample.esn0, text: sample => `${sample.place} dB`, finest: 0, apart: 70, words: "Es/N0 in dB",
            label: () => ["E", lowered(3, "s"), element("tspan", {dy: -3}, "/N"), lowered(3, "0"),
                          element("tspan", {dy: -3}, " (dB)")]},
        iterations: {
            name: "Iterations", of: sample => sample.iterations, text: sample => sample.iterations, finest: 1, apart: 40,
            words: "iterations", label: () => ["Iterations"]},
    };
    const names = {
        ber: "Bit error rate (BER)", bler: "Block error rate (BLER)", bits: "Throughput in bits per symbol"};
    const margin = {left: 62, right: 16, top: 14, bottom: 52};
    const dashes = ["none", "9 5", "3 3", "10 4 2 4"];
    const arrowLength = 0.4;  // a bound's arrow goes down to this fraction of it
    const reach = 48;         // in pixels, within which a point is found by the pointer
    const hidden = new Set();  // names of curves
    let rows, views, axis, curves, quantity;
    let places = [];    // what was drawn: {curve, sample, x, y}
    let current = null; // the one that is looked at

    function element(name, attributes, ...children) {
        const made = document.createElementNS("http://www.w3.org/2000/svg", name);
        for (const [key, value] of Object.entries(attributes)) {
            made.setAttribute(key, value);
        }
        made.append(...children);
        return made;
    }

    const rounded = value => Math.round(value * 100) / 100;
    const nameOf = curve => `${axis} ${curve.index}`;
    const isHidden = curve => hidden.has(nameOf(curve));
    const colourOf = curve => `var(--${curve.colour})`;
    const isLinear = () => quantity === "bits";  // the other axes are logarithmic
    const drawn = rate => rate !== null && ((rate.below ? rate.high : rate.value) > 0 || isLinear());
    const hasPlace = sample => axisOf[axis].of(sample) !== null;
    // A curve that others cover is broader, to show on both sides of them.
    const widthOf = curve => curve.reference ? 1.5 : 2 + 2 * curve.layer;
    const sizeOf = curve => 3.6 + 1.6 * curve.layer;
    const heightOf = rate => rate.below ? rate.high : rate.value;

    function marker(curve, x, y, size) {
        const corners = [0, 4, 3, 4, 5][curve.marker];
        const style = {
            class: "marker", stroke: colourOf(curve), fill: curve.reference ? "var(--paper)" : colourOf(curve)};
        if (corners === 0) {
            return element("circle", {...style, cx: rounded(x), cy: rounded(y), r: size});
        }
        const turn = curve.marker === 1 ? Math.PI / 4 : 0;
        return element("polygon", {...style, points: polygon(x, y, size * 1.25, corners, turn)});
    }

    function polygon(x, y, radius, corners, turn) {
        const points = [];
        for (let i = 0; i < corners; ++i) {
            const angle = turn - Math.PI / 2 + 2 * Math.PI * i / corners;
            points.push(`${rounded(x + radius * Math.cos(angle))},${rounded(y + radius * Math.sin(angle))}`);
        }
        return points.join(" ");
    }

    function niceStep(span, most) {
        const power = 10 ** Math.floor(Math.log10(span / most));
        return [1, 2, 5, 10].map(factor => factor * power).find(step => span / step <= most);
    }

    // All curves count, hidden or not, so that the axes stay where they are.
    function ranges() {
        const all = curves.flatMap(curve => curve.samples);
        const x = all.filter(sample => hasPlace(sample) && (drawn(sample.ber) || drawn(sample.bler))).map(axisOf[axis].of);
        const y = all.map(sample => sample[quantity]).filter(drawn).flatMap(
            rate => rate.below ? [0.8 * arrowLength * rate.high] : rate.low > 0 ? [rate.value, rate.low] : [rate.value]);
        const least = Math.min(0.5, ...y);
        const from = x.length > 0 ? Math.min(...x) : 0;
        const to = x.length > 0 ? Math.max(...x) : 1;
        const space = from < to ? 0.03 * (to - from) : 0.5;
        const values = all.map(sample => sample[quantity]).filter(drawn).map(rate => rate.value);
        return {
            from: from - space, to: to + space, decades: -Math.floor(Math.log10(least)),
            most: 1.1 * Math.max(0, ...values) || 1};
    }

    function makeScale(width, height) {
        const range = ranges();
        const right = width - margin.right;
        const bottom = height - margin.bottom;
        return {
            ...range, right, bottom,
            x: value => margin.left + (value - range.from) / (range.to - range.from) * (right - margin.left),
            y: value => margin.top + (bottom - margin.top) *
                (isLinear() ? 1 - value / range.most : Math.min(1, -Math.log10(value) / range.decades)),
        };
    }

    function axes(scale) {
        const group = element("g", {});
        const line = (kind, x1, y1, x2, y2) => group.append(element(
            "line", {class: kind, x1: rounded(x1), y1: rounded(y1), x2: rounded(x2), y2: rounded(y2)}));
        const label = (x, y, anchor, ...content) => group.append(element(
            "text", {x: rounded(x), y: rounded(y), "text-anchor": anchor}, ...content));
        const rise = niceStep(scale.most, 8);
        for (let i = 0; isLinear() && i * rise <= scale.most; ++i) {
            const y = scale.y(i * rise);
            line("major", margin.left, y, scale.right, y);
            label(margin.left - 10, y + 4, "end", (i * rise).toFixed(rise < 1 ? 1 : 0));
        }
        const every = Math.ceil(scale.decades / 10);
        for (let decade = 0; !isLinear() && decade <= scale.decades; ++decade) {
            const y = scale.y(10 ** -decade);
            for (let digit = 2; digit < 10 && decade > 0; ++digit) {
                const between = scale.y(digit * 10 ** -decade);
                line("minor", margin.left, between, scale.right, between);
            }
            line("major", margin.left, y, scale.right, y);
            if (decade % every === 0) {
                const exponent = decade === 0 ? "0" : `−${decade}`;
                label(margin.left - 10, y + 4, "end", "10", element("tspan", {dy: -5, "font-size": 10}, exponent));
            }
        }
        const {finest, apart} = axisOf[axis];
        const step = Math.max(
            finest, niceStep(scale.to - scale.from, Math.max(2, (scale.right - margin.left) / apart)));
        const digits = Math.max(0, -Math.floor(Math.log10(step) + 1e-9));
        for (let i = Math.ceil(scale.from / step); i * step <= scale.to; ++i) {
            line("major", scale.x(i * step), margin.top, scale.x(i * step), scale.bottom);
            label(scale.x(i * step), scale.bottom + 20, "middle", (i * step).toFixed(digits).replace("-", "−"));
        }
        line("axis", margin.left, scale.bottom, scale.right, scale.bottom);
        line("axis", margin.left, margin.top, margin.left, scale.bottom);
        group.append(element(
            "text", {class: "name", x: (margin.left + scale.right) / 2, y: scale.bottom + 44, "text-anchor": "middle"},
            ...axisOf[axis].label()));
        const middle = (margin.top + scale.bottom) / 2;
        group.append(element(
            "text", {class: "name", x: 16, y: middle, transform: `rotate(-90 16 ${middle})`, "text-anchor": "middle"},
            names[quantity]));
        return group;
    }

    function confidenceBar(curve, rate, x, scale) {
        const low = rate.low > 0 ? scale.y(rate.low) : scale.bottom;
        const high = scale.y(rate.high);
        return element("path", {
            class: "bar", stroke: colourOf(curve),
            d: `M${rounded(x)} ${rounded(low)}V${rounded(high)}m-4 0h8M${rounded(x - 4)} ${rounded(low)}h8`});
    }

    // No error was seen: an open triangle at the bound, with an arrow to where the rate may be.
    function bound(curve, rate, x, scale) {
        const from = scale.y(rate.high);
        const to = scale.y(rate.high * arrowLength);
        return [
            element("path", {
                class: "bar", stroke: colourOf(curve),
                d: `M${rounded(x)} ${rounded(from)}V${rounded(to)}m-4 -6l4 6l4 -6`}),
            element("polygon", {
                class: "marker", stroke: colourOf(curve), fill: "var(--paper)", points: polygon(x, from, 6.5, 3, Math.PI)}),
        ];
    }

    // Shannon's limit for symbols of two dimensions, as far as it lies below the top.
    function limit(scale) {
        let path = "";
        for (let i = 0; i <= 200; ++i) {
            const x = scale.from + (scale.to - scale.from) * i / 200;
            const bits = Math.log2(1 + 10 ** (x / 10));
            if (bits <= scale.most) {
                path += `${path === "" ? "M" : "L"}${rounded(scale.x(x))} ${rounded(scale.y(bits))}`;
            }
        }
        const group = element("g", {class: "limit"});
        group.append(
            element("path", {d: path, fill: "none", stroke: "currentColor", "stroke-width": 1.5, "stroke-dasharray": "2 4"}),
            element("text", {x: margin.left + 8, y: margin.top + 16}, "dotted: Shannon’s limit"));
        return group;
    }

    function drawCurve(curve, scale) {
        const group = element("g", {class: curve.reference ? "reference" : "own", "data-curve": curve.index});
        const above = [];
        let path = "";
        for (const sample of curve.samples) {
            const rate = sample[quantity];
            if (!drawn(rate) || !hasPlace(sample)) {
                continue;
            }
            const x = scale.x(axisOf[axis].of(sample));
            const y = scale.y(heightOf(rate));
            places.push({curve, sample, x, y});
            if (rate.below) {
                above.push(...bound(curve, rate, x, scale));
                continue;
            }
            path += `${path === "" ? "M" : "L"}${rounded(x)} ${rounded(y)}`;
            if (bars.checked && rate.low !== null && rate.high !== null) {
                group.append(confidenceBar(curve, rate, x, scale));
            }
            above.push(marker(curve, x, y, sizeOf(curve)));
        }
        if (path !== "") {
            group.append(element(
                "path", {
                    class: "curve", stroke: colourOf(curve), "stroke-width": widthOf(curve),
                    "stroke-dasharray": dashes[curve.dash], d: path}));
        }
        group.append(...above);
        return group;
    }

    function describe() {
        const shown = curves.filter(curve => !isHidden(curve)).map(curve => curve.title);
        return `${names[quantity]} against ${axisOf[axis].words}${isLinear() ? "" : ", on a logarithmic scale"}. ` +
            `Series: ${shown.join("; ") || "none"}. The table below has all the figures.`;
    }

    function draw() {
        const width = Math.max(300, chart.clientWidth || 1000);
        const height = Math.round(Math.min(580, Math.max(340, width * 0.54)));
        const scale = makeScale(width, height);
        places = [];
        // The group's empty title keeps browsers from showing the picture's one beside the figures.
        const content = element("g", {}, element("title", {}), axes(scale));
        if (isLinear() && axis === "esn0") {
            content.append(limit(scale));
        }
        for (const wanted of [true, false]) {
            for (const curve of curves) {
                if (curve.reference === wanted && !isHidden(curve)) {
                    content.append(drawCurve(curve, scale));
                }
            }
        }
        content.append(element("g", {id: "pointer"}));
        const svg = element(
            "svg", {
                viewBox: `0 0 ${width} ${height}`, role: "img", "aria-labelledby": "chart-title",
                "aria-describedby": "chart-description"},
            element("title", {id: "chart-title"}, names[quantity]),
            element("desc", {id: "chart-description"}, describe()),
            element("rect", {width, height, fill: "none"}), content);
        chart.querySelector("svg")?.remove();
        chart.prepend(svg);
        look(current && places.find(place => isSame(place, current)) || null);
    }

    // ---- The point that is looked at

    const isSame = (a, b) => a.curve.index === b.curve.index && a.sample.row === b.sample.row;

    function pair(list, name, value, detail) {
        const term = document.createElement("dt");
        const figure = document.createElement("dd");
        term.textContent = name;
        figure.textContent = value;
        if (detail) {
            const small = document.createElement("small");
            small.textContent = detail;
            figure.append(small);
        }
        list.append(term, figure);
    }

    function fillTip({curve, sample}) {
        const title = document.createElement("strong");
        title.textContent = curve.title;
        title.style.borderColor = colourOf(curve);
        const list = document.createElement("dl");
        pair(list, axisOf[axis].name, axisOf[axis].text(sample));
        for (const [name, rate] of [["BER", sample.ber], ["BLER", sample.bler], ["Bits per symbol", sample.bits]]) {
            if (rate !== null) {
                pair(list, name, rate.text, rate.interval);
            }
        }
        for (const [name, text] of sample.counts) {
            pair(list, name, text);
        }
        tip.replaceChildren(title, list);
    }

    function placeTip({x, y}) {
        const shrunk = chart.clientWidth / chart.querySelector("svg").viewBox.baseVal.width;
        const left = x * shrunk + 18;
        const fits = left + tip.offsetWidth <= chart.clientWidth;
        tip.style.left = `${Math.max(0, fits ? left : x * shrunk - 18 - tip.offsetWidth)}px`;
        const top = Math.min(y * shrunk - tip.offsetHeight / 2, chart.clientHeight - tip.offsetHeight);
        tip.style.top = `${Math.max(0, top)}px`;
    }

    function look(place) {
        current = place;
        tip.hidden = place === null;
        document.querySelector("tr.marked")?.classList.remove("marked");
        const pointer = document.getElementById("pointer");
        pointer.replaceChildren();
        for (const group of chart.querySelectorAll("[data-curve]")) {
            group.classList.toggle("dimmed", place !== null && Number(group.dataset.curve) !== place.curve.index);
        }
        if (place === null) {
            return;
        }
        const {x, y, curve, sample} = place;
        const bottom = chart.querySelector("svg").viewBox.baseVal.height - margin.bottom;
        pointer.append(
            element("path", {class: "cross", d: `M${margin.left} ${rounded(y)}H${rounded(x)}V${bottom}`, fill: "none"}),
            element("circle", {class: "ring", cx: rounded(x), cy: rounded(y), r: 8.5, stroke: colourOf(curve)}));
        document.getElementById(sample.row)?.classList.add("marked");
        fillTip(place);
        placeTip(place);
    }

    function nearest(event) {
        const svg = chart.querySelector("svg");
        const box = svg.getBoundingClientRect();
        const grown = svg.viewBox.baseVal.width / box.width;
        const x = (event.clientX - box.left) * grown;
        const y = (event.clientY - box.top) * grown;
        let best = null;
        let least = reach;
        for (const place of places) {
            const distance = Math.hypot(place.x - x, place.y - y);
            if (distance <= least) {  // of several in one place, the one on top
                best = place;
                least = distance;
            }
        }
        return best;
    }

    // Left and right go along a curve, up and down to the next curve's closest point.
    function step(key) {
        if (current === null) {
            return places[0] ?? null;
        }
        const along = places.filter(place => place.curve === current.curve);
        if (key === "ArrowLeft" || key === "ArrowRight") {
            return along[along.findIndex(place => place.sample === current.sample) + (key === "ArrowRight" ? 1 : -1)] ?? current;
        }
        const order = curves.filter(curve => places.some(place => place.curve === curve));
        const change = key === "ArrowDown" ? 1 : order.length - 1;
        const next = order[(order.indexOf(current.curve) + change) % order.length];
        const distance = place => Math.hypot(place.x - current.x, place.y - current.y);
        return places.filter(place => place.curve === next).reduce((a, b) => distance(b) < distance(a) ? b : a);
    }

    chart.addEventListener("pointermove", event => look(nearest(event)));
    chart.addEventListener("pointerdown", event => look(nearest(event)));
    chart.addEventListener("pointerleave", event => event.pointerType === "mouse" && look(null));
    chart.addEventListener("blur", () => look(null));
    chart.addEventListener("keydown", event => {
        if (["ArrowLeft", "ArrowRight", "ArrowUp", "ArrowDown"].includes(event.key)) {
            event.preventDefault();
            look(step(event.key));
        } else if (event.key === "Escape") {
            look(null);
        }
    });

    // ---- What to draw

    function legendItem(curve) {
        const button = document.createElement("button");
        button.type = "button";
        button.setAttribute("aria-pressed", String(!isHidden(curve)));
        button.append(
            element("svg", {width: 40, height: 16, "aria-hidden": "true"},
                element("path", {
                    d: "M2 8H38", stroke: colourOf(curve), "stroke-width": widthOf(curve),
                    "stroke-dasharray": dashes[curve.dash]}),
                marker(curve, 20, 8, sizeOf(curve))),
            curve.title);
        button.addEventListener("click", () => {
            if (!hidden.delete(nameOf(curve))) {
                hidden.add(nameOf(curve));
            }
            button.setAttribute("aria-pressed", String(!isHidden(curve)));
            draw();
        });
        const item = document.createElement("li");
        item.append(button);
        return item;
    }

    // Where there is one Eb/N0 only, the curves are those against iterations.
    function firstView() {
        return views.find(view => view.curves.some(curve => curve.samples.length > 1)) ?? views[0];
    }

    function show(view) {
        ({axis, curves} = view);
        const titles = curves.map(curve => curve.title);
        if (titles.join("\n") !== Array.from(legend.children, item => item.textContent).join("\n")) {
            legend.replaceChildren(...curves.map(legendItem));
        }
        draw();
    }

    function take(data) {
        ({rows, views} = data);
        for (const curve of views.flatMap(view => view.curves)) {
            curve.samples = curve.samples.map(row => rows[row]);
        }
        quantity ??= rows.some(row => row.bits !== null) ? "bits" : "ber";
        show(views.find(view => view.axis === axis) ?? firstView());
    }

    take(JSON.parse(document.getElementById("data").textContent));
    addEventListener("curves", event => take(event.detail));
    for (const choice of document.querySelectorAll("input[name=axis]")) {
        choice.checked = choice.value === axis;
        choice.addEventListener("change", () => {
            look(null);
            show(views.find(view => view.axis === choice.value));
        });
    }
    for (const choice of document.querySelectorAll("input[name=quantity]")) {
        choice.checked = choice.value === quantity;
        choice.addEventListener("change", () => {
            quantity = choice.value;
            draw();
        });
    }
    bars.addEventListener("change", draw);
    addEventListener("resize", draw);
})();
