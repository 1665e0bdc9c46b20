package com.tavir.slideshow;

/** Where a picture of a container stands between being added and being removed. */
public enum ImageState {
    ADDED(false),
    MARKED_AFTER_ADDING(true),
    LOADED(false),
    MARKED_AFTER_LOADING(true);

    private final boolean marked;

    ImageState(boolean marked) {
        this.marked = marked;
    }

    /** The next {@link SlideShow#compact} removes the picture. */
    public boolean isMarked() {
        return marked;
    }

    /** The library's codes are 0 to 3; what else a file may hold still tells the mark by bit 0. */
    static ImageState of(int code) {
        return values()[code & 3];
    }
}
