Without a command it says what is missing, and that is a usage error:

    $ cfg32
    A subcommand is required
    Run with --help for more information.
    [2]
