#!/usr/bin/python3
"""Web galleries: valid pages, every file there, hostile names harmless, a second build touches
nothing; and in Chromium, if it is installed, layout, keys and no errors."""
import html.parser
import json
import os
import re
import shutil
import subprocess
import sys
import tempfile
import time
from pathlib import Path
from urllib.parse import unquote

try:
    from PIL import Image
    from PIL.TiffImagePlugin import IFDRational
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
HOSTILE = "<script>alert(1)<\u2215script> \"quoted\" & 'single' {{title}}.png"
VOID = {"meta", "link", "img", "source"}
faults = []


def check(found, expected, what):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


def run(*arguments, status=0):
    done = subprocess.run([FOTOMILL, *map(str, arguments)], capture_output=True, check=False)
    if done.returncode != status:
        faults.append(f"{arguments}: status {done.returncode}, expected {status}: {done.stderr}")
    return done


class Page(html.parser.HTMLParser):
    """Collects tags; complains about unbalanced and repeated ones."""

    def __init__(self, path):
        super().__init__(convert_charrefs=True)
        self.open, self.tags, self.texts, self.ids = [], [], [], set()
        text = path.read_text(encoding="utf-8")
        self.feed(text)
        self.close()
        check(self.open, [], f"open tags of {path.name}")
        check(text.startswith("<!DOCTYPE html>\n"), True, "doctype")

    def handle_starttag(self, tag, attrs):
        names = [name for name, _ in attrs]
        check(len(names), len(set(names)), f"attributes of {tag}")
        self.tags.append((tag, dict(attrs)))
        name = dict(attrs).get("id")
        if name is not None:
            check(name in self.ids or not re.fullmatch(r"[a-z][a-z0-9-]*", name), False,
                  f"id {name}")
            self.ids.add(name)
        if tag not in VOID:
            self.open.append(tag)

    def handle_endtag(self, tag):
        check(self.open.pop() if self.open else None, tag, "end tag")

    def handle_data(self, data):
        self.texts.append(data)

    def all(self, tag):
        return [attributes for name, attributes in self.tags if name == tag]

    def files(self):
        """All files that the page refers to."""
        found = set()
        for _, attributes in self.tags:
            found |= {attributes.get(name) for name in ("href", "src")}
            for part in (attributes.get("srcset") or "").split(","):
                found.add(part.strip().split(" ")[0])
        return {name for name in found if name and not name.startswith(("#", "data:"))}


def state(folder):
    return {path.relative_to(folder).as_posix(): path.stat().st_mtime_ns
            for path in folder.rglob("*") if path.is_file()}


