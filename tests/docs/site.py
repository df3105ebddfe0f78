#!/usr/bin/env python3
"""Checks the documentation site: no Markdown is left over in its text, each page has the structure
that a code host gives it, links lead somewhere, nothing is loaded from other hosts, each page is in
the navigation, and the search knows the words of the text. Usage: site.py PAGES-DIR HTML-DIR [WORD...]
"""
import difflib
import json
import pathlib
import re
import subprocess
import sys
from html.parser import HTMLParser
from urllib.parse import unquote, urlsplit

BLOCKS = {"p", "h1", "h2", "h3", "h4", "h5", "h6", "li", "td", "th", "dd", "dt", "div", "article", "br"}
STRUCTURE = {"a", "h1", "h2", "h3", "h4", "ul", "ol", "li", "table", "tr", "th", "td", "pre", "blockquote",
             "code", "strong", "em", "img", "hr"}
VOID = {"br", "img", "hr", "input", "meta", "link", "area"}
LEFT_OVER = re.compile(r"\]\(|\]\[|\*|`|<!--|\|\s*$|:?---|^\s*(\||#{1,6} |>|[-+] |\d+[.)] )", re.M)


class Html(HTMLParser):
    """One page: its anchors, its links, what it loads; the texts and the structure of its article."""

    def __init__(self, text):
        super().__init__()
        self.ids, self.links, self.loads, self.texts, self.structure = set(), [], [], [""], []
        self.open = []
        self.feed(text)

    def handle_starttag(self, tag, attributes):
        named = dict(attributes)
        self.ids |= {named.get("id"), named.get("name")}
        if tag == "a" and "href" in named:
            self.links.append(named["href"])
        loads = named.get("src") or (tag == "link" and named.get("rel") != "canonical" and named.get("href"))
        if loads:
            self.loads.append(loads)
        if tag not in VOID:
            self.open.append(tag)
        if tag in BLOCKS:
            self.texts.append("")
        else:
            self.texts[-1] += "\u2026"  # what is marked up does not begin a line
        if tag in STRUCTURE and "pre" not in self.open[:-1] and named.get("class") != "headerlink":
            self.structure.append(tag)

    def handle_endtag(self, tag):
        while tag in self.open and self.open.pop() != tag:
            pass
        if tag in BLOCKS:
            self.texts.append("")

    def handle_data(self, data):
        if not {"pre", "code", "script", "style"} & set(self.open):
            self.texts[-1] += data


def article(text):
    """The part of a page that its Markdown became."""
    found = re.search(r"<article.*?</article>", text, re.S)
    return found.group() if found else ""


def structure(text):
    """The tags that make up a text, a word each."""
    return Html(text).structure


def on_a_code_host(page):
    """The HTML that a code host makes of a page."""
    return subprocess.run(["cmark-gfm", "-e", "table", "--unsafe", str(page)], check=True,
                          capture_output=True, text=True).stdout


def faults_of_text(page, html):
    """Markup that is left over in a page, and where it is built in another way than elsewhere."""
    for text in Html(html).texts:
        for line in text.splitlines() if LEFT_OVER.search(text) else ():
            if LEFT_OVER.search(line):
                yield f"markup in the text: {line.strip()}"
    here, there = structure(html), structure(on_a_code_host(page))
    for kind, a, b, c, d in difflib.SequenceMatcher(None, there, here, False).get_opcodes():
        if kind != "equal":
            near = " ".join(there[max(0, a - 3):a])
            yield f"after '{near}' a code host has '{' '.join(there[a:b])}', the site '{' '.join(here[c:d])}'"


def faults_of_links(file, pages):
    """Links of a file that lead nowhere, and what it loads from other hosts."""
    for url in pages[file].loads:
        if urlsplit(url).netloc:
            yield f"loads {url}"
    for url in pages[file].links + pages[file].loads:
        parts = urlsplit(url)
        if parts.scheme or parts.netloc:
            continue
        target = (file.parent / unquote(parts.path)).resolve() if parts.path else file
        target = target / "index.html" if target.is_dir() else target
        if not target.is_file():
            yield f"no {url!r}"
        elif (parts.fragment and target in pages and unquote(parts.fragment) not in pages[target].ids
              and file.parent.name != "reference"):  # Doxygen names sections that it leaves out
            yield f"no anchor {url!r}"


def faults(source, site, words):
    """All that is wrong, a line each."""
    pages = {file: Html(file.read_text()) for file in site.rglob("*.html")}
    navigation = {(site / url).resolve() for url in pages[site / "index.html"].links if "#" not in url}
    for page in sorted(source.rglob("*.md")):
        name = page.relative_to(source)
        file = site / name.with_name("index.html" if name.stem == "README" else name.stem + ".html")
        if file not in navigation and name.name != "README.md":
            yield f"{name}: not in the navigation"
        yield from (f"{name}: {fault}" for fault in faults_of_text(page, article(file.read_text())))
    for file in sorted(pages):
        yield from (f"{file.relative_to(site)}: {fault}" for fault in faults_of_links(file, pages))
    index = json.loads((site / "search/search_index.json").read_text())
    text = " ".join(entry["text"] for entry in index["docs"])
    yield from (f"the search does not find {word}" for word in words if word not in text)


def main():
    source, site = (pathlib.Path(folder).resolve() for folder in sys.argv[1:3])
    found = list(faults(source, site, sys.argv[3:]))
    print(*found, sep="\n", end="\n" if found else "")
    sys.exit(bool(found))


if __name__ == "__main__":
    main()
