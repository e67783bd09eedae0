"use strict";
// Shows calls: all, those that have something (#search=4989), or one of them (#call=7). Everything comes from the operators' commands, as JSON lines, and goes into
// the page as text alone.

const AGAIN = 1000; // milliseconds
const SVG = "http://www.w3.org/2000/svg";
const ROW = 22, COLUMN = 340, LEFT = 80, TOP = 30; // of the ladder

const main = document.getElementById("main");
const search = document.getElementById("search");
let selected = 0;
let isPaused = false;
let looks = 0; // that were begun
let shownHistory = null; // leg and property
let shown = ""; // what the page has been made of
let scores = new Map(); // of the call that is looked at: by leg, what each look has told

async function ask(path) {
    const answer = await fetch("/control/" + path);
    const lines = (await answer.text()).split("\n").filter((line) => line !== "").map((line) => JSON.parse(line));
    if (!answer.ok) throw new Error(lines.length > 0 ? lines[0].reason : answer.statusText);
    return lines;
}

function make(name, attributes = {}, ...contents) {
    const isPicture = ["svg", "g", "line", "text", "circle", "rect", "polyline", "path", "title"].includes(name);
    const element = isPicture ? document.createElementNS(SVG, name) : document.createElement(name);
    for (const [key, value] of Object.entries(attributes)) element.setAttribute(key, value);
    element.append(...contents);
    return element;
}

function table(names, rows) {
    return make("table", {}, make("thead", {}, make("tr", {}, ...names.map((name) => make("th", {}, name)))),
        make("tbody", {}, ...rows));
}

const seconds = (nanoseconds) => (nanoseconds === null || nanoseconds === undefined ? "?" : (nanoseconds / 1e9).toFixed(1));
const isWanted = (text) => text.toLowerCase().includes(search.value.trim().toLowerCase());

// ---- all calls

function row(call, cells) {
    const element = make("tr", { "data-call": call }, ...cells.map((cell, i) => make("td", i < 2 ? { class: "number" } : {}, String(cell))));
    element.addEventListener("click", () => { location.hash = "call=" + call; });
    return element;
}

function showAll([status, up, recorded]) {
    document.getElementById("state").textContent = `${status[0].state}, ${status[0].calls} up`;
    const upRows = up.map((call) => [call.call, call.age.toFixed(1), call.state, call.parties, call.opinion ?? "", call.lost ?? ""])
        .filter((cells) => isWanted(cells.join(" ")));
    const knownRows = recorded.reverse().map((call) => [call.call, seconds(call.age), call.state,
        (call.numbers ?? []).map((number) => number ?? "?").join(" - "), call.cause ?? ""]).filter((cells) => isWanted(cells.join(" "))).slice(0, 500);
    replace([make("h2", {}, "Up"), table(["call", "age/s", "state", "parties", "MOS", "lost"], upRows.map((cells) => row(cells[0], cells))),
        make("h2", {}, "Recorded"), table(["call", "lasted/s", "state", "numbers", "cause"], knownRows.map((cells) => row(cells[0], cells)))]);
    select(selected);
}

function select(place) {
    const rows = [...document.querySelectorAll("tr[data-call]")];
    selected = Math.max(0, Math.min(place, rows.length - 1));
    rows.forEach((element, i) => element.setAttribute("aria-selected", i === selected));
    if (document.activeElement === document.body) rows[selected]?.scrollIntoView({ block: "nearest" });
}

// ---- one call

