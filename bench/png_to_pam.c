/* The yardstick of `zelctl png-decode FILE OUT.pam`: the smallest libpng program that writes
 * the same PAM (8-bit RGB_ALPHA; images with alpha laid on black, the default transparent
 * style, so alpha is 255 and colour is premultiplied).
 *
 *   png_to_pam FILE OUT.pam */

#include <png.h>

#include <stdio.h>
#include <stdlib.h>

static void flatten(png_bytep row, png_uint_32 width)
{
    for (png_uint_32 x = 0; x < width; ++x) {
        png_bytep p = row + 4 * x;
        const unsigned a = p[3];
        p[0] = (png_byte)(p[0] * a / 255);
        p[1] = (png_byte)(p[1] * a / 255);
        p[2] = (png_byte)(p[2] * a / 255);
        p[3] = 255;
    }
}

int main(int argc, char **argv)
{
    if (argc != 3) {
        fprintf(stderr, "usage: png_to_pam FILE OUT.pam\n");
        return 2;
    }
    FILE *in = fopen(argv[1], "rb");
    FILE *out = fopen(argv[2], "wb");
    if (!in || !out) {
        fprintf(stderr, "png_to_pam: cannot open the files\n");
        return 1;
    }
    png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, NULL, NULL, NULL);
    png_infop info = png_create_info_struct(png);
    png_bytep image = NULL;
    if (setjmp(png_jmpbuf(png))) {
        fprintf(stderr, "png_to_pam: %s is not a PNG it can read\n", argv[1]);
        return 1;
    }
    png_init_io(png, in);
    png_read_info(png, info);
    const int alpha = (png_get_color_type(png, info) & PNG_COLOR_MASK_ALPHA) || png_get_valid(png, info, PNG_INFO_tRNS);
    png_set_expand(png);
    png_set_strip_16(png);
    png_set_gray_to_rgb(png);
    png_set_add_alpha(png, 0xFF, PNG_FILLER_AFTER);
    const int passes = png_set_interlace_handling(png);
    png_read_update_info(png, info);
    const png_uint_32 width = png_get_image_width(png, info);
    const png_uint_32 height = png_get_image_height(png, info);
    const size_t stride = (size_t)width * 4;
    fprintf(out, "P7\nWIDTH %u\nHEIGHT %u\nDEPTH 4\nMAXVAL 255\nTUPLTYPE RGB_ALPHA\nENDHDR\n", width, height);
    image = malloc(passes > 1 ? stride * height : stride);
    if (passes > 1) {
        png_bytep *rows = malloc(sizeof(png_bytep) * height);
        for (png_uint_32 y = 0; y < height; ++y)
            rows[y] = image + stride * y;
        png_read_image(png, rows);
        free(rows);
    }
    for (png_uint_32 y = 0; y < height; ++y) {
        png_bytep row = passes > 1 ? image + stride * y : image;
        if (passes == 1)
            png_read_row(png, row, NULL);
        if (alpha)
            flatten(row, width);
        fwrite(row, 1, stride, out);
    }
    png_read_end(png, NULL);
    png_destroy_read_struct(&png, &info, NULL);
    free(image);
    fclose(in);
    return fclose(out) == 0 ? 0 : 1;
}
