// SPDX-License-Identifier: Apache-2.0
//
// The body of a function: the shown texts of the page, each with its least contrast, as WCAG 2 defines it,
// with any colour behind it. Colours are those that the browser has computed.
const canvas = document.createElement("canvas").getContext("2d", {willReadFrequently: true});

/** Red, green and blue from 0 to 255, and the opacity from 0 to 1. */
function parsed(colour) {
    canvas.clearRect(0, 0, 1, 1);
    canvas.fillStyle = colour;
    canvas.fillRect(0, 0, 1, 1);
    const [r, g, b, a] = canvas.getImageData(0, 0, 1, 1).data;
    return {rgb: [r, g, b], alpha: a / 255};
}

function over(top, bottom) {
    return top.rgb.map((value, i) => value * top.alpha + bottom[i] * (1 - top.alpha));
}

function luminance(rgb) {
    const [r, g, b] = rgb.map(value => value / 255)
        .map(value => value <= 0.04045 ? value / 12.92 : ((value + 0.055) / 1.055) ** 2.4);
    return 0.2126 * r + 0.7152 * g + 0.0722 * b;
}

function contrast(one, other) {
    const [low, high] = [luminance(one), luminance(other)].sort((a, b) => a - b);
    return (high + 0.05) / (low + 0.05);
}

/** Every colour that is behind the content of an element: a pattern has several. */
function grounds(element) {
    if (!element) {
        const dark = matchMedia("(prefers-color-scheme: dark)").matches;
        return [dark ? [18, 18, 18] : [255, 255, 255]];
    }
    const style = getComputedStyle(element);
    if (element.namespaceURI.endsWith("/svg")) {
        const rect = element.parentElement?.querySelector(":scope > rect");
        return rect ? [parsed(getComputedStyle(rect).fill).rgb] : grounds(element.closest("svg").parentElement);
    }
    const own = parsed(style.backgroundColor);
    const behind = own.alpha === 1 ? [own.rgb] : grounds(element.parentElement).map(each => over(own, each));
    const pattern = style.backgroundImage.match(/rgba?\([^)]*\)|color\([^)]*\)/g) ?? [];
    return [...behind, ...pattern.map(parsed).filter(each => each.alpha > 0)
        .flatMap(each => behind.map(ground => over(each, ground)))];
}

function isShown(element) {
    const box = element.getBoundingClientRect();
    return box.width > 1 && box.height > 1 && element.checkVisibility({contentVisibilityAuto: true}) &&
        getComputedStyle(element).clipPath === "none";
}

const found = [];
const walker = document.createTreeWalker(document.body, NodeFilter.SHOW_TEXT);
while (walker.nextNode()) {
    const element = walker.currentNode.parentElement;
    const text = walker.currentNode.textContent.trim();
    if (text && !element.matches("script, style, title") && isShown(element)) {
        const style = getComputedStyle(element);
        const colour = parsed(element.namespaceURI.endsWith("/svg") ? style.fill : style.color);
        const least = Math.min(...grounds(element).map(ground => contrast(over(colour, ground), ground)));
        const where = `${element.closest("section")?.className ?? ""} ${element.localName}.${element.className}`;
        found.push({text: text.slice(0, 40), where, contrast: least});
    }
}
return found;
