#!/usr/bin/env python3
"""The Print and pages window of the real program: live pages, PDF files, the system's printer."""
import os
import re
import shutil
import subprocess
import sys

from driven_desktop import PROJECT, Desktop, make_pictures, needs_manager, run

for program in ("pdfinfo", "pdftotext", "pdftoppm"):
    if shutil.which(program) is None:
        print(f"{program} is not installed: left out")
        sys.exit(77)


def pdf_facts(path):
    """Pages, and the size of the first one in points."""
    text = subprocess.run(["pdfinfo", str(path)], check=True, capture_output=True, text=True).stdout
    size = re.search(r"Page size:\s+([\d.]+) x ([\d.]+)", text)
    return int(re.search(r"Pages:\s+(\d+)", text)[1]), float(size[1]), float(size[2])


def pdf_text(path):
    return subprocess.run(["pdftotext", str(path), "-"], check=True, capture_output=True,
                          text=True).stdout


def dark_share(path, page):
    """The part of a page that is not white, as drawn at 20 dots per inch."""
    data = subprocess.run(["pdftoppm", "-r", "20", "-gray", "-f", str(page), "-l", str(page),
                           str(path)], check=True, capture_output=True).stdout
    width, height = map(int, data.split(b"\n")[1].split())
    pixels = data[-width * height:]
    return sum(pixel < 250 for pixel in pixels) / len(pixels)


def open_pages(desktop, keys, kind):
    desktop.focus("Fotomill Professional")
    desktop.key("ctrl+a")
    if " " in keys:
        desktop.key("ctrl+k")
        desktop.wait(r"finder found=")
        desktop.focus("Find command")
        desktop.type(keys)
        desktop.wait(r"finder found=1$")
        desktop.key("Return")
    else:
        desktop.key(keys)
    desktop.wait(rf"pages kind={kind}")
    line = desktop.wait(r"pages-preview .* status=0")
    desktop.focus("^Print and pages")
    return line


def save_pdf(desktop, path):
    desktop.key("ctrl+s")
    desktop.wait(r"prompt save-pdf")
    desktop.focus("^Save as PDF$", native=True)
    desktop.key("ctrl+a")
    desktop.type(str(path))
    desktop.key("Return")


def options_change_the_pages(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png", "c.jpg", "d.bmp", "e.bmp"])
    (pictures / "d.bmp").write_bytes(b"BM and no more")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=5 .*listing=0")
        line = open_pages(desktop, "functions contact", "contact")
        assert " page=1/1 " in line and "problems=d.bmp: " in line, line
        # The first option of the kind: columns and rows. Text that makes no sense is told at once.
        desktop.key("Tab")
        desktop.type("1x")
        desktop.wait(r'pages-problem "1x" is not a number of columns')
        desktop.type("3")
        desktop.wait(r"pages-preview .* page=1/2 status=0")
        desktop.key("Page_Down")
        desktop.wait(r"pages-preview .* page=2/2 status=0")
        desktop.key("ctrl+Home")
        line = desktop.wait(r"pages-preview .* page=1/2 status=0")
        width = int(line.split("pixels=")[1].split("x")[0])
        desktop.key("ctrl+plus")
        line = desktop.wait(r"pages-preview .* page=1/2 status=0")
        assert int(line.split("pixels=")[1].split("x")[0]) > width * 1.2, line
        desktop.key("ctrl+0")
        desktop.wait(rf"pages-preview .* pixels={width}x")
        desktop.screenshot("pages-contact")
        # Another kind, then the first one with its options as they were.
        desktop.key("shift+Tab", "Down", "Down", "Down")
        line = desktop.wait(r"pages-preview .* page=1/4 status=0")
        desktop.key("Home")
        desktop.wait(r"pages-preview .* page=1/2 status=0")
        pdf = folder / "sheets.pdf"
        save_pdf(desktop, pdf)
        desktop.wait(r"batch-line .*a\.bmp -> .*sheets\.pdf")
        desktop.wait(r"batch-line .*d\.bmp: ")
        desktop.wait(r"batch stays-open")
        assert pdf_facts(pdf)[0] == 2, pdf_facts(pdf)
        text = pdf_text(pdf)
        assert "a.bmp" in text and "e.bmp" in text and "d.bmp" not in text, text
        desktop.focus("^Print and pages")
        desktop.key("Escape")
        desktop.wait(r"pages closed")
        settings = (folder / "data/Fotomill Professional 11.ini").read_text()
        assert "CatalogPortraitWide=1\n" in settings and "CatalogPortraitDeep=3\n" in settings


def an_abort_leaves_no_file(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    large = folder / "large.ppm"
    large.write_bytes(b"P6 6000 6000 255\n" + os.urandom(6000) * 18000)
    program = os.environ.get("FOTOMILL", str(PROJECT / "build/release/fotomill"))
    subprocess.run([program, "convert", str(large), "--out", str(pictures / "large.tif")],
                   check=True, stdout=subprocess.DEVNULL)
    for number in range(30):
        os.link(pictures / "large.tif", pictures / f"more{number}.tif")
    with Desktop(folder, pictures, settings=["CloseProgressWhenDone=0"]) as desktop:
        desktop.wait(r"lines=32 .*listing=0")
        open_pages(desktop, "ctrl+p", "print")
        pdf = folder / "prints.pdf"
        save_pdf(desktop, pdf)
        desktop.wait(r"batch opened")
        desktop.focus("^Progress$", settle=False)
        desktop.key("alt+a")
        desktop.wait(r"batch ended status=4")
        assert not [path.name for path in folder.iterdir() if ".pdf" in path.name]


@needs_manager
def prints_go_to_the_printer(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    # The system's printer that writes a file needs no print server.
    settings = folder / "home/.config/gtk-3.0/settings.ini"
    settings.parent.mkdir(parents=True)
    settings.write_text("[Settings]\ngtk-print-backends=file\n")
    printed = folder / "output.pdf"  # in the current folder
    os.chdir(folder)
    with Desktop(folder, pictures, settings=["NewPrintSizeMode=4", "PrintWorkshopUnits=1",
                                             "PrintWorkshopSizeWidth=10", "PrintSize=12",
                                             "PrintWorkshopSizeDepth=10"]) as desktop:
        os.chdir(PROJECT)
        desktop.wait(r"lines=2 .*listing=0")
        line = open_pages(desktop, "ctrl+p", "print")
        assert " page=1/2 " in line and " size=279x216 " in line, line  # Letter, turned
        desktop.key("ctrl+p")
        desktop.wait(r"prompt print")
        dialog = desktop.focus("^Print$", native=True)
        desktop.screenshot("pages-print-dialog")
        # The focus is elsewhere in each release of the toolkit; the first printer is where it was.
        desktop.xdotool("mousemove", "--window", dialog, 80, 90, "click", 1)
        desktop.settle()
        desktop.key("Return")
        desktop.wait(r"pages-printed pages=2 status=0 done=1")
    assert pdf_facts(printed) == (2, 612, 792), pdf_facts(printed)
    # 10 x 7.5 cm on each sheet, which is turned.
    shares = [dark_share(printed, page) for page in (1, 2)]
    assert all(0.1 < share < 0.14 for share in shares), shares


run(options_change_the_pages, an_abort_leaves_no_file, prints_go_to_the_printer)