def test_pages(work, web):
    done = run("gallery", work, "--dest", web, "--title", "A & B <i>", "--per-page", "4", "--json",
               status=1)
    rows = json.loads(done.stdout)
    check(sorted(Path(row["file"]).name for row in rows if row["status"] != 0), ["broken.jpg"],
          "files that fail")
    pages = [Page(web / name) for name in ("index.html", "page-2.html")]
    for page in pages:
        for name in page.files():
            check((web / unquote(name)).is_file() and ":" not in name, True, f"{name} exists")
        check([tag for tag, attributes in page.tags
               if any(name.startswith("on") for name in attributes)], [], "inline scripts")
        check(len(page.all("script")), 1, "scripts")
        check(page.all("html")[0].get("lang"), "en", "language")
        for image in page.all("img"):
            check("alt" in image, True, "alternative texts")
        check("A & B <i>" in page.texts, True, "title")
    pictures = [image for page in pages for image in page.all("img") if "loading" in image]
    check(len(pictures), 6, "pictures")
    alts = [image["alt"] for image in pictures]
    check(Path(HOSTILE).stem in alts, True, f"hostile name in {alts}")
    for image in pictures:
        with Image.open(web / image["src"]) as opened:
            check((str(opened.width), str(opened.height)), (image["width"], image["height"]),
                  "size in the page")
    links = [link for page in pages for link in page.all("a") if "id" in link]
    large = next(link for link in links if link["id"].startswith("wide-"))
    with Image.open(web / large["href"]) as opened:
        check(opened.size, (1920, 1280), "largest size")
        check("exif" in opened.info or "icc_profile" in opened.info, False, "metadata is removed")
    check(large.get("data-details"), "Brownie \u00b7 1/320 s \u00b7 f/5.6 \u00b7 ISO 400",
          "exposure")
    check(any("data-original" in link for link in links), False, "no link to the originals")
    tall = next(image for page in pages for image in page.all("img") if image["alt"] == "turned")
    check((tall["width"], tall["height"]), ("400", "480"), "orientation")
    with Image.open(web / tall["src"]) as opened:
        check(opened.convert("L").getpixel((200, 20)) > 200, True, "turned upright")
    if shutil.which("tidy"):
        for name in ("index.html", "page-2.html"):
            report = subprocess.run(["tidy", "-q", "-e", str(web / name)], capture_output=True,
                                    text=True, check=False).stderr
            # attributes that are younger than the validator
            known = [f'attribute "{name}"' for name in ("sizes", "loading", "decoding",
                                                        "aria-current")]
            check([line for line in report.splitlines()
                   if not any(word in line for word in known)], [], f"validator on {name}")


def test_weight(work):
    many, web = work / "many", work / "weight"
    many.mkdir()
    Image.new("RGB", (30, 20), "red").save(many / "first-picture-of-the-holidays-000.png")
    for i in range(1, 200):
        os.link(many / "first-picture-of-the-holidays-000.png",
                many / f"first-picture-of-the-holidays-{i:03}.png")
    run("gallery", many, "--dest", web)
    size = sum((web / name).stat().st_size for name in ("index.html", "gallery.css", "gallery.js"))
    check(size < 200000, True, f"weight of the first view: {size}")


def test_again(work, web):
    arguments = ("gallery", work, "--dest", web, "--title", "A & B <i>", "--per-page", "4")
    before = state(web)
    run(*arguments, status=1)
    check(state(web), before, "a second build touches nothing")
    (web / "pictures" / "mine.jpg").write_bytes(b"mine")
    (web / "notes.html").write_bytes(b"mine")
    with Image.open(work / "small.png") as image:
        image.transpose(Image.Transpose.FLIP_TOP_BOTTOM).save(work / "small.png")
    (work / "plain.gif").unlink()
    time.sleep(0.01)
    run(*arguments, status=1)
    after = state(web)
    gone = sorted(re.sub("-[0-9a-f]{12}-", "-*-", name) for name in before.keys() - after.keys())
    check(gone, ["pictures/plain-*-120.jpg", "pictures/plain-*-120.webp",
                 "pictures/small-*-90.jpg", "pictures/small-*-90.webp"], "files deleted")
    changed = {name for name in before if name in after and before[name] != after[name]}
    check(changed, {"index.html", "page-2.html", "pictures/gallery-files.txt"}, "files rewritten")
    check((web / "pictures" / "mine.jpg").exists() and (web / "notes.html").exists(), True,
          "other files are left alone")
    run("gallery", work / "small.png", "--dest", web)
    check((web / "page-2.html").exists(), False, "pages no longer used")


