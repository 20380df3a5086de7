#!/usr/bin/python3
"""Pictures with faces: drawings that the detector recognizes. As a program, writes one with a face
to a file. Skips the test without Pillow."""
import sys

try:
    from PIL import Image, ImageDraw, ImageFilter
except ImportError:
    sys.exit(77)


def draw_face(draw, x, y, size, red_eyes):
    def oval(across, down, width, height, color):
        draw.ellipse([x + (across - width) * size, y + (down - height) * size,
                      x + (across + width) * size, y + (down + height) * size], fill=color)
    oval(0, -.15, 1, 1.25, (60, 45, 35))
    oval(0, 0, .85, 1.1, (222, 184, 160))
    for side in (-.38, .38):
        oval(side, -.22, .26, .13, (120, 85, 70))
        oval(side, -.40, .28, .05, (70, 50, 40))
        oval(side, -.2, .17, .08, (245, 245, 245))
        oval(side, -.2, .08, .08, (230, 20, 20) if red_eyes else (40, 30, 30))
    oval(0, .08, .10, .25, (240, 205, 182))
    oval(0, .28, .16, .06, (150, 105, 90))
    oval(0, .58, .34, .10, (150, 70, 70))


def picture(faces, red_eyes=False):
    """Faces given by center and size."""
    image = Image.new("RGB", (640, 480), (120, 140, 160))
    for face in faces:
        draw_face(ImageDraw.Draw(image), *face, red_eyes)
    return image.filter(ImageFilter.GaussianBlur(2))


if __name__ == "__main__":
    picture([tuple(map(int, face.split(","))) for face in sys.argv[2:]]).save(sys.argv[1])
