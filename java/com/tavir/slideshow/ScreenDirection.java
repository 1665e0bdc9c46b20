package com.tavir.slideshow;

/** The direction of the screen that a show is made for; how far TURNED is turned is the application's. */
public enum ScreenDirection {
    NORMAL,
    TURNED
}
