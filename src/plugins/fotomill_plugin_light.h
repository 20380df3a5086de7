/*
 * From linear light, as formats with a high dynamic range store it, to samples of 8 bits. Optional,
 * like fotomill_plugin_kit.h. A module in C also links the library m.
 *
 * Light is multiplied by 2 to the power of the exposure. Values above white are then either clipped
 * at white, or the luminance Y is compressed to Y / (1 + Y), the simple form of the operator in
 * E. Reinhard and others, "Photographic Tone Reproduction for Digital Images" (2002). The curve is
 * that of sRGB (IEC 61966-2-1), rounded to the nearest sample.
 */
#ifndef FOTOMILL_PLUGIN_LIGHT_H
#define FOTOMILL_PLUGIN_LIGHT_H

#include <math.h>
#include <stdint.h>
#include <string.h>

/* Rows of a table of options. */
#define FMW_LIGHT_OPTIONS                                                        \
  {"Exposure", "Exposure, in stops", FMW_OPTION_NUMBER, -20, 20, 0, nullptr}, {  \
    "Highlights", "Highlights", FMW_OPTION_CHOICE, 0, 1, 0, "Clipped;Compressed" \
  }

typedef struct FmwLight {
  float gain;
  int compressed;
  float least[257];          /* the least light of each sample; that of 256 is never reached */
  uint8_t start[0x3f80 + 1]; /* by the upper half of a float up to 1: its sample, or one too low */
} FmwLight;

/* The light of a sample, or of a place between two of them, 0 to 255. */
static inline float FmwLightOf(double sample) {
  const double value = sample / 255;
  return (float)(value <= 0.04045 ? value / 12.92 : pow((value + 0.055) / 1.055, 2.4));
}

static inline void FmwInitLight(FmwLight* light, int32_t exposure, int32_t highlights) {
  uint32_t sample = 0;
  light->gain = ldexpf(1, exposure);
  light->compressed = highlights == 1;
  light->least[0] = 0;
  light->least[256] = INFINITY;
  for (int i = 1; i < 256; ++i) light->least[i] = FmwLightOf(i - 0.5);
  for (uint32_t i = 0; i < sizeof light->start; ++i) {
    const uint32_t bits = i << 16;
    float value;
    memcpy(&value, &bits, sizeof value);
    while (value >= light->least[sample + 1]) ++sample;
    light->start[i] = (uint8_t)sample;
  }
}

static inline uint8_t FmwLightSample(const FmwLight* light, float value) {
  uint32_t bits, sample;
  if (!(value > 0)) return 0; /* not a number, too */
  if (value >= 1) return 255;
  memcpy(&bits, &value, sizeof bits);
  sample = light->start[bits >> 16];
  while (value >= light->least[sample + 1]) ++sample;
  return (uint8_t)sample;
}

/* Writes blue, green, red. */
static inline void FmwLightPixel(const FmwLight* light, float red, float green, float blue,
                                 uint8_t* pixel) {
  float gain = light->gain;
  if (light->compressed) {
    const float luminance = gain * (0.2126F * red + 0.7152F * green + 0.0722F * blue);
    if (luminance > 0 && luminance < INFINITY) gain /= 1 + luminance;
  }
  pixel[0] = FmwLightSample(light, blue * gain);
  pixel[1] = FmwLightSample(light, green * gain);
  pixel[2] = FmwLightSample(light, red * gain);
}

#endif
