// SPDX-License-Identifier: Apache-2.0
//
// What a page can do beyond being read: tabs of outputs, a line and its source light up together, one key
// leads through bytes and lines, and the table of a fleet is sorted and filtered. The markup is whole
// without it. Texts of units are only ever moved as text.
"use strict";

// --- Small helpers ---------------------------------------------------------------------------------

/** A new element with these attributes and children. */
function make(name, attributes = {}, ...children) {
    const element = document.createElement(name);
    for (const [key, value] of Object.entries(attributes)) {
        element.setAttribute(key, value);
    }
    element.append(...children);
    return element;
}

/** The index after `key` is pressed at `index` of `count` in a row; undefined if the key does not move. */
function movedAlong(key, index, count) {
    switch (key) {
    case "ArrowLeft":
        return Math.max(index - 1, 0);
    case "ArrowRight":
        return Math.min(index + 1, count - 1);
    case "Home":
        return 0;
    case "End":
        return count - 1;
    default:
        return undefined;
    }
}

/** Whether a key moves or works alone, without Control, Alt or Meta. */
function isPlain(event) {
    return !event.ctrlKey && !event.altKey && !event.metaKey;
}

// --- Tabs of the outputs ---------------------------------------------------------------------------

const tabOf = new WeakMap(); // the tab of a panel

function selectTab(tab) {
    for (const other of tab.parentElement.children) {
        const isSelected = other === tab;
        other.setAttribute("aria-selected", String(isSelected));
        other.tabIndex = isSelected ? 0 : -1;
        document.getElementById(other.getAttribute("aria-controls")).hidden = !isSelected;
    }
}

