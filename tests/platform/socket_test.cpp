int unused_here;
