package com.tavir.slideshow;

/** In which order the pictures of a show come. */
public enum Order {
    SEQUENTIAL,
    SHUFFLED
}
