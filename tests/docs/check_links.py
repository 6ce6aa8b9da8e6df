#!/usr/bin/env python3
"""Checks that the file and the anchor of every relative link in HTML pages and Markdown files exist.

    check_links.py HTML_FOLDER MARKDOWN_FILE...
"""

import html.parser
import pathlib
import re
import sys
import urllib.parse


class Page(html.parser.HTMLParser):
    def __init__(self, path):
        super().__init__()
        self.links, self.places = [], set()
        self.feed(path.read_text(encoding="utf-8"))

    def handle_starttag(self, tag, attrs):
        for name, value in attrs:
            if name in ("id", "name"):
                self.places.add(value)
            if (tag, name) in (("a", "href"), ("link", "href"), ("script", "src"), ("img", "src")):
                self.links.append(value or "")


def main():
    broken, count = [], 0
    folder = pathlib.Path(sys.argv[1])
    pages = {path.resolve(): Page(path) for path in sorted(folder.rglob("*.html"))}
    for path, page in pages.items():
        for link in page.links:
            target = urllib.parse.urlparse(link)
            if target.scheme or target.netloc or link in ("", "#") or link.startswith("javascript:"):
                continue
            count += 1
            file = (path.parent / urllib.parse.unquote(target.path)).resolve() if target.path else path
            if not file.exists():
                broken.append(f"{path.name}: {link}: no such file")
            elif target.fragment and file in pages and \
                    urllib.parse.unquote(target.fragment) not in pages[file].places:
                broken.append(f"{path.name}: {link}: no such place")
    for name in sys.argv[2:]:
        path = pathlib.Path(name)
        text = re.sub(r"^```.*?^```", "", path.read_text(encoding="utf-8"), flags=re.M | re.S)
        for link in re.findall(r"\]\(([^)#\s]+)[^)]*\)", text):
            if not urllib.parse.urlparse(link).scheme:
                count += 1
                if not (path.parent / link).exists():
                    broken.append(f"{name}: {link}: no such file")
    print("\n".join(broken) if broken else f"{count} links are valid")
    return 1 if broken or count == 0 else 0


sys.exit(main())
