#pragma once
// The headless render command:
//
//   pictavo --render OUT.jpg [--layout N] [--ratio 1:1|3:4|9:16] [--margin 0-10]
//           [--roundness 0-10] [--background '#RRGGBB'] [--screen WxH] PHOTO...
//
// decodes the photos as the application does (bounded by the screen size),
// builds the save-mode collage control on a buffer canvas and writes the
// JPEG through the application's own save. Exit status: 0 written; 1 the
// collage could not be rendered or written; 2 bad arguments; 3 fewer than two
// usable photos.

enum CLyRenderExit : int {
  LY_RENDER_OK = 0,
  LY_RENDER_FAILED = 1,
  LY_RENDER_USAGE = 2,
  LY_RENDER_NO_PHOTOS = 3,
};

// argv[1] is "--render".
int runRenderCommand(int argc, char** argv);
