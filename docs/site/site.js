// What the pages that Doxygen writes lack for those who use a keyboard or a screen reader. Its own scripts come first.
addEventListener("load", () => {
    const each = (selector, change) => document.querySelectorAll(selector).forEach(change);
    const roles = { "#doc-content": "main", "#top": "banner", "#side-nav": "navigation", "#nav-path": "navigation", ".toc": "navigation" };
    const names = { "#side-nav": "All pages", "#nav-path": "Footer", ".toc": "On this page" };
    for (const [selector, role] of Object.entries(roles)) each(selector, (element) => element.setAttribute("role", role));
    for (const [selector, name] of Object.entries(names)) each(selector, (element) => element.setAttribute("aria-label", name));
    // The search field is made anew whenever the width of the window changes.
    const nameFields = () => {
        each("#MSearchField", (element) => element.setAttribute("aria-label", "Search"));
        each("#main-menu-state", (element) => element.setAttribute("aria-label", "Menu"));
    };
    nameFields();
    new MutationObserver(nameFields).observe(document.body, { childList: true, subtree: true });
    if (document.querySelector("h1") === null) {
        each(".headertitle .title", (title) => {
            title.setAttribute("role", "heading");
            title.setAttribute("aria-level", "1");
        });
    }
    each("object", (picture) => {
        picture.setAttribute("role", "img");
        picture.setAttribute("aria-label", picture.parentElement.querySelector(".caption")?.textContent ?? "Picture");
    });
    // What scrolls can be scrolled by keys.
    each("#doc-content, #nav-tree, .memproto, .fragment, .contents table, .contents tbody, .contents thead", (element) => {
        if (element.scrollWidth > element.clientWidth || element.scrollHeight > element.clientHeight) element.tabIndex = 0;
    });
});