function ladder(events) {
    const legs = [[0, "call"], ...new Map(events.filter((event) => event.leg).map((event) => [event.leg, event.legName ?? String(event.leg)])).entries()];
    const x = (leg) => LEFT + legs.findIndex(([serial]) => serial === leg) * COLUMN;
    const start = Date.parse(events[0]?.time ?? 0);
    const width = LEFT + 40 + legs.length * COLUMN, height = TOP + (events.length + 1) * ROW;
    const picture = make("svg", { width, height, role: "img", "aria-label": "ladder" });
    for (const [leg, name] of legs) picture.append(make("text", { class: "head", x: x(leg), y: 16 }, name),
        make("line", { class: "life", x1: x(leg), x2: x(leg), y1: 22, y2: height }));
    events.forEach((event, i) => {
        const y = TOP + i * ROW;
        const own = x(event.leg ?? 0);
        const part = make("g", { "data-event": event.event, "data-text": event.text, tabindex: event.property ? 0 : -1 },
            make("rect", { x: 0, y, width, height: ROW }),
            make("text", { class: "time", x: 0, y: y + 14 }, `+${Date.parse(event.time) - start}`));
        const other = legs.find(([serial]) => serial !== 0 && serial !== event.leg);
        if (event.event === "TOLD" && other) part.append(arrow(x(other[0]), own, y + 18));
        else part.append(make("circle", { class: "dot", cx: own, cy: y + 10, r: event.leg ? 4 : 2 }));
        const text = event.text.length > 50 ? event.text.slice(0, 48) + "..." : event.text;
        part.append(make("text", { x: own + 10, y: y + 14 }, text), make("title", {}, event.text));
        if (event.property && event.leg) {
            part.setAttribute("data-property", event.property);
            const open = () => { shownHistory = { leg: event.leg, property: event.property }; show(); };
            part.addEventListener("click", open);
            part.addEventListener("keydown", (key) => { if (key.key === "Enter") { key.stopPropagation(); open(); } });
        }
        picture.append(part);
    });
    return make("div", { id: "ladder" }, picture);
}

function arrow(from, to, y) {
    const tip = to > from ? -6 : 6;
    return make("path", { class: "arrow", d: `M${from} ${y} L${to} ${y} L${to + tip} ${y - 3} L${to + tip} ${y + 3} L${to} ${y}` });
}

function holders(call) {
    const rows = call.legs.map((leg) => make("tr", {}, make("td", {}, leg.name), make("td", {}, leg.state), make("td", { class: "number" }, seconds(leg.age)),
        make("td", {}, leg.holders.map((holder) => `${holder.kind}${holder.endpoint ? ` ${holder.adapter} of ${holder.endpoint}` : ""}`).join(", ")),
        make("td", {}, leg.end ?? "")));
    return [make("h2", {}, "Who holds it"), table(["leg", "state", "age/s", "held by", "it ends"], rows)];
}

// How the quality of each leg has been while it was looked at: the opinion score, 1 to 5; below, it was not measured.
function quality(lines) {
    for (const line of lines) {
        const score = Number(/MOS:\s*([0-9.]+)/.exec(line.quality)?.[1] ?? 0);
        if (score >= 1) scores.set(line.legName, [...(scores.get(line.legName) ?? []).slice(-299), score]);
    }
    if (scores.size === 0) return [];
    const parts = [make("h2", {}, "Quality (MOS, 1 to 5)")];
    for (const [leg, points] of scores) {
        const at = (score, i) => [5 + i, 65 - (Math.min(5, score) - 1) * 15];
        const [x, y] = at(points.at(-1), points.length - 1);
        parts.push(make("svg", { width: 440, height: 72, role: "img", "data-score": points.at(-1), "aria-label": `quality of ${leg}` },
            make("line", { class: "life", x1: 5, x2: 305, y1: 65, y2: 65 }), make("line", { class: "life", x1: 5, x2: 305, y1: 5, y2: 5 }),
            make("polyline", { class: "plot", points: points.map((score, i) => at(score, i).join(",")).join(" ") }),
            make("circle", { class: "dot", cx: x, cy: y, r: 2.5 }),
            make("text", { x: 315, y: 20 }, leg), make("text", { x: 315, y: 40 }, points.at(-1).toFixed(2))));
    }
    return parts;
}

function past(events) {
    if (shownHistory === null) return [];
    const rows = events.filter((event) => event.leg === shownHistory.leg && event.property === shownHistory.property)
        .map((event) => make("tr", {}, ...[event.time, event.turn, event.before ?? "", event.after ?? "", event.writer ?? ""].map((cell) => make("td", {}, String(cell)))));
    return [make("h2", { id: "history" }, `${shownHistory.property} of leg ${shownHistory.leg}`), table(["time", "turn", "before", "after", "written by"], rows)];
}

