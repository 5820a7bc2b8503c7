// SPDX-License-Identifier: MIT OR GPL-2.0-only
"use strict";

const data = JSON.parse(document.getElementById("data").textContent);
const MOST_COMPARED = 1e6;
const MOST_TOLD = 5; // waits in the story; the others fold
const TIME_ROOM = 0.12; // what a time on the axis takes of the width
const shown = { run: 0, other: -1, step: 0, output: 0, filter: "", toScale: false };
const large = { side: 0, step: 0 }; // what is enlarged, which may be of the run beside

/* What is as it was behind the step before is not written once more. */
for (const { steps } of data.runs) {
  steps.forEach((step, index) => {
    step.outputs ??= steps[index - 1].outputs;
    step.status ??= steps[index - 1].status;
  });
}

const part = (id) => document.getElementById(id);

/** An element with attributes and children. What a run holds becomes text, never markup. */
function make(tag, attributes = {}, ...children) {
  const element = document.createElement(tag);
  for (const [name, value] of Object.entries(attributes)) {
    if (name === "onclick") element.addEventListener("click", value);
    else if (value === true) element.setAttribute(name, "");
    else if (value !== false && value !== null && value !== undefined) element.setAttribute(name, value);
  }
  element.append(...children.filter((child) => child !== null && child !== ""));
  return element;
}

const counted = (count, one, many = one + "s") => `${count} ${count === 1 ? one : many}`;

/** Microseconds as people say them. */
function spoken(us) {
  if (us !== 0 && us < 1000) return `${us} µs`;
  if (us < 1e6) return `${us / 1000} ms`;
  return `${us / 1e6} s`;
}

const enumerated = (words) => words.length < 2 ? words.join("")
  : `${words.slice(0, -1).join(", ")} and ${words.at(-1)}`;

/** What a page may have no room for, and what one and many of them are called. */
const LEFT_OUT = [["entries", "line of the trace", "lines of the trace"],
                  ["changes", "change of the state", "changes of the state"],
                  ["pictures", "picture", "pictures"], ["texts", "other text", "other texts"]];

/** What these steps have that the page does not; empty when that is nothing. */
function leftOut(steps) {
  const sum = (kind) => steps.reduce((before, step) => before + (step.left_out?.[kind] ?? 0), 0);
  return enumerated(LEFT_OUT.filter(([kind]) => sum(kind) > 0)
    .map(([kind, one, many]) => counted(sum(kind), one, many)));
}

const run = () => data.runs[shown.run];
/** What stands beside each other: one run, or two. Cards of the second have names of their own. */
const sides = () => [shown.run, shown.other].filter((index) => index >= 0).map((index) => data.runs[index]);
const cardId = (side, index) => `${side === 0 ? "" : "other-"}step-${index + 1}`;
const isRefused = (step) => Boolean(step.explanation && step.explanation.verdict === "refused");
const isNothing = (step) => Boolean(step.explanation && step.explanation.verdict === "nothing");
const failuresOf = (runShown, index) => runShown.failures.filter((failure) => failure.step === index);
/** What went wrong without a refusal: assertions, and what the board found of wrong use. */
const troublesOf = (step) => step.entries.filter((entry) =>
  entry.kind === "assert" || (entry.kind === "notice" && (entry.function === "misuse" || entry.function === "fault")));
const isBad = (runShown, index) => isRefused(runShown.steps[index]) || failuresOf(runShown, index).length > 0 ||
  troublesOf(runShown.steps[index]).length > 0 || runShown.steps[index].graphics_state === "out";
const boardsOf = (runShown) => runShown.boards.join(", ") || "none";
/** What tells runs of the page apart. */
const nameOf = (runShown) => data.runs.every((one) => boardsOf(one) === boardsOf(runShown)) ? runShown.name
  : `${runShown.name} on board ${boardsOf(runShown)}`;
const titleOf = (step) => step.command || "(before the first command)";

/* In short: what somebody wants to know who does not read on. */

function linkTo(index, side = 0) {
  const link = make("a", { href: `#${cardId(side, index)}` }, `step ${index + 1}`);
  link.addEventListener("click", (event) => {
    event.preventDefault();
    goTo(side, index);
  });
  return link;
}

function waits(runShown) {
  const lane = runShown.lanes.find((one) => one.kind === "graphics");
  return lane.spans.filter((span) => span.to.us > span.from.us || span.open);
}

/** Where what still holds is seen no longer. */
function endOf(runShown) {
  if (runShown.lanes_end_us !== null) return "where the bars of its time line end";
  return runShown.steps_left_out > 0 ? "where this page ends" : "where the run ends";
}

function waitLine(runShown, side, span) {
  const line = make("li", { class: "bad" });
  line.append("No graphics for ", make("strong", {}, spoken(span.to.us - span.from.us)),
              `: ${span.text} from ${spoken(span.from.us)}, in `, linkTo(span.from.step, side),
              `, until ${spoken(span.to.us)}, in `, linkTo(span.to.step, side));
  line.append(span.open ? `, ${endOf(runShown)} and they still wait.`
    : `: ${span.ended_by || titleOf(runShown.steps[span.to.step])}.`);
  return line;
}