def test_options(work):
    web = work / "options"
    run("gallery", work / "wide.jpg", "--dest", web, "--sizes", "100,300", "--no-webp",
        "--no-details", "--originals", "--caption", "%F: %W")
    page = Page(web / "index.html")
    link = page.all("a")[0]
    check(page.all("source"), [], "no WebP")
    check(page.all("img")[0]["srcset"].count(" 100w") + page.all("img")[0]["srcset"].count(" 300w"),
          2, "sizes")
    check(link.get("data-details"), None, "no details")
    check((web / unquote(link["data-original"])).resolve(), (work / "wide.jpg").resolve(),
          "link to the original")
    check("wide: 2400" in page.texts, True, "caption")
    run("gallery", "theme", "--dest", web / "theme")
    run("gallery", "theme", "--dest", web / "theme", status=2)
    (web / "theme" / "template.html").write_text("<p>{{title}}</p>{{pictures}}")
    run("gallery", work / "wide.jpg", "--dest", web, "--theme", web / "theme", "--title", "<&>")
    check((web / "index.html").read_text().startswith("<p>&lt;&amp;&gt;</p><ul"), True, "theme")
    (web / "theme" / "template.html").write_text("nothing")
    for wrong in (("--theme", web / "theme"), ("--theme", web / "none"), ("--sizes", "300,100"),
                  ("--sizes", "1,20,30"), ("--sizes", "20,30,40,50"), ("--caption", "%Q")):
        run("gallery", work / "wide.jpg", "--dest", work / "nothing", *wrong, status=2)
    check((work / "nothing").exists(), False, "nothing is written")
    run("gallery", work / "wide.jpg", "--dest", work / "nothing", "--dry-run")
    check((work / "nothing").exists(), False, "a dry run writes nothing")


def test_safety(work):
    """Files of others and galleries are not lost, and a gallery does not show itself."""
    site, source = work / "site", work / "source"
    for name in ("index.html", "gallery.css", "gallery.js", "page-2.html"):
        site.mkdir()
        (site / name).write_text("mine")
        run("gallery", work / "wide.jpg", work / "small.png", "--per-page", "1", "--dest", site,
            status=2)
        check([path.name for path in site.rglob("*")], [name], "nothing is written")
        check((site / name).read_text(), "mine", f"{name} is kept")
        shutil.rmtree(site)
    source.mkdir()
    shutil.copy(work / "small.png", source)
    web = source / "web"
    for _ in range(2):
        run("gallery", source, source / "small.png", "-r", "--dest", web)
        check(len(Page(web / "index.html").all("img")), 2, "one picture, and the viewer's")
    before = state(web)
    run("gallery", work / "broken.jpg", work / "missing.jpg", "--dest", web, status=1)
    check(state(web), before, "a gallery of nothing")
    shutil.rmtree(source)


SCRIPT = """
window.addEventListener("load", async () => {
  const facts = {};
  const wait = () => new Promise((resolve) => setTimeout(resolve, 150));
  const viewer = document.querySelector(".viewer");
  const links = [...document.querySelectorAll(".pictures a")];
  const press = async (key) => {
    (document.activeElement || viewer).dispatchEvent(
      new KeyboardEvent("keydown", { key, bubbles: true, cancelable: true }));
    await wait();
  };
  const position = () => viewer.querySelector(".position").textContent;
  const rows = new Map();
  for (const item of document.querySelectorAll(".pictures li")) {
    const box = item.getBoundingClientRect();
    rows.set(Math.round(box.top), Math.max(rows.get(Math.round(box.top)) || 0, box.right));
  }
  facts.width = innerWidth;
  facts.scrolls = document.documentElement.scrollWidth > innerWidth;
  facts.perRow = links.length / rows.size;
  facts.scripts = document.querySelectorAll("script").length;
  links[1].focus();
  links[1].click();
  await wait();
  const box = viewer.getBoundingClientRect();
  facts.fills = box.left === 0 && box.top === 0 && box.width === innerWidth &&
    box.height === innerHeight;
  facts.open = viewer.open && position();
  facts.webp = /[.]webp$/.test(links[1].querySelector("img").currentSrc);
  facts.large = viewer.querySelector("img").currentSrc === links[1].href;
  await press("ArrowRight");
  facts.right = position();
  await press("ArrowLeft");
  await press("ArrowLeft");
  facts.left = position();
  await press("ArrowLeft");
  facts.start = position();
  await press("End");
  facts.end = position();
  const swipe = (type, x) => viewer.dispatchEvent(new PointerEvent(type,
    { clientX: x, clientY: 100, isPrimary: true, pointerType: "touch", bubbles: true }));
  swipe("pointerdown", 100);
  swipe("pointerup", 300);
  await wait();
  facts.swiped = position();
  viewer.querySelector(".close").click();
  facts.closed = !viewer.open && document.activeElement === links[2];
  links[0].click();
  await press("Escape");
  facts.escaped = !viewer.open && document.activeElement === links[0];
  document.title = JSON.stringify(facts);
});
"""


