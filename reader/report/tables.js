// Long tables: sorting by a click on a heading, searching, and a part of the rows at a time, so that thousands of calls
// stay quick. Without this script all rows are simply there.
(() => {
"use strict";

const SHOWN = 200;  // rows, until more are asked for

const element = (name, properties) => Object.assign(document.createElement(name), properties);
const cell = (row, column) => row.cells[column].textContent;

// Numbers by their value, all else as text. Cells without a value come last either way.
function comparison(column, isNumber, direction) {
    const collator = new Intl.Collator("en", {numeric: true});
    return (a, b) => {
        if (a.key === "" || b.key === "")
            return (a.key === "") - (b.key === "");
        return direction * (isNumber ? Number(a.key) - Number(b.key) : collator.compare(a.key, b.key));
    };
}

class LongTable {
    constructor(table) {
        this.table = table;
        this.body = table.tBodies[0];
        this.rows = [...this.body.rows];
        this.matching = this.rows;
        this.limit = SHOWN;
        this.addTools();
        this.addSorting();
        this.show();
    }

    addTools() {
        const what = this.table.dataset.what;
        this.status = element("span", {className: "note", role: "status"});
        const search = element("input", {type: "search", placeholder: `Search ${what}`});
        search.setAttribute("aria-label", `Search ${what}`);
        search.addEventListener("input", () => this.search(search.value));
        this.more = element("button", {type: "button", textContent: `Show ${SHOWN} more`});
        this.more.addEventListener("click", () => this.showUpTo(this.limit + SHOWN));
        this.all = element("button", {type: "button", textContent: "Show all"});
        this.all.addEventListener("click", () => this.showUpTo(this.rows.length));
        const tools = element("div", {className: "tools"});
        tools.append(search, this.status, this.more, this.all);
        this.table.parentElement.before(tools);
    }

    addSorting() {
        for (const heading of this.table.tHead.rows[0].cells) {
            const button = element("button", {type: "button", textContent: heading.textContent});
            button.addEventListener("click", () => this.sort(heading));
            heading.replaceChildren(button);
        }
    }

    sort(heading) {
        const isAscending = heading.getAttribute("aria-sort") !== "ascending";
        for (const other of this.table.tHead.rows[0].cells)
            other.removeAttribute("aria-sort");
        heading.setAttribute("aria-sort", isAscending ? "ascending" : "descending");
        const column = heading.cellIndex;
        const keyed = this.rows.map(row => ({row, key: cell(row, column)}));
        keyed.sort(comparison(column, heading.classList.contains("n"), isAscending ? 1 : -1));
        this.rows = keyed.map(({row}) => row);
        this.choose();
    }

    // All words must be in a row, in any order.
    search(text) {
        this.words = text.toLowerCase().split(/\s+/).filter(word => word !== "");
        this.choose();
    }

    choose() {
        const words = this.words || [];
        this.matching = words.length === 0 ? this.rows : this.rows.filter(row => {
            const text = row.textContent.toLowerCase();
            return words.every(word => text.includes(word));
        });
        this.showUpTo(SHOWN);
    }

    showUpTo(limit) {
        this.limit = limit;
        this.show();
    }

    show() {
        const shown = this.matching.slice(0, this.limit);
        this.body.replaceChildren(...shown);
        const isPart = shown.length < this.matching.length;
        this.more.hidden = this.all.hidden = !isPart;
        const what = this.matching.length === 1 ? this.table.dataset.what.slice(0, -1) : this.table.dataset.what;
        const of = this.matching.length === this.rows.length ? "" : ` of ${this.rows.length}`;
        this.status.textContent =
            `${this.matching.length}${of} ${what}` + (isPart ? `, ${shown.length} shown` : "");
    }
}

for (const table of document.querySelectorAll("table[data-what]"))
    new LongTable(table);

// Ladders and numbers below charts open on demand; a link to a ladder opens it. Paper has all ladders.
const LADDERS_OPEN = 3;
const ladders = [...document.querySelectorAll("#ladders details")];
for (const details of [...document.querySelectorAll("#charts details"), ...ladders.slice(LADDERS_OPEN)])
    details.open = false;
function openTarget() {
    const target = location.hash && document.getElementById(location.hash.slice(1));
    if (target && target.tagName === "DETAILS")
        target.open = true;
}
window.addEventListener("hashchange", openTarget);
openTarget();
let opened = [];
window.addEventListener("beforeprint", () => {
    opened = ladders.filter(details => !details.open);
    opened.forEach(details => { details.open = true; });
});
window.addEventListener("afterprint", () => opened.forEach(details => { details.open = false; }));
})();