function makeTab(panel) {
    const name = panel.dataset.path.replace(/^.*\//, "");
    const state = panel.querySelector(".state").textContent;
    const tab = make("button",
        {type: "button", role: "tab", id: `${panel.id}-tab`, "aria-controls": panel.id,
            class: panel.className.replace("output", "tab")},
        name, " ", make("small", {class: "sign"}, state));
    panel.setAttribute("role", "tabpanel");
    panel.setAttribute("aria-labelledby", tab.id);
    tabOf.set(panel, tab);
    return tab;
}

function makeTabs(unit) {
    const panels = [...unit.querySelectorAll(".output")];
    const tabs = panels.map(makeTab);
    const list = make("div", {class: "tabs", role: "tablist", "aria-label": "Outputs"}, ...tabs);
    panels[0].before(list);
    list.addEventListener("click", event => {
        const tab = event.target.closest("[role=tab]");
        if (tab) {
            selectTab(tab);
        }
    });
    list.addEventListener("keydown", event => {
        const next = isPlain(event) ? movedAlong(event.key, tabs.indexOf(event.target), tabs.length) : undefined;
        if (next !== undefined) {
            event.preventDefault();
            selectTab(tabs[next]);
            tabs[next].focus();
        }
    });
    const first = panels.findIndex(panel => panel.querySelector(".lines"));
    selectTab(tabs[Math.max(first, 0)]);
}

/** Shows the panel that holds the element, if there is one. */
function openPanelOf(element) {
    const panel = element.closest("[role=tabpanel]");
    if (panel?.hidden) {
        selectTab(tabOf.get(panel));
    }
}

// --- Lighting up what belongs together ---------------------------------------------------------------

/** The key of the whole that a value belongs to: the first two parts of its own. Often it is the value itself. */
function wholeOf(key) {
    return key.split(".", 2).join(".");
}

/** For each key of a unit the elements that show the value or, if it is a whole, something of it. */
function elementsByKey(unit) {
    const found = new Map();
    for (const element of unit.querySelectorAll("[data-key]")) {
        for (const key of new Set([element.dataset.key, wholeOf(element.dataset.key)])) {
            if (!found.has(key)) {
                found.set(key, []);
            }
            found.get(key).push(element);
        }
    }
    return found;
}

const keysOf = new WeakMap(); // the elements by key of a unit, made when they are first needed

/**
 * Everything that shows the element's value, itself included, a part of the value or the whole that it belongs
 * to, in the order of the page.
 */
function partners(element) {
    const unit = element.closest(".unit");
    if (!keysOf.has(unit)) {
        keysOf.set(unit, elementsByKey(unit));
    }
    const key = element.dataset.key;
    const whole = wholeOf(key);
    const same = keysOf.get(unit).get(key);
    const wholes = whole === key ? [] : keysOf.get(unit).get(whole).filter(other => other.dataset.key === whole);
    return [...same, ...wholes];
}

let lit = []; // what is lit now

function light(element) {
    for (const each of lit) {
        each.classList.remove("lit");
    }
    lit = element ? partners(element) : [];
    for (const panel of new Set(lit.map(each => each.closest("[role=tabpanel]")))) {
        if (panel) {
            lit.push(tabOf.get(panel));
        }
    }
    for (const each of lit) {
        each.classList.add("lit");
    }
}

/** The element with a key that an event is about, if any. */
function keyed(event) {
    return event.target.closest?.(".unit [data-key]") ?? null;
}

/** Brings the partners of the element into view: the first line, and the first other one. */
function reveal(element) {
    const others = partners(element).filter(other => other !== element && !other.contains(element));
    const isLine = other => other.matches(".lines tr");
    const isListed = other => other.matches("tr, td, .cell");
    const chosen = isLine(element) ? [] : [others.find(isLine)];
    chosen.push(others.find(other => !isLine(other) && isListed(other)));
    for (const other of chosen.filter(Boolean)) {
        openPanelOf(other);
        other.scrollIntoView({block: "nearest", inline: "nearest"});
    }
}

/** What is lit follows the pointer, and otherwise the focus. */
function followPointerAndFocus() {
    document.addEventListener("pointerover", event => {
        const element = keyed(event);
        light(element ?? document.activeElement.closest(".unit [data-key]"));
        showDetail(event);
    });
    document.addEventListener("focusin", event => {
        light(keyed(event));
        showDetail(event);
    });
    document.addEventListener("focusout", () => light(null));
    document.addEventListener("click", event => {
        if (keyed(event) && getSelection().isCollapsed) {
            reveal(keyed(event));
        }
    });
    document.addEventListener("keydown", event => {
        if (event.key === "Escape") {
            light(null);
        } else if (isPlain(event) && event.key === "Enter" && keyed(event) === event.target) {
            reveal(event.target);
        }
    });
}

// --- Details of bytes and slots ------------------------------------------------------------------------

/** The bytes of a slot or the auxiliary area as a text, which stands in the table. */
function slotText(part) {
    const row = part.dataset.key && partners(part).find(other => other.matches(".slots tr"));
    const text = row?.cells[4]?.textContent;
    return text ? `, as text ${text}` : "";
}

/** What a cell of the image or a part of the drawing stands for, in words. */
function detailText(element) {
    const textOf = selector => element.querySelector(selector).textContent;
    return element.matches(".cell") ? `Parameter ${textOf("b")}, ${textOf("small")}` :
        `${textOf("title")}: ${textOf("desc")}${slotText(element)}`;
}

/** Shows the details of a cell or a part at the place for them. Others leave what is there. */
function showDetail(event) {
    const element = event.target.closest?.(".cell, .part");
    if (element) {
        element.closest("section").querySelector(".details").textContent = detailText(element);
    }
}

function makeDetails(unit) {
    for (const [shown, hint] of [[".cells", "Point at a byte, or move to it by the arrow keys, for its details."],
                                 [".drawing", "Point at a part, or move to it by the arrow keys, for its content."]]) {
        // A screen reader has the same in each cell and part.
        unit.querySelector(shown)?.after(make("p", {class: "details", "aria-hidden": "true"}, hint));
    }
}

// --- One stop of the Tab key for each table, the image and the drawing --------------------------------------

/** The item below or above: in the nearest row that has another height, the one that is least aside. */
function movedAcross(key, item, items) {
    const sign = {ArrowDown: 1, ArrowUp: -1}[key];
    if (!sign) {
        return undefined;
    }
    const from = item.getBoundingClientRect();
    const distance = other => {
        const to = other.getBoundingClientRect();
        const down = sign * (to.top - from.top);
        return down > 1 ? down * 10000 + Math.abs(to.left - from.left) : Infinity;
    };
    const nearest = items.map(other => [distance(other), other]).reduce((a, b) => b[0] < a[0] ? b : a);
    return nearest[0] === Infinity ? item : nearest[1];
}

/** What the section of an element is about. */
function headingOf(element) {
    return element.closest("section").querySelector("h2, h3, h4").textContent;
}

/** Lets the Tab key stop at one item of a group, and arrow keys move to the others. */
function makeGroup(group, items) {
    const moveTo = item => {
        for (const other of items) {
            other.tabIndex = other === item ? 0 : -1;
        }
    };
    moveTo(items[0]);
    const around = group.parentElement; // a drawing that listens to the focus would take it itself
    around.addEventListener("focusin", event => {
        if (items.includes(event.target)) {
            moveTo(event.target);
        }
    });
    around.addEventListener("keydown", event => {
        const index = items.indexOf(event.target);
        if (index < 0 || !isPlain(event)) {
            return;
        }
        const next = movedAcross(event.key, items[index], items) ??
            items[movedAlong(event.key, index, items.length)];
        if (next) {
            event.preventDefault();
            next.focus();
        }
    });
}

/** A list of items to choose from. What is in an option is its name: its elements have no roles of their own. */
function makeList(list, selector, name) {
    const items = [...list.querySelectorAll(selector)];
    list.setAttribute("role", "listbox");
    list.setAttribute("aria-label", name);
    for (const item of items) {
        item.setAttribute("role", "option");
    }
    makeGroup(list, items);
}

function makeGroups(unit) {
    for (const table of unit.querySelectorAll("table")) {
        const items = [...table.querySelectorAll("[data-key]")];
        if (items.length > 0) {
            table.setAttribute("role", "grid");
            table.setAttribute("aria-label", headingOf(table));
            makeGroup(table, items);
        }
    }
    makeList(unit.querySelector(".cells"), ".cell", "Bytes of the image");
    makeList(unit.querySelector(".drawing"), ".part", "Parts of the record area");
}

/** A box that scrolls and in which nothing takes the focus takes it itself. */
function makeScrollable(part) {
    for (const box of part.querySelectorAll(".scroll")) {
        if (!box.querySelector("[tabindex], a, button")) {
            box.tabIndex = 0;
            box.setAttribute("role", "group");
            box.setAttribute("aria-label", headingOf(box));
        }
    }
}

/** The keys of the verdict lead to what they name. */
function makeKeyButtons(unit) {
    for (const item of unit.querySelectorAll(".verdict [data-key]")) {
        const key = item.querySelector("code:not(.code)");
        if (key) {
            const button = make("button", {type: "button", class: "key"}, key.textContent);
            key.replaceChildren(button);
        }
    }
}

// --- Units ---------------------------------------------------------------------------------------------------

const completed = new WeakSet();

/** Adds to a unit what the script adds, once. */
function complete(unit) {
    if (completed.has(unit)) {
        return;
    }
    completed.add(unit);
    makeTabs(unit);
    makeDetails(unit);
    makeKeyButtons(unit);
    makeGroups(unit);
    makeScrollable(unit);
}

/** Shows what the address leads to, which may be in a panel that is not shown. */
function followAddress() {
    const target = document.getElementById(location.hash.slice(1));
    const unit = target?.closest(".unit");
    if (unit) {
        complete(unit);
        openPanelOf(target);
        target.scrollIntoView();
    }
}

/** A page may have hundreds of units: each is completed when it is about to be seen. */
function completeUnits() {
    const observer = new IntersectionObserver(entries => {
        for (const entry of entries) {
            if (entry.isIntersecting) {
                complete(entry.target);
                observer.unobserve(entry.target);
            }
        }
    }, {rootMargin: "100%"});
    for (const unit of document.querySelectorAll(".unit")) {
        unit.setAttribute("aria-label", unit.querySelector("h2").textContent); // also if it is not laid out
        observer.observe(unit);
    }
    addEventListener("hashchange", followAddress);
    followAddress();
}

// --- The table of a fleet ----------------------------------------------------------------------------------------

const inOrder = new Intl.Collator("en", {numeric: true}).compare;

/** The value of a cell, without the signs below it. The first cell of a row has a link. */
function valueOf(cell) {
    return cell.firstChild.textContent.trim();
}

let late = []; // rows that are still laid out only if they are seen

/** To lay out hundreds of rows takes longer than anybody should wait: those that are not seen come bit by bit. */
function layOutLater(rows) {
    if (late.length === 0) {
        setTimeout(layOutSome, 100);
    }
    late = [...rows];
    for (const row of late) {
        row.classList.add("late");
    }
}

function layOutSome() {
    for (const row of late.splice(0, 10)) {
        row.classList.remove("late");
    }
    if (late.length > 0) {
        setTimeout(layOutSome);
    }
}

/** Sorts the rows by a column, upwards first. Rows that are equal there keep their order. */
function sortBy(table, column) {
    const heads = [...table.tHead.rows[0].cells];
    const head = heads[column];
    const isUp = head.getAttribute("aria-sort") !== "ascending";
    for (const other of heads) {
        other.removeAttribute("aria-sort");
    }
    head.setAttribute("aria-sort", isUp ? "ascending" : "descending");
    const isNumber = head.dataset.order === "number";
    const compare = isNumber ? (a, b) => Number(a.value) - Number(b.value) : (a, b) => inOrder(a.value, b.value);
    const body = table.tBodies[0];
    const rows = [...body.rows].map(row => ({row, value: valueOf(row.cells[column])}));
    rows.sort(isUp ? compare : (a, b) => compare(b, a));
    body.append(...rows.map(each => each.row));
    layOutLater(body.rows);
}

/** The text, which may go on in another line after each "_". */
function breakable(text) {
    return text.split(/(?<=_)/).flatMap(part => [part, make("wbr")]);
}

function makeSortable(table) {
    [...table.tHead.rows[0].cells].forEach((head, column) => {
        const title = make("span", {}, ...breakable(head.textContent.trim()));
        const button = make("button", {type: "button"}, title);
        button.addEventListener("click", () => sortBy(table, column));
        head.replaceChildren(button);
    });
}

/** A box above the table: a row stays while it contains every word that is typed there. */
function makeFilter(table) {
    const rows = [...table.tBodies[0].rows];
    const texts = new Map(rows.map(row => [row, row.textContent.toLowerCase()]));
    const input = make("input", {type: "search", id: "filter", autocomplete: "off", spellcheck: "false"});
    const shown = make("output", {for: "filter"});
    const filter = () => {
        const words = input.value.toLowerCase().split(/\s+/);
        for (const row of rows) {
            row.hidden = !words.every(word => texts.get(row).includes(word));
        }
        layOutLater(rows);
        shown.value = `${rows.filter(row => !row.hidden).length} of ${rows.length} units`;
    };
    input.addEventListener("input", filter);
    filter();
    const box = make("p", {class: "filter"}, make("label", {for: "filter"}, "Filter"), " ", input, " ", shown);
    (table.closest(".scroll") ?? table).before(box);
}

// --- All together ----------------------------------------------------------------------------------------------------

document.documentElement.classList.add("scripted");
completeUnits();
followPointerAndFocus();
const fleet = document.querySelector("#fleet table");
if (fleet) {
    makeSortable(fleet);
    makeFilter(fleet);
}