const WHY = {
  held: "Graphics are taken out of the picture while the display part switches the outputs, and come back when it " +
        "says that it is done. A timer brings them back if it never does.",
  "awaits video plane": "Graphics come back when the video plane has its sync control.",
};

/** Why they wait, for those who know the system only from the outside, and what that looked like. */
function whyLine(runShown, side, span) {
  const step = runShown.steps[span.from.step];
  const why = make("li", {}, "Why: ", linkTo(span.from.step, side), " is ", make("code", {}, titleOf(step)),
                   `. ${WHY[step.graphics_state] ?? ""}`);
  const looks = looksOf(runShown, span);
  if (looks.length > 0) why.append(make("div", { class: "looks" }, ...looks));
  return why;
}

/** One output before a wait, within it and behind it: the first on which that makes a difference. */
function looksOf(runShown, span) {
  const { steps } = runShown;
  const moments = [["before", span.from.step - 1], ["meanwhile", Math.max(span.from.step, span.to.step - 1)],
                   ["afterwards", span.to.step]].filter(([, index]) => steps[index] && steps[index].outputs.length > 0);
  const pictureAt = (index, output) => steps[index].outputs[output].picture;
  if (span.open || moments.length < 2) return [];
  const [[, within], [, behind]] = moments.slice(-2);
  const hasAll = (place) => moments.every(([, index]) => pictureAt(index, place) !== null);
  const output = steps[within].outputs.findIndex((_, place) =>
    pictureAt(within, place) !== pictureAt(behind, place) && hasAll(place));
  return output < 0 ? [] : moments.map(([when, index]) => {
    const seen = steps[index].outputs[output];
    const label = `${when}, after step ${index + 1}: ${seen.output}, ${seen.description}`;
    return make("figure", {}, make("img", { src: data.pictures[seen.picture], alt: label }),
                make("figcaption", { "aria-hidden": "true" }, label));
  });
}

/** All of them, or the first ones and how many more there are. */
function waitLines(runShown, side) {
  const all = waits(runShown);
  const lines = (spans) => spans.map((span) => waitLine(runShown, side, span));
  const told = lines(all.slice(0, MOST_TOLD));
  const more = all.slice(MOST_TOLD);
  if (all.length > 0) told.splice(1, 0, whyLine(runShown, side, all[0]));
  if (more.length === 0) return told;
  const sum = more.reduce((us, span) => us + span.to.us - span.from.us, 0);
  return [...told, make("li", { class: "bad" }, folded(`${counted(more.length, "more wait")}, ${spoken(sum)} together`,
                                                       "waits", make("ul", {}, ...lines(more))))];
}

/** What happened in a run, in sentences. */
function story(runShown, side) {
  const lines = waitLines(runShown, side);
  const scripted = runShown.steps.map((step) => step.entries.filter((entry) => entry.faulted).length);
  const sum = scripted.reduce((one, other) => one + other, 0);
  if (sum > 0)
    lines.push(make("li", {}, `${counted(sum, "answer")} of the platform came by script, first in `,
                    linkTo(scripted.findIndex((count) => count > 0), side), "."));
  runShown.steps.forEach((step, index) => {
    if (isRefused(step))
      lines.push(make("li", { class: "bad" }, linkTo(index, side), ` was refused: ${step.explanation.reason.text}.`));
    for (const trouble of troublesOf(step))
      lines.push(make("li", { class: "bad" }, "In ", linkTo(index, side), `: ${trouble.brief}`));
    if (step.graphics_state === "out" && (index === 0 || runShown.steps[index - 1].graphics_state !== "out"))
      lines.push(make("li", { class: "bad" }, "After ", linkTo(index, side), ` graphics are ${step.graphics}.`));
  });
  for (const { text, step } of runShown.failures)
    lines.push(step === null ? make("li", { class: "bad failed" }, `Failed: ${text}`)
      : make("li", { class: "bad failed" }, linkTo(step, side), ` failed: ${text}`));
  const missing = missingOf(runShown);
  if (lines.length === 0)
    lines.push(make("li", {}, `Nothing was refused, and graphics never waited${
      missing.length > 0 ? ", as far as this page tells" : ""}.`));
  return [...lines, ...missing, summaryOf(runShown)];
}

/** What a run has that the page does not. */
function missingOf(runShown) {
  const lines = [];
  if (runShown.steps_left_out > 0)
    lines.push(`${counted(runShown.steps_left_out, "more step")} ran that this page leaves out.`);
  const left = leftOut(runShown.steps);
  if (left) lines.push(`Of its steps this page leaves out ${left}.`);
  if (runShown.lanes_end_us !== null)
    lines.push(`The bars of its time line end at ${spoken(runShown.lanes_end_us)}: this page has no room for more.`);
  if (!data.sees) lines.push("There are no pictures: this tool was built without.");
  return lines.map((text) => make("li", {}, text));
}

