// Window glue (JAWT + Xlib/MIT-SHM) arrives with the canvas work.
