Without a command it says what is missing, and that is a usage error:

    $ cfg32
    cfg32: A subcommand is required
      hint: x
    [2]