function summaryOf(runShown) {
  const expectations = runShown.steps.reduce((sum, step) => sum + step.expectations.length, 0);
  const verdict = runShown.failures.length > 0 ? "The scenario failed" : "The scenario did what it says";
  return make("li", {}, `${verdict}: ${counted(runShown.steps.length, "step")}, ` +
                        `${counted(expectations, "expectation")}, ${spoken(runShown.lasted_us)} on board ` +
                        `${boardsOf(runShown)}.`);
}

/** One story, or both with their names. */
function showStories() {
  const lists = sides().map((runShown, side) => {
    const list = make("ul", {}, ...story(runShown, side));
    rove(list, "a", ["ArrowUp"], ["ArrowDown"]);
    return make("div", { class: "story" }, sides().length > 1 ? make("h3", {}, nameOf(runShown)) : null, list);
  });
  part("story").classList.toggle("two", lists.length > 1);
  part("story").replaceChildren(...lists);
}

/* The time line. */

/** Where moments stand, from 0 to 1. To scale, time alone decides; else half of the width is shared by all steps, so
 *  that those that take no time are seen, too. Of two runs beside each other both have the longer one's measure. */
class Axis {
  constructor(runShown, runs, toScale) {
    this.steps = runShown.steps;
    const total = Math.max(...runs.map((one) => one.to_us));
    const count = Math.max(1, ...runs.map((one) => one.steps.length));
    const each = toScale && total > 0 ? 0 : 0.5 / count;
    const time = total === 0 ? 0 : each === 0 ? 1 : 0.5;
    const room = 0.97; // what holds at the end is seen behind it
    const timed = (step) => time * (step.to_us - step.from_us) / Math.max(1, total);
    const widest = Math.max(...runs.map(({ steps }) =>
      steps.reduce((sum, step) => sum + timed(step) + each, 0))) || 1;
    this.own = each / widest * room;
    this.timed = this.steps.map((step) => timed(step) / widest * room);
    this.widths = this.timed.map((width) => this.own + width);
    this.starts = [0];
    for (const width of this.widths) this.starts.push(this.starts.at(-1) + width);
    this.end = this.starts.at(-1) + 1 - room;
  }

  /** Within its step a moment stands by its time, and in what the step has of its own by its place in the trace: so
   *  that what a step does at its end is seen within it. */
  at(moment) {
    const step = this.steps[moment.step];
    if (step === undefined) return 0;
    const passed = step.to_us - step.from_us;
    const before = step.entries.filter((entry) => entry.sequence <= moment.sequence).length;
    const share = (part, whole) => whole > 0 ? Math.min(1, Math.max(0, part / whole)) : 0;
    return this.starts[moment.step] + this.own * share(before, step.entries.length) +
      this.timed[moment.step] * share(moment.us - step.from_us, passed);
  }
}

const kindOf = (lane) => lane.kind === "graphics" ? "held" : lane.kind;

function bar(from, to, kind, text, label, onclick) {
  const width = to - from;
  const element = make("button", { type: "button", class: `bar ${kind}${width < 0.02 ? " narrow" : ""}`, title: label,
                                   "aria-label": label, onclick }, width < 0.02 ? "" : text);
  element.style.left = `${from * 100}%`;
  element.style.width = `${width * 100}%`;
  return element;
}

/** A lane: a name, and a track for each side. */
function laneRow(name, tracks) {
  return make("div", { class: "lane" }, make("span", { class: "lane-name" }, name), make("div", {}, ...tracks));
}

function track(name, side, bars) {
  const whose = sides().length > 1 ? `, ${nameOf(sides()[side])}` : "";
  const element = make("div", { class: `track side-${side}`, role: "toolbar", "aria-label": name + whose }, ...bars);
  rove(element, ".bar", ["ArrowLeft"], ["ArrowRight"]);
  return element;
}

function laneBar(axis, side, lane, span) {
  const runShown = sides()[side];
  const lasted = `${spoken(span.to.us - span.from.us)}, from ${spoken(span.from.us)} to ${spoken(span.to.us)}`;
  const goesOn = runShown.lanes_end_us !== null; // behind the last bar
  const end = span.open ? endOf(runShown) : `step ${span.to.step + 1}`;
  const label = `${lane.name}: ${span.text} for ${lasted}, step ${span.from.step + 1} to ${end}`;
  const to = span.open && !goesOn ? axis.end : axis.at(span.to);
  return bar(axis.at(span.from), to, kindOf(lane), span.text, label, () => {
    goTo(side, span.from.step);
    part("told").textContent = label;
  });
}

function stepBar(axis, side, index) {
  const runShown = sides()[side];
  const step = runShown.steps[index];
  const label = `Step ${index + 1}: ${titleOf(step)}, at ${spoken(step.from_us)}` +
                (isRefused(step) ? ", refused" : "") + (failuresOf(runShown, index).length > 0 ? ", failed" : "");
  const button = bar(axis.starts[index], axis.starts[index + 1], isBad(runShown, index) ? "step refusing" : "step",
                     String(index + 1), label, () => goTo(side, index));
  button.dataset.step = index;
  return button;
}