function showOne(serial, lines) {
    const explained = lines.find((line) => line.legs !== undefined);
    const events = lines.filter((line) => line.event !== undefined);
    document.getElementById("state").textContent = `call ${serial}, ${explained ? `${explained.state}, ${seconds(explained.age)} s` : "over"}`;
    const parts = explained ? holders(explained) : [];
    replace([...parts, ...quality(lines.filter((line) => line.quality !== undefined)), ...past(events), make("h2", {}, "Ladder (milliseconds)"), ladder(events)]);
}

// ---- the page

// What has the keyboard keeps it, and what is scrolled stays, since the parts come in the same order.
function replace(parts) {
    const next = make("div", {}, ...parts);
    if (next.outerHTML === shown) return;
    shown = next.outerHTML;
    const scrolled = document.getElementById("ladder")?.scrollLeft ?? 0;
    const focused = [...document.querySelectorAll("[tabindex]")].indexOf(document.activeElement);
    main.replaceChildren(...next.childNodes);
    const again = document.getElementById("ladder");
    if (again !== null) again.scrollLeft = scrolled;
    if (focused >= 0) document.querySelectorAll("[tabindex]")[focused]?.focus();
}

const selectedCall = () => /^#call=([0-9]+)$/.exec(location.hash)?.[1];

// Only where the gateway has a token is there a form for it.
async function clear(event) {
    event.preventDefault();
    const told = document.getElementById("cleared");
    const answer = await fetch(`/control/drop/${selectedCall()}/16`,
        { method: "POST", headers: { Authorization: "Bearer " + document.getElementById("token").value } });
    told.textContent = answer.ok ? "cleared" : answer.status === 401 ? "this is not the token" : (await answer.text());
    await show();
}

async function show() {
    const serial = selectedCall();
    document.body.toggleAttribute("data-call", serial !== undefined);
    const look = ++looks;
    try {
        const answers = await Promise.all((serial ? [`call/${serial}`] : ["status", "top?rows=200", "recorded"]).map(ask));
        if (look !== looks) return; // somebody has looked elsewhere meanwhile
        if (serial) showOne(serial, answers[0]);
        else showAll(answers);
        main.classList.remove("bad");
    } catch (error) {
        if (look !== looks) return;
        shown = "";
        main.classList.add("bad");
        main.textContent = error.message;
    }
}

function readSearch() { search.value = decodeURIComponent(/^#search=(.*)$/.exec(location.hash)?.[1] ?? ""); }

async function follow() {
    if (!isPaused && !document.hidden) await show();
    setTimeout(follow, AGAIN);
}

function changeTheme() {
    const isDark = document.documentElement.dataset.theme ? document.documentElement.dataset.theme === "dark"
        : matchMedia("(prefers-color-scheme: dark)").matches;
    document.documentElement.dataset.theme = isDark ? "light" : "dark";
    localStorage.setItem("theme", document.documentElement.dataset.theme);
}

const keys = {
    "/": () => search.focus(),
    j: () => select(selected + 1),
    ArrowDown: () => select(selected + 1),
    k: () => select(selected - 1),
    ArrowUp: () => select(selected - 1),
    Enter: () => document.querySelectorAll("tr[data-call]")[selected]?.click(),
    Escape: () => { location.hash = ""; },
    p: () => { isPaused = !isPaused; },
    d: changeTheme,
};
document.addEventListener("keydown", (event) => {
    if (event.target.tagName === "INPUT") {
        if (event.key === "Escape" || (event.key === "Enter" && event.target === search)) event.target.blur();
        return;
    }
    if (event.ctrlKey || event.altKey || event.metaKey || !(event.key in keys)) return;
    event.preventDefault();
    keys[event.key]();
});
search.addEventListener("input", () => {
    history.replaceState(null, "", search.value === "" ? "#" : "#search=" + encodeURIComponent(search.value));
    show();
});
window.addEventListener("hashchange", () => {
    shownHistory = null;
    scores = new Map();
    selected = 0;
    document.getElementById("cleared").textContent = "";
    readSearch();
    show();
});
document.getElementById("clear").addEventListener("submit", clear);
document.getElementById("theme").addEventListener("click", changeTheme);
if (localStorage.getItem("theme")) document.documentElement.dataset.theme = localStorage.getItem("theme");
readSearch();
follow();
