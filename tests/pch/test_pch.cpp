// The precompiled header of the test programs is built with this unit; GoogleTest gives the main.