/** Round times within a step, as far apart as they can be read. */
function roundTimes(axis, index) {
  const { from_us: from, to_us: to } = axis.steps[index];
  const share = axis.timed[index] / TIME_ROOM;
  if (share < 2) return [];
  const least = (to - from) / share;
  const power = 10 ** Math.floor(Math.log10(least));
  const each = [1, 2, 5, 10].map((digit) => digit * power).find((round) => round >= least);
  const times = [];
  for (let us = Math.ceil(from / each) * each; us < to; us += each)
    times.push([us, axis.starts[index] + axis.own + axis.timed[index] * (us - from) / (to - from)]);
  return times;
}

/** When steps begin and the run ends, and round times between; as many as there is room for, in this order. */
function timesRow(axis, side) {
  const runShown = sides()[side];
  const wanted = [...runShown.steps.map((step, index) => [step.from_us, axis.starts[index]]),
                  [runShown.to_us, axis.starts.at(-1)],
                  ...runShown.steps.flatMap((_, index) => roundTimes(axis, index))];
  const taken = [];
  const times = make("div", { class: "times", "aria-hidden": "true" });
  for (const [us, at] of wanted) {
    const isLast = at > 1 - TIME_ROOM;
    const left = isLast ? at - TIME_ROOM : at;
    if (taken.some((one) => one.us === us || Math.abs(one.left - left) < TIME_ROOM)) continue;
    taken.push({ us, left });
    const time = make("span", isLast ? { class: "last" } : {}, spoken(us));
    time.style.left = `${at * 100}%`;
    times.append(time);
  }
  return make("div", { class: "lane" }, make("span", { class: "lane-name" }), times);
}

function showLanes() {
  const axes = sides().map((one) => new Axis(one, sides(), shown.toScale));
  const tracksOf = (name, barsOf) => axes.map((axis, side) => track(name, side, barsOf(axis, side)));
  const steps = tracksOf("steps", (axis, side) => axis.steps.map((_, index) => stepBar(axis, side, index)));
  const lanes = run().lanes.flatMap((lane, place) => sides().every((one) => one.lanes[place].spans.length === 0) ? []
    : [laneRow(lane.name, tracksOf(lane.name, (axis, side) =>
      sides()[side].lanes[place].spans.map((span) => laneBar(axis, side, lane, span))))]);
  part("lanes").classList.toggle("two", axes.length > 1);
  part("lanes").replaceChildren(timesRow(axes[0], 0), laneRow("steps", steps), ...lanes,
                                ...axes.slice(1).map((axis) => timesRow(axis, 1)));
  part("whose").hidden = axes.length < 2;
  part("whose").textContent = axes.length < 2 ? ""
    : `In each lane, above: ${nameOf(sides()[0])}. Below: ${nameOf(sides()[1])}, whose times stand at the bottom.`;
  part("lanes").axes = axes;
}

/* A step. */

function entryLine(entry) {
  const time = make("span", { class: "time" }, `${(entry.time_us / 1000).toFixed(3)}  `);
  const names = entry.kind + (entry.faulted ? " faulted" : "");
  const item = make("li", { class: names }, time, entry.brief + (entry.faulted ? "  (scripted)" : ""));
  item.style.marginLeft = `${entry.depth * 1.5}em`;
  item.dataset.text = entry.brief.toLowerCase();
  return item;
}

function folded(title, className, ...content) {
  return make("details", { class: className }, make("summary", {}, title), ...content);
}

function listOf(entries, what, className) {
  if (entries.length === 0) return null;
  return folded(what, className, make("ul", { class: "entries" }, ...entries.map((entry) => entryLine(entry))));
}

function changesOf(step) {
  if (step.changes.length === 0) return null;
  const row = (change) => make("tr", {}, make("th", { scope: "row" }, change.path),
                               make("td", {}, change.older ?? "–"), make("td", {}, change.newer ?? "–"));
  const head = make("tr", {}, ...["What", "before", "after"].map((text) => make("th", { scope: "col" }, text)));
  return folded(`${counted(step.changes.length, "change")} of the state`, "state",
                make("table", { class: "changes" }, make("thead", {}, head),
                     make("tbody", {}, ...step.changes.map(row))));
}

function reasonsOf(step) {
  const reasons = step.explanation ? step.explanation.reasons : [];
  if (reasons.length === 0) return null;
  return folded(`Why: ${counted(reasons.length, "decision")}`, "why", make("ul", { class: "entries" },
    ...reasons.map((reason) => make("li", {}, `${reason.text}  (${reason.function}, ${reason.place})`))));
}

function expectationsOf(step) {
  if (step.expectations.length === 0) return null;
  return folded(counted(step.expectations.length, "expectation"), "expected",
                make("ul", { class: "entries" }, ...step.expectations.map(({ line }) => make("li", {}, line))));
}

function refusalOf(step) {
  if (isNothing(step)) return make("p", { class: "when" }, `Nothing to do: ${step.explanation.reason.text}.`);
  if (!isRefused(step)) return null;
  const { reason, advice, accepted } = step.explanation;
  const refused = make("p", { class: "refused" }, `Refused: ${reason.text}.`);
  if (advice) refused.append(` What to do: ${advice}.`);
  if (accepted.length > 0) refused.append(" Accepted instead: ", make("code", {}, accepted.join("; ")));
  return refused;
}

