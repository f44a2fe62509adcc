// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ReportTemplate.h"

namespace pemaro::zelkctl {

// clang-format off
const char* const kReportTemplate = R"html(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>Touch frames</title>
<style>
:root { color-scheme: dark; --line: #3a3a44; --dim: #a0a0ac; --accent: #fa9a1e; --bad: #ff5a5a; }
body { margin: 0; padding: 1rem; background: #15151a; color: #e8e8ee; font: 15px/1.45 system-ui, sans-serif; }
h1 { font-size: 1.15rem; margin: 0 0 .5rem; overflow-wrap: anywhere; }
main { display: flex; flex-wrap: wrap; gap: 1.25rem; }
canvas { display: block; background: #08060f; border: 1px solid var(--line); }
#map { height: min(70vh, 720px); image-rendering: pixelated; }
#side { flex: 1 1 22rem; min-width: 18rem; }
#plot { width: 100%; height: 120px; cursor: crosshair; }
#scrubber { width: 100%; accent-color: var(--accent); }
button, select { font: inherit; background: #24242c; color: inherit; border: 1px solid var(--line); padding: .2rem .7rem; }
table { border-collapse: collapse; font-variant-numeric: tabular-nums; }
td, th { padding: .1rem .8rem .1rem 0; text-align: right; font-weight: normal; }
th { color: var(--dim); }
td:first-child, th:first-child { text-align: left; }
#fingers { margin-top: .8rem; }
#status { font-variant-numeric: tabular-nums; min-height: 1.5em; }
.dim, kbd { color: var(--dim); }
kbd { border: 1px solid var(--line); padding: 0 .35em; border-radius: 3px; }
.bad { color: var(--bad); }
</style>
</head>
<body>
<h1 id="name"></h1>
<main>
<canvas id="map" aria-label="heat map of a frame"></canvas>
<div id="side">
<p id="status" role="status">The page needs a browser with scripts.</p>
<p>
<button id="play" type="button">Play</button>
<select id="speed" aria-label="speed">
<option value="0.1">0.1 x</option><option value="0.25">0.25 x</option><option value="0.5">0.5 x</option>
<option value="1" selected>1 x</option><option value="2">2 x</option><option value="5">5 x</option>
</select>
<label><input id="tracks" type="checkbox" checked> tracks</label>
</p>
<input id="scrubber" type="range" min="0" value="0" step="1" aria-label="frame">
<p class="dim">Time between frames, in milliseconds; red where frames are lost</p>
<canvas id="plot" aria-label="time between frames"></canvas>
<table id="fingers"></table>
<h2 style="font-size:1rem">The recording</h2>
<table id="summary"></table>
<p class="dim"><kbd>space</kbd> play, <kbd>&larr;</kbd> <kbd>&rarr;</kbd> a frame, with <kbd>shift</kbd> ten,
<kbd>home</kbd> <kbd>end</kbd>, <kbd>+</kbd> <kbd>-</kbd> speed, <kbd>t</kbd> tracks</p>
</div>
</main>
<script type="application/json" id="about">@SUMMARY@</script>
<script type="application/json" id="palette">@PALETTE@</script>
<script type="text/plain" id="data">@FRAMES@</script>
<script>
"use strict";
const byId = id => document.getElementById(id);
const about = JSON.parse(byId("about").textContent);
const palette = JSON.parse(byId("palette").textContent);
const trackColors = ["#6cf", "#6f8", "#f8c", "#ff6", "#c9f", "#fa6", "#8ff", "#f66", "#9d6", "#aaf"];
const trackLength = 60;
const positionMax = 65535;
let frames = [];
let current = 0;
let playing = false;
let startedAt = 0;
let startedFrom = 0;

function bytesOf(base64) {
    return Uint8Array.from(atob(base64), character => character.charCodeAt(0));
}

async function inflated(bytes) {
    const stream = new Blob([bytes]).stream().pipeThrough(new DecompressionStream("deflate"));
    return new Response(stream).arrayBuffer();
}

function parse(buffer) {
    const view = new DataView(buffer);
    const list = [];
    for (let at = 0; at < buffer.byteLength;) {
        const frame = {
            seconds: view.getFloat64(at, true), number: view.getUint32(at + 8, true),
            sequence: view.getUint32(at + 12, true), lost: view.getUint32(at + 16, true),
            columns: view.getUint16(at + 20, true), rows: view.getUint16(at + 22, true), fingers: []
        };
        const count = view.getUint16(at + 24, true);
        at += 28;
        for (let i = 0; i < count; ++i, at += 8) {
            frame.fingers.push({
                id: view.getUint16(at, true), x: view.getUint16(at + 2, true),
                y: view.getUint16(at + 4, true), peak: view.getInt16(at + 6, true)
            });
        }
        frame.cells = new Uint8Array(buffer, at, frame.columns * frame.rows);
        at += frame.cells.length;
        list.push(frame);
    }
    return list;
}

function place(position, cells, size) {
    return (position / positionMax * (cells - 1) + 0.5) / cells * size;
}

function drawMap(frame) {
    const canvas = byId("map");
    const columns = frame.columns || 9, rows = frame.rows || 16;
    const scale = Math.max(1, Math.floor(720 / rows));
    canvas.width = columns * scale;
    canvas.height = rows * scale;
    const context = canvas.getContext("2d");
    if (frame.cells.length > 0) {
        const image = new ImageData(columns, rows);
        frame.cells.forEach((level, i) => image.data.set([...palette[level], 255], 4 * i));
        const cells = document.createElement("canvas");
        cells.width = columns;
        cells.height = rows;
        cells.getContext("2d").putImageData(image, 0, 0);
        context.imageSmoothingEnabled = false;
        context.drawImage(cells, 0, 0, canvas.width, canvas.height);
    }
    if (byId("tracks").checked) {
        drawTracks(context, canvas, columns, rows);
    }
    context.strokeStyle = "#fff";
    context.fillStyle = "#fff";
    context.lineWidth = 2;
    context.font = "16px sans-serif";
    for (const finger of frame.fingers) {
        const x = place(finger.x, columns, canvas.width), y = place(finger.y, rows, canvas.height);
        context.beginPath();
        context.moveTo(x - 9, y);
        context.lineTo(x + 9, y);
        context.moveTo(x, y - 9);
        context.lineTo(x, y + 9);
        context.stroke();
        context.fillText(finger.id, x + 10, y - 8);
    }
}

function drawTracks(context, canvas, columns, rows) {
    const last = new Map();
    context.lineWidth = 3;
    for (let i = Math.max(0, current - trackLength); i <= current; ++i) {
        for (const finger of frames[i].fingers) {
            const to = [place(finger.x, columns, canvas.width), place(finger.y, rows, canvas.height)];
            const from = last.get(finger.id);
            if (from) {
                context.strokeStyle = trackColors[finger.id % trackColors.length];
                context.globalAlpha = 0.15 + 0.85 * (1 - (current - i) / trackLength);
                context.beginPath();
                context.moveTo(...from);
                context.lineTo(...to);
                context.stroke();
            }
            last.set(finger.id, to);
        }
    }
    context.globalAlpha = 1;
}

function interval(i) {
    return i > 0 ? (frames[i].seconds - frames[i - 1].seconds) * 1000 : 0;
}

function drawPlot() {
    const canvas = byId("plot");
    canvas.width = canvas.clientWidth * devicePixelRatio;
    canvas.height = canvas.clientHeight * devicePixelRatio;
    const context = canvas.getContext("2d");
    const most = Math.max(1, ...frames.map((_, i) => i).map(interval).filter(isFinite));
    const across = i => frames.length > 1 ? i / (frames.length - 1) * canvas.width : 0;
    const up = value => canvas.height - 2 - value / most * (canvas.height - 18);
    for (let i = 1; i < frames.length; ++i) {
        context.strokeStyle = frames[i].lost > 0 ? "#ff5a5a" : "#fa9a1e";
        context.beginPath();
        context.moveTo(across(i), canvas.height);
        context.lineTo(across(i), up(interval(i)));
        context.stroke();
    }
    context.fillStyle = "#a0a0ac";
    context.font = 11 * devicePixelRatio + "px sans-serif";
    context.fillText("most " + most.toFixed(2), 4, 12 * devicePixelRatio);
    context.strokeStyle = "#fff";
    context.beginPath();
    context.moveTo(across(current), 0);
    context.lineTo(across(current), canvas.height);
    context.stroke();
}

function addRow(table, texts, tag) {
    const row = table.insertRow();
    for (const text of texts) {
        const cell = document.createElement(tag || "td");
        cell.textContent = text;
        row.append(cell);
    }
    return row;
}

function show(index) {
    current = Math.min(Math.max(index, 0), frames.length - 1);
    const frame = frames[current];
    byId("scrubber").value = current;
    byId("status").textContent = `frame ${frame.number} (sequence ${frame.sequence}) at ` +
        `${frame.seconds.toFixed(3)} s` + (current > 0 ? `, ${interval(current).toFixed(3)} ms after the one before` : "") +
        (frame.lost > 0 ? `, ${frame.lost} lost before it` : "");
    byId("status").className = frame.lost > 0 ? "bad" : "";
    const fingers = byId("fingers");
    fingers.replaceChildren();
    addRow(fingers, ["finger", "x", "y", "peak"], "th");
    frame.fingers.forEach(finger => addRow(fingers, [finger.id, finger.x, finger.y, finger.peak]));
    drawMap(frame);
    drawPlot();
}

function play(on) {
    playing = on;
    byId("play").textContent = on ? "Pause" : "Play";
    if (on) {
        if (current === frames.length - 1) {
            show(0);
        }
        startedAt = performance.now();
        startedFrom = frames[current].seconds;
        requestAnimationFrame(tick);
    }
}

function tick() {
    if (!playing) {
        return;
    }
    const passed = (performance.now() - startedAt) / 1000 * Number(byId("speed").value);
    let next = current;
    while (next < frames.length - 1 && frames[next + 1].seconds <= startedFrom + passed) {
        ++next;
    }
    if (next !== current) {
        show(next);
    }
    if (current === frames.length - 1) {
        play(false);
    } else {
        requestAnimationFrame(tick);
    }
}

function goTo(index) {
    play(false);
    show(index);
}

function changeSpeed(step) {
    const speed = byId("speed");
    speed.selectedIndex = Math.min(Math.max(speed.selectedIndex + step, 0), speed.length - 1);
    play(playing);
}

function onKey(event) {
    const step = event.shiftKey ? 10 : 1;
    const actions = {
        " ": () => play(!playing), ArrowLeft: () => goTo(current - step), ArrowRight: () => goTo(current + step),
        Home: () => goTo(0), End: () => goTo(frames.length - 1), "+": () => changeSpeed(1),
        "-": () => changeSpeed(-1), t: () => { byId("tracks").click(); }
    };
    if (actions[event.key] && !event.ctrlKey && !event.altKey && !event.metaKey) {
        event.preventDefault();
        actions[event.key]();
    }
}

function describe() {
    const range = extent => extent.min === extent.max ? extent.max : `${extent.min} to ${extent.max}`;
    const rows = [["frames", about.frames], ["bytes", about.bytes], ["image", range(about.columns) + " x " + range(about.rows)],
        ["duration", about.seconds.toFixed(3) + " s"], ["rate", about.rate.toFixed(1) + " frames/s"],
        ["lost", `${about.lost} in ${about.gaps.length} gaps`], ["corrupt", about.corrupt.length]];
    if (about.intervals_ms) {
        const spread = about.intervals_ms;
        rows.push(["intervals, p50 / p99 / most", [spread.p50, spread.p99, spread.max].map(v => v.toFixed(3)).join(" / ") + " ms"]);
    }
    if (about.truncated) {
        rows.push(["truncated", "at offset " + about.truncated.offset]);
    }
    rows.forEach(row => addRow(byId("summary"), row));
    byId("name").textContent = about.file;
    document.title = about.file;
}

async function start() {
    describe();
    frames = parse(await inflated(bytesOf(byId("data").textContent)));
    byId("scrubber").max = frames.length - 1;
    byId("scrubber").addEventListener("input", event => goTo(Number(event.target.value)));
    byId("play").addEventListener("click", () => play(!playing));
    byId("speed").addEventListener("change", () => play(playing));
    byId("tracks").addEventListener("change", () => show(current));
    byId("plot").addEventListener("click", event =>
        goTo(Math.round(event.offsetX / event.target.clientWidth * (frames.length - 1))));
    document.addEventListener("keydown", onKey);
    addEventListener("resize", drawPlot);
    // A link may lead to a frame: #frame=17.
    show(Number((location.hash.match(/^#frame=(\d+)$/) || [0, 0])[1]));
}

start().catch(error => {
    byId("status").textContent = "The page cannot be shown: " + error;
    byId("status").className = "bad";
});
</script>
</body>
</html>
)html";
// clang-format on

}  // namespace pemaro::zelkctl