def test_browser(web):
    browser = shutil.which("chromium")
    if not browser:
        print("not tried: chromium is not installed")
        return
    web = shutil.copytree(web, web.with_name("driven"))
    page = web / "index.html"
    page.write_text(page.read_text().replace("</head>", f"<script>{SCRIPT}</script></head>"))
    for width, rows in ((1280, 2), (500, 1)):
        with tempfile.TemporaryDirectory() as profile:
            done = subprocess.run(
                [browser, "--headless=new", "--no-sandbox", "--disable-gpu", "--dump-dom",
                 "--enable-logging=stderr", "--virtual-time-budget=6000",
                 f"--user-data-dir={profile}", f"--window-size={width},900", page.as_uri()],
                capture_output=True, text=True, check=False, timeout=120)
        title = re.search(r"<title>(\{.*?\})</title>", done.stdout)
        if not title:
            faults.append(f"the script did not finish at {width}: {done.stderr[-500:]}")
            continue
        facts = json.loads(title[1])
        check(facts["width"] <= width, True, "window")
        check(facts["perRow"] >= rows, True, f"pictures per row at {width}: {facts['perRow']}")
        del facts["width"], facts["perRow"]
        check(facts, {"scrolls": False, "scripts": 2, "fills": True, "open": "2 / 4", "webp": True,
                      "large": True, "right": "3 / 4", "left": "1 / 4", "start": "1 / 4",
                      "end": "4 / 4", "swiped": "3 / 4", "closed": True, "escaped": True},
              f"keys and swiping at {width}")
        errors = [line for line in done.stderr.splitlines() if "CONSOLE" in line]
        check(errors, [], "console")


def make_pictures(work):
    """The pictures of the tests."""
    wide = Image.linear_gradient("L").resize((2400, 1600)).convert("RGB")
    exif = Image.Exif()
    exif[0x0110] = "Brownie"
    exif[0x8769] = {0x829A: IFDRational(1, 320), 0x829D: IFDRational(56, 10), 0x8827: 400}
    wide.save(work / "wide.jpg", exif=exif, quality=90)
    wide.resize((90, 60)).save(work / "small.png")
    wide.resize((120, 80)).save(work / "plain.gif")
    wide.resize((700, 500)).save(work / "other.png")
    wide.resize((600, 500)).save(work / HOSTILE)
    turned = Image.new("RGB", (600, 500))
    turned.paste((255, 255, 255), (0, 0, 100, 500))  # the left becomes the top
    exif = Image.Exif()
    exif[0x0112] = 6
    turned.save(work / "turned.jpg", exif=exif)
    (work / "broken.jpg").write_bytes((work / "wide.jpg").read_bytes()[:3000])


def main():
    with tempfile.TemporaryDirectory() as name:
        work, web = Path(name, "pictures"), Path(name, "web")
        work.mkdir()
        make_pictures(work)
        for test, arguments in ((test_pages, (work, web)), (test_browser, (web,)),
                                (test_again, (work, web)), (test_options, (work,)),
                                (test_safety, (work,)),
                                (test_weight, (work,))):
            before = len(faults)
            test(*arguments)
            for fault in faults[before:]:
                print(f"FAILED: {test.__name__}: {fault}")
    return 1 if faults else 0


sys.exit(main())