/** Whether two pictures are known to differ: of one that is left out nothing is known. */
function lookApart(one, other) {
  return one.picture !== null && other.picture !== null && one.picture !== other.picture;
}

function pictureOf(side, index, output) {
  const { steps } = sides()[side];
  const seen = steps[index].outputs[output];
  const before = index > 0 ? steps[index - 1].outputs[output] : undefined;
  const isNew = before !== undefined && lookApart(before, seen);
  const label = `${seen.output}: ${seen.description}${isNew ? ", changed" : ""}`;
  if (seen.picture === null) return make("p", { class: "nothing" }, `${label}; left out`);
  const image = make("img", { src: data.pictures[seen.picture], alt: label, loading: "lazy" });
  return make("button", { type: "button", class: `picture${isNew ? " changed" : ""}`,
                          onclick: () => enlarge(side, index, output) },
              image, make("span", { "aria-hidden": "true" }, label));
}

function picturesOf(side, index) {
  const { outputs } = sides()[side].steps[index];
  if (outputs.length === 0) return null;
  return make("div", { class: "pictures", role: "group", "aria-label": `What is seen after step ${index + 1}` },
              ...outputs.map((_, output) => pictureOf(side, index, output)));
}

function whenOf(step) {
  const lasted = step.to_us - step.from_us;
  return `at ${spoken(step.from_us)}` + (lasted > 0 ? `, takes ${spoken(lasted)}` : "") + ` · ${step.place}`;
}

/** What a step shows of the trace, in lists that fold. */
function detailsOf(step) {
  const stores = step.entries.filter((entry) => entry.kind === "store");
  const others = step.entries.filter((entry) => entry.kind !== "store");
  const calls = others.filter((entry) => entry.kind === "call").length;
  const told = others.length - calls;
  const title = counted(calls, "call") + (told > 0 ? `, ${counted(told, "line")} of log and board` : "");
  const left = leftOut([step]);
  return [left ? make("p", { class: "left-out" }, `This page leaves out ${left}.`) : null, reasonsOf(step),
          listOf(others, title, "calls"), listOf(stores, counted(stores.length, "store"), "stores"),
          changesOf(step), expectationsOf(step),
          step.status ? folded("What this means" + (step.power_on_us > 0
                                 ? `; its times count from the power-on at ${spoken(step.power_on_us)}` : ""), "status",
                               make("div", { class: "scroll", tabindex: "0", role: "group",
                                             "aria-label": "What this means" }, make("pre", {}, step.status))) : null];
}

function card(side, index) {
  const runShown = sides()[side];
  const step = runShown.steps[index];
  const isHeld = ["held", "awaits video plane", "out"].includes(step.graphics_state);
  const failures = failuresOf(runShown, index).map(({ text }) => make("p", { class: "failed" }, `Failed: ${text}`));
  const troubles = troublesOf(step).map(({ brief }) => make("p", { class: "failed" }, brief));
  const whose = side === 0 ? "" : `${nameOf(runShown)}, `;
  const title = make("h3", {}, make("span", { class: "number" }, `${index + 1}  `), make("code", {}, titleOf(step)));
  return make("article", { class: `card${isBad(runShown, index) ? " refusing" : ""}`,
                           id: cardId(side, index), tabindex: "-1",
                           "aria-label": `${whose}Step ${index + 1}: ${titleOf(step)}` },
              title, make("p", { class: "when" }, whenOf(step)),
              ...step.results.map((line) => make("p", { class: isRefused(step) ? "result refusing" : "result" },
                                                 make("code", {}, line))),
              step.told ? make("pre", { class: "told scroll", tabindex: "0", role: "group",
                                      "aria-label": "What the command shows" }, step.told) : null,
              refusalOf(step), ...failures, ...troubles,
              isHeld ? make("p", { class: "held-back" }, `Graphics are ${step.graphics}.`) : null,
              picturesOf(side, index), ...detailsOf(step));
}

/* Two runs side by side. */

/** The same of lists that are too long to be compared in order: by what they hold. */
function matched(older, newer) {
  const places = new Map();
  for (let j = newer.length - 1; j >= 0; --j) {
    if (!places.has(newer[j])) places.set(newer[j], []);
    places.get(newer[j]).push(j);
  }
  const pairs = older.map((text, i) => [i, places.get(text)?.pop() ?? -1]);
  const found = new Set(pairs.map(([, j]) => j));
  return [...pairs, ...newer.map((_, j) => [-1, j]).filter(([, j]) => !found.has(j))];
}

/** What two lists have in common, in order: pairs of places, with -1 where there is none on the other side. Time and
 *  room go with the product of what is between a common beginning and a common end. */
