// Headless canvas for builds without a window system.
