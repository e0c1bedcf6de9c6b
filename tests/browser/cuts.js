// SPDX-License-Identifier: Apache-2.0
//
// The body of a function: the texts, in the elements of a selector or in all of the page, that can't be read
// whole, because they are not shown, stick out of the page at its sides, or are cut by a box that they are in.
// What only people at a screen need is left out.
const ONLY_ON_SCREENS = ".tabs, .details, .filter, svg, script, style";

/** The box that cuts what is in the element; undefined if it lets everything stick out. */
function edges(element) {
    const style = getComputedStyle(element);
    if (style.clipPath !== "none") {
        return {left: 0, right: 0, top: 0, bottom: 0};
    }
    const box = element.getBoundingClientRect();
    const x = style.overflowX === "visible" ? {left: -Infinity, right: Infinity} : {left: box.left, right: box.right};
    const y = style.overflowY === "visible" ? {top: -Infinity, bottom: Infinity} : {top: box.top, bottom: box.bottom};
    return {...x, ...y};
}

const within = new Map([[document.body, {left: 0, right: innerWidth, top: -Infinity, bottom: Infinity}]]);

/** Where a text of the element can be seen. */
function visiblePlace(element) {
    if (!within.has(element)) {
        const [own, outer] = [edges(element), visiblePlace(element.parentElement)];
        within.set(element, {
            left: Math.max(own.left, outer.left), right: Math.min(own.right, outer.right),
            top: Math.max(own.top, outer.top), bottom: Math.min(own.bottom, outer.bottom)});
    }
    return within.get(element);
}

function isWhole(text) {
    const range = document.createRange();
    range.selectNodeContents(text);
    const seen = visiblePlace(text.parentElement);
    const boxes = [...range.getClientRects()];
    return boxes.length > 0 && boxes.every(box => box.left >= seen.left - 1 && box.right <= seen.right + 1 &&
        box.top >= seen.top - 1 && box.bottom <= seen.bottom + 1);
}

const cut = [];
for (const part of document.querySelectorAll(arguments[0] ?? "body")) {
    const walker = document.createTreeWalker(part, NodeFilter.SHOW_TEXT);
    while (walker.nextNode()) {
        const text = walker.currentNode;
        if (text.textContent.trim() && !text.parentElement.closest(ONLY_ON_SCREENS) && !isWhole(text)) {
            cut.push(`${text.textContent.trim().slice(0, 60)} in ${text.parentElement.closest("[class]")?.className}`);
        }
    }
}
return cut;