function aligned(older, newer) {
  const longest = Math.min(older.length, newer.length);
  let begin = 0;
  while (begin < longest && older[begin] === newer[begin]) ++begin;
  let end = 0;
  while (end < longest - begin && older.at(-1 - end) === newer.at(-1 - end)) ++end;
  const [one, other] = [older, newer].map((list) => list.slice(begin, list.length - end));
  const inside = one.length * other.length > MOST_COMPARED ? matched(one, other) : inOrder(one, other);
  const moved = ([i, j]) => [i < 0 ? -1 : i + begin, j < 0 ? -1 : j + begin];
  return [...Array.from({ length: begin }, (_, i) => [i, i]), ...inside.map(moved),
          ...Array.from({ length: end }, (_, i) => [older.length - end + i, newer.length - end + i])];
}

function inOrder(older, newer) {
  const lengths = Array.from({ length: older.length + 1 }, () => new Uint32Array(newer.length + 1));
  for (let i = older.length - 1; i >= 0; --i)
    for (let j = newer.length - 1; j >= 0; --j)
      lengths[i][j] = older[i] === newer[j] ? lengths[i + 1][j + 1] + 1
        : Math.max(lengths[i + 1][j], lengths[i][j + 1]);
  const pairs = [];
  let i = 0;
  let j = 0;
  while (i < older.length || j < newer.length) {
    if (i < older.length && j < newer.length && older[i] === newer[j]) pairs.push([i++, j++]);
    else if (j === newer.length || (i < older.length && lengths[i + 1][j] >= lengths[i][j + 1])) pairs.push([i++, -1]);
    else pairs.push([-1, j++]);
  }
  return pairs;
}

function differingLines(older, newer) {
  const items = [];
  for (const [i, j] of aligned(older, newer)) {
    if (j < 0) items.push(make("li", { class: "gone" }, older[i]));
    else if (i < 0) items.push(make("li", { class: "new" }, newer[j]));
  }
  return items;
}

/** What differs between two steps: a line for each that is on one side alone. Clocks and counters of calls do after
 *  every other difference, and say nothing. */
function differences(one, other) {
  const briefs = (step) => step.entries.map((entry) => entry.brief + (entry.faulted ? "  (scripted)" : ""));
  const states = (step) => step.changes.filter((change) => !change.counter)
    .map((change) => `${change.path}: ${change.older} → ${change.newer}`);
  const lasted = (step) => [`takes ${spoken(step.to_us - step.from_us)}`];
  const reason = (step) => isRefused(step) ? [`refused: ${step.explanation.reason.text}`] : [];
  const failures = (step) => data.runs.flatMap((of) => failuresOf(of, of.steps.indexOf(step))).map(({ text }) => text);
  return [lasted, reason, failures, (step) => step.results, (step) => [step.graphics ?? ""],
          (step) => step.told.split("\n"), briefs, states]
    .flatMap((of) => differingLines(of(one), of(other)))
    .concat(differingPictures(one, other));
}

/** The pictures themselves: a number would tell nothing. */
function differingPictures(one, other) {
  const image = (seen) => make("img", { src: data.pictures[seen.picture], alt: `${seen.output}: ${seen.description}` });
  return one.outputs.flatMap((seen, index) => {
    const beside = other.outputs[index];
    if (!beside || !lookApart(seen, beside)) return [];
    return [make("li", { class: "apart-pictures" }, `${seen.output}: ${seen.description} / ${beside.description}`,
                 make("span", { class: "both" }, image(seen), image(beside)))];
  });
}

/** The pairs of steps with the same command. */
function pairsOf(one, other) {
  const commands = (of) => of.steps.map((step) => step.command);
  return aligned(commands(one), commands(other));
}

/** How two runs differ, in words: what somebody wants to know who compares them. */
function comparison(one, other) {
  const line = (what, here, there) => here === there ? [] : [make("li", {}, `${what}: ${here} here, ${there} there.`)];
  const waited = (of) => {
    const all = waits(of);
    return all.length === 0 ? "never" : all.map((span) => spoken(span.to.us - span.from.us)).join(", then ");
  };
  const count = (of, is) => of.steps.filter((_, index) => is(of, index)).length;
  const refused = (of) => counted(count(of, (run_, index) => isRefused(run_.steps[index])), "step");
  const last = (lane) => lane.spans.length > 0 && lane.spans.at(-1).open ? lane.spans.at(-1).text : "nothing";
  const lines = [...line("Boards", boardsOf(one), boardsOf(other)),
                 ...line("Graphics waited", waited(one), waited(other)),
                 ...line("Refused", refused(one), refused(other)),
                 ...line("Failures", one.failures.length, other.failures.length),
                 ...line("The run takes", spoken(one.lasted_us), spoken(other.lasted_us)),
                 ...one.lanes.flatMap((lane, index) => lane.kind !== "output" ? []
                   : line(`In the end, ${lane.name}`, last(lane), last(other.lanes[index])))];
  const pairs = pairsOf(one, other);
  const apart = pairs.filter(([i, j]) => i >= 0 && j >= 0 && differences(one.steps[i], other.steps[j]).length > 0);
  const alone = pairs.filter(([i, j]) => i < 0 || j < 0).length;
  if (alone > 0) lines.push(make("li", {}, `${counted(alone, "step")} in one of them alone.`));
  if (apart.length > 0)
    lines.push(make("li", {}, `${counted(apart.length, "step")} with the same command differ, the first is `,
                    linkTo(apart[0][0]), "."));
  return lines.length > 0 ? lines : [make("li", {}, "Both do the same, and look the same.")];
}

