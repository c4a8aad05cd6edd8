# pc_attach_version(<target>): attaches the product version of the project to
# the executable so that the program can read it back from its own file.
function(pc_attach_version target)
endfunction()
