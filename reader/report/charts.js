// Draws the charts from the tables of figures, which the program has put into the page as JSON.
(() => {
"use strict";

const data = JSON.parse(document.getElementById("data").textContent);
const rows = name => data.tables[name] || [];

// Colours come from the stylesheet, so that charts follow light and dark.
const color = name => getComputedStyle(document.documentElement).getPropertyValue(name).trim();
const SERIES = 7, POINTS = ["circle", "triangle", "rect", "rectRot", "star", "cross", "crossRot"];
const series = index => color(`--series-${index % SERIES + 1}`);
const point = index => POINTS[index % POINTS.length];

// Times are "2026-11-21T11:25:33.300+01:00", or seconds since the first frame; "" where the input has none.
const isDate = text => text.includes("T");
const milliseconds = text => isDate(text) ? Date.parse(text) : Number(text) * 1000;
const zone = text => text.slice(23);
const dated = Boolean(data.from) && isDate(data.from);
// One axis has one clock: that of the trace's beginning. What is on another one stands in the tables only; a chart says how much.
const notDrawn = {};
function onClock(chart, list, key) {
    const fitting = list.filter(row => row[key] && isDate(row[key]) === dated);
    notDrawn[chart] = list.length - fitting.length;
    return fitting;
}

function shift(offset) {
    const parts = /^([+-])(\d\d):(\d\d)$/.exec(offset);
    return parts ? (parts[1] + "1") * (parts[2] * 60 + Number(parts[3])) * 60000 : 0;
}

const SECOND = 1000, MINUTE = 60 * SECOND, HOUR = 60 * MINUTE, DAY = 24 * HOUR, MOST_TICKS = 9;
const STEPS = [1, 2, 5, 10, 15, 30].map(count => count * SECOND)
    .concat([1, 2, 5, 10, 15, 30].map(count => count * MINUTE), [1, 2, 3, 6, 12].map(count => count * HOUR),
            [1, 2, 7, 14, 28, 91, 364].map(count => count * DAY));

// An axis of time over the whole trace, with ticks at round times of the trace's own zone.
function timeAxis() {
    const offset = dated ? shift(zone(data.from)) : 0;
    const from = milliseconds(data.from);
    const until = Math.max(milliseconds(data.until), from + SECOND);
    const step = STEPS.find(each => (until - from) / each <= MOST_TICKS) || STEPS[STEPS.length - 1];
    const text = value => {
        if (!dated)
            return String(value / 1000);
        const words = new Date(value + offset).toISOString();
        const time = step < MINUTE ? words.slice(11, 19) : words.slice(11, 16);
        return step >= DAY ? words.slice(0, 10) : time === "00:00" ? words.slice(5, 10) : time;
    };
    return {
        type: "linear", min: from, max: until, ticks: {callback: text, color: color("--dim"), maxRotation: 0},
        afterBuildTicks: axis => {
            axis.ticks = [];
            for (let at = Math.ceil((from + offset) / step) * step - offset; at <= until; at += step)
                axis.ticks.push({value: at});
        },
        title: {display: true, color: color("--dim"),
                text: dated ? `${data.from.slice(0, 10)}, time of day (UTC${zone(data.from)})` : "seconds since the first frame"},
        grid: {color: color("--rule")},
    };
}

const axis = (title, more = {}) => ({
    beginAtZero: true, title: {display: title !== "", text: title, color: color("--dim")},
    grid: {color: color("--rule")}, ...more, ticks: {color: color("--dim"), ...more.ticks},
});
const whole = {ticks: {precision: 0}};

const distinct = list => [...new Set(list)];

function use() {
    const steps = onClock("use", rows("use"), "from");
    if (steps.length === 0)
        return null;
    const datasets = [];
    distinct(steps.map(row => row.dchannel)).forEach((dchannel, index) => {
        const own = steps.filter(row => row.dchannel === dchannel);
        const last = own[own.length - 1];
        const line = key => [...own.map(row => ({x: milliseconds(row.from), y: row[key]})),
                             {x: milliseconds(last.from) + last.seconds * SECOND, y: 0}];
        const look = {stepped: true, pointRadius: 0, borderColor: series(index), borderWidth: 1.5};
        datasets.push({...look, label: `${dchannel}, on average`, data: line("mean"), fill: "origin",
                       backgroundColor: series(index) + "40"},
                      {...look, label: `${dchannel}, most at once`, data: line("most"), borderDash: [4, 3]});
    });
    return {type: "line", data: {datasets}, options: {scales: {x: timeAxis(), y: axis("channels in use")}}};
}

function causes() {
    const counted = rows("causes").filter(row => row.first > 0);
    if (counted.length === 0)
        return null;
    const labelOf = row => row.name ? `${row.cause} ${row.name}` : row.cause;
    const locationOf = row => row.location || "not said";
    const sum = list => list.reduce((total, row) => total + row.first, 0);
    const countOf = label => sum(counted.filter(row => labelOf(row) === label));
    const labels = distinct(counted.map(labelOf)).sort((a, b) => countOf(b) - countOf(a));
    const datasets = distinct(counted.map(locationOf)).map((location, index) => ({
        label: location, backgroundColor: series(index), borderColor: color("--panel"), borderWidth: 1,
        data: labels.map(label => sum(counted.filter(row => labelOf(row) === label && locationOf(row) === location))),
    }));
    return {type: "bar", data: {labels, datasets}, options: {indexAxis: "y", scales: {
        x: axis("calls", {stacked: true, ...whole}), y: axis("", {stacked: true, ticks: {autoSkip: false}})}}};
}

const OF_SET_UP = ["first response", "progress", "alerting", "alerting after digits", "connect"];

function times() {
    const measured = rows("times").filter(row => OF_SET_UP.includes(row.measure));
    if (measured.length === 0)
        return null;
    const datasets = [["median_s", "median"], ["p95_s", "95 of 100 calls"], ["worst_s", "worst"]].map(([key, label], index) => ({
        label, data: measured.map(row => row[key]), showLine: false, pointStyle: point(index), pointRadius: 4 + 3 * index,
        backgroundColor: index === 0 ? series(index) : "transparent", borderColor: series(index), borderWidth: 2, clip: false,
    }));
    return {type: "line", data: {labels: measured.map(row => `${row.measure}, call from ${row.from}`), datasets},
            options: {indexAxis: "y", scales: {x: axis("seconds", {type: "logarithmic"}), y: axis("", {offset: true})}}};
}

const MOST_HOURS = 2000;

// Hours in which nothing happened have no row: they are put between, unless the trace is very long.
function everyHour(list) {
    const filled = [];
    const none = {seizures_us: 0, seizures_peer: 0, failed: 0};
    const span = list.length === 0 ? 0 : milliseconds(list[list.length - 1].hour) - milliseconds(list[0].hour);
    for (const row of list) {
        const before = filled[filled.length - 1];
        for (let at = before && span / HOUR < MOST_HOURS ? before.at + HOUR : Infinity; at < milliseconds(row.hour); at += HOUR)
            filled.push({...none, at});
        filled.push({...row, at: milliseconds(row.hour)});
    }
    return filled;
}

function hours() {
    const list = everyHour(onClock("hours", rows("hours"), "hour"));
    if (list.length === 0)
        return null;
    const offset = dated ? shift(zone(data.from)) : 0;
    const labels = list.map(row => dated ? new Date(row.at + offset).toISOString().slice(5, 16).replace("T", " ")
                                         : `${row.at / HOUR} h`);
    const bars = [["seizures_us", "calls begun by us", "calls"], ["seizures_peer", "calls begun by the peer", "calls"],
                  ["failed", "failed", "failed"]];
    const datasets = bars.map(([key, label, stack], index) => ({
        label, stack, data: list.map(row => row[key]), backgroundColor: series(key === "failed" ? 3 : index),
    }));
    return {type: "bar", data: {labels, datasets}, options: {scales: {
        x: axis("hour", {stacked: true}), y: axis("calls", {stacked: true, ...whole})}}};
}

function links() {
    const events = onClock("links", rows("link_events"), "time");
    if (events.length === 0)
        return null;
    const nameOf = row => row.tei ? `${row.dchannel}, TEI ${row.tei}` : row.dchannel;
    const datasets = distinct(events.map(nameOf)).map((name, index) => ({
        label: name, clip: false, pointRadius: 6, pointStyle: point(index), backgroundColor: series(index), borderColor: series(index),
        data: events.filter(row => nameOf(row) === name).map(row => ({x: milliseconds(row.time), y: row.event})),
    }));
    return {type: "scatter", data: {datasets}, options: {scales: {
        x: timeAxis(), y: axis("", {type: "category", offset: true, labels: data.link_news})}}};
}

function sayWhatIsNotDrawn(figure, count) {
    figure.querySelectorAll(":scope > .note").forEach(old => old.remove());
    if (!count)
        return;
    const words = `Not in the chart, but in the table: ${count} ${count === 1 ? "row" : "rows"} without ` +
                  (dated ? "a time of day." : "a time since the first frame.");
    figure.querySelector("details").before(Object.assign(document.createElement("p"), {className: "note", textContent: words}));
}

const CHARTS = {use, causes, times, hours, links};
let drawn = [];

function draw() {
    drawn.forEach(chart => chart.destroy());
    drawn = [];
    Chart.defaults.font.family = getComputedStyle(document.body).fontFamily;
    Chart.defaults.color = color("--ink");
    for (const [name, make] of Object.entries(CHARTS)) {
        const canvas = document.getElementById(`chart-${name}`);
        if (canvas === null)
            continue;  // there are no numbers for it
        const config = make();
        canvas.parentElement.hidden = config === null;
        sayWhatIsNotDrawn(canvas.closest("figure"), notDrawn[name]);
        if (config !== null) {
            Object.assign(config.options, {animation: false, maintainAspectRatio: false,
                                           plugins: {legend: {labels: {usePointStyle: true}}}});
            drawn.push(new Chart(canvas, config));
        }
    }
}

draw();
window.matchMedia("(prefers-color-scheme: dark)").addEventListener("change", draw);
// Paper is white, whatever the screen is.
window.addEventListener("beforeprint", () => {
    document.documentElement.dataset.onPaper = "";
    draw();
});
window.addEventListener("afterprint", () => {
    delete document.documentElement.dataset.onPaper;
    draw();
});
})();