function pair(index, otherIndex) {
  const missing = () => make("p", { class: "nothing" }, "no such step in this run");
  const both = make("div", { class: "pair" }, index < 0 ? missing() : card(0, index),
                    otherIndex < 0 ? missing() : card(1, otherIndex));
  if (index < 0 || otherIndex < 0) return make("div", { class: "row" }, both);
  const found = differences(run().steps[index], data.runs[shown.other].steps[otherIndex]);
  const text = found.length === 0 ? make("p", { class: "apart" }, "Both do the same, and look the same.")
    : make("div", { class: "apart" },
           folded(`${counted(found.length, "difference")}: − on the left, + on the right`, "differences",
                  make("ul", { class: "entries" }, ...found)));
  return make("div", { class: "row" }, both, text);
}

function showCards() {
  shown.pairs = shown.other < 0 ? run().steps.map((_, index) => [index, -1]) : pairsOf(run(), data.runs[shown.other]);
  part("cards").replaceChildren(...shown.pairs.map(([one, other]) => shown.other < 0
    ? make("div", { class: "row" }, card(0, one)) : pair(one, other)));
  for (const row of part("cards").children) letTab(row, false);
}

/* Of all steps one alone can be gone through by Tab, and of each lane and list one part: else there were thousands. */

const TABBED = "button, summary, .told"; // what unfolds has been asked for

function letTab(row, lets) {
  for (const element of row.querySelectorAll(TABBED)) element.tabIndex = lets ? 0 : -1;
  row.classList.toggle("open", lets);
}

function openToTab(row) {
  if (row === shown.row) return;
  if (shown.row) letTab(shown.row, false);
  letTab(row, true);
  shown.row = row;
}

/** One of these parts is reached by Tab, the one that was used last; keys go to the one before and the one behind. */
function rove(container, selector, back, forth) {
  const all = [...container.querySelectorAll(selector)];
  all.forEach((item, index) => item.tabIndex = index === 0 ? 0 : -1);
  container.addEventListener("focusin", (event) => {
    const used = event.target.closest(selector);
    if (used) for (const item of all) item.tabIndex = item === used ? 0 : -1;
  });
  container.addEventListener("keydown", (event) => {
    const items = all.filter((item) => item.checkVisibility());
    const at = items.indexOf(event.target);
    const to = back.includes(event.key) ? at - 1 : forth.includes(event.key) ? at + 1
      : event.key === "Home" ? 0 : event.key === "End" ? items.length - 1 : -2;
    if (at < 0 || to === -2 || event.shiftKey || event.ctrlKey || event.altKey || event.metaKey) return;
    event.preventDefault();
    event.stopPropagation();
    items[Math.min(items.length - 1, Math.max(0, to))].focus();
  });
}

/* Choosing, filtering, enlarging. */

/** The place of the other run's step that stands beside this one; -1: none does. */
const besideOf = (index) => shown.pairs.find(([one]) => one === index)?.[1] ?? -1;

/** Show where a step stands in the tracks of a side. */
function mark(side, index) {
  const axis = part("lanes").axes[side];
  part("lanes").style.setProperty(`--at-${side}`, axis.starts[index] ?? 0);
  part("lanes").style.setProperty(`--wide-${side}`, axis.widths[index] ?? 0);
  for (const button of document.querySelectorAll(`.side-${side} .bar.step`))
    button.classList.toggle("chosen", Number(button.dataset.step) === index);
}

function choose(index, moves) {
  if (run().steps.length === 0) {
    part("told").textContent = "No step of it ran.";
    return;
  }
  shown.step = Math.min(run().steps.length - 1, Math.max(0, index));
  const id = cardId(0, shown.step);
  for (const element of document.querySelectorAll(".card")) {
    element.classList.toggle("chosen", element.id === id);
    if (element.id === id) element.setAttribute("aria-current", "step");
    else element.removeAttribute("aria-current");
  }
  openToTab(part(id).closest(".row"));
  mark(0, shown.step);
  if (shown.other >= 0) mark(1, besideOf(shown.step));
  const step = run().steps[shown.step];
  part("told").textContent =
    `Step ${shown.step + 1} of ${run().steps.length}, at ${spoken(step.from_us)}: ${titleOf(step)}`;
  if (!moves) return;
  history.replaceState(null, "", `#${id}`);
  lookAt(id);
}

function lookAt(id) {
  part(id).focus({ preventScroll: true });
  part(id).scrollIntoView({ block: "nearest" });
}

/** A step of either side. The position is one of the first; it moves along where the two have it in common. */
function goTo(side, index) {
  if (side === 0) {
    choose(index, true);
    return;
  }
  const beside = shown.pairs.find(([, other]) => other === index)?.[0] ?? -1;
  if (beside >= 0) choose(beside, false);
  lookAt(cardId(1, index));
}

