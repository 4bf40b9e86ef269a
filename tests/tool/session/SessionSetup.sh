# Nothing has to be there before the session begins.