/** Who works in a step is there. */
function follow(event) {
  const row = event.target.closest(".row");
  const own = row?.querySelector("[id^=step-]");
  if (own && event.target.id !== own.id && own.id !== cardId(0, shown.step))
    choose(Number(own.id.slice("step-".length)) - 1, false);
  if (row) openToTab(row);
}

function filter() {
  const wanted = shown.filter.toLowerCase();
  let lines = 0;
  let steps = 0;
  for (const element of document.querySelectorAll(".card")) {
    let here = 0;
    for (const list of element.querySelectorAll(".calls, .stores")) {
      let inList = 0;
      for (const line of list.querySelectorAll("li")) {
        line.hidden = wanted !== "" && !line.dataset.text.includes(wanted);
        inList += line.hidden ? 0 : 1;
      }
      list.open = wanted !== "" && inList > 0;
      here += inList;
    }
    element.classList.toggle("without", wanted !== "" && here === 0);
    lines += here;
    steps += here > 0 ? 1 : 0;
  }
  part("found").textContent = wanted === "" ? "" : `${counted(lines, "line")} in ${counted(steps, "step")}`;
}

function showLarge() {
  const { side, step: index } = large;
  const runShown = sides()[side];
  const step = runShown.steps[index];
  const seen = step.outputs[shown.output];
  const whose = sides().length > 1 ? `${nameOf(runShown)}: ` : "";
  part("large-title").textContent = `${whose}${seen.output}, after step ${index + 1}: ${titleOf(step)}`;
  part("large-picture").hidden = seen.picture === null;
  part("large-picture").src = data.pictures[seen.picture] ?? "data:,";
  part("large-picture").alt = `${seen.output}: ${seen.description}`;
  part("large-text").textContent =
    `${whose}${seen.output} after step ${index + 1}: ${seen.description}. Graphics: ${step.graphics}.` +
    (seen.picture === null ? " This page leaves the picture out." : "");
}

function enlarge(side, index, output) {
  if (side === 0) choose(index, false);
  large.side = side;
  large.step = index;
  shown.output = output;
  showLarge();
  part("large").showModal();
}

function keyInLarge(event) {
  const { steps } = sides()[large.side];
  const by = { ArrowLeft: [-1, 0], ArrowRight: [1, 0], ArrowUp: [0, -1], ArrowDown: [0, 1] }[event.key];
  if (by === undefined) return;
  event.preventDefault();
  event.stopPropagation();
  const outputs = steps[large.step].outputs.length;
  shown.output = (shown.output + by[1] + outputs) % outputs;
  const next = large.step + by[0];
  if (next >= 0 && next < steps.length && steps[next].outputs.length > 0) large.step = next;
  if (large.side === 0) choose(large.step, false);
  showLarge();
}

function key(event) {
  if (event.shiftKey && event.key !== "/") return; // it selects text
  if (event.ctrlKey || event.altKey || event.metaKey || part("large").open) return;
  if (event.target.closest("input, select, textarea, .scroll")) return;
  const steps = { ArrowLeft: shown.step - 1, ArrowRight: shown.step + 1, Home: 0, End: run().steps.length - 1 };
  if (event.key in steps) choose(steps[event.key], true);
  else if (event.key === "/") part("filter").focus();
  else return;
  event.preventDefault();
}

function show() {
  document.title = `${run().name} – storyboard`;
  const other = data.runs[shown.other];
  part("title").textContent = other ? `${nameOf(run())} beside ${nameOf(other)}` : nameOf(run());
  part("beside").hidden = !other;
  part("compared").replaceChildren(...(other ? comparison(run(), other) : []));
  rove(part("compared"), "a", ["ArrowUp"], ["ArrowDown"]);
  showStories();
  showCards();
  showLanes();
  choose(shown.step, false);
  filter();
}

function offerRuns() {
  const options = () => data.runs.map((one, index) => make("option", { value: index }, `${index + 1}  ${nameOf(one)}`));
  part("run").replaceChildren(...options());
  part("other").replaceChildren(make("option", { value: -1 }, "none"), ...options());
  for (const label of document.querySelectorAll(".runs")) label.hidden = data.runs.length < 2;
}

function begin() {
  offerRuns();
  part("run").addEventListener("change", (event) => {
    shown.run = Number(event.target.value);
    shown.step = 0;
    show();
  });
  part("other").addEventListener("change", (event) => {
    shown.other = Number(event.target.value);
    show();
  });
  part("filter").addEventListener("input", (event) => {
    shown.filter = event.target.value.trim();
    filter();
  });
  part("scale").addEventListener("change", (event) => {
    shown.toScale = event.target.checked;
    showLanes();
    choose(shown.step, false);
  });
  part("controls").addEventListener("submit", (event) => event.preventDefault());
  part("large").addEventListener("keydown", keyInLarge);
  part("cards").addEventListener("focusin", follow);
  document.addEventListener("keydown", key);
  const asked = /^#step-(\d+)$/.exec(location.hash);
  if (asked) shown.step = Number(asked[1]) - 1;
  show();
}

begin();
